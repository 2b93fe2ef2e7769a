// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/vfsstoragejob.h"

#include "core/storageplace.h"
#include "service/storageplacesmanagerproxy.h"
#include "vfs/vfs.h"

#include <QPointer>

namespace VeyFM {

VFSStorageJob::VFSStorageJob(
    const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent)
    : Job(parent)
    , m_entry(entry)
    , m_storagePlacesManager(manager)
{
}

VFSStorageJob::~VFSStorageJob() = default;

void VFSStorageJob::run(Factory makeJob, const QString& refusal)
{
    if (!m_entry.isStoragePlace()) {
        finishedWithError(1, refusal);
        return;
    }
    if (!m_storagePlacesManager) {
        finishedWithError(1, tr("Can't get service interface"));
        return;
    }
    // May open Storage devices, which is told of, and the job be deleted in there.
    const QPointer<VFSStorageJob> alive(this);
    const StoragePlace place = VFS::ptr()->storagePlace(m_entry);
    if (!alive) {
        return;
    }
    Job* const job = (m_storagePlacesManager->*makeJob)(place);
    // Made without a parent; a request that is still under way goes with this job.
    job->setParent(this);
    connect(job, &Job::finished, this, &VFSStorageJob::storageJobFinished);
    job->start();
}

void VFSStorageJob::storageJobFinished(Job* job)
{
    if (job->error() == 0) {
        finishedOk();
    } else {
        finishedWithError(job->error(), job->errorString());
    }
}

VFSStorageMountJob::VFSStorageMountJob(
    const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent)
    : VFSStorageJob(entry, manager, parent)
{
}

void VFSStorageMountJob::start()
{
    run(&StoragePlacesManagerProxy::mountStoragePlace, tr("This type of point cannot be mounted"));
}

VFSStorageUnmountJob::VFSStorageUnmountJob(
    const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent)
    : VFSStorageJob(entry, manager, parent)
{
}

void VFSStorageUnmountJob::start()
{
    run(&StoragePlacesManagerProxy::unmountStoragePlace,
        tr("This type of point cannot be unmounted"));
}

VFSStorageEjectJob::VFSStorageEjectJob(
    const Entry& entry, StoragePlacesManagerProxy* manager, QObject* parent)
    : VFSStorageJob(entry, manager, parent)
{
}

void VFSStorageEjectJob::start()
{
    run(&StoragePlacesManagerProxy::ejectStoragePlaceDevice,
        tr("This type of point cannot be ejected"));
}

} // namespace VeyFM
