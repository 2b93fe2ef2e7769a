// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTFUSEENTRYJOB_H
#define VEYFM_MOUNTFUSEENTRYJOB_H

#include "core/entry.h"
#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

/**
 * Makes a network URL show in the place tree of every process of the session: the job for a host
 * that wants to show a URL. It takes a mount that is there, or makes one with MountURLJob, has
 * the service record it, and waits until the service has told everybody.
 *
 * Its URL is to be that of a root, as MountPaths::mountRootUrl() gives it: a server has one place
 * in the tree, which stands for whatever was mounted first, and the folder that a host wants to
 * show is below it. With the URL of a folder the next folder of the server would show the first.
 *
 * There is no bound on that wait: a service that never announces the mount leaves the job
 * running, and so does a user who gives up an SFTP login at its first question.
 *
 * Ends with code 2 for a user outside the "fuse" group, with code 1 when the URL makes no place
 * (one of the scheme "smb" never does: see UpdateSmbEntryJob), and with the code of MountURLJob.
 */
class VEYFMVFS_EXPORT MountFuseEntryJob : public Job
{
    Q_OBJECT

public:
    /// A job for a URL as text; it asks @p authenticator, which it holds.
    MountFuseEntryJob(
        QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent = nullptr);
    ~MountFuseEntryJob() override;

    /**
     * The path of the URL's entry, for VFS::entry(); empty until success.
     *
     * It leads there for a mount that was found, and for a URL of the root of a host. The place
     * of a mount that was made for another URL stands for the whole URL already, and this path
     * has that of the URL once more behind it: take the entry of VFS::fuseMountAdded() then.
     */
    QString path() const;

    void start() override;

private Q_SLOTS:
    void slotMountUrlFinished(Job* job);
    void slotFuseMountAdded(const QString& url, const Entry& entry);

private:
    QString pathBelow(const Entry& mount) const;

    const QString m_url;
    QString m_path;
    const QSharedPointer<Authenticator> m_authenticator;
    QString m_waitedUrl; // Whose registration the job waits for; empty until then.
};

} // namespace VeyFM

#endif
