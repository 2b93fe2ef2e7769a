// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_OPTIONS_H
#define VEYFM_BENCHMARKS_OPTIONS_H

#include <QString>

namespace Benchmarks {

/// How much a program measures. A smoke run only proves that everything still works.
struct Options
{
    bool smoke = false;

    /// A number of things to work on.
    int size(int full) const
    {
        return smoke ? std::max(10, full / 1000) : full;
    }

    /// A number of interleaved repetitions.
    int rounds(int full) const
    {
        return smoke ? 1 : full;
    }
};

/// Each program defines this one: it registers its rows with Google Benchmark.
void registerRows(const Options& options);

/// A fresh directory on the disk that goes away with the program. It lies below TMPDIR.
QString scratchDirectory();

} // namespace Benchmarks

#endif
