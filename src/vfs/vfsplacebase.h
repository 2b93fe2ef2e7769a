// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFSPLACEBASE_H
#define VEYFM_VFSPLACEBASE_H

#include "core/entrylist.h"
#include "veyfmvfs_export.h"

#include <QStringList>

#include <memory>

class QObject;

namespace VeyFM {

class VFSPlaceBasePrivate;

/**
 * The named places and how they hang together.
 *
 * A place has two paths. Its place path, Entry::path(), is its key: a word, or the path of a
 * place above it, a `/` and a name, with no leading `/`. It never changes. Its local path is the
 * directory that it stands for, empty for a purely virtual place, and may change.
 *
 * A place may be the child of several places, so the shape is that of a directed acyclic graph;
 * the host must not make a cycle. Siblings stay in the order in which they were added. A child
 * that is no place is known to its parent alone.
 *
 * A pending place is filled when somebody first looks at its children, by a slot that gets its
 * path. The slot runs at once in the thread of its receiver; from any other thread it is queued,
 * and the caller sees the place still empty.
 *
 * Where an operation takes the entry of a place, only its path() counts. Unknown places are
 * normal, and answered with a null Entry, false, 0 or an empty list.
 *
 * Operations may be called from any thread, and wait for one another; hasPlace() never waits. The
 * slot that fills a place runs while all others wait, so it must not wait for another thread that
 * uses this object.
 */
class VEYFMVFS_EXPORT VFSPlaceBase
{
public:
    VFSPlaceBase();
    ~VFSPlaceBase();

    /// Makes a place, or returns the one of that path as it is.
    Entry createPlace(const QString& path, int type, const QString& localPath);

    /// createPlace() with the stored fields of an entry.
    Entry createPlace(const Entry& entry);

    /**
     * Makes a place that is filled on first need, or arms the place of that path again.
     *
     * @param receiver owner of the slot, not owned; once it is gone nothing fills the place
     * @param slot name of a slot with one QString argument, without a signature
     */
    Entry createPendingPlace(const QString& path, int type, QObject* receiver, const char* slot);

    /**
     * Hangs an entry below a place; true if a link was made. A place that hangs there already is
     * refused, while an entry that is no place may hang there twice.
     */
    bool addEntryToPlace(const Entry& entry, const Entry& place);

    /// addEntryToPlace() for each entry; returns those for which a link was made.
    EntryList addEntriesToPlace(const EntryList& entries, const Entry& place);

    /// Undoes one link, that of the first child equal to @p entry; true if there was one.
    bool removeEntryFromPlace(const Entry& entry, const Entry& place);

    /// Drops all children of a place. A place among them can't be hung there again afterwards.
    void clearPlace(const Entry& place);

    /**
     * Removes a place from the store and from all its parents. True if it hung below a living
     * place. Places below it stay in the store.
     */
    bool destroyPlace(const Entry& place);

    /// Replaces the local path of a place. Entries copied out earlier keep the old one.
    void setPlaceLocalPath(const Entry& place, const QString& localPath);

    /// The place of a path, or a null entry. Fills the place one level above, if that is pending
    /// and the path was not found.
    Entry placeEntry(const QString& path) const;

    /// Whether a place exists. Fills the place one level above, if that is pending. @{
    bool hasPlace(const QString& path) const;
    bool hasPlace(const Entry& entry) const;
    /// @}

    /// The children of a place as they are now. Fills the place, if it is pending.
    EntryList childEntries(const Entry& place) const;

    /// Whether a place has children, or is pending and may get some. Fills nothing.
    bool hasChilds(const Entry& place) const;

    /// Whether @p child hangs below @p place. Fills the place, if it is pending.
    bool placeHasChildEntry(const Entry& place, const Entry& child) const;

    /// The position of @p child among the children of @p parent, for sorting: 0 also when it is
    /// not there.
    int placeOrderIndex(const Entry& child, const Entry& parent);

    /// The first place below @p root, in level order, that has @p entry as a child.
    Entry checkAndGetParentPlace(const Entry& entry, const Entry& root) const;

    /// The first place, in the order of the paths, with exactly this local path. @{
    Entry dirPlaceEntry(const QString& localPath) const;
    Entry checkAndGetDirPlace(const QString& localPath) const;
    /// @}

    /**
     * A local path written through the place with the longest directory that contains it, or as
     * it is. A place's own directory gives its path with a `/` behind it.
     */
    QString placeRelatedPath(const QString& localPath) const;

    /// Whether the first section of a relative path is the path of a place.
    bool isPathContainsPlace(const QString& path) const;

    /**
     * The chain of place paths that leads from the place @p placePath down to @p path. Places
     * are matched as plain text, so "Home" also leads to "Homework/x".
     */
    QStringList exploreParentPlacesHistory(const QString& path, const QString& placePath) const;

private:
    Q_DISABLE_COPY(VFSPlaceBase)
    std::unique_ptr<VFSPlaceBasePrivate> const d;
};

} // namespace VeyFM

#endif
