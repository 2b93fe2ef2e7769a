// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_ENTRYLIST_H
#define VEYFM_ENTRYLIST_H

#include "core/entry.h"

#include <QList>
#include <QStringList>

namespace VeyFM {

/**
 * A list of entries, in the order of the list, duplicates allowed. The result of VFS::childs(),
 * the argument of the watcher notifications, and the form in which entries cross the bus.
 *
 * Queries are linear, and those that mention Entry::localPath() compute it for each element that
 * they pass.
 */
class VEYFMVFS_EXPORT EntryList : public QList<Entry>
{
public:
    EntryList();
    /// The same elements, shared until one of both changes.
    EntryList(const QList<Entry>& entries);
    /// A list of one element, a null entry too.
    EntryList(const Entry& entry);
    /// Copies share their elements until one of them changes; what was moved from is empty. @{
    EntryList(const EntryList& other);
    EntryList(EntryList&& other) noexcept;
    EntryList& operator=(const EntryList& other);
    EntryList& operator=(EntryList&& other) noexcept;
    /// @}
    virtual ~EntryList();

    bool hasPlace() const;     ///< Any element with Entry::isPlace().
    bool hasPurePlace() const; ///< Any element with Entry::isPurePlace().
    bool hasDir() const;       ///< Any element with Entry::isDir().
    bool hasFile() const;      ///< Any element with Entry::isFile().

    /**
     * Any element whose type shares a bit with @p mask. Entry types are plain numbers, not
     * flags, so this does not find one exact type: 1000 also finds 2000 and 10001.
     */
    bool hasChildOfType(int mask) const;

    /// Any element that Entry::isSimilar() to @p entry.
    bool containsSimilar(const Entry& entry) const;

    EntryList files() const;  ///< The elements with Entry::isFile(), in order.
    EntryList dirs() const;   ///< The elements with Entry::isDir(), in order.
    EntryList places() const; ///< The elements with Entry::isPlace(), in order.

    /// The elements whose type shares a bit with @p mask, with the warning of hasChildOfType().
    EntryList sublistOfType(int mask) const;

    QStringList paths() const;      ///< path() of every element, empty ones too.
    QStringList localPaths() const; ///< localPath() of every element, empty ones too.

    /// localPathWithScheme() of the elements that have one: the only one of the three that
    /// leaves out empty texts.
    QStringList localPathsWithScheme() const;

    /**
     * Appends those elements of @p other whose path is not in this list yet, and returns a copy
     * of the result. What was here first is kept, whatever type or local path the other one has;
     * duplicates within @p other collapse to the first, duplicates already here stay.
     */
    EntryList mergeWith(const EntryList& other);

    /**
     * Sorts by Entry::path() with the order of QString: by UTF-16 code units, without locale,
     * directories not grouped. Stable in both directions: elements of one path keep their
     * relative order, so a descending sort is not the reverse of an ascending one.
     */
    void sort(bool ascending);
};

/// D-Bus form `a(ssi)`. @{
VEYFMVFS_EXPORT QDBusArgument& operator<<(QDBusArgument& argument, const EntryList& entries);
VEYFMVFS_EXPORT const QDBusArgument& operator>>(const QDBusArgument& argument, EntryList& entries);
/// @}

} // namespace VeyFM

Q_DECLARE_METATYPE(VeyFM::EntryList)

#endif
