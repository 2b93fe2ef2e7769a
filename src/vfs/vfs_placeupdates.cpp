// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// How the tree follows the service's devices, bookmarks and mounts.

#include "core/urlparsing.h"
#include "vfs/vfs_p.h"

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

// The type of a device's place; 0 for a device that is not shown.
int entryType(StoragePlace::Type type)
{
    switch (type) {
    case StoragePlace::StorageTypeFloppyDrive:
        return TypeFloppyDriveStoragePlace;
    case StoragePlace::StorageTypeCdromDrive:
        return TypeCdromDriveStoragePlace;
    case StoragePlace::StorageTypeUsbDisk:
        return TypeUsbDiskStoragePlace;
    case StoragePlace::StorageTypeHardDiskDrive:
        return TypeHardDiskDriveStoragePlace;
    case StoragePlace::StorageType5:
        return TypeStoragePlace5;
    case StoragePlace::StorageType6:
        return TypeStoragePlace6;
    case StoragePlace::StorageType7:
        return TypeStoragePlace7;
    case StoragePlace::StorageType8:
        return TypeStoragePlace8;
    default:
        return TypeNone;
    }
}

} // namespace

Entry VFSPrivate::entryOfRecord(const QString& path) const
{
    // The name of a record is text: one that is empty, or leads up by "..", would resolve to some
    // other place, which must not change or go in place of one that the tree does not know.
    const Entry entry = q->entry(path);
    return entry.m_path != path && placeBase.hasPlace(entry) ? Entry() : entry;
}

void VFSPrivate::_q_createStoragePlaces(const QString& path)
{
    Q_UNUSED(path)
    Q_EMIT q->longTimeOperationStarted();
    if (storagePlacesManager) {
        // Only here: a process that never looks at devices is not woken by their news.
        follow(
            storagePlacesManager, &StoragePlacesManagerProxy::storagePlaceUpdated,
            &VFSPrivate::_q_serviceStoragePlaceUpdated);
        follow(
            storagePlacesManager, &StoragePlacesManagerProxy::storagePlaceAdded,
            &VFSPrivate::_q_serviceStoragePlaceAdded);
        follow(
            storagePlacesManager, &StoragePlacesManagerProxy::storagePlaceRemoved,
            &VFSPrivate::_q_serviceStoragePlaceRemoved);
        const QList<StoragePlace> places = storagePlacesManager->availableStoragePlaces();
        for (const StoragePlace& place : places) {
            addStoragePlace(place, false);
        }
    }
    Q_EMIT q->longTimeOperationFinished();
}

void VFSPrivate::addStoragePlace(const StoragePlace& place, bool notify)
{
    const int type = entryType(place.type());
    if (type == TypeNone) {
        return;
    }
    const QString path = storageDevicesEntry.m_path + slash + place.m_placeName;
    const Entry entry = placeBase.createPlace(path, type, place.mountPoint());
    addEntryToPlace(entry, storageDevicesEntry, notify);
}

void VFSPrivate::_q_serviceStoragePlaceAdded(const StoragePlace& place)
{
    news.tell([this, place] { addStoragePlace(place, true); });
}

void VFSPrivate::_q_serviceStoragePlaceUpdated(
    const StoragePlace& place, const StoragePlace& previous)
{
    // The signals run before the tree knows the new mount point, and the entry that goes to the
    // watchers still has the old one. Receivers read the entry again.
    const bool isOtherState = previous.isMounted() != place.isMounted();
    const bool isOtherAbility = previous.isMountable() != place.isMountable();
    news.tell(
        [this, place, isOtherState] {
            if (isOtherState) {
                Q_EMIT q->storagePlaceMountStateChanged(place);
            }
        },
        [this, place, isOtherAbility] {
            if (isOtherAbility) {
                Q_EMIT q->storagePlaceMountabilityChanged(place);
            }
        },
        [this, place] {
            const Entry entry = entryOfRecord(place.name());
            placeBase.setPlaceLocalPath(entry, place.mountPoint());
            q->notifyWatchers(entry);
        });
}

void VFSPrivate::_q_serviceStoragePlaceRemoved(const StoragePlace& place)
{
    // While the signal runs the place is still in the tree.
    news.tell(
        [this, place] { Q_EMIT q->storagePlaceRemoved(place); },
        [this, place] { destroyPlace(entryOfRecord(place.name())); });
}

