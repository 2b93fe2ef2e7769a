// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_PRIVATEMOUNTS_H
#define VEYFM_TESTS_PRIVATEMOUNTS_H

#include <QString>

#include <cerrno>
#include <cstring>

#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

/// Mounts of this thread and of the processes that it starts are their own from now on, and go
/// with them. Why that is not possible here, or empty.
inline QString keepMountsPrivate()
{
    if (::access("/dev/fuse", R_OK | W_OK) == 0 && ::unshare(CLONE_NEWNS) == 0 &&
        ::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0) {
        return QString();
    }
    return QStringLiteral("no mounts here: ") + QString::fromLocal8Bit(std::strerror(errno));
}

#endif
