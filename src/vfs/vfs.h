// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFS_H
#define VEYFM_VFS_H

#include "core/entrylist.h"
#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "core/storagedeviceinfo.h"
#include "core/storageplace.h"
#include "core/stringmap.h"
#include "veyfmvfs_export.h"

#include <QByteArrayList>
#include <QObject>
#include <QUrl>

#include <memory>

namespace VeyFM {

class EntryWatcher;
class FuseMountsManagerProxy;
class Job;
class NetworkMountsManagerProxy;
class NetworkPlacesManagerProxy;
class SmbBrowserProxy;
class VFSPlaceBase;
class VFSPrivate;
class VFSSettings;

/**
 * The virtual file system: one object per process, reached through ptr().
 *
 * It holds a tree of named places (Computer, Home, Trash, Desktop, File System, Favourites,
 * Storage devices, Network) laid over the local disk, turns paths and URLs into Entry values,
 * lists and walks, and tells of changes through entryWatcher().
 *
 * A host does three things, in this order:
 * 1. create its QCoreApplication;
 * 2. call initialize(), so that the translator is there when places get their names;
 * 3. call ptr() from its main thread. The object, its signals and its watches belong to that
 *    thread.
 *
 * The object goes away at process exit, after main() has returned.
 *
 * What all processes of a user share (devices, bookmarks, the Samba network, mounts) comes from
 * the file manager service on the session bus. It is looked for once, by the first ptr(), and
 * started if it can be. Where there is none, two lines of the log say so and the tree shows its
 * built-in places. One that hangs is waited for; setServiceProbe() says how long.
 *
 * Nothing here throws. What means nothing yields a null Entry, false, or an empty text or list.
 *
 * Threads: resolution, navigation, the mapping of URLs, the look-ups of records and the fixed
 * entries may be used in any thread, while news change what they look at. What comes from the
 * service on first need (the children of a place, the list of devices) is read in the thread of
 * the object alone: a caller in another thread sees it empty, and it is there some time later. The
 * operations that ask the service each time (storageDeviceInfo(), addFavouritePlace(),
 * removeFavouritePlace()) block the thread that calls them. The watchers, the jobs and the
 * settings are for the thread of the object.
 *
 * Slots: signals are emitted synchronously, in the thread of the object. A slot may change or
 * destroy what its host has just handed over by reference, and may run an event loop. News of the
 * service that arrive in there are not held back: what is left of the news that the slot was told
 * of is done first.
 */
class VEYFMVFS_EXPORT VFS : public QObject
{
    Q_OBJECT

public:
    /// What childs() leaves out or adds.
    enum EntryChildFilter {
        SkipSymLinks = 1,     ///< Leave out the symbolic links of the directory.
        WithExtraChildren = 2 ///< Add the extra children of the entry. There never are any.
    };
    /// Any of EntryChildFilter together.
    Q_DECLARE_FLAGS(EntryChildFilters, EntryChildFilter)

    /**
     * Installs the translator and registers the meta types. Any call but the first does nothing.
     * To be called from one thread, behind the QCoreApplication and before ptr().
     */
    static void initialize();

    /**
     * Bounds what a file manager service that hangs costs the first ptr(): without it, each of
     * some fifteen calls waits 25 seconds. To be called before ptr(), from any thread; later it
     * does nothing. 0, the default, is no bound.
     *
     * With a bound the owner of the service's name, if there is one, has so many @p milliseconds
     * to answer a ping, and a service that has to be started first three times as many to start.
     * If it does not, one line at critical level says so and this process goes on, for good, as if
     * no service were installed: the clients of the service have nothing to tell, nothing is sent,
     * and of a service that awakes later nobody takes note.
     *
     * It says nothing about later: a service that hangs then lets each blocking call wait, as ever.
     * Nor does it bound how long the connection to the bus itself takes.
     */
    static void setServiceProbe(int milliseconds);

    /**
     * The one object; the first call constructs it, and may block on the session bus: for minutes,
     * where a service hangs and setServiceProbe() was not called. Any thread may call it
     * afterwards.
     *
     * Not to be called from the destructor of a static object: this object is one itself, and may
     * be gone by then. The same goes for everything that calls it, Entry::localPath() for one.
     */
    static VFS* ptr();

    ~VFS() override;

