// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/storageplacesmanagerproxy.h"

#include "jobs/storageplacejob.h"
#include "service/servicecall.h"
#include "service/servicesignals.h"

namespace VeyFM {

StoragePlacesManagerProxy::StoragePlacesManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , m_interface(std::move(interface))
{
    if (const auto alive = m_interface.toStrongRef()) {
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
    if (!m_storagePlacesLoaded) {
        m_storagePlaces = readFromService<QList<StoragePlace>>(
            m_interface, QStringLiteral("availableStoragePlaces"));
        // After a failed read too: what is not there now will be told by signals.
        m_storagePlacesLoaded = true;
    }
    return m_storagePlaces;
}

StorageDeviceInfo StoragePlacesManagerProxy::storageDeviceInfo(const StoragePlace& place) const
{
    return readFromService<StorageDeviceInfo>(
        m_interface, QStringLiteral("storageDeviceInfo"), place);
}

Job* StoragePlacesManagerProxy::mountStoragePlace(const StoragePlace& place)
{
    return new StoragePlaceMountJob(place, m_interface.toStrongRef());
}

Job* StoragePlacesManagerProxy::unmountStoragePlace(const StoragePlace& place)
{
    return new StoragePlaceUnmountJob(place, m_interface.toStrongRef());
}

Job* StoragePlacesManagerProxy::ejectStoragePlaceDevice(const StoragePlace& place)
{
    return new StoragePlaceEjectJob(place, m_interface.toStrongRef());
}

void StoragePlacesManagerProxy::slotStoragePlaceUpdated(const StoragePlace& place)
{
    // The old state is known only here: a device that is not in the list gets a default record,
    // and receivers compare with that.
    StoragePlace previous;
    const int index = m_storagePlacesLoaded ? m_storagePlaces.indexOf(place) : -1;
    if (index >= 0) {
        previous = m_storagePlaces.at(index);
        m_storagePlaces[index] = place;
    }
    Q_EMIT storagePlaceUpdated(place, previous);
}

void StoragePlacesManagerProxy::slotStoragePlaceAdded(const StoragePlace& place)
{
    if (m_storagePlacesLoaded) {
        m_storagePlaces.append(place);
    }
    Q_EMIT storagePlaceAdded(place);
}

void StoragePlacesManagerProxy::slotStoragePlaceRemoved(const StoragePlace& place)
{
    if (m_storagePlacesLoaded) {
        m_storagePlaces.removeAll(place);
    }
    Q_EMIT storagePlaceRemoved(place);
}

} // namespace VeyFM
