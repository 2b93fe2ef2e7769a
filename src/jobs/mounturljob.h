// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTURLJOB_H
#define VEYFM_MOUNTURLJOB_H

#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

/**
 * Mounts an "smb", "ftp" or "sftp" URL by the job of its scheme, and passes the result on. Any
 * other scheme ends it with code 5.
 */
class VEYFMVFS_EXPORT MountURLJob : public Job
{
    Q_OBJECT

public:
    /// A job for a URL as text; it asks @p authenticator, which it holds.
    MountURLJob(
        QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent = nullptr);
    ~MountURLJob() override;

    QString url() const;       ///< As Qt writes it, with a user name that was changed on the way.
    QString localPath() const; ///< The result, empty until success.

    void start() override;

private Q_SLOTS:
    void smbSubJobFinished(Job* job);
    void ftpSubJobFinished(Job* job);
    void sftpSubJobFinished(Job* job);

private:
    template <typename SubJob>
    void takeResult(Job* job);

    QString m_url;
    const QSharedPointer<Authenticator> m_authenticator;
    QString m_localPath;
};

} // namespace VeyFM

#endif
