// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTPATHS_H
#define VEYFM_MOUNTPATHS_H

#include "veyfmvfs_export.h"

#include <QString>
#include <QUrl>

namespace VeyFM {

/**
 * How the URL of a network resource divides into the root of its mount and the path below it. A
 * host may be mounted twice: from its root, and from the user's home directory there, which
 * paths that begin with "/~" mean. May be called from any thread.
 */
class VEYFMVFS_EXPORT MountPaths
{
public:
    MountPaths() = delete;

    /**
     * The key of a mount: the URL without its path, and "/~/" behind it for a path that begins
     * with "/~", "/" for any other. User, password, port, query and fragment stay, so each of
     * them makes a key of its own.
     */
    static QString mountRootUrl(const QUrl& url);

    /**
     * The decoded path below the root that mountRootUrl() tells: all of it, without "/~" where it
     * begins so. Empty for "/~" alone. Nothing is normalised.
     */
    static QString mountRootRelativePath(const QUrl& url);
};

} // namespace VeyFM

#endif
