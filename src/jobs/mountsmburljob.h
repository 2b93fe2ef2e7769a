// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTSMBURLJOB_H
#define VEYFM_MOUNTSMBURLJOB_H

#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

/**
 * Turns an "smb" URL into the local path of its file. No tool mounts anything here: the service
 * keeps the Samba network reachable below one directory, so the job proves that the user may
 * read the share, and works out the path.
 *
 * As a rule it ends inside start(). All its own failures have code 5; those of
 * CheckSmbShareAuthJob pass through.
 */
class VEYFMVFS_EXPORT MountSmbURLJob : public Job
{
    Q_OBJECT

public:
    /// A job for a URL as text; it asks @p authenticator, which it holds.
    MountSmbURLJob(
        QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent = nullptr);
    ~MountSmbURLJob() override;

    QString url() const;       ///< The URL as it was passed in.
    QString localPath() const; ///< The result, empty until success.

    void start() override;

private Q_SLOTS:
    void checkSmbAuthJobFinished(Job* job);

private:
    const QString m_url;
    const QSharedPointer<Authenticator> m_authenticator;
    QString m_tailPath;
    QString m_localPath;
};

} // namespace VeyFM

#endif
