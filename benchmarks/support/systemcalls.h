// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_SYSTEMCALLS_H
#define VEYFM_BENCHMARKS_SYSTEMCALLS_H

#include <functional>
#include <map>
#include <optional>

namespace Benchmarks {

/**
 * Runs @p work in a traced copy of this process and counts its system calls by number. Nothing
 * where tracing is not allowed, as in many containers.
 */
std::optional<std::map<long, int>> systemCallsOf(const std::function<void()>& work);

} // namespace Benchmarks

#endif
