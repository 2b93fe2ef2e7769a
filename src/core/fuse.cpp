// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/fuse.h"

#include <QVarLengthArray>

#include <cstring>
#include <grp.h>
#include <unistd.h>

namespace VeyFM {

namespace {

enum class GroupLookup { IsFuse, IsOther, Failed };

GroupLookup lookUpGroup(gid_t gid)
{
    char buffer[4096];
    group record;
    group* found = nullptr;
    if (getgrgid_r(gid, &record, buffer, sizeof(buffer), &found) != 0) {
        return GroupLookup::Failed;
    }
    // A group without a name is not a failure.
    const bool isFuse = found && std::strcmp(found->gr_name, "fuse") == 0;
    return isFuse ? GroupLookup::IsFuse : GroupLookup::IsOther;
}

} // namespace

bool Fuse::isInFuseGroup()
{
    if (getuid() == 0) {
        return true;
    }

    const int count = qMax(0, getgroups(0, nullptr));
    QVarLengthArray<gid_t, 256> groups(count + 1);
    // The list may have changed in between, and a count of 0 only asks for its length.
    const int filled = qMin(count, getgroups(count, groups.data()));

    if (lookUpGroup(getegid()) == GroupLookup::IsFuse) {
        return true;
    }
    for (int i = 0; i < filled; ++i) {
        const GroupLookup result = lookUpGroup(groups.at(i));
        // One failure ends the walk, though "fuse" may stand behind it.
        if (result != GroupLookup::IsOther) {
            return result == GroupLookup::IsFuse;
        }
    }
    return false;
}

} // namespace VeyFM
