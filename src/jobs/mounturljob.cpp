// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mounturljob.h"

#include "core/urltext.h"
#include "jobs/mountftpurljob.h"
#include "jobs/mountsftpurljob.h"
#include "jobs/mountsmburljob.h"

namespace VeyFM {

MountURLJob::MountURLJob(
    QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent)
    : Job(parent)
    , m_url(url)
    , m_authenticator(std::move(authenticator))
{
}

MountURLJob::~MountURLJob() = default;

QString MountURLJob::url() const
{
    return m_url;
}

QString MountURLJob::localPath() const
{
    return m_localPath;
}

void MountURLJob::start()
{
    const QString scheme = UrlText::writtenScheme(m_url);
    Job* job = nullptr;
    if (scheme == QLatin1String("smb")) {
        job = new MountSmbURLJob(m_authenticator, m_url, this);
        connect(job, &Job::finished, this, &MountURLJob::smbSubJobFinished);
    } else if (scheme == QLatin1String("ftp")) {
        job = new MountFtpURLJob(m_authenticator, m_url, this);
        connect(job, &Job::finished, this, &MountURLJob::ftpSubJobFinished);
    } else if (scheme == QLatin1String("sftp")) {
        job = new MountSFtpURLJob(m_authenticator, m_url, this);
        connect(job, &Job::finished, this, &MountURLJob::sftpSubJobFinished);
    } else {
        finishedWithError(5, tr("This network protocol is not supported"));
        return;
    }
    job->start();
}

void MountURLJob::smbSubJobFinished(Job* job)
{
    takeResult<MountSmbURLJob>(job);
}

void MountURLJob::ftpSubJobFinished(Job* job)
{
    takeResult<MountFtpURLJob>(job);
}

void MountURLJob::sftpSubJobFinished(Job* job)
{
    takeResult<MountSFtpURLJob>(job);
}

template <typename SubJob>
void MountURLJob::takeResult(Job* job)
{
    auto* const subJob = qobject_cast<SubJob*>(job);
    if (subJob->error() != 0) {
        finishedWithError(subJob->error(), subJob->errorString());
        return;
    }
    m_url = subJob->url();
    m_localPath = subJob->localPath();
    finishedOk();
}

} // namespace VeyFM
