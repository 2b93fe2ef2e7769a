// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_COST_H
#define VEYFM_BENCHMARKS_COST_H

#include <malloc.h>
#include <time.h>

// What a process has cost so far, for programs without Google Benchmark too.

namespace Benchmarks {

/// CPU time of this process, by all of its threads, in nanoseconds.
inline double processCpu()
{
    timespec now{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &now);
    return double(now.tv_sec) * 1e9 + double(now.tv_nsec);
}

/// Bytes that this process has allocated and not freed, by all of its threads.
inline double bytesInUse()
{
    const struct mallinfo2 info = mallinfo2();
    return double(info.uordblks + info.hblkhd);
}

} // namespace Benchmarks

#endif
