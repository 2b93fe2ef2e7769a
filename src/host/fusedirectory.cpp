// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/fusedirectory.h"

#include "host/mountinfo.h"

namespace VeyFM {
namespace Host {

namespace {

const QLatin1Char slash('/');

bool holds(const KernelMount& mount, const QString& directory)
{
    return mount.directory == directory || mount.directory == slash ||
           directory.startsWith(mount.directory + slash);
}

} // namespace

QString fuseDirectory(const QUrl& url, const QString& mountRoot)
{
    const QString user = url.userName(QUrl::FullyDecoded);
    const QString host = url.host(QUrl::FullyDecoded);
    QString directory = mountRoot + slash + url.scheme() + slash +
                        (user.isEmpty() ? host : user + QLatin1Char('@') + host);
    const bool isHome = url.scheme() == QLatin1String("sftp") &&
                        url.path(QUrl::FullyDecoded).startsWith(QLatin1String("/~"));
    if (isHome) {
        directory += QLatin1Char('~');
    }
    return directory;
}

bool isOnFuseMount(const QString& path, const QString& mountRoot, const MountInfo& kernel)
{
    const QString place = kernelPath(path, mountRoot);
    const QVector<KernelMount> mounts = kernel.mounts();
    const KernelMount* holder = nullptr;
    for (const KernelMount& mount : mounts) {
        if (holds(mount, place) &&
            (!holder || mount.directory.size() >= holder->directory.size())) {
            holder = &mount;
        }
    }
    // The home may lie on one itself, as an encrypted one does.
    return holder && holder->isFuse() && !holds(*holder, kernelPath(mountRoot, mountRoot));
}

} // namespace Host
} // namespace VeyFM
