// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/storageplacesmanagerproxy.h"

#include "jobs/storageplacejob.h"
#include "service/devicetable.h"
#include "service/servicecall.h"
#include "service/servicelist.h"
#include "service/servicesignals.h"

namespace VeyFM {

class StoragePlacesManagerProxyPrivate
{
public:
    StoragePlacesManagerProxyPrivate(QWeakPointer<QDBusInterface> serviceInterface, QObject* proxy)
        : interface(std::move(serviceInterface))
        , storagePlaces(proxy, "slotRead")
    {
    }

    QList<StoragePlace> read() const
    {
        return readFromService<QList<StoragePlace>>(
            interface, QStringLiteral("availableStoragePlaces"));
    }

    const QWeakPointer<QDBusInterface> interface;
    ServiceList<StoragePlace, DeviceTable> storagePlaces;
};

StoragePlacesManagerProxy::StoragePlacesManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , d(std::make_unique<StoragePlacesManagerProxyPrivate>(std::move(interface), this))
{
    if (const auto alive = d->interface.toStrongRef()) {
        followService(
            *alive, SIGNAL(storagePlaceUpdated(VeyFM::StoragePlace)), this,
            SLOT(slotStoragePlaceUpdated(VeyFM::StoragePlace)));
        followService(
            *alive, SIGNAL(storagePlaceAdded(VeyFM::StoragePlace)), this,
            SLOT(slotStoragePlaceAdded(VeyFM::StoragePlace)));
        followService(
            *alive, SIGNAL(storagePlaceRemoved(VeyFM::StoragePlace)), this,
            SLOT(slotStoragePlaceRemoved(VeyFM::StoragePlace)));
    }
}

StoragePlacesManagerProxy::~StoragePlacesManagerProxy() = default;

QList<StoragePlace> StoragePlacesManagerProxy::availableStoragePlaces()
{
    return d->storagePlaces.get([this] { return d->read(); });
}

StoragePlace StoragePlacesManagerProxy::storagePlaceByUdi(const QString& udi)
{
    return d->storagePlaces.find(
        [this] { return d->read(); },
        [&udi](const DeviceTable& places) { return places.withUdi(udi); });
}

StoragePlace StoragePlacesManagerProxy::storagePlaceByPlaceName(const QString& placeName)
{
    return d->storagePlaces.find(
        [this] { return d->read(); },
        [&placeName](const DeviceTable& places) { return places.withPlaceName(placeName); });
}

void StoragePlacesManagerProxy::slotRead()
{
    availableStoragePlaces();
}

StorageDeviceInfo StoragePlacesManagerProxy::storageDeviceInfo(const StoragePlace& place) const
{
    return readFromService<StorageDeviceInfo>(
        d->interface, QStringLiteral("storageDeviceInfo"), place);
}

Job* StoragePlacesManagerProxy::mountStoragePlace(const StoragePlace& place)
{
    return new StoragePlaceMountJob(place, d->interface.toStrongRef());
}

Job* StoragePlacesManagerProxy::unmountStoragePlace(const StoragePlace& place)
{
    return new StoragePlaceUnmountJob(place, d->interface.toStrongRef());
}

Job* StoragePlacesManagerProxy::ejectStoragePlaceDevice(const StoragePlace& place)
{
    return new StoragePlaceEjectJob(place, d->interface.toStrongRef());
}

void StoragePlacesManagerProxy::slotStoragePlaceUpdated(const StoragePlace& place)
{
    // The old state is known only here: a device that is not in the list gets a default record,
    // and receivers compare with that.
    StoragePlace previous;
    d->storagePlaces.patch(
        [&place, &previous](DeviceTable& places) { previous = places.replace(place); });
    Q_EMIT storagePlaceUpdated(place, previous);
}

void StoragePlacesManagerProxy::slotStoragePlaceAdded(const StoragePlace& place)
{
    d->storagePlaces.patch([&place](DeviceTable& places) { places.append(place); });
    Q_EMIT storagePlaceAdded(place);
}

void StoragePlacesManagerProxy::slotStoragePlaceRemoved(const StoragePlace& place)
{
    d->storagePlaces.patch([&place](DeviceTable& places) { places.removeAll(place.udi()); });
    Q_EMIT storagePlaceRemoved(place);
}

} // namespace VeyFM
