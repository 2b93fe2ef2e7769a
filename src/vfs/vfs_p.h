// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFS_P_H
#define VEYFM_VFS_P_H

#include "core/entrylist.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "vfs/vfssettings.h"
#include "watch/entrywatcher.h"

#include <QAtomicInt>
#include <QMap>

struct __dirstream;

namespace VeyFM {

/**
 * The inside of VFS. Its sources are cut by concern: vfs_startup, vfs_paths, vfs_listing,
 * vfs_navigation, vfs_urls, vfs_watching.
 */
class VFSPrivate
{
public:
    explicit VFSPrivate(VFS* vfs);
    ~VFSPrivate();

    // Start-up. Runs inside the construction of the one VFS object, so nothing that it calls may
    // come back to VFS::ptr(); Entry::localPath() on an empty stored path would.
    void initialize();
    void initializeNetwork();

    // Paths.
    Entry entryFromSchemePath(const QString& path) const;
    Entry entryFromRelativePath(const QString& path) const;
    QString resolveLocalPath(const QString& path) const;
    QString removeExcessivePathPlaces(const QString& path) const;
    QString resolveChildPath(const Entry& entry, const QString& name) const;
    static QString cleanPath(const QString& path);
    static QString realPath(const QString& path);
    static QString canonicalizedPath(const QString& path, const QString& stopPath);

    /// Entry::localPath() for code that may run before VFS::ptr() returns.
    QString localPathOf(const Entry& entry) const;

    // Listing.
    bool appendDirectory(
        const Entry& entry, const QString& localPath, VFS::EntryChildFilters filter,
        EntryList* children) const;
    static __dirstream* openListing(const QByteArray& directory);

    // Changes to the tree, announced to the watchers on request.
    bool addEntryToPlace(const Entry& entry, const Entry& place, bool notify);
    EntryList addEntriesToPlace(const EntryList& entries, const Entry& place, bool notify);
    void destroyPlace(const Entry& place);

    VFS* const q;
    EntryWatcher entryWatcher;
    VFSPlaceBase placeBase;
    mutable QAtomicInt stopFlag;
    // Read by VFS::childs(); nothing fills it.
    QMap<Entry, EntryList> extraChildren;

    // Written during construction only, and so free to read from any thread.
    Entry rootEntry;
    Entry favouritesEntry;
    Entry computerEntry;
    Entry placesEntry;
    Entry networkEntry;
    Entry sambaNetworkEntry;
    Entry ftpNetworkEntry;
    Entry sftpNetworkEntry;
    Entry desktopEntry;
    Entry trashEntry;
    Entry homeEntry;
    Entry fileSystemEntry;
    Entry documentsEntry;
    Entry storageDevicesEntry;

    VFSSettings settings;
};

} // namespace VeyFM

#endif
