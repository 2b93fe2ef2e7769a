// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_JOBRUNNER_H
#define VEYFM_MOUNT_JOBRUNNER_H

#include "workerauthenticator.h"

#include <QSharedPointer>
#include <QString>

namespace VeyFM {

class Job;

namespace Mount {

/// How a job ended.
struct JobResult
{
    int code = 0;
    QString text;
};

/// Runs the jobs of one mount, which share the answers of the person.
class JobRunner
{
public:
    JobRunner(SupervisorLink& link, const QString& scheme);

    WorkerAuthenticator& authenticator();

    /// Runs a job, and another one as long as that is of use. Calls @p take with the one that did
    /// well.
    template <typename MadeJob, typename Take>
    JobResult run(const QString& url, const Take& take)
    {
        while (true) {
            MadeJob job(m_authenticator, url);
            JobResult result;
            if (runOnce(job, &result)) {
                if (result.code == 0) {
                    take(job);
                }
                return result;
            }
        }
    }

private:
    bool runOnce(Job& job, JobResult* result);
    bool takeSilence(JobResult* result);
    QString cancelledText() const;

    const QString m_scheme;
    const QSharedPointer<WorkerAuthenticator> m_authenticator;
};

} // namespace Mount
} // namespace VeyFM

#endif
