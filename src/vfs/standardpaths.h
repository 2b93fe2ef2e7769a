// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_STANDARDPATHS_H
#define VEYFM_STANDARDPATHS_H

#include "veyfmvfs_export.h"

#include <QString>

namespace VeyFM {

/**
 * Where the built-in places lie, and the full names of hosts. May be called from any thread; the
 * system is asked afresh at each call.
 */
class VEYFMVFS_EXPORT StandardPaths
{
public:
    StandardPaths() = delete;

    /// "/".
    static QString fileSystemRootPath();

    /// Directories of the user, as the platform has them, whether they exist or not. Null where
    /// the platform knows none. @{
    static QString trashDirPath();
    static QString desktopDirPath();
    static QString documentsDirPath();
    /// @}

    /**
     * The canonical name of @p host as the resolver has it. A name beyond ASCII is looked up in
     * its ACE form. What is no host name, or does not resolve, comes back unchanged.
     *
     * Blocks for as long as the resolver takes; nothing bounds it.
     */
    static QString toCanonicalHostName(const QString& host);
};

} // namespace VeyFM

#endif
