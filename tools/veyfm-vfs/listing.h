// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_LISTING_H
#define VEYFM_TOOL_LISTING_H

#include "vfs/vfs.h"

#include <QVector>

namespace VeyFM {
namespace Tool {

/// A child and, where they were asked for, the facts that lstat() tells of it.
struct Item
{
    Entry entry;
    bool onDisk = false;
    qint64 size = 0;
    qint64 modified = 0; ///< Nanoseconds, so that files of one moment keep their order.
};

enum class SortBy { Nothing, Name, Size, Time };

struct ListingOptions
{
    bool hidden = false;
    bool facts = false; ///< Fill in what lstat() tells.
    bool reverse = false;
    SortBy sortBy = SortBy::Name;
    VFS::EntryChildFilters filters = {};
};

struct Listing
{
    QVector<Item> items;
    QByteArrayList leftOut; ///< Names that the encoding of the locale has no text for.
};

/**
 * The children of an entry: first the places, which keep the order of the tree, then what the
 * directory holds, sorted. Sizes and times sort the greatest and newest first, as ls does.
 */
Listing listing(const Entry& entry, const ListingOptions& options);

/// Reports the names that a listing of the entry had to leave out. Whether there were any.
bool reportLeftOut(const Entry& entry, const QByteArrayList& names);

} // namespace Tool
} // namespace VeyFM

#endif
