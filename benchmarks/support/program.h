// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_PROGRAM_H
#define VEYFM_BENCHMARKS_PROGRAM_H

#include <initializer_list>
#include <string>

namespace Benchmarks {

/// A program that has run to its end.
struct ProgramRun
{
    double cpu = 0;     ///< CPU time from its start to its end, in nanoseconds.
    double elapsed = 0; ///< The time that a user waits for it, in nanoseconds.
    std::string output;
};

/**
 * Runs a program with the environment of this process. One that fails ends this process: there is
 * nothing to measure then.
 */
ProgramRun runProgram(std::initializer_list<std::string> command);

} // namespace Benchmarks

#endif
