// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountfinder.h"

#include "host/mountinfo.h"

#include <QDir>
#include <QFile>
#include <QStringList>

#include <algorithm>
#include <climits>

#include <unistd.h>

namespace VeyFM {
namespace Host {

namespace {

const QLatin1Char slash('/');

constexpr int mostLinks = 40; // As the kernel has it.

/// The target of a link; empty for what is none.
QString linkTarget(const QString& path)
{
    QByteArray target(PATH_MAX, '\0');
    const ssize_t size =
        ::readlink(QFile::encodeName(path).constData(), target.data(), size_t(target.size()));
    return size <= 0 ? QString() : QFile::decodeName(target.left(int(size)));
}

/// Whether the directory is one that findMount() may find.
bool isMount(const QString& directory, const QString& root, const MountInfo& kernel)
{
    const QVector<KernelMount> mounts = kernel.mounts();
    for (const KernelMount& mount : mounts) {
        if (mount.directory == directory && mount.isFuse() && directory.startsWith(root + slash)) {
            return true;
        }
    }
    return false;
}

/// The path without links, down to the first mount on it.
QString physicalPath(const QString& path, const QString& root, const MountInfo& kernel)
{
    QStringList rest = path.split(slash, Qt::SkipEmptyParts);
    QString result;
    int links = 0;
    while (!rest.isEmpty()) {
        const QString name = rest.takeFirst();
        if (name == QLatin1String(".")) {
            continue;
        }
        if (name == QLatin1String("..")) {
            result.truncate(std::max(result.lastIndexOf(slash), 0));
            continue;
        }
        const QString next = result + slash + name;
        if (isMount(next, root, kernel)) {
            return QDir::cleanPath(next + slash + rest.join(slash));
        }
        const QString target = linkTarget(next);
        if (target.isEmpty() || ++links > mostLinks) {
            result = next;
            continue;
        }
        if (target.startsWith(slash)) {
            result.clear();
        }
        rest = target.split(slash, Qt::SkipEmptyParts) + rest;
    }
    return result.isEmpty() ? QString(slash) : result;
}

} // namespace

FoundMount findMount(const QString& path, const QString& mountRoot, const MountInfo& kernel)
{
    const QString root = kernelPath(mountRoot, mountRoot);
    const QString physical = physicalPath(path, root, kernel);
    if (!physical.startsWith(root + slash)) {
        return {FoundMount::Elsewhere, physical};
    }
    for (QString directory = physical; directory.size() > root.size();
         directory.truncate(directory.lastIndexOf(slash))) {
        if (isMount(directory, root, kernel)) {
            return {FoundMount::Found, directory};
        }
    }
    return {FoundMount::NotMounted, physical};
}

} // namespace Host
} // namespace VeyFM