    /**
     * The settings, the watcher, the tree and the clients of the service, owned by this object.
     * The clients are there without a service too, and then have nothing to tell.
     * @{
     */
    VFSSettings* settings();
    const VFSSettings* settings() const;
    EntryWatcher* entryWatcher();
    VFSPlaceBase* placeBase();
    const VFSPlaceBase* placeBase() const;
    SmbBrowserProxy* smbBrowser();
    NetworkMountsManagerProxy* networkMountsManager();
    NetworkPlacesManagerProxy* networkPlacesManager();
    FuseMountsManagerProxy* fuseMountsManager();
    /// @}

    /**
     * The fixed entries, as they were made at start-up. Their paths are translated words, but
     * for the root's, which is "_". The network ones are null where the network is switched
     * off. The documents entry is an ordinary directory and no place. @{
     */
    Entry rootEntry() const;
    Entry favouritesEntry() const;
    Entry desktopEntry() const;
    Entry computerEntry() const;
    Entry trashEntry() const;
    Entry homeEntry() const;
    Entry fileSystemEntry() const;
    Entry documentsEntry() const;
    Entry placesEntry() const;
    Entry networkEntry() const;
    Entry sambaNetworkEntry() const;
    Entry ftpNetworkEntry() const;
    Entry sftpNetworkEntry() const;
    Entry storageDevicesEntry() const;
    /// @}

    /**
     * Any text to an entry: a path through places, a local path (absolute, or relative to the
     * working directory), a "file" or "vey-fm" URL, or a URL that is only carried ("mailto",
     * "http", "qthelp", "ftp", "sftp"). Null when the text means nothing.
     *
     * An entry that does not exist is not null; see isEntryExists(). A relative name with a
     * colon behind a valid scheme word, such as "notes:old", is a URL and not a file, and a place
     * wins over a file of its name in the working directory.
     */
    Entry entry(const QString& path) const;

    /**
     * Drops ".", "..", doubled slashes and place sections that only lead to the next place.
     * Stepping up from a top-level directory leaves the notation of the file system:
     * "/usr/../etc" becomes "File System/etc".
     */
    QString normalizePath(const QString& path) const;

    /// entry(path).localPath().
    QString localPath(const QString& path) const;

    /// Computes the local path of an entry; empty for URLs and purely virtual places.
    QString localPath(const Entry& entry) const;

    /**
     * The place children of an entry in the order of the tree, then the content of its directory
     * in the order of the disk. Kinds come from the directory record: nothing but links is
     * examined. A name that is not valid in the local encoding is left out unless it is a link.
     *
     * A place that is filled on first need is filled here, which may take long and block on the
     * service. A listing that stopGettingChilds() cancelled is empty.
     */
    EntryList childs(const Entry& entry, EntryChildFilters filter = {}) const;

    /**
     * childs(), and the names of the directory that it left out since they are not valid in the
     * local encoding, in the order of the disk, both from one reading. For those who tell their
     * user of them. A listing that was cancelled leaves some or none of them.
     */
    EntryList
    childsAndLeftOut(const Entry& entry, EntryChildFilters filter, QByteArrayList* leftOut) const;

    /**
     * Cancels one listing: the running one that gets to a directory record first, or the next
     * one. From any thread.
     */
    void stopGettingChilds();

    /// Whether an entry has children, by the cheapest test: an empty directory that can be read
    /// says yes, and so does a place that was never opened.
    bool hasChilds(const Entry& entry) const;

    /// Whether at least one child would be a place or a directory. Links do not count.
    bool containsDirsOrPlaces(const Entry& entry) const;

    /// Whether an entry exists: a place that is in the tree, something on the disk, or a
    /// "mailto:" or "vey-fm:" text. Other URLs do not exist.
    bool isEntryExists(const Entry& entry) const;

    /// The child called @p name, whether it exists or not; null where there can't be one.
    Entry child(const Entry& entry, const QString& name) const;

    /**
     * The parent of an entry as seen from @p root: a place may hang below several, and the first
     * in level order counts. Null for a place that is not below @p root.
     */
    Entry parent(const Entry& entry, const Entry& root) const;
    /// parent() as seen from rootEntry().
    Entry parent(const Entry& entry) const;
    /// Whether parent() is not null.
    bool hasParent(const Entry& entry) const;

    /// The chain of parents from the top down, the entry itself at its end.
    EntryList pathEntryList(const Entry& entry, const Entry& root) const;
    /// pathEntryList() from rootEntry().
    EntryList pathEntryList(const Entry& entry) const;

