// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/accountnames.h"

#include <QVarLengthArray>

#include <cerrno>

#include <grp.h>
#include <pwd.h>
#include <unistd.h>

namespace VeyFM {

namespace {

constexpr int stackBufferSize = 1024;
constexpr long groupBufferLimit = 256000;

using NameBuffer = QVarLengthArray<char, stackBufferSize>;

long recommendedBufferSize(int name)
{
    const long size = ::sysconf(name);
    return size == -1 ? stackBufferSize : size;
}

} // namespace

// The two look-ups are not twins: a user's record fits the buffer that the system recommends, so
// there is one call; a group's carries its members and may be of any size, so that one grows.

QString userName(uint userId)
{
    NameBuffer buffer(int(recommendedBufferSize(_SC_GETPW_R_SIZE_MAX)));
    passwd record;
    passwd* found = nullptr;
    ::getpwuid_r(userId, &record, buffer.data(), size_t(buffer.size()), &found);
    return found ? QString::fromLocal8Bit(found->pw_name) : QString();
}

QString groupName(uint groupId)
{
    long size = recommendedBufferSize(_SC_GETGR_R_SIZE_MAX);
    if (size >= groupBufferLimit) {
        return QString();
    }
    NameBuffer buffer(static_cast<int>(size));
    group record;
    group* found = nullptr;
    while (true) {
        // Whether to grow is read from errno and not from the result, so that must start clean.
        errno = 0;
        const int failed =
            ::getgrgid_r(groupId, &record, buffer.data(), size_t(buffer.size()), &found);
        if (failed == 0 || errno != ERANGE || size * 2 >= groupBufferLimit) {
            break;
        }
        size *= 2;
        buffer.resize(int(size));
    }
    return found ? QString::fromLocal8Bit(found->gr_name) : QString();
}

} // namespace VeyFM
