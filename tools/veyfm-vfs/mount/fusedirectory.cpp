// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/fusedirectory.h"

#include "host/mountinfo.h"
#include "mount/pidfd.h"
#include "report.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <QDir>
#include <QFile>

#include <cerrno>
#include <chrono>
#include <dirent.h>
#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/statfs.h>
#include <sys/wait.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

using Host::KernelMount;
using Host::kernelPath;

namespace {

const QLatin1Char slash('/');

constexpr std::chrono::seconds patience(5);  // With fusermount3.
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

/// Waits for the end of a child, and ends it when it takes too long. Its exit code, or -1.
int waitForChild(pid_t pid, std::chrono::milliseconds patience)
{
    const int handle = openPidfd(pid);
    pollfd poll = {handle, POLLIN, 0};
    const bool ended = ::poll(&poll, 1, int(patience.count())) == 1;
    if (handle >= 0) {
        ::close(handle);
    }
    int status = 0;
    if (!ended) {
        // One that hangs in a dead mount outlives that, and is nobody's any more.
        ::kill(pid, SIGKILL);
        ::waitpid(pid, &status, WNOHANG);
        return -1;
    }
    return ::waitpid(pid, &status, 0) == pid && WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

/// A look at the file system of a path: 0, the error, or -1 for one that does not answer.
int errorOf(const QString& place, std::chrono::seconds patience)
{
    const QByteArray path = QFile::encodeName(place);
    // Not here: a look that hangs can't be taken back, not even by the end of the process.
    const pid_t pid = ::fork();
    if (pid == 0) {
        ::closefrom(STDIN_FILENO);
        struct statfs info;
        ::_exit(::statfs(path.constData(), &info) == 0 ? 0 : errno);
    }
    return pid < 0 ? errno : waitForChild(pid, patience);
}

/// Runs a program with its output thrown away, for at most five seconds. Whether it did well.
bool runQuietly(const char* program, const char* option, const QByteArray& operand)
{
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        ::posix_spawn_file_actions_addopen(&actions, descriptor, "/dev/null", O_RDWR, 0);
    }
    QByteArray words[] = {program, option, operand};
    char* const arguments[] = {words[0].data(), words[1].data(), words[2].data(), nullptr};
    pid_t pid = -1;
    const int error = ::posix_spawnp(&pid, program, &actions, nullptr, arguments, environ);
    ::posix_spawn_file_actions_destroy(&actions);
    return error == 0 && waitForChild(pid, patience) == 0;
}

void unmount(const QString& directory)
{
    const QByteArray path = QFile::encodeName(directory);
    for (const char* option : {"-u", "-uz"}) {
        for (const char* program : {"fusermount3", "fusermount"}) {
            if (runQuietly(program, option, path)) {
                return;
            }
        }
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
    const QString user = url.userName(QUrl::FullyDecoded);
    const QString host = url.host(QUrl::FullyDecoded);
    QString directory = mountRoot() + slash + url.scheme() + slash +
                        (user.isEmpty() ? host : user + QLatin1Char('@') + host);
    const bool isHome = url.scheme() == QLatin1String("sftp") &&
                        url.path(QUrl::FullyDecoded).startsWith(QLatin1String("/~"));
    if (isHome) {
        directory += QLatin1Char('~');
    }
    return directory;
}

bool isOnFuseMount(const QString& path, const MountInfo& kernel)
{
    const auto holds = [](const KernelMount& mount, const QString& directory) {
        return mount.directory == directory || mount.directory == slash ||
               directory.startsWith(mount.directory + slash);
    };
    const QString place = kernelDirectory(path);
    const QVector<KernelMount> mounts = kernel.mounts();
    const KernelMount* holder = nullptr;
    for (const KernelMount& mount : mounts) {
        if (holds(mount, place) &&
            (!holder || mount.directory.size() >= holder->directory.size())) {
            holder = &mount;
        }
    }
    // The home may lie on one itself, as an encrypted one does.
    return holder && holder->isFuse() && !holds(*holder, kernelDirectory(mountRoot()));
}

QString whyDead(const QString& directory, int seconds)
{
    const int error = errorOf(directory, std::chrono::seconds(seconds));
    if (error < 0) {
        return QStringLiteral("it does not answer");
    }
    return error == 0 ? QString() : systemReason(error);
}

bool isMissing(const QString& path, int seconds)
{
    const int error = errorOf(path, std::chrono::seconds(seconds));
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
    return made == AllMounts || errorOf(directory, shortLook) == ENOTCONN;
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
