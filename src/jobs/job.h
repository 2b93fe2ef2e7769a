// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_JOB_H
#define VEYFM_JOB_H

#include "veyfmvfs_export.h"

#include <QObject>
#include <QString>
#include <QVariant>

#include <memory>

namespace VeyFM {

class JobPrivate;

/**
 * An operation that has to wait for a tool, a user or the service.
 *
 * A job is created, connected to, and started once, by start() or exec(). It ends by finished(),
 * and tells success or failure by error() and errorString(). A job that deletes itself goes by
 * deleteLater(), so every slot of finished() runs with a live job, but must not keep the pointer.
 *
 * Jobs have no threads: a job stays in the thread that created it. One that waits for the news of
 * the service ends by the first that fits; should a second come before the event loop turns,
 * finished() comes again. A job may be deleted at any time but in a slot of finished().
 *
 * Codes: 0 success; 1 the entry or the service can't serve the request; 2 the user gave up, or
 * the operation was refused to the user; 4 the user may not browse Samba shares, being outside
 * the "fuse" group; 5 bad input or a failed mount. A job that wraps another one passes its code
 * and text on.
 */
class VEYFMVFS_EXPORT Job : public QObject
{
    Q_OBJECT

public:
    /// A job with nothing done yet.
    explicit Job(QObject* parent = nullptr);
    ~Job() override;

    /// Begins the work. A job may finish before this returns.
    virtual void start() = 0;

    /**
     * Runs the job to its end in a nested event loop that leaves user input queued. For a job that
     * never finishes this returns only when somebody deletes it. The job is
     * still alive when this returns, so the caller may read error(), but a job that deletes
     * itself goes at the next return to an event loop.
     */
    void exec();

    /// Whether the job deletes itself when it has finished, as it does by default. @{
    bool isDeleteOnFinish() const;
    void setDeleteOnFinish(bool deleteOnFinish);
    /// @}

    /// A value that the caller hangs on the job; nothing here looks at it. @{
    QVariant data() const;
    void setData(const QVariant& data);
    /// @}

    /// 0, or why the job failed.
    int error() const;

    /// What went wrong, for the user; null after success.
    QString errorString() const;

    /// Stores both and ends nothing.
    void setError(int errorCode, const QString& errorString);

public Q_SLOTS:
    /// finishedOk() at the next turn of the event loop.
    void finishedOkLater();

    /// Ends the job with success, whatever setError() has left.
    void finishedOk();

    /// Ends the job with a failure. The code is stored as it comes.
    void finishedWithError(int errorCode, QString errorString);

Q_SIGNALS:
    /// The end of the job.
    void finished(Job* job);

protected:
    /// For a subclass with a longer private part, which the job takes over.
    Job(JobPrivate& dd, QObject* parent);

    /// What the job keeps.
    std::unique_ptr<JobPrivate> const d_ptr;

private:
    void finish();

    Q_DISABLE_COPY(Job)
    Q_DECLARE_PRIVATE(Job)
};

} // namespace VeyFM

#endif
