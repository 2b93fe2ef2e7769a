// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_MOUNTFINDER_H
#define VEYFM_HOST_MOUNTFINDER_H

#include <QString>

namespace VeyFM {
namespace Host {

class MountInfo;

/// A mount that the jobs may have made, or why there is none.
struct FoundMount
{
    enum Why {
        Found,
        NotMounted, ///< The path lies below the root of all mounts, but on none of them.
        Elsewhere   ///< It does not.
    };

    Why why = Elsewhere;
    QString directory; ///< As the kernel names it, be it found or not.
};

/**
 * The FUSE mount below @p mountRoot in which an absolute path lies. Links are followed, also those
 * that lead there from elsewhere, up to that mount: nothing in it is looked at.
 */
FoundMount findMount(const QString& path, const QString& mountRoot, const MountInfo& kernel);

} // namespace Host
} // namespace VeyFM

#endif