    /// The place paths that lead to File System: Computer from rootEntry(), none otherwise.
    QStringList fileSystemEntryPathList(const Entry& root) const;

    /// The chain of place paths that leads from @p root to @p path.
    QStringList exploreParentPlacesHistory(const QString& path, const Entry& root) const;
    /// exploreParentPlacesHistory() from rootEntry().
    QStringList exploreParentPlacesHistory(const QString& path) const;

    /// The entry of a link's target, below the same place as the link where it lies there.
    Entry symLinkTargetEntry(const Entry& entry) const;

    /// The same object as seen through the deepest place whose directory holds it.
    Entry placeRelatedEntry(const Entry& entry) const;

    /// Whether the entry is, or lies below, a place other than File System and Computer. The
    /// root place counts.
    bool isPlaceRelativeEntry(const Entry& entry) const;

    /// Whether the entry is, or lies below, a storage place.
    bool isStoragePlaceRelativeEntry(const Entry& entry) const;
    /// Whether any of @p entries isStoragePlaceRelativeEntry().
    bool hasStoragePlaceRelativeEntries(const EntryList& entries) const;

    /**
     * Whether the path begins with that of a network place, as plain text. With the network
     * switched off those paths are empty, and every entry counts.
     */
    bool isEntryInNetwork(const Entry& entry) const;
    /// Whether any of @p entries isEntryInNetwork().
    bool hasNetworkRelativeEntries(const EntryList& entries) const;

    /// False: archives can't be browsed.
    bool isSupportedFileArchive(const Entry& entry) const;

    /// The network URL of an entry below the network places, or empty.
    QString getUrlForEntry(const Entry& entry) const;

    /**
     * URLs of entries: "file" where there is a local path, with the links in its directories
     * resolved down to the desktop, "vey-fm" where there is none. An entry whose directory no
     * longer exists is dropped.
     */
    QList<QUrl> urlsFromEntries(const EntryList& entries) const;

    /// One entry for each URL, null where the URL means nothing.
    EntryList entriesFromUrls(const QList<QUrl>& urls) const;

    /**
     * The share place of an "ftp" or "sftp" URL that is mounted on @p localPath, named after its
     * user and host. It is not put into the tree. Null for any other scheme.
     */
    Entry createEntryForUrl(const QString& url, const QString& localPath) const;

    /// The place of a Samba share, or null. Note the order of the arguments.
    Entry smbShareEntry(const QString& share, const QString& host, const QString& workgroup) const;

    /// The host section of an entry below Samba, or empty.
    QString smbHost(const Entry& entry) const;
    /// The workgroup section of an entry below Samba, or empty.
    QString smbWorkgroup(const Entry& entry) const;

    /// EntryWatcher::entryReset() for these entries, in this process. @{
    void notifyWatchers(const Entry& entry);
    void notifyWatchers(const EntryList& entries);
    /// @}

    /// notifyWatchers() that, without @p anyWay, passes over entries nobody watches.
    void directNotifyWatchers(const EntryList& entries, bool anyWay);

    /**
     * notifyWatchers() in every process of the session, this one included, by way of the
     * service: it has no effect yet when this returns. Without the service it has none at all.
     */
    void notifyAllWatchers(const EntryList& entries);

    /// The device of a storage place, or a record that is not valid.
    StoragePlace storagePlace(const Entry& entry) const;
    /// The current state of a record that was held for a while, or one that is not valid.
    StoragePlace freshStoragePlace(const StoragePlace& place) const;
    /// All devices of one type.
    QList<StoragePlace> storagePlacesByType(StoragePlace::Type type) const;
    /// The details of a device, asked of the service; a default record where there are none.
    StorageDeviceInfo storageDeviceInfo(const StoragePlace& place) const;

    /**
     * A job that asks the service to do something with the device of a storage place. It is
     * returned unstarted, deletes itself when it has finished, and is a child of this object.
     * @{
     */
    Job* mount(const Entry& entry);
    Job* unmount(const Entry& entry);
    Job* eject(const Entry& entry);
    /// @}

    /// The network bookmark of an entry, or a null record.
    NetworkPlace networkPlace(const Entry& entry) const;

