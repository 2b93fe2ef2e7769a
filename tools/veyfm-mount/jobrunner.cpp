// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobrunner.h"

#include "host/helpertexts.h"
#include "jobs/checksmbshareauthjob.h"
#include "jobs/job.h"
#include "jobs/mountftpurljob.h"
#include "jobs/mountsftpurljob.h"

#include <QEventLoop>
#include <QProcess>

namespace VeyFM {
namespace Mount {

namespace {

constexpr int cancelledCode = 2; // See Job.
constexpr int failedCode = 5;

} // namespace

JobRunner::JobRunner(SupervisorLink& link, const QString& scheme)
    : m_scheme(scheme)
    , m_authenticator(QSharedPointer<WorkerAuthenticator>::create(link))
{
}

WorkerAuthenticator& JobRunner::authenticator()
{
    return *m_authenticator;
}

/// False when it is worth to run another job.
bool JobRunner::runOnce(Job& job, JobResult* result)
{
    job.setDeleteOnFinish(false);
    m_authenticator->beginJob();
    bool ended = false;
    QEventLoop loop;
    QObject::connect(&job, &Job::finished, &loop, [&](Job* finished) {
        ended = true;
        *result = {finished->error(), finished->errorString()};
        loop.quit();
    });
    job.start();
    // All of an SFTP conversation happens in there.
    const bool isSilent = !ended && m_authenticator->protocol() == QLatin1String("sftp") &&
                          !m_authenticator->wasAccepted();
    if (isSilent) {
        return takeSilence(result);
    }
    const QList<QProcess*> tools = job.findChildren<QProcess*>();
    for (QProcess* tool : tools) {
        // The job waits for ever.
        QObject::connect(tool, &QProcess::errorOccurred, &loop, [&, tool](auto error) {
            if (error == QProcess::FailedToStart) {
                ended = true;
                *result = {
                    failedCode, QStringLiteral("%1 can't be started: %2")
                                    .arg(tool->program(), tool->errorString())};
                loop.quit();
            }
        });
    }
    if (!ended) {
        loop.exec();
    }
    if (result->code != 0 && !m_authenticator->whyEnded().isEmpty()) {
        *result = {failedCode, m_authenticator->whyEnded()};
    } else if (result->code != 0 && m_authenticator->isGivenUp()) {
        // The tool may have ended before it could be told.
        *result = {cancelledCode, cancelledText()};
    }
    return true;
}

bool JobRunner::takeSilence(JobResult* result)
{
    if (m_authenticator->isWorthAnotherJob()) {
        return false;
    }
    if (m_authenticator->isGivenUp()) {
        *result = {cancelledCode, cancelledText()};
    } else {
        *result = {failedCode, QLatin1String(Host::endedByServer)};
    }
    return true;
}

QString JobRunner::cancelledText() const
{
    if (m_scheme == QLatin1String("smb")) {
        return CheckSmbShareAuthJob::tr("Login cancelled");
    }
    return m_scheme == QLatin1String("ftp")
               ? MountFtpURLJob::tr("Accessing ftp resource was cancelled")
               : MountSFtpURLJob::tr("Accessing sftp resource was cancelled");
}

} // namespace Mount
} // namespace VeyFM
