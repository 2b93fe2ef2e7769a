// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "listing.h"

#include "describe.h"
#include "report.h"

#include <algorithm>

#include <dirent.h>
#include <sys/stat.h>

namespace VeyFM {
namespace Tool {

namespace {

void fillFacts(Item& item)
{
    struct stat status = {};
    const QByteArray local = item.entry.localPath().toLocal8Bit();
    if (local.isEmpty() || ::lstat(local.constData(), &status) != 0) {
        return;
    }
    item.onDisk = true;
    item.size = status.st_size;
    item.modified = qint64(status.st_mtim.tv_sec) * 1000000000 + status.st_mtim.tv_nsec;
}

void sortByFacts(QVector<Item>::iterator begin, QVector<Item>::iterator end, SortBy sortBy)
{
    std::stable_sort(begin, end, [sortBy](const Item& left, const Item& right) {
        return sortBy == SortBy::Size ? left.size > right.size : left.modified > right.modified;
    });
}

bool isText(const QByteArray& name)
{
    const bool isAscii =
        std::all_of(name.begin(), name.end(), [](char c) { return uchar(c) < 0x80; });
    // Behind a slash, since a byte order mark at the head of a text is no part of it.
    const QByteArray path = '/' + name;
    return isAscii || QString::fromLocal8Bit(path).toLocal8Bit() == path;
}

} // namespace

QVector<Item> listing(const Entry& entry, const ListingOptions& options)
{
    EntryList places;
    EntryList files;
    const EntryList children = VFS::ptr()->childs(entry, options.filters);
    for (const Entry& child : children) {
        if (child.isPlace()) {
            places.append(child);
        } else if (options.hidden || !child.isHidden()) {
            files.append(child);
        }
    }
    const bool byFacts = options.sortBy == SortBy::Size || options.sortBy == SortBy::Time;
    if (options.sortBy != SortBy::Nothing) {
        files.sort(byFacts || !options.reverse);
    }

    QVector<Item> items;
    items.reserve(children.size());
    for (const Entry& place : qAsConst(places)) {
        items.append({place});
    }
    for (const Entry& file : qAsConst(files)) {
        items.append({file});
    }
    if (options.facts || byFacts) {
        std::for_each(items.begin(), items.end(), fillFacts);
    }
    if (byFacts) {
        sortByFacts(items.begin() + places.size(), items.end(), options.sortBy);
    }
    if (options.reverse && options.sortBy != SortBy::Name) {
        std::reverse(items.begin() + places.size(), items.end());
    }
    return items;
}

bool reportLeftOut(const Entry& entry, const ListingOptions& options)
{
    const QByteArray local = entry.localPath().toLocal8Bit();
    if (local.isEmpty() || local.contains('\0') || !hasDirectory(entry)) {
        return false;
    }
    bool wereAny = false;
    DIR* const stream = ::opendir(local.constData());
    while (const dirent* record = stream ? ::readdir(stream) : nullptr) {
        const QByteArray name = record->d_name;
        // Links of such names are listed.
        const bool isShown = record->d_type == DT_LNK || isText(name);
        if (!isShown && (options.hidden || !name.startsWith('.'))) {
            reportBytes(
                shownPath(entry) + QLatin1Char('/'), name,
                QStringLiteral("left out, not a valid name in the encoding of the locale"));
            wereAny = true;
        }
    }
    if (stream) {
        ::closedir(stream);
    }
    return wereAny;
}

} // namespace Tool
} // namespace VeyFM
