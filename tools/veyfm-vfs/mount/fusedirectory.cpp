// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/fusedirectory.h"

#include "host/boundedchild.h"
#include "host/fusedirectory.h"
#include "host/mountinfo.h"
#include "report.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <QDir>
#include <QFile>

#include <cerrno>
#include <chrono>
#include <dirent.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

using Host::KernelMount;
using Host::kernelPath;

namespace {

const QLatin1Char slash('/');

constexpr std::chrono::seconds shortLook(1); // A dead mount tells at once.

QString mountRoot()
{
    return VFS::ptr()->settings()->mountRootPath();
}

QString kernelDirectory(const QString& directory)
{
    return kernelPath(directory, mountRoot());
}

/// The names in a directory. They are not looked at, since a dead mount would not answer.
QStringList namesIn(const QString& directory)
{
    QStringList names;
    DIR* const stream = ::opendir(QFile::encodeName(directory).constData());
    if (!stream) {
        return names;
    }
    while (const dirent* const entry = ::readdir(stream)) {
        names.append(QFile::decodeName(entry->d_name));
    }
    ::closedir(stream);
    return names;
}

void unmount(const QString& directory)
{
    if (!Host::unmountFuse(directory, false)) {
        Host::unmountFuse(directory, true);
    }
}

QVector<int> mountIds()
{
    QVector<int> ids;
    const QVector<KernelMount> mounts = MountInfo::read().mounts();
    for (const KernelMount& mount : mounts) {
        ids.append(mount.id);
    }
    return ids;
}

} // namespace

QString fuseDirectory(const QUrl& url)
{
    return Host::fuseDirectory(url, mountRoot());
}

bool isOnFuseMount(const QString& path, const MountInfo& kernel)
{
    return Host::isOnFuseMount(path, mountRoot(), kernel);
}

QString whyDead(const QString& directory, int seconds)
{
    const int error = Host::lookAt(directory, std::chrono::seconds(seconds));
    if (error < 0) {
        return QStringLiteral("it does not answer");
    }
    return error == 0 ? QString() : systemReason(error);
}

bool isMissing(const QString& path, int seconds)
{
    const int error = Host::lookAt(path, std::chrono::seconds(seconds));
    return error == ENOENT || error == ENOTDIR;
}

FuseTrace::FuseTrace(const QString& scheme)
    : m_parent(mountRoot() + slash + scheme)
    , m_names(namesIn(m_parent))
    , m_others(mountIds())
{
    for (const QString& directory : {m_parent, mountRoot()}) {
        if (!QDir(directory).exists()) {
            m_parents.append(directory);
        }
    }
}

void FuseTrace::pause()
{
    const QVector<int> now = mountIds();
    const std::lock_guard<std::mutex> lock(m_lock);
    m_atPause = now;
    m_isPaused = true;
}

void FuseTrace::resume()
{
    const QVector<int> now = mountIds();
    const std::lock_guard<std::mutex> lock(m_lock);
    for (const int id : now) {
        if (!m_atPause.contains(id)) {
            m_others.append(id);
        }
    }
    m_isPaused = false;
}

bool FuseTrace::isOfOthers(int mountId) const
{
    const std::lock_guard<std::mutex> lock(m_lock);
    return m_others.contains(mountId) || (m_isPaused && !m_atPause.contains(mountId));
}

bool FuseTrace::isMadeHere(const QString& directory, Made made) const
{
    if (made == NoMounts) {
        return false;
    }
    const QString path = kernelDirectory(directory);
    const KernelMount* top = nullptr;
    const QVector<KernelMount> mounts = MountInfo::read().mounts();
    for (const KernelMount& mount : mounts) {
        if (mount.directory == path) {
            top = &mount;
        }
    }
    if (!top || !top->isFuse() || isOfOthers(top->id)) {
        return false;
    }
    return made == AllMounts || Host::lookAt(directory, shortLook) == ENOTCONN;
}

void FuseTrace::remove(const QStringList& directories, Made made) const
{
    for (const QString& directory : directories) {
        if (isMadeHere(directory, made)) {
            unmount(directory);
        }
        if (!m_names.contains(directory.mid(m_parent.size() + 1))) {
            ::rmdir(QFile::encodeName(directory).constData());
        }
    }
    for (const QString& directory : m_parents) {
        ::rmdir(QFile::encodeName(directory).constData());
    }
}

} // namespace Tool
} // namespace VeyFM