    /// The favourite that points at the directory of an entry, be it a place or not; a record
    /// with no local path where there is none.
    FavouritePlace favouritePlace(const Entry& entry) const;
    /// Where a favourite hangs in the tree.
    QString favouritePlacePath(const FavouritePlace& place) const;
    /// Whether the directory of @p place has a favourite, under whatever name.
    bool hasFavouritePlace(const FavouritePlace& place) const;

    /// Asks the service for a change. The tree follows when the service's news arrive. @{
    void addFavouritePlace(const FavouritePlace& place);
    void removeFavouritePlace(const FavouritePlace& place);
    /// @}

Q_SIGNALS:
    /**
     * A device was mounted or unmounted, can now be mounted or no longer, or went away. These run
     * before the tree follows: a receiver sees the place as it was.
     * @{
     */
    void storagePlaceMountStateChanged(StoragePlace storagePlace);
    void storagePlaceMountabilityChanged(StoragePlace storagePlace);
    void storagePlaceRemoved(StoragePlace storagePlace);
    /// @}

    /// The local path of a share or a bookmark changed. The entry that comes along still has the
    /// old one: read it again by its path. @{
    void smbShareUpdated(Entry entry);
    void networkPlaceUpdated(Entry entry);
    /// @}

    /// The service told of a bookmark. The entry is null where a place of that name was there
    /// already.
    void networkPlaceAdded(NetworkPlace networkPlace, Entry entry);

    /// A process of the session has mounted a URL. The entry is null where that makes no place.
    void fuseMountAdded(QString url, Entry entry);

    /**
     * Brackets the blocking fill of a place on first need. The end may fail to come when the
     * place went away meanwhile.
     *
     * As a rule both run with the lock of the tree held, by the operation that looked at the place:
     * a slot may use this object, but must not wait for another thread that does.
     * @{
     */
    void longTimeOperationStarted();
    void longTimeOperationFinished();
    /// @}

private:
    VFS();

    Q_DISABLE_COPY(VFS)
    Q_DECLARE_PRIVATE(VFS)
    std::unique_ptr<VFSPrivate> const d_ptr;

    // Fill a place on first need.
    Q_PRIVATE_SLOT(d_func(), void _q_createStoragePlaces(QString))
    Q_PRIVATE_SLOT(d_func(), void _q_createSambaWorkgroups(QString))
    Q_PRIVATE_SLOT(d_func(), void _q_createSambaHosts(QString))
    Q_PRIVATE_SLOT(d_func(), void _q_createSambaShares(QString))

    // News of the service.
    Q_PRIVATE_SLOT(d_func(), void _q_serviceNotifyWatchers(VeyFM::EntryList))
    Q_PRIVATE_SLOT(d_func(), void _q_serviceStoragePlaceAdded(VeyFM::StoragePlace))
    Q_PRIVATE_SLOT(d_func(), void _q_serviceStoragePlaceRemoved(VeyFM::StoragePlace))
    Q_PRIVATE_SLOT(
        d_func(), void _q_serviceStoragePlaceUpdated(VeyFM::StoragePlace, VeyFM::StoragePlace))
    Q_PRIVATE_SLOT(d_func(), void _q_favouritePlaceAdded(VeyFM::FavouritePlace))
    Q_PRIVATE_SLOT(d_func(), void _q_favouritePlaceRemoved(VeyFM::FavouritePlace))
    Q_PRIVATE_SLOT(d_func(), void _q_networkPlaceAdded(VeyFM::NetworkPlace))
    Q_PRIVATE_SLOT(d_func(), void _q_networkPlaceRemoved(VeyFM::NetworkPlace))
    Q_PRIVATE_SLOT(d_func(), void _q_networkPlaceUpdated(VeyFM::NetworkPlace))
    Q_PRIVATE_SLOT(d_func(), void _q_fuseMountAdded(QString, VeyFM::Entry))
    Q_PRIVATE_SLOT(d_func(), void _q_smbWorkgroupsChanged(QStringList, QStringList))
    Q_PRIVATE_SLOT(d_func(), void _q_smbWorkgroupUpdated(QString, QStringList, QStringList))
    Q_PRIVATE_SLOT(d_func(), void _q_smbHostUpdated(QString, QString, StringMap, StringMap))
    Q_PRIVATE_SLOT(d_func(), void _q_smbShareUpdated(QString, QString, QString, QString))
};

Q_DECLARE_OPERATORS_FOR_FLAGS(VFS::EntryChildFilters)

} // namespace VeyFM

#endif
