// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_PIDFD_H
#define VEYFM_HOST_PIDFD_H

#include <sys/syscall.h>
#include <sys/types.h>
#include <unistd.h>

namespace VeyFM {
namespace Host {

// By number: glibc 2.36 declares pidfd_open() without C linkage.

/// A handle of a process that no other gets, to be closed; or -1. Readable when the process ends.
inline int openPidfd(pid_t pid)
{
    return int(::syscall(SYS_pidfd_open, pid, 0));
}

/// Whether the process was there to get the signal.
inline bool sendSignal(int pidfd, int number)
{
    return ::syscall(SYS_pidfd_send_signal, pidfd, number, nullptr, 0) == 0;
}

} // namespace Host
} // namespace VeyFM

#endif
