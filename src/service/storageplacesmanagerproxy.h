// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_STORAGEPLACESMANAGERPROXY_H
#define VEYFM_STORAGEPLACESMANAGERPROXY_H

#include "core/storagedeviceinfo.h"
#include "core/storageplace.h"
#include "veyfmvfs_export.h"

#include <QList>
#include <QObject>
#include <QWeakPointer>

#include <memory>

class QDBusInterface;

namespace VeyFM {

class Job;
class StoragePlacesManagerProxyPrivate;

/**
 * The storage devices as the service knows them.
 *
 * The list is read at the first call and kept for the life of the object: the service's signals
 * patch it, and nothing else does. A first read that failed stays as an empty list, to which
 * only signals add.
 *
 * Any thread may call it. From a thread other than that of the object a list that was not read yet
 * is empty, and is read by the event loop of the object later. What asks the service blocks the
 * thread that calls it for one exchange. Jobs are to be made in the thread of the object, where
 * the signals are emitted too.
 */
class VEYFMVFS_EXPORT StoragePlacesManagerProxy : public QObject
{
    Q_OBJECT

public:
    /// The interface is not kept alive; without it the object lives on with no news.
    explicit StoragePlacesManagerProxy(
        QWeakPointer<QDBusInterface> interface, QObject* parent = nullptr);
    ~StoragePlacesManagerProxy() override;

    /// All devices, in the service's order.
    QList<StoragePlace> availableStoragePlaces();

    /**
     * The first device with this identifier, or with this name below VFS::storageDevicesEntry(),
     * or a default record. The list is read as by availableStoragePlaces(), and not walked. @{
     */
    StoragePlace storagePlaceByUdi(const QString& udi);
    StoragePlace storagePlaceByPlaceName(const QString& placeName);
    /// @}

    /// Asks for the details of a device, at each call; a default record where there are none.
    StorageDeviceInfo storageDeviceInfo(const StoragePlace& place) const;

    /**
     * A job that asks the service, without a parent and not started. It ends with code 1 when
     * the service is gone, and with code 2 and the service's own words when it refuses. @{
     */
    Job* mountStoragePlace(const StoragePlace& place);
    Job* unmountStoragePlace(const StoragePlace& place);
    Job* ejectStoragePlaceDevice(const StoragePlace& place);
    /// @}

Q_SIGNALS:
    /// Never emitted: jobs tell what went wrong. @{
    void mountError(QString error);
    void unmountError(QString error);
    void ejectError(QString error);
    /// @}

    /**
     * The service's news, after the list has been patched. An update carries the new state first
     * and the old one second; for a device that is not in the list the old state is a default
     * record, and the device is not added.
     * @{
     */
    void storagePlaceUpdated(VeyFM::StoragePlace place, VeyFM::StoragePlace previous);
    void storagePlaceAdded(VeyFM::StoragePlace place);
    void storagePlaceRemoved(VeyFM::StoragePlace place);
    /// @}

private Q_SLOTS:
    void slotRead();
    void slotStoragePlaceUpdated(const VeyFM::StoragePlace& place);
    void slotStoragePlaceAdded(const VeyFM::StoragePlace& place);
    void slotStoragePlaceRemoved(const VeyFM::StoragePlace& place);

private:
    const std::unique_ptr<StoragePlacesManagerProxyPrivate> d;
};

} // namespace VeyFM

#endif
