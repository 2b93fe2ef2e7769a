// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "listing.h"

#include "describe.h"
#include "report.h"

#include <algorithm>

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

} // namespace

Listing listing(const Entry& entry, const ListingOptions& options)
{
    EntryList places;
    EntryList files;
    Listing result;
    const EntryList children =
        VFS::ptr()->childsAndLeftOut(entry, options.filters, &result.leftOut);
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

    if (!options.hidden) {
        const auto isHidden = [](const QByteArray& name) {
            return name.startsWith('.');
        };
        QByteArrayList& names = result.leftOut;
        names.erase(std::remove_if(names.begin(), names.end(), isHidden), names.end());
    }

    QVector<Item>& items = result.items;
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
    return result;
}

bool reportLeftOut(const Entry& entry, const QByteArrayList& names)
{
    for (const QByteArray& name : names) {
        reportBytes(
            shownPath(entry) + QLatin1Char('/'), name,
            QStringLiteral("left out, not a valid name in the encoding of the locale"));
    }
    return !names.isEmpty();
}

} // namespace Tool
} // namespace VeyFM
