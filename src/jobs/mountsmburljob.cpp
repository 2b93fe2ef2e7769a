// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountsmburljob.h"

#include "core/smburl.h"
#include "core/urltext.h"
#include "jobs/checksmbshareauthjob.h"
#include "service/smbbrowserproxy.h"
#include "vfs/vfs.h"

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

} // namespace

MountSmbURLJob::MountSmbURLJob(
    QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent)
    : Job(parent)
    , m_url(url)
    , m_authenticator(std::move(authenticator))
{
}

MountSmbURLJob::~MountSmbURLJob() = default;

QString MountSmbURLJob::url() const
{
    return m_url;
}

QString MountSmbURLJob::localPath() const
{
    return m_localPath;
}

void MountSmbURLJob::start()
{
    if (UrlText::writtenScheme(m_url) != QLatin1String("smb")) {
        finishedWithError(5, tr("Url scheme is not smb"));
        return;
    }
    const SmbUrl smbUrl(m_url.trimmed());
    if (!smbUrl.isValid()) {
        finishedWithError(5, tr("Incorrect url"));
        return;
    }
    if (smbUrl.host().isEmpty()) {
        finishedWithError(5, tr("Url must contain host name"));
        return;
    }
    if (smbUrl.share().isEmpty()) {
        finishedWithError(5, tr("Url must contain share name"));
        return;
    }
    m_tailPath = smbUrl.tailPath();
    auto* const job = new CheckSmbShareAuthJob(
        m_authenticator, smbUrl.share(), smbUrl.host(), smbUrl.workgroup(), this);
    connect(job, &Job::finished, this, &MountSmbURLJob::checkSmbAuthJobFinished);
    job->start();
}

void MountSmbURLJob::checkSmbAuthJobFinished(Job* job)
{
    auto* const checkJob = qobject_cast<CheckSmbShareAuthJob*>(job);
    if (checkJob->error() != 0) {
        finishedWithError(checkJob->error(), checkJob->errorString());
        return;
    }
    // Where a ticket is what worked, the share is reached under the name that the ticket is for.
    const QString share = checkJob->share();
    const QString host =
        checkJob->hostForKerberos().isEmpty() ? checkJob->host() : checkJob->hostForKerberos();
    QString network = VFS::ptr()->smbBrowser()->smbNetworkLocalPath();
    if (network.isEmpty()) {
        finishedWithError(5, tr("Can't get local path for samba network"));
        return;
    }
    if (!network.endsWith(slash)) {
        network += slash;
    }
    m_localPath = network + host + slash + share + slash + m_tailPath;
    finishedOk();
}

} // namespace VeyFM
