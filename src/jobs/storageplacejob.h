// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_STORAGEPLACEJOB_H
#define VEYFM_STORAGEPLACEJOB_H

#include "core/storageplace.h"
#include "jobs/job.h"

#include <QSharedPointer>

class QDBusInterface;
class QDBusPendingCallWatcher;

namespace VeyFM {

/**
 * Asks the service to do something with a storage device, and waits for its reply. Nothing can
 * cancel a request that has been sent.
 *
 * Ends with code 1 and "Can't get service interface" without an interface, and with code 2 and
 * the text of the service's error, or of the bus, when the request fails. Any other reply of one
 * boolean is success, whatever its value.
 */
class VEYFMVFS_EXPORT StoragePlaceJob : public Job
{
    Q_OBJECT

public:
    ~StoragePlaceJob() override;

protected:
    /// For @p place, through @p interface, which may be null or gone.
    StoragePlaceJob(
        const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface,
        QObject* parent);

    /// Sends @p method with the record as its one argument. Without an interface the job ends with
    /// code 1 and @p refusal, which each job translates under its own name.
    void request(const QString& method, const QString& refusal);

protected Q_SLOTS:
    /// Ends the job by the service's reply.
    void callFinishedSlot(QDBusPendingCallWatcher* call);

private:
    const StoragePlace m_storagePlace;
    // Holds the interface while the request is under way, even when the service is released.
    const QSharedPointer<QDBusInterface> m_interface;
};

/// Mounts a device.
class VEYFMVFS_EXPORT StoragePlaceMountJob : public StoragePlaceJob
{
    Q_OBJECT

public:
    /// Sends nothing before start().
    StoragePlaceMountJob(
        const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface,
        QObject* parent = nullptr);
    void start() override;
};

/// Unmounts a device.
class VEYFMVFS_EXPORT StoragePlaceUnmountJob : public StoragePlaceJob
{
    Q_OBJECT

public:
    /// Sends nothing before start().
    StoragePlaceUnmountJob(
        const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface,
        QObject* parent = nullptr);
    void start() override;
};

/// Ejects the device or its medium.
class VEYFMVFS_EXPORT StoragePlaceEjectJob : public StoragePlaceJob
{
    Q_OBJECT

public:
    /// Sends nothing before start().
    StoragePlaceEjectJob(
        const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface,
        QObject* parent = nullptr);
    void start() override;
};

} // namespace VeyFM

#endif
