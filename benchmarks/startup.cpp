// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// The first VFS::ptr() without a bus beside a program that only opens the session bus.

#include "support/contest.h"
#include "support/options.h"
#include "support/program.h"

namespace Benchmarks {

void registerRows(const Options& options)
{
    addRow("first VFS::ptr() with no bus", options.rounds(101), [](benchmark::State& state) {
        Contest contest([] { return runProgram({VEYFM_START_VFS}).cpu; });
        contest.floor("QCoreApplication and session bus", 1.15, [] {
            return runProgram({VEYFM_START_BUS}).cpu;
        });
        contest.run(state);
    });
}

} // namespace Benchmarks
