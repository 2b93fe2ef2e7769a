// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mounttrace.h"

#include "host/boundedchild.h"
#include "host/mountinfo.h"

#include <QFile>
#include <QFileInfo>

#include <cerrno>
#include <chrono>

#include <dirent.h>
#include <unistd.h>

namespace VeyFM {
namespace Mount {

namespace {

constexpr std::chrono::seconds patience(1); // A dead mount tells at once.

QString parentOf(const QString& directory)
{
    return directory.left(directory.lastIndexOf(QLatin1Char('/')));
}

/// By the directory above it: what is mounted there is not looked at.
bool isThere(const QString& directory)
{
    const QByteArray name = QFile::encodeName(directory.mid(parentOf(directory).size() + 1));
    DIR* const stream = ::opendir(QFile::encodeName(parentOf(directory)).constData());
    bool isFound = false;
    while (const dirent* const entry = stream && !isFound ? ::readdir(stream) : nullptr) {
        isFound = name == entry->d_name;
    }
    if (stream) {
        ::closedir(stream);
    }
    return isFound;
}

/// FUSE mounts on a directory, the last one on top.
QVector<int> fuseMountsOn(const QString& kernelPath)
{
    QVector<int> ids;
    const QVector<Host::KernelMount> mounts = Host::MountInfo::read().mounts();
    for (const Host::KernelMount& mount : mounts) {
        if (mount.directory == kernelPath && mount.isFuse()) {
            ids.append(mount.id);
        }
    }
    return ids;
}

} // namespace

MountTrace::MountTrace(const QString& directory, const QString& mountRoot)
    : m_directory(directory)
    , m_kernelPath(Host::kernelPath(directory, mountRoot))
    , m_mounts(fuseMountsOn(m_kernelPath))
{
    if (!isThere(directory)) {
        m_missing.append(directory);
    }
    // No mounts of ours, and what is above them may have more than can be read.
    for (const QString& path : {parentOf(directory), mountRoot}) {
        if (!QFileInfo(path).exists() && !QFileInfo(path).isSymLink()) {
            m_missing.append(path);
        }
    }
}

QString MountTrace::directory() const
{
    return m_directory;
}

QVector<int> MountTrace::newMounts() const
{
    QVector<int> ids = fuseMountsOn(m_kernelPath);
    for (const int id : m_mounts) {
        ids.removeAll(id);
    }
    return ids;
}

bool MountTrace::hasNewMount() const
{
    return !newMounts().isEmpty();
}

void MountTrace::remove() const
{
    for (int mounts = newMounts().size(); mounts > 0; --mounts) {
        const int error = Host::lookAt(m_directory, patience);
        const bool isDead = error == ENOTCONN || error == ECONNABORTED;
        if (!isDead) {
            break;
        }
        if (!Host::unmountFuse(m_directory, false)) {
            Host::unmountFuse(m_directory, true);
        }
    }
    for (const QString& directory : m_missing) {
        ::rmdir(QFile::encodeName(directory).constData());
    }
}

} // namespace Mount
} // namespace VeyFM
