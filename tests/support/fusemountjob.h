// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_FUSEMOUNTJOB_H
#define VEYFM_TESTS_FUSEMOUNTJOB_H

#include "jobs/mountftpurljob.h"
#include "jobs/mountsftpurljob.h"

#include <functional>
#include <memory>

/// A job of either protocol with its results, which the two have in common, but no class for it.
struct FuseMountJob
{
    template <typename MadeJob>
    explicit FuseMountJob(std::unique_ptr<MadeJob> made)
        : url([job = made.get()] { return job->url(); })
        , localPath([job = made.get()] { return job->localPath(); })
        , job(std::move(made))
    {
    }

    VeyFM::Job* operator->() const
    {
        return job.get();
    }

    std::function<QString()> url;
    std::function<QString()> localPath;
    std::unique_ptr<VeyFM::Job> job;

    /// The job of a protocol, which has "ftp" or "sftp" as its scheme, for any URL.
    static FuseMountJob make(
        const QString& scheme, const QSharedPointer<VeyFM::Authenticator>& authenticator,
        const QString& url)
    {
        using namespace VeyFM;
        FuseMountJob made =
            scheme == QLatin1String("ftp")
                ? FuseMountJob(std::make_unique<MountFtpURLJob>(authenticator, url))
                : FuseMountJob(std::make_unique<MountSFtpURLJob>(authenticator, url));
        made->setDeleteOnFinish(false);
        return made;
    }
};

#endif
