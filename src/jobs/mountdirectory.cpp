// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountdirectory_p.h"

#include "platform/uniquefd.h"

#include <QByteArray>
#include <QFile>
#include <QList>

#include <cerrno>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace VeyFM {

namespace {

using VeySu::UniqueFd;

constexpr mode_t forUserAlone = 0700;

// From one directory to the next by descriptors, so that what is looked at is what was made. They
// can be had of directories that can't be read, such as one that the umask took all rights of.
UniqueFd openPath(int parent, const QByteArray& name, int flags)
{
    return UniqueFd(::openat(parent, name.constData(), O_PATH | O_CLOEXEC | flags));
}

// The umask belongs to the whole process, and is not ours to change.
void giveBackWhatTheUmaskTook(int directory)
{
    struct stat info = {};
    if (::fstat(directory, &info) == 0 && (info.st_mode & 0777) != forUserAlone) {
        // A descriptor of this kind has no other road to it.
        const QByteArray path = "/proc/self/fd/" + QByteArray::number(directory);
        ::chmod(path.constData(), forUserAlone);
    }
}

UniqueFd openOrMake(int parent, const QByteArray& name, int flags)
{
    UniqueFd found = openPath(parent, name, flags);
    if (found.isValid() || errno != ENOENT ||
        ::mkdirat(parent, name.constData(), forUserAlone) != 0) {
        return found;
    }
    UniqueFd made = openPath(parent, name, O_NOFOLLOW | O_DIRECTORY);
    if (made.isValid()) {
        giveBackWhatTheUmaskTook(made.get());
    }
    return made;
}

// Without asking the server of a mount, which may have gone, for more than it needs to.
bool isSameFileSystem(int one, int other)
{
    struct statx first = {};
    struct statx second = {};
    const int flags = AT_EMPTY_PATH | AT_STATX_DONT_SYNC;
    return ::statx(one, "", flags, 0, &first) == 0 && ::statx(other, "", flags, 0, &second) == 0 &&
           first.stx_dev_major == second.stx_dev_major &&
           first.stx_dev_minor == second.stx_dev_minor;
}

bool isFitForMount(int parent, int file)
{
    struct stat info = {};
    if (!isSameFileSystem(parent, file)) {
        return true;
    }
    return ::fstat(file, &info) == 0 && !S_ISLNK(info.st_mode) &&
           (!S_ISDIR(info.st_mode) || info.st_uid == ::geteuid());
}

} // namespace

bool makeMountDirectory(const QString& path)
{
    QList<QByteArray> names = QFile::encodeName(path).split('/');
    const QByteArray last = names.takeLast();
    UniqueFd parent =
        openPath(AT_FDCWD, path.startsWith(QLatin1Char('/')) ? "/" : ".", O_DIRECTORY);
    for (const QByteArray& name : names) {
        if (!name.isEmpty() && parent.isValid()) {
            parent = openOrMake(parent.get(), name, O_DIRECTORY);
        }
    }
    if (!parent.isValid()) {
        return true;
    }
    const UniqueFd made = openOrMake(parent.get(), last, O_NOFOLLOW);
    return !made.isValid() || isFitForMount(parent.get(), made.get());
}

} // namespace VeyFM
