#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# Runs fuzz targets that were built with libFuzzer, each for some seconds, from its corpus on.

set -euo pipefail

usage() {
    cat <<'TEXT'
Usage: tests/fuzz/run.sh BUILD-DIRECTORY SECONDS [TOPIC]...

Without a topic all targets run, one after another. New inputs that reach new code are kept in
BUILD-DIRECTORY/tests/fuzz/found/TOPIC, and one that fails in BUILD-DIRECTORY/tests/fuzz/failed.
Put the latter into tests/fuzz/corpus/TOPIC, made small with: fuzz_TOPIC -minimize_crash=1 FILE
TEXT
}

if (($# < 2)); then
    usage >&2
    exit 2
fi
build=$1/tests/fuzz
seconds=$2
shift 2
source=$(dirname "${BASH_SOURCE[0]}")
topics=("$@")
if ((${#topics[@]} == 0)); then
    for corpus in "$source"/corpus/*/; do
        topics+=("$(basename "$corpus")")
    done
fi

failed=()
for topic in "${topics[@]}"; do
    found=$build/found/$topic
    mkdir -p "$found" "$build/failed"
    # An input of more than ten seconds is a hang, and one of a gigabyte a bomb.
    "$build/fuzz_$topic" -max_total_time="$seconds" -timeout=10 -rss_limit_mb=1024 \
        -print_final_stats=1 -verbosity=1 -artifact_prefix="$build/failed/$topic-" \
        "$found" "$source/corpus/$topic" || failed+=("$topic")
done
if ((${#failed[@]} > 0)); then
    echo "run.sh: failed: ${failed[*]}" >&2
    exit 1
fi
