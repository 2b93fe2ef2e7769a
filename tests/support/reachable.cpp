// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/reachable.h"

#include <QFile>

#include <cerrno>
#include <dirent.h>
#include <fcntl.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

bool bind(const QByteArray& source, const QByteArray& target)
{
    return ::mount(source.constData(), target.constData(), nullptr, MS_BIND | MS_REC, nullptr) == 0;
}

// An entry of the folder behind a descriptor, at another place.
bool show(int folder, const char* name, const QByteArray& target)
{
    const QByteArray source = "/proc/self/fd/" + QByteArray::number(folder) + '/' + name;
    struct stat info = {};
    if (::fstatat(folder, name, &info, AT_SYMLINK_NOFOLLOW) != 0) {
        return errno == ENOENT; // Others may be at work in there.
    }
    if (S_ISLNK(info.st_mode)) {
        QByteArray link(int(info.st_size) + 1, '\0');
        const auto length = ::readlinkat(folder, name, link.data(), size_t(link.size()));
        return length >= 0 &&
               ::symlink(link.left(int(length)).constData(), target.constData()) == 0;
    }
    if (S_ISDIR(info.st_mode)) {
        return ::mkdir(target.constData(), 0755) == 0 && bind(source, target);
    }
    const int fd = ::open(target.constData(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0644);
    ::close(fd);
    return fd >= 0 && bind(source, target);
}

bool openFolder(const QByteArray& path)
{
    DIR* const closed = ::opendir(path.constData());
    if (!closed || ::mount("tmpfs", path.constData(), "tmpfs", 0, "mode=0755") != 0) {
        return false;
    }
    bool done = true;
    while (const dirent* const found = ::readdir(closed)) {
        const QByteArray name = found->d_name;
        if (name != "." && name != "..") {
            done = show(::dirfd(closed), found->d_name, path + '/' + name) && done;
        }
    }
    ::closedir(closed);
    return done;
}

} // namespace

bool makeReachable(const QByteArray& path)
{
    for (int slash = path.indexOf('/', 1); slash > 0; slash = path.indexOf('/', slash + 1)) {
        const QByteArray folder = path.left(slash);
        struct stat info = {};
        if (::stat(folder.constData(), &info) != 0 ||
            ((info.st_mode & S_IXOTH) == 0 && !openFolder(folder))) {
            return false;
        }
    }
    return true;
}
