// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_FUSEDIRECTORY_H
#define VEYFM_HOST_FUSEDIRECTORY_H

#include <QString>
#include <QUrl>

namespace VeyFM {
namespace Host {

class MountInfo;

/// The directory below the root of all mounts on which the jobs mount the root of an ftp or sftp
/// URL.
QString fuseDirectory(const QUrl& url, const QString& mountRoot);

/// Whether the path lies on a FUSE mount that does not hold the root of all mounts, too. The mount
/// is not looked at.
bool isOnFuseMount(const QString& path, const QString& mountRoot, const MountInfo& kernel);

} // namespace Host
} // namespace VeyFM

#endif
