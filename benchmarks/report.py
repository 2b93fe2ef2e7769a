#!/usr/bin/env python3
# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

"""Runs the benchmark programs that are named and prints one table of what they measured."""

import json
import os
import subprocess
import sys
import tempfile


def rows_of(program, arguments):
    """The rows of one program, as Google Benchmark writes them."""
    with tempfile.NamedTemporaryFile(suffix=".json") as out:
        command = [program, *arguments, "--benchmark_out=" + out.name,
                   "--benchmark_out_format=json"]
        subprocess.run(command, stdout=subprocess.DEVNULL,
                       stderr=subprocess.DEVNULL, check=True)
        text = out.read()
        # A filter that no row of this program matches leaves nothing behind.
        return json.loads(text)["benchmarks"] if text.strip() else []


def rivals_of(row):
    """(kind, name, ratio, bound) of each rival in a row."""
    for key, ratio in row.items():
        kind, _, rest = key.partition(":")
        name, _, what = rest.rpartition(":")
        if what == "ratio":
            yield kind, name, ratio, row[f"{kind}:{name}:bound"]


def measured(name, value):
    if name.startswith("memory"):
        return f"{value:.0f} bytes"
    if name.startswith("system calls"):
        return f"{value:.2f}"
    if name.startswith("round trips"):
        return f"{value:.0f}"
    if "growth" in name and value < 1000 and name.split(",")[0] != "event":
        return f"{value:.2f} x inotify"
    if value >= 1e6:
        return f"{value / 1e6:.2f} ms"
    return f"{value:.0f} ns" if value < 10000 else f"{value / 1000:.1f} us"


def cells(row):
    name = row["name"].split("/iterations")[0].split("/manual_time")[0]
    if row.get("error_occurred"):
        return [name, row["error_message"], "", "", "skipped"]
    met = True
    value = measured(name, row["ours"])
    if "limit" in row:
        met = row["ours"] <= row["limit"] + 1e-9
        value += f" ({row['limit']:g})"
    sides = {"floor": [], "peer": []}
    for kind, rival, ratio, bound in rivals_of(row):
        met = met and ratio <= bound
        sides[kind].append(f"{ratio:.2f} {rival} ({bound:g})")
    return [name, value, ", ".join(sides["floor"]), ", ".join(sides["peer"]),
            "yes" if met else "NO"]


def print_table(table):
    widths = [max(len(line[i]) for line in table) for i in range(len(table[0]))]
    for number, line in enumerate(table):
        print("| " + " | ".join(c.ljust(w) for c, w in zip(line, widths)) + " |", flush=True)
        if number == 0:
            print("|" + "|".join("-" * (w + 2) for w in widths) + "|")


def main():
    programs = [argument for argument in sys.argv[1:] if not argument.startswith("-")]
    arguments = [argument for argument in sys.argv[1:] if argument.startswith("-")]
    table = [["job", "measured (limit)", "against floor (bound)", "against peers (bound)", "met?"]]
    for program in programs:
        print(os.path.basename(program), file=sys.stderr, flush=True)
        table += [cells(row) for row in rows_of(program, arguments)]
    print_table(table)


if __name__ == "__main__":
    main()
