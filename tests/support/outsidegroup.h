// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_OUTSIDEGROUP_H
#define VEYFM_TESTS_OUTSIDEGROUP_H

#include <grp.h>
#include <unistd.h>

/// For rerunPasses(): the tests of a user who is not in the group "fuse".
constexpr const char* outsideGroupArgument = "outside-group";

/// Goes on as a user without groups, where the test runs as root. Before anything has threads;
/// whether it worked shows in Fuse::isInFuseGroup().
inline void leaveGroups()
{
    constexpr unsigned nobody = 65534;
    if (geteuid() == 0 &&
        (setgroups(0, nullptr) != 0 || setgid(nobody) != 0 || setuid(nobody) != 0)) {
        _exit(1);
    }
}

#endif
