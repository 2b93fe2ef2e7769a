// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/systemcalls.h"

#include <csignal>

#include <sys/ptrace.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Benchmarks {

namespace {

// A call that no listing makes, to tell where the work begins and ends.
constexpr long marker = SYS_getpgrp;

bool waitForStop(pid_t child, int* status)
{
    return waitpid(child, status, 0) == child && WIFSTOPPED(*status);
}

} // namespace

std::optional<std::map<long, int>> systemCallsOf(const std::function<void()>& work)
{
    const pid_t child = fork();
    if (child < 0) {
        return std::nullopt;
    }
    if (child == 0) {
        if (ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) != 0) {
            _exit(1);
        }
        raise(SIGSTOP);
        syscall(marker);
        work();
        syscall(marker);
        _exit(0);
    }
    int status = 0;
    if (!waitForStop(child, &status)) {
        return std::nullopt;
    }
    ptrace(PTRACE_SETOPTIONS, child, nullptr, PTRACE_O_TRACESYSGOOD | PTRACE_O_EXITKILL);

    std::map<long, int> calls;
    int markers = 0;
    while (ptrace(PTRACE_SYSCALL, child, nullptr, nullptr) == 0 && waitForStop(child, &status)) {
        __ptrace_syscall_info info{};
        if (WSTOPSIG(status) != (SIGTRAP | 0x80) ||
            ptrace(PTRACE_GET_SYSCALL_INFO, child, sizeof(info), &info) <= 0 ||
            info.op != PTRACE_SYSCALL_INFO_ENTRY) {
            continue;
        }
        if (long(info.entry.nr) == marker) {
            ++markers;
        } else if (markers == 1) {
            ++calls[long(info.entry.nr)];
        }
    }
    return markers == 2 ? std::make_optional(calls) : std::nullopt;
}

} // namespace Benchmarks
