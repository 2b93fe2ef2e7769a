// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "locate.h"
#include "verbs/describeeach.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

#include <QJsonArray>
#include <QStringList>

#include <sys/stat.h>

namespace VeyFM {
namespace Tool {

namespace {

/// Whether lstat() has anything to tell.
bool isOnDisk(const Entry& entry)
{
    struct stat status = {};
    const QByteArray local = entry.localPath().toLocal8Bit();
    return !local.isEmpty() && ::lstat(local.constData(), &status) == 0;
}

QStringList flagsOf(const Entry& entry)
{
    const VFS& vfs = *VFS::ptr();
    QStringList flags;
    const auto add = [&flags](bool set, const char* name) {
        if (set) {
            flags.append(QLatin1String(name));
        }
    };
    add(entry.isPlace(), "place");
    add(entry.isDirPlace(), "directory-place");
    add(entry.isPurePlace(), "pure-place");
    add(entry.isStoragePlace(), "storage-place");
    add(entry.isDir(), "directory");
    add(entry.isFile(), "file");
    add(entry.isSymLink(), "link");
    add(entry.isHidden(), "hidden");
    add(entry.isOnDesktop(), "on-desktop");
    add(entry.isPlaceBased(), "place-based");
    add(vfs.isPlaceRelativeEntry(entry), "below-place");
    add(vfs.isStoragePlaceRelativeEntry(entry), "below-storage-place");
    add(vfs.isEntryInNetwork(entry), "network");
    add(!entry.isExists(), "missing");
    return flags;
}

EntryList chainOf(const Entry& entry)
{
    EntryList chain = VFS::ptr()->pathEntryList(entry);
    if (!chain.isEmpty()) {
        chain.removeLast();
    }
    return chain;
}

QString account(const QString& name, uint id)
{
    return name.isEmpty() ? QString::number(id) : QStringLiteral("%1 (%2)").arg(name).arg(id);
}

QJsonObject describe(const Entry& entry)
{
    QJsonObject object = toJson(entry);
    object.insert(QStringLiteral("url"), textOrNull(urlOf(entry)));
    object.insert(QStringLiteral("networkUrl"), textOrNull(networkUrlOf(entry)));
    if (isOnDisk(entry)) {
        object.insert(QStringLiteral("size"), entry.fileSize());
        object.insert(QStringLiteral("modified"), isoTime(entry.lastModified()));
        object.insert(QStringLiteral("statusChanged"), isoTime(entry.lastStatusChange()));
        object.insert(QStringLiteral("owner"), textOrNull(entry.owner()));
        object.insert(QStringLiteral("ownerId"), qint64(entry.ownerId()));
        object.insert(QStringLiteral("group"), textOrNull(entry.group()));
        object.insert(QStringLiteral("groupId"), qint64(entry.groupId()));
    }
    object.insert(QStringLiteral("readable"), entry.isReadable());
    object.insert(QStringLiteral("writable"), entry.isWritable());
    object.insert(QStringLiteral("executable"), entry.isExecutable());
    object.insert(QStringLiteral("linkTarget"), textOrNull(entry.symLinkTarget()));
    QJsonArray chain;
    const EntryList parents = chainOf(entry);
    for (const Entry& parent : parents) {
        chain.append(shownPath(parent));
    }
    object.insert(QStringLiteral("parents"), chain);
    object.insert(QStringLiteral("flags"), QJsonArray::fromStringList(flagsOf(entry)));
    return object;
}

void print(Output& output, const Entry& entry)
{
    const auto line = [&output](const char* label, const QString& value) {
        if (!value.isEmpty()) {
            output.write(QByteArray(label) + ": " + output.label(value, Entry()) + '\n');
        }
    };
    const auto yesNo = [](bool yes) {
        return yes ? QStringLiteral("yes") : QStringLiteral("no");
    };
    output.write("path: " + output.label(shownPath(entry), entry) + '\n');
    line("local path", entry.localPath());
    line("type", QStringLiteral("%1 (%2)").arg(typeName(entry.type())).arg(entry.type()));
    line("URL", urlOf(entry));
    line("network URL", networkUrlOf(entry));
    if (isOnDisk(entry)) {
        line("size", QString::number(entry.fileSize()));
        line("modified", isoTime(entry.lastModified()));
        line("status changed", isoTime(entry.lastStatusChange()));
        line("owner", account(entry.owner(), entry.ownerId()));
        line("group", account(entry.group(), entry.groupId()));
    }
    line("readable", yesNo(entry.isReadable()));
    line("writable", yesNo(entry.isWritable()));
    line("executable", yesNo(entry.isExecutable()));
    line("link target", entry.symLinkTarget());
    QStringList parents;
    const EntryList chain = chainOf(entry);
    for (const Entry& parent : chain) {
        if (parent != VFS::ptr()->rootEntry()) {
            parents.append(shownPath(parent));
        }
    }
    line("parents", parents.join(QLatin1String(" > ")));
    line("flags", flagsOf(entry).join(QLatin1String(", ")));
}

int run(Invocation& invocation)
{
    const auto describeEntry = [](const QString&, const Entry& entry) {
        return describe(entry);
    };
    const auto printEntry = [](Output& output, const QString&, const Entry& entry) {
        print(output, entry);
    };
    return describeEach(invocation, {locate, describeEntry, printEntry});
}

} // namespace

Verb infoVerb()
{
    Verb verb;
    verb.name = QStringLiteral("info");
    verb.operands = QStringLiteral("ENTRY...");
    verb.summary = QStringLiteral("Show all that is known of an entry");
    verb.details = QStringLiteral(
        "Size, times, owner and group are those of a link itself. Control characters in names\n"
        "are escaped, also into a pipe; --json has the names as they are.");
    verb.leastOperands = 1;
    verb.options = {colorOption()};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
