// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_NETWORKMOUNTS_H
#define VEYFM_TOOL_NETWORKMOUNTS_H

#include "core/entry.h"
#include "core/stringmap.h"

#include <QMap>
#include <QString>
#include <QVector>

namespace VeyFM {

namespace Host {
class MountInfo;
}

namespace Tool {

using Host::MountInfo;

/// A directory that a network resource is mounted on, or that the service takes for one.
struct NetworkMount
{
    QString url; ///< Empty where nobody knows; may hold a password.
    QString directory;
    QString state;     ///< "mounted", "stale", "unregistered" or "unknown".
    QString placePath; ///< Empty where it has no place.
};

/// What the service has of mounts.
struct RegisteredMounts
{
    bool isKnown = false;        ///< Whether the service was asked, and answered.
    StringMap directories;       ///< By the URLs of their roots.
    QMap<QString, Entry> places; ///< By the URLs that were mounted.
};

/**
 * All mounts of network resources, by their directories: those that are registered, and FUSE
 * mounts below @p root that are not. A place that lies in a mount belongs to its line, and one
 * that lies in none has a line of its own.
 */
QVector<NetworkMount>
networkMounts(const RegisteredMounts& registered, const MountInfo& kernel, const QString& root);

} // namespace Tool
} // namespace VeyFM

#endif
