// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/scanjob.h"

#include "jobs/updatesmbentryjob.h"
#include "service/smbbrowserproxy.h"
#include "vfs/vfs.h"

namespace VeyFM {
namespace Tool {

ScanJob::ScanJob(const Entry& entry)
    : m_entry(entry)
{
}

ScanJob::~ScanJob() = default;

QString ScanJob::news()
{
    return QStringLiteral("end of the scan");
}

QStringList ScanJob::added() const
{
    return m_added;
}

QStringList ScanJob::removed() const
{
    return m_removed;
}

void ScanJob::start()
{
    const VFS* vfs = VFS::ptr();
    if (m_entry.isSambaNetworkPlace()) {
        followNetwork();
    } else if (m_entry.isSambaWorkgroupPlace()) {
        followWorkgroup(vfs->smbWorkgroup(m_entry));
    } else {
        followHost(vfs->smbHost(m_entry), vfs->smbWorkgroup(m_entry));
    }
    // Only shares need somebody to ask.
    auto* const job = new UpdateSmbEntryJob({}, m_entry, this);
    job->start();
}

void ScanJob::followNetwork()
{
    const SmbBrowserProxy* browser = VFS::ptr()->smbBrowser();
    connect(browser, &SmbBrowserProxy::workgroupsNotChanged, this, [this] { end(); });
    connect(browser, &SmbBrowserProxy::workgroupsChanged, this, &ScanJob::end);
}

void ScanJob::followWorkgroup(const QString& workgroup)
{
    const SmbBrowserProxy* browser = VFS::ptr()->smbBrowser();
    connect(
        browser, &SmbBrowserProxy::workgroupNotUpdated, this,
        [this, workgroup](const QString& told) {
            if (told == workgroup) {
                end();
            }
        });
    connect(
        browser, &SmbBrowserProxy::workgroupUpdated, this,
        [this,
         workgroup](const QString& told, const QStringList& added, const QStringList& removed) {
            if (told == workgroup) {
                end(added, removed);
            }
        });
}

void ScanJob::followHost(const QString& host, const QString& workgroup)
{
    const SmbBrowserProxy* browser = VFS::ptr()->smbBrowser();
    connect(
        browser, &SmbBrowserProxy::hostNotUpdated, this,
        [this, host, workgroup](const QString& toldHost, const QString& toldWorkgroup) {
            if (toldHost == host && toldWorkgroup == workgroup) {
                end();
            }
        });
    connect(
        browser, &SmbBrowserProxy::hostUpdated, this,
        [this, host, workgroup](
            const QString& toldHost, const QString& toldWorkgroup, const StringMap& added,
            const StringMap& removed) {
            if (toldHost == host && toldWorkgroup == workgroup) {
                end(added.keys(), removed.keys());
            }
        });
}

void ScanJob::end(const QStringList& added, const QStringList& removed)
{
    if (m_ended) {
        return;
    }
    m_ended = true;
    m_added = added;
    m_removed = removed;
    // Later, so that the tree has heard of it.
    finishedOkLater();
}

} // namespace Tool
} // namespace VeyFM
