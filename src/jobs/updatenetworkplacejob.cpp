// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/updatenetworkplacejob.h"

#include "jobs/mounturljob.h"
#include "service/networkplacesmanagerproxy.h"
#include "vfs/vfs.h"

namespace VeyFM {

UpdateNetworkPlaceJob::UpdateNetworkPlaceJob(
    QSharedPointer<Authenticator> authenticator, const Entry& netPlaceEntry, QObject* parent)
    : Job(parent)
    , m_netPlaceEntry(netPlaceEntry)
    , m_authenticator(std::move(authenticator))
{
}

UpdateNetworkPlaceJob::~UpdateNetworkPlaceJob() = default;

Entry UpdateNetworkPlaceJob::netPlaceEntry() const
{
    return m_netPlaceEntry;
}

void UpdateNetworkPlaceJob::start()
{
    const NetworkPlace place = VFS::ptr()->networkPlace(m_netPlaceEntry);
    if (place.isNull()) {
        finishedWithError(5, tr("Can't find entry for network place"));
        return;
    }
    if (!place.localPath().isEmpty()) {
        finishedOk();
        return;
    }
    auto* const job = new MountURLJob(m_authenticator, place.url(), this);
    connect(job, &Job::finished, this, &UpdateNetworkPlaceJob::slotMountURLJobFinished);
    job->start();
}

void UpdateNetworkPlaceJob::slotMountURLJobFinished(Job* job)
{
    auto* const mountJob = qobject_cast<MountURLJob*>(job);
    if (mountJob->error() != 0) {
        finishedWithError(mountJob->error(), mountJob->errorString());
        return;
    }
    // Before the request, so that the answer can't be missed.
    connect(
        VFS::ptr(), &VFS::networkPlaceUpdated, this,
        &UpdateNetworkPlaceJob::slotNetworkPlaceUpdatedInVFS);
    NetworkPlace place = VFS::ptr()->networkPlace(m_netPlaceEntry);
    place.setLocalPath(mountJob->localPath());
    VFS::ptr()->networkPlacesManager()->updateNetworkPlace(place);
}

void UpdateNetworkPlaceJob::slotNetworkPlaceUpdatedInVFS(const Entry& entry)
{
    // Whichever bookmark it is about: the first such news ends the job.
    Q_UNUSED(entry)
    finishedOkLater();
}

} // namespace VeyFM
