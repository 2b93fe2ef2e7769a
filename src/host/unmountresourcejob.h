// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_UNMOUNTRESOURCEJOB_H
#define VEYFM_UNMOUNTRESOURCEJOB_H

#include "core/entry.h"
#include "jobs/job.h"
#include "veyfmvfshost_export.h"

#include <QStringList>

namespace VeyFM {

class UnmountResourceJobPrivate;

/**
 * Unmounts what a MountResourceJob, or any other job of the library, has mounted for an "sftp" or
 * "ftp" URL: the whole mount of the host and user, wherever below it the entry lies. The empty
 * directory goes as well, and the service is made to look, so that it forgets the mount.
 *
 * \code
 * auto* job = new VeyFM::UnmountResourceJob(entry);
 * connect(job, &Job::finished, this, [=] {
 *     if (job->error() != 0) {
 *         showError(job->errorString());  // "… is in use by: less (4711)"
 *     }
 * });
 * job->start();
 * \endcode
 *
 * Only mounts of FUSE below VFSSettings::mountRootPath() are touched. Links on the way are
 * followed, those in a mount are not, and nothing in here looks into the mount: one whose server
 * has gone can't hold it up.
 *
 * While another program mounts there, this waits for five seconds at most.
 *
 * Ends with code 5 for what is no such mount, for one that is in use, and for one that can't be
 * unmounted. It never blocks, and belongs to one thread, that of VFS, which must have called
 * VFS::ptr() before. It may be deleted at any time but in a slot of finished(), which comes once,
 * and never inside start(); what was begun goes on then.
 *
 * The place of the mount stays in the tree of each process that knows it, as long as that runs.
 */
class VEYFMVFSHOST_EXPORT UnmountResourceJob : public Job
{
    Q_OBJECT

public:
    /// A job for the mount that an entry lies in. An entry of an "sftp" or "ftp" URL stands for the
    /// mount of that.
    explicit UnmountResourceJob(const Entry& entry, QObject* parent = nullptr);

    /// The same for a URL, an absolute local path, or the path of a place, such as
    /// "SFTP/anna@server", and what lies below it.
    explicit UnmountResourceJob(const QString& text, QObject* parent = nullptr);
    ~UnmountResourceJob() override;

    /**
     * Whether a mount that is in use goes all the same: from the tree of files at once, and whole
     * when nobody uses it any more. So goes one whose server has gone. False by default. To be set
     * before start(). @{
     */
    void setLazy(bool lazy);
    bool isLazy() const;
    /// @}

    /// Begins. Only the first call does anything.
    void start() override;

    /// The directory that is unmounted, without links; empty as long as none is known.
    QString directory() const;

    /// After a failure, the programs that use the mount, such as "less (4711)", by the numbers of
    /// their processes. Those of other users are not seen.
    QStringList holders() const;

private:
    Q_DISABLE_COPY(UnmountResourceJob)
    Q_DECLARE_PRIVATE(UnmountResourceJob)
};

} // namespace VeyFM

#endif
