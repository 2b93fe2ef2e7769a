// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// The first VFS::ptr() without a bus beside a program that only opens the session bus.

#include "support/contest.h"
#include "support/options.h"

#include <cstdio>
#include <cstdlib>

#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>

extern char** environ;

namespace Benchmarks {

namespace {

double nanoseconds(const timeval& time)
{
    return double(time.tv_sec) * 1e9 + double(time.tv_usec) * 1e3;
}

// CPU time of a whole process, from its start to its end.
double cpuTimeOfProgram(const char* program)
{
    char* const arguments[] = {const_cast<char*>(program), nullptr};
    pid_t child = 0;
    int status = 0;
    rusage usage{};
    if (posix_spawn(&child, program, nullptr, nullptr, arguments, environ) != 0 ||
        wait4(child, &status, 0, &usage) != child || status != 0) {
        std::fprintf(stderr, "%s failed\n", program);
        std::exit(1);
    }
    return nanoseconds(usage.ru_utime) + nanoseconds(usage.ru_stime);
}

} // namespace

void registerRows(const Options& options)
{
    addRow("first VFS::ptr() with no bus", options.rounds(101), [](benchmark::State& state) {
        Contest contest([] { return cpuTimeOfProgram(VEYFM_START_VFS); });
        contest.floor("QCoreApplication and session bus", 1.15, [] {
            return cpuTimeOfProgram(VEYFM_START_BUS);
        });
        contest.run(state);
    });
}

} // namespace Benchmarks
