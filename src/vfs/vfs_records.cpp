// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// From entries back to the service's records.

#include "jobs/vfsstoragejob.h"
#include "vfs/vfs_p.h"

#include <algorithm>

namespace VeyFM {

namespace {

// The first record that fits, or a default one.
template <typename Record, typename Predicate>
Record firstOf(const QList<Record>& records, Predicate fits)
{
    const auto found = std::find_if(records.begin(), records.end(), fits);
    return found == records.end() ? Record() : *found;
}

} // namespace

StoragePlace VFS::storagePlace(const Entry& given) const
{
    Q_D(const VFS);
    const Entry entry = copied(given);
    // May open Storage devices, and thus read the list from the service.
    if (!d->placeBase.hasPlace(entry.m_path)) {
        return StoragePlace();
    }
    // The path of a record without asking VFS::ptr() for the place above it, since this may run
    // while that is being constructed.
    const QString parent = d->storageDevicesEntry.m_path + QLatin1Char('/');
    if (!entry.m_path.startsWith(parent)) {
        return StoragePlace();
    }
    return d->storagePlacesManager->storagePlaceByPlaceName(entry.m_path.mid(parent.size()));
}

StoragePlace VFS::freshStoragePlace(const StoragePlace& place) const
{
    return d_func()->storagePlacesManager->storagePlaceByUdi(place.udi());
}

QList<StoragePlace> VFS::storagePlacesByType(StoragePlace::Type type) const
{
    const QList<StoragePlace> all = d_func()->storagePlacesManager->availableStoragePlaces();
    QList<StoragePlace> result;
    std::copy_if(
        all.begin(), all.end(), std::back_inserter(result),
        [type](const StoragePlace& place) { return place.type() == type; });
    return result;
}

StorageDeviceInfo VFS::storageDeviceInfo(const StoragePlace& place) const
{
    Q_D(const VFS);
    return d->storagePlacesManager ? d->storagePlacesManager->storageDeviceInfo(place)
                                   : StorageDeviceInfo();
}

Job* VFS::mount(const Entry& entry)
{
    return new VFSStorageMountJob(entry, d_func()->storagePlacesManager.get(), this);
}

Job* VFS::unmount(const Entry& entry)
{
    return new VFSStorageUnmountJob(entry, d_func()->storagePlacesManager.get(), this);
}

Job* VFS::eject(const Entry& entry)
{
    return new VFSStorageEjectJob(entry, d_func()->storagePlacesManager.get(), this);
}

NetworkPlace VFS::networkPlace(const Entry& entry) const
{
    if (!entry.isFavouriteNetworkPlace()) {
        return NetworkPlace();
    }
    const QString name = entry.lastPathSection();
    return firstOf(
        d_func()->networkPlacesManager->networkPlaces(),
        [&name](const NetworkPlace& place) { return place.name() == name; });
}

FavouritePlace VFS::favouritePlace(const Entry& entry) const
{
    // By directory and not by place path, so a plain directory finds its bookmark too.
    const QString local = entry.localPath();
    return firstOf(
        d_func()->favouritePlacesManager->favouritePlaces(),
        [&local](const FavouritePlace& place) { return place.localPath == local; });
}

QString VFS::favouritePlacePath(const FavouritePlace& place) const
{
    return d_func()->favouritesEntry.m_path + QLatin1Char('/') + place.name();
}

bool VFS::hasFavouritePlace(const FavouritePlace& place) const
{
    return d_func()->favouritePlacesManager->favouritePlaces().contains(place);
}

void VFS::addFavouritePlace(const FavouritePlace& place)
{
    d_func()->favouritePlacesManager->addFavouritePlace(place);
}

void VFS::removeFavouritePlace(const FavouritePlace& place)
{
    d_func()->favouritePlacesManager->removeFavouritePlace(place);
}

} // namespace VeyFM
