// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFS_P_H
#define VEYFM_VFS_P_H

#include "core/copied.h"
#include "core/entrylist.h"
#include "core/newsqueue.h"
#include "service/favouriteplacesmanagerproxy.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "service/networkplacesmanagerproxy.h"
#include "service/smbbrowserproxy.h"
#include "service/storageplacesmanagerproxy.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "vfs/vfssettings.h"
#include "watch/entrywatcher.h"

#include <QAtomicInt>
#include <QDBusInterface>
#include <QList>
#include <QMap>
#include <QSharedPointer>
#include <QWeakPointer>

#include <memory>

namespace VeyFM {

/// The one watcher that VFS tells of resets, through a slot that is closed to hosts.
class NotifiedEntryWatcher : public EntryWatcher
{
public:
    using EntryWatcher::entryChangedNotify;
    using EntryWatcher::EntryWatcher;
};

/**
 * The inside of VFS. Its sources are cut by concern: vfs_startup, vfs_service, vfs_paths,
 * vfs_listing, vfs_navigation, vfs_urls, vfs_watching, vfs_records, vfs_placeupdates, vfs_samba.
 */
class VFSPrivate
{
public:
    explicit VFSPrivate(VFS* vfs);
    ~VFSPrivate();

    // Start-up. Runs inside the construction of the one VFS object, so nothing that it calls may
    // come back to VFS::ptr(); Entry::localPath() on an empty stored path would.
    void initService();
    void initialize();
    void initializeNetwork();
    void releaseService();
    QSharedPointer<QDBusInterface> createInterface(const QString& path, const QString& interface);

    // Paths.
    Entry entryFromSchemePath(const QString& path) const;
    Entry entryFromRelativePath(const QString& path) const;
    Entry entryFromNormalPath(const QString& path) const;
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
        EntryList* children, QByteArrayList* leftOut) const;

    /// The URL of a bookmark, or of something below it, by its path behind the Network place.
    QString bookmarkUrl(const QString& relativePath) const;

    // Places for the service's records. Within a step of the news, like all that announces.
    void addStoragePlace(const StoragePlace& place, bool notify);
    void addFavouritePlace(const FavouritePlace& place, bool notify);
    void addNetworkPlace(const NetworkPlace& place, bool notify);
    EntryList addNetworkMounts(const QMap<QString, Entry>& mounts, bool notify);
    EntryList addMountsOfKind(const QList<Entry>& mounts, const Entry& kindPlace, bool notify);
    QString networkPlacePath(const NetworkPlace& place) const;
    Entry entryOfRecord(const QString& path) const;
    QString workgroupPath(const QString& workgroup) const;

    /// Connects a signal of one of the proxies below to a slot of this.
    template <typename Proxy, typename Signal, typename Slot>
    void follow(const std::unique_ptr<Proxy>& proxy, Signal signal, Slot slot)
    {
        QObject::connect(proxy.get(), signal, q, [this, slot](const auto&... arguments) {
            (this->*slot)(arguments...);
        });
    }

    // Fills of pending places, and news of the service.
    void _q_createStoragePlaces(const QString& path);
    void _q_createSambaWorkgroups(const QString& path);
    void _q_createSambaHosts(const QString& path);
    void _q_createSambaShares(const QString& path);
    void _q_serviceNotifyWatchers(const EntryList& entries);
    void _q_serviceStoragePlaceAdded(const StoragePlace& place);
    void _q_serviceStoragePlaceRemoved(const StoragePlace& place);
    void _q_serviceStoragePlaceUpdated(const StoragePlace& place, const StoragePlace& previous);
    void _q_favouritePlaceAdded(const FavouritePlace& place);
    void _q_favouritePlaceRemoved(const FavouritePlace& place);
    void _q_networkPlaceAdded(const NetworkPlace& place);
    void _q_networkPlaceRemoved(const NetworkPlace& place);
    void _q_networkPlaceUpdated(const NetworkPlace& place);
    void _q_fuseMountAdded(const QString& url, const Entry& entry);
    void _q_smbWorkgroupsChanged(const QStringList& added, const QStringList& removed);
    void _q_smbWorkgroupUpdated(
        const QString& workgroup, const QStringList& added, const QStringList& removed);
    void _q_smbHostUpdated(
        const QString& host, const QString& workgroup, const StringMap& added,
        const StringMap& removed);
    void _q_smbShareUpdated(
        const QString& share, const QString& host, const QString& workgroup,
        const QString& localPath);

    // Changes to the tree, announced to the watchers on request: additions by steps of their own.
    bool addEntryToPlace(const Entry& entry, const Entry& place, bool notify);
    EntryList addEntriesToPlace(const EntryList& entries, const Entry& place, bool notify);
    void destroyPlace(const Entry& place);
    void destroyPlaceLater(const Entry& place);

    VFS* const q;
    NotifiedEntryWatcher entryWatcher;
    VFSPlaceBase placeBase;
    // What the slots for news of the service do, all of them.
    NewsQueue news;
    mutable QAtomicInt stopFlag;
    QWeakPointer<QDBusInterface> fileSystemInterface;
    std::unique_ptr<StoragePlacesManagerProxy> storagePlacesManager;
    std::unique_ptr<FavouritePlacesManagerProxy> favouritePlacesManager;
    std::unique_ptr<SmbBrowserProxy> smbBrowser;
    std::unique_ptr<NetworkMountsManagerProxy> networkMountsManager;
    std::unique_ptr<NetworkPlacesManagerProxy> networkPlacesManager;
    std::unique_ptr<FuseMountsManagerProxy> fuseMountsManager;
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

    QString serviceName;
    // The one strong holder of the interfaces: to empty it cuts all proxies off.
    QList<QSharedPointer<QDBusInterface>> interfaces;
    // Set only where the service could be activated, and then this process counts there.
    std::unique_ptr<QDBusInterface> serviceInterface;
};

} // namespace VeyFM

#endif
