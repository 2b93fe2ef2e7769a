// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entrylist.h"

#include "core/copied.h"
#include "core/pathorder.h"
#include "core/pathset.h"

#include <QDBusArgument>

#include <algorithm>

namespace VeyFM {

namespace {

template <typename Predicate>
bool anyOf(const EntryList& given, Predicate predicate)
{
    const EntryList entries = copied(given);
    return std::any_of(entries.begin(), entries.end(), predicate);
}

template <typename Predicate>
EntryList filtered(const EntryList& entries, Predicate predicate)
{
    EntryList result;
    std::copy_if(entries.begin(), entries.end(), std::back_inserter(result), predicate);
    return result;
}

auto sharesBitWith(int mask)
{
    return [mask](const Entry& entry) {
        return (entry.type() & mask) != 0;
    };
}

} // namespace

EntryList::EntryList() = default;
EntryList::EntryList(const EntryList& other) = default;
EntryList::EntryList(EntryList&& other) noexcept = default;
EntryList::~EntryList() = default;
EntryList& EntryList::operator=(const EntryList& other) = default;
EntryList& EntryList::operator=(EntryList&& other) noexcept = default;

EntryList::EntryList(const QList<Entry>& entries)
    : QList<Entry>(entries)
{
}

EntryList::EntryList(const Entry& entry)
{
    append(entry);
}

bool EntryList::hasPlace() const
{
    return anyOf(*this, [](const Entry& entry) { return entry.isPlace(); });
}

bool EntryList::hasPurePlace() const
{
    return anyOf(*this, [](const Entry& entry) { return entry.isPurePlace(); });
}

bool EntryList::hasDir() const
{
    return anyOf(*this, [](const Entry& entry) { return entry.isDir(); });
}

bool EntryList::hasFile() const
{
    return anyOf(*this, [](const Entry& entry) { return entry.isFile(); });
}

bool EntryList::hasChildOfType(int mask) const
{
    // A bit test on plain numbers, and meant as one: callers compare type() for an exact kind.
    return anyOf(*this, sharesBitWith(mask));
}

bool EntryList::containsSimilar(const Entry& entry) const
{
    return anyOf(
        *this, [entry = copied(entry)](const Entry& element) { return element.isSimilar(entry); });
}

EntryList EntryList::files() const
{
    return filtered(*this, [](const Entry& entry) { return entry.isFile(); });
}

EntryList EntryList::dirs() const
{
    return filtered(*this, [](const Entry& entry) { return entry.isDir(); });
}

EntryList EntryList::places() const
{
    return filtered(*this, [](const Entry& entry) { return entry.isPlace(); });
}

EntryList EntryList::sublistOfType(int mask) const
{
    return filtered(*this, sharesBitWith(mask));
}

QStringList EntryList::paths() const
{
    QStringList result;
    result.reserve(size());
    for (const Entry& entry : *this) {
        result.append(entry.path());
    }
    return result;
}

QStringList EntryList::localPaths() const
{
    const EntryList entries = copied(*this);
    QStringList result;
    result.reserve(entries.size());
    for (const Entry& entry : entries) {
        result.append(entry.localPath());
    }
    return result;
}

QStringList EntryList::localPathsWithScheme() const
{
    const EntryList entries = copied(*this);
    QStringList result;
    for (const Entry& entry : entries) {
        const QString path = entry.localPathWithScheme();
        if (!path.isEmpty()) {
            result.append(path);
        }
    }
    return result;
}

EntryList EntryList::mergeWith(const EntryList& other)
{
    // A copy, since the list may be merged with itself.
    const EntryList added = other;
    PathSet known(size() + added.size());
    for (const Entry& entry : qAsConst(*this)) {
        known.insert(entry.path());
    }
    for (const Entry& entry : added) {
        if (known.insert(entry.path())) {
            append(entry);
        }
    }
    return *this;
}

void EntryList::sort(bool ascending)
{
    std::vector<QStringView> paths;
    paths.reserve(size_t(size()));
    for (const Entry& entry : qAsConst(*this)) {
        // The view outlives the returned copy: the element keeps the text alive.
        paths.push_back(QStringView(entry.path()));
    }
    std::vector<int> order = stableOrder(paths, ascending);

    // Each position takes the element that belongs there, cycle by cycle: the list swaps
    // pointers, and no element is copied.
    for (int start = 0; start < size(); ++start) {
        int position = start;
        while (order[size_t(position)] != start) {
            const int source = order[size_t(position)];
            swapItemsAt(position, source);
            order[size_t(position)] = position;
            position = source;
        }
        order[size_t(position)] = position;
    }
}

QDBusArgument& operator<<(QDBusArgument& argument, const EntryList& entries)
{
    argument.beginArray(qMetaTypeId<Entry>());
    for (const Entry& entry : entries) {
        argument << entry;
    }
    argument.endArray();
    return argument;
}

const QDBusArgument& operator>>(const QDBusArgument& argument, EntryList& entries)
{
    argument.beginArray();
    entries.clear();
    while (!argument.atEnd()) {
        Entry entry;
        argument >> entry;
        entries.append(entry);
    }
    argument.endArray();
    return argument;
}

} // namespace VeyFM
