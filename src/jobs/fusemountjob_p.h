// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FUSEMOUNTJOB_P_H
#define VEYFM_FUSEMOUNTJOB_P_H

#include "jobs/fusemount_p.h"
#include "jobs/job_p.h"

namespace VeyFM {

/// What the FTP and SFTP jobs have in common: their results, what they have learnt of the tool
/// while it runs, and what comes of its end. Their conversations with it are their own.
class FuseMountJobPrivate : public JobPrivate
{
public:
    FuseMountJobPrivate(const QString& url, QSharedPointer<Authenticator> authenticator);

    /// Asks for the password, in the words of the job.
    virtual FuseMount::Answer requestPassword(QString* password) = 0;

    /// Takes the mount that the service knows of, if there is one, with a path below its root.
    bool takeRegisteredMount(const QString& relativePath);

    enum End {
        Over,        ///< Nothing more is to be done, or the job has been deleted.
        RunAgain,    ///< As after a refusal.
        UserChanged, ///< The same, unless the new user has a mount already.
        GivenUp,
        Failed,
        Mounted,
    };
    /// Takes the end of the tool. The directory is gone where the job has to fail.
    End takeEnd(int exitCode);

    FuseMount mount;
    QString localPath;
    // Each is consumed by the end of the tool.
    bool accessDenied = false;
    bool restartRequested = false;
    bool cancelled = false;
    bool failed = false; ///< Whatever the tool says of its end.
};

} // namespace VeyFM

#endif