void VFSPrivate::addFavouritePlace(const FavouritePlace& place, bool notify)
{
    const Entry entry =
        placeBase.createPlace(q->favouritePlacePath(place), TypeFavouritePlace, place.localPath);
    addEntryToPlace(entry, favouritesEntry, notify);
}

void VFSPrivate::_q_favouritePlaceAdded(const FavouritePlace& place)
{
    news.tell([this, place] { addFavouritePlace(place, true); });
}

void VFSPrivate::_q_favouritePlaceRemoved(const FavouritePlace& place)
{
    news.tell([this, place] { destroyPlace(entryOfRecord(q->favouritePlacePath(place))); });
}

QString VFSPrivate::networkPlacePath(const NetworkPlace& place) const
{
    return networkEntry.m_path + slash + place.name();
}

void VFSPrivate::addNetworkPlace(const NetworkPlace& place, bool notify)
{
    const Entry entry = placeBase.createPlace(
        networkPlacePath(place), TypeFavouriteNetworkPlace, place.localPath());
    // A null entry tells that nothing new was linked. The signal goes out in either case, and
    // for the bookmarks read at start-up too.
    const Entry linked = addEntryToPlace(entry, networkEntry, notify) ? entry : Entry();
    news.then([this, place, linked] { Q_EMIT q->networkPlaceAdded(place, linked); });
}

void VFSPrivate::_q_networkPlaceAdded(const NetworkPlace& place)
{
    news.tell([this, place] { addNetworkPlace(place, true); });
}

void VFSPrivate::_q_networkPlaceRemoved(const NetworkPlace& place)
{
    news.tell([this, path = networkPlacePath(place)] {
        destroyPlace(Entry(path, QString(), TypeFavouriteNetworkPlace));
    });
}

void VFSPrivate::_q_networkPlaceUpdated(const NetworkPlace& place)
{
    news.tell([this, place] {
        // The entry that goes out still has the old local path. Receivers read it again.
        const Entry entry = entryOfRecord(networkPlacePath(place));
        placeBase.setPlaceLocalPath(entry, place.localPath());
        news.then([this, entry] { q->notifyWatchers(entry); });
        news.then([this, entry] { Q_EMIT q->networkPlaceUpdated(entry); });
    });
}

EntryList VFSPrivate::addNetworkMounts(const QMap<QString, Entry>& mounts, bool notify)
{
    QList<Entry> ftpMounts;
    QList<Entry> sftpMounts;
    for (auto it = mounts.cbegin(); it != mounts.cend(); ++it) {
        // As a place it would stand before the directory of that path.
        if (it.value().m_path.startsWith(slash)) {
            continue;
        }
        const QString scheme = UrlParsing::scheme(it.key());
        if (scheme == QLatin1String("ftp")) {
            ftpMounts.append(it.value());
        } else if (scheme == QLatin1String("sftp")) {
            sftpMounts.append(it.value());
        }
    }
    EntryList result = addMountsOfKind(ftpMounts, ftpNetworkEntry, notify);
    result += addMountsOfKind(sftpMounts, sftpNetworkEntry, notify);
    return result;
}

EntryList
VFSPrivate::addMountsOfKind(const QList<Entry>& mounts, const Entry& kindPlace, bool notify)
{
    EntryList entries;
    for (const Entry& mount : mounts) {
        entries.append(placeBase.createPlace(mount));
    }
    if (entries.isEmpty()) {
        return entries;
    }
    // FTP and SFTP hang under Network from the first mount of their kind on.
    if (!placeBase.placeHasChildEntry(networkEntry, kindPlace)) {
        addEntryToPlace(kindPlace, networkEntry, notify);
    }
    news.then([this, entries, kindPlace, notify] {
        // A service that calls a mount after a place above would make a ring of the tree, in which
        // every walk to the top goes on for ever. Such a mount stays without a link.
        EntryList linkable;
        for (const Entry& entry : entries) {
            if (entry != kindPlace && placeBase.checkAndGetParentPlace(kindPlace, entry).isNull()) {
                linkable.append(entry);
            }
        }
        addEntriesToPlace(linkable, kindPlace, notify);
    });
    return entries;
}

void VFSPrivate::_q_fuseMountAdded(const QString& url, const Entry& entry)
{
    news.tell([this, url, entry] {
        const Entry mount =
            entry.isNull() ? Entry() : addNetworkMounts({{url, entry}}, true).value(0);
        news.then([this, url, mount] { Q_EMIT q->fuseMountAdded(url, mount); });
    });
}

} // namespace VeyFM
