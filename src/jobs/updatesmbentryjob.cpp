// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/updatesmbentryjob.h"

#include "jobs/checksmbshareauthjob.h"
#include "service/smbbrowserproxy.h"
#include "vfs/vfs.h"

#include <QPointer>

namespace VeyFM {

UpdateSmbEntryJob::UpdateSmbEntryJob(
    QSharedPointer<Authenticator> authenticator, const Entry& smbEntry, QObject* parent)
    : Job(parent)
    , m_smbEntry(smbEntry)
    , m_authenticator(std::move(authenticator))
{
}

UpdateSmbEntryJob::~UpdateSmbEntryJob() = default;

Entry UpdateSmbEntryJob::smbEntry() const
{
    return m_smbEntry;
}

void UpdateSmbEntryJob::start()
{
    // A scan that finds nothing new ends the job as well. The connections come before the
    // request, which may tell what is known from inside the call.
    SmbBrowserProxy* const browser = VFS::ptr()->smbBrowser();
    if (m_smbEntry.isSambaNetworkPlace()) {
        const auto slot = &UpdateSmbEntryJob::updateWorkgroupsFinished;
        connect(browser, &SmbBrowserProxy::workgroupsNotChanged, this, slot);
        connect(browser, &SmbBrowserProxy::workgroupsChanged, this, slot);
        browser->rescan();
    } else if (m_smbEntry.isSambaWorkgroupPlace()) {
        const auto slot = &UpdateSmbEntryJob::updateWorkgroupFinished;
        connect(browser, &SmbBrowserProxy::workgroupUpdated, this, slot);
        connect(browser, &SmbBrowserProxy::workgroupNotUpdated, this, slot);
        browser->rescanWorkgroup(VFS::ptr()->smbWorkgroup(m_smbEntry));
    } else if (m_smbEntry.isSambaServerPlace()) {
        const auto slot = &UpdateSmbEntryJob::updateHostFinished;
        connect(browser, &SmbBrowserProxy::hostUpdated, this, slot);
        connect(browser, &SmbBrowserProxy::hostNotUpdated, this, slot);
        browser->rescanHost(VFS::ptr()->smbHost(m_smbEntry), VFS::ptr()->smbWorkgroup(m_smbEntry));
    } else if (m_smbEntry.isSambaSharePlace()) {
        updateShare();
    } else {
        finishedWithError(1, tr("Not a samba entry"));
    }
}

void UpdateSmbEntryJob::updateShare()
{
    // May open the place of the server, which is told of, and the job be deleted in there.
    const QPointer<UpdateSmbEntryJob> alive(this);
    const bool isAttached = !m_smbEntry.localPath().isEmpty();
    if (!alive) {
        return;
    }
    if (isAttached) {
        finishedOk();
        return;
    }
    auto* const job = new CheckSmbShareAuthJob(
        m_authenticator, m_smbEntry.lastPathSection(), VFS::ptr()->smbHost(m_smbEntry),
        VFS::ptr()->smbWorkgroup(m_smbEntry), this);
    connect(job, &Job::finished, this, &UpdateSmbEntryJob::checkJobFinished);
    job->start();
}

void UpdateSmbEntryJob::updateWorkgroupsFinished()
{
    finishedOkLater();
}

void UpdateSmbEntryJob::updateWorkgroupFinished()
{
    finishedOkLater();
}

void UpdateSmbEntryJob::updateHostFinished()
{
    finishedOkLater();
}

void UpdateSmbEntryJob::checkJobFinished(Job* job)
{
    auto* const checkJob = qobject_cast<CheckSmbShareAuthJob*>(job);
    if (checkJob->error() != 0) {
        finishedWithError(checkJob->error(), checkJob->errorString());
        return;
    }
    connect(VFS::ptr(), &VFS::smbShareUpdated, this, &UpdateSmbEntryJob::slotSharedUpdatedInVFS);
    // For the update that the service announces; the path comes with it.
    VFS::ptr()->smbBrowser()->shareLocalPath(
        checkJob->share(), checkJob->host(), checkJob->workgroup(), checkJob->hostForKerberos());
}

void UpdateSmbEntryJob::slotSharedUpdatedInVFS(const Entry& entry)
{
    // Whichever share it is about.
    Q_UNUSED(entry)
    finishedOkLater();
}

} // namespace VeyFM
