// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountlock.h"

#include "host/mountinfo.h"

#include <QCryptographicHash>
#include <QFile>

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

namespace VeyFM {
namespace Host {

namespace {

QString reason(int error)
{
    return QString::fromLocal8Bit(std::strerror(error));
}

/// Opens a directory that belongs to this user alone, and makes it where it is missing. Takes the
/// one above, and closes it. -1 and errno on failure.
int enterOwn(int parent, const char* name)
{
    int child = -1;
    int error = 0;
    if (::mkdirat(parent, name, 0700) != 0 && errno != EEXIST) {
        error = errno;
    } else {
        child = ::openat(parent, name, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
        error = errno;
    }
    ::close(parent);
    struct stat status = {};
    if (child >= 0 && (::fstat(child, &status) != 0 || status.st_uid != ::geteuid())) {
        ::close(child);
        child = -1;
        error = EPERM;
    }
    errno = error;
    return child;
}

int openDirectory(const QByteArray& path)
{
    return ::open(path.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
}

/// The directory of the locks, and @p path for what has to be said of it.
int openLocks(const QString& mountRoot, QString* path)
{
    const QByteArray runtime = qgetenv("XDG_RUNTIME_DIR");
    if (runtime.startsWith('/')) {
        *path = QFile::decodeName(runtime) + QStringLiteral("/veyfm-vfs/locks");
        int directory = openDirectory(runtime);
        for (const char* name : {"veyfm-vfs", "locks"}) {
            directory = directory < 0 ? -1 : enterOwn(directory, name);
        }
        return directory;
    }
    *path = mountRoot + QStringLiteral("/.locks");
    const QByteArray root = QFile::encodeName(mountRoot);
    ::mkdir(root.constData(), 0777); // As the jobs make it; that it failed is seen next.
    const int directory = openDirectory(root);
    return directory < 0 ? -1 : enterOwn(directory, ".locks");
}

/// The same for all programs, whatever links they come by.
QByteArray fileName(const QString& directory, const QString& mountRoot)
{
    return QCryptographicHash::hash(
               QFile::encodeName(kernelPath(directory, mountRoot)), QCryptographicHash::Sha256)
        .toHex();
}

} // namespace

MountLock::~MountLock()
{
    close();
}

bool MountLock::open(const QString& directory, const QString& mountRoot)
{
    close();
    QString path;
    const int locks = openLocks(mountRoot, &path);
    int error = errno;
    if (locks >= 0) {
        m_file = ::openat(
            locks, fileName(directory, mountRoot).constData(),
            O_RDWR | O_CREAT | O_NOFOLLOW | O_CLOEXEC, 0600);
        error = errno;
        ::close(locks);
    }
    m_why = isOpen() ? QString() : QStringLiteral("%1: %2").arg(path, reason(error));
    return isOpen();
}

bool MountLock::tryLock()
{
    int result = -1;
    do {
        result = ::flock(m_file, LOCK_EX | LOCK_NB);
    } while (result != 0 && errno == EINTR);
    return result == 0;
}

void MountLock::close()
{
    if (m_file >= 0) {
        ::close(m_file);
    }
    m_file = -1;
}

bool MountLock::isOpen() const
{
    return m_file >= 0;
}

QString MountLock::why() const
{
    return m_why;
}

} // namespace Host
} // namespace VeyFM
