// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FUSE_H
#define VEYFM_FUSE_H

#include "veyfmvfs_export.h"

namespace VeyFM {

/// What the system lets this process do with FUSE. May be called from any thread.
class VEYFMVFS_EXPORT Fuse
{
public:
    Fuse() = delete;

    /**
     * Whether the process runs for root, by its real user, or has the group "fuse" as its
     * effective or a supplementary group. The system is asked afresh at each call, and a group
     * that can't be looked up reads as false.
     */
    static bool isInFuseGroup();
};

} // namespace VeyFM

#endif
