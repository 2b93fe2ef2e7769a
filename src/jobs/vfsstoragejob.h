// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFSSTORAGEJOB_H
#define VEYFM_VFSSTORAGEJOB_H

#include "core/entry.h"
#include "jobs/job.h"

namespace VeyFM {

class StoragePlace;
class StoragePlacesManagerProxy;

/**
 * Does something with the storage device of an entry: finds its record, starts one
 * StoragePlaceJob and passes its result on.
 *
 * Whether the device is mounted, or can be ejected, is not looked at: that is the service's to
 * refuse. An entry with a storage type but no device behind it sends a default record.
 */
class VEYFMVFS_EXPORT VFSStorageJob : public Job
{
    Q_OBJECT

public:
    ~VFSStorageJob() override;

protected:
    /// For the device of @p entry. The manager is not owned.
    VFSStorageJob(const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent);

    /// What makes the job for the record.
    using Factory = Job* (StoragePlacesManagerProxy::*)(const StoragePlace&);
    /// Ends with code 1 and @p refusal when the entry is no storage place.
    void run(Factory makeJob, const QString& refusal);

protected Q_SLOTS:
    /// Passes the result of the inner job on.
    void storageJobFinished(Job* job);

private:
    const Entry m_entry;
    StoragePlacesManagerProxy* const m_storagePlacesManager; // not owned
};

/// Mounts the device of an entry.
class VEYFMVFS_EXPORT VFSStorageMountJob : public VFSStorageJob
{
    Q_OBJECT

public:
    /// Looks at nothing before start(). The manager is not owned.
    VFSStorageMountJob(
        const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent = nullptr);
    void start() override;
};

/// Unmounts the device of an entry.
class VEYFMVFS_EXPORT VFSStorageUnmountJob : public VFSStorageJob
{
    Q_OBJECT

public:
    /// Looks at nothing before start(). The manager is not owned.
    VFSStorageUnmountJob(
        const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent = nullptr);
    void start() override;
};

/// Ejects the device of an entry.
class VEYFMVFS_EXPORT VFSStorageEjectJob : public VFSStorageJob
{
    Q_OBJECT

public:
    /// Looks at nothing before start(). The manager is not owned.
    VFSStorageEjectJob(
        const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent = nullptr);
    void start() override;
};

} // namespace VeyFM

#endif
