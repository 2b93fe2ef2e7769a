// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTRESOURCEJOB_H
#define VEYFM_MOUNTRESOURCEJOB_H

#include "core/entry.h"
#include "host/mountquestion.h"
#include "jobs/authenticator.h"
#include "jobs/job.h"
#include "veyfmvfshost_export.h"

#include <QSharedPointer>

namespace VeyFM {

class MountResourceJobPrivate;

/**
 * Mounts an "sftp" or "ftp" URL, or reaches an "smb" one, in a process of its own, the program
 * `veyfm-mount`. So it never blocks, whatever the server does, and can be cancelled at any moment.
 *
 * \code
 * auto* job = new VeyFM::MountResourceJob(QStringLiteral("sftp://anna@server/~/Documents"));
 * connect(job, &MountResourceJob::passwordRequested, this, [=](const MountQuestion& question) {
 *     auto* dialog = new LoginDialog(question, this);  // Answers whenever its user does.
 *     connect(dialog, &LoginDialog::accepted, job, [=] {
 *         job->answerPassword(dialog->user(), dialog->password());
 *     });
 *     connect(dialog, &LoginDialog::rejected, job, &MountResourceJob::giveUp);
 *     connect(job, &QObject::destroyed, dialog, &QObject::deleteLater);
 *     dialog->open();
 * });
 * connect(job, &MountResourceJob::confirmationRequested, ...);  // Likewise, with confirm().
 * connect(stopButton, &QPushButton::clicked, job, &MountResourceJob::cancel);
 * connect(job, &Job::finished, this, [=] {
 *     job->error() == 0 ? show(job->entry()) : showError(job->errorString());
 * });
 * job->start();
 * \endcode
 *
 * A URL that is mounted already is taken as it is. With a running file manager service the mount
 * is made known to all programs of the session. Where another program is mounting the same
 * resource, this waits, says so by waitingForOther(), and takes that mount. A URL leads to one
 * mount of its host and user, below which the folder lies. No password belongs into a URL; such a
 * one is refused.
 *
 * A mount that fails, is cancelled, or whose job is deleted leaves nothing behind: no process, no
 * directory, no mount. That holds as well when this process is killed. What a job has ended well
 * with stays mounted when this process ends; UnmountResourceJob takes it away.
 *
 * Codes and texts are those of the library's jobs, see Job and MountURLJob. 2 is also that of a
 * cancelled job, whoever cancelled. 5 stands too for what went wrong with the program, and for
 * setSilenceLimit().
 *
 * A job belongs to one thread, that of VFS, which must run an event loop and have called VFS::ptr()
 * before. It may be deleted at any time but in a slot of finished(), which comes once, and never
 * inside start().
 */
class VEYFMVFSHOST_EXPORT MountResourceJob : public Job
{
    Q_OBJECT

public:
    /// A job that asks by its signals. The URL is text, as a user types it.
    explicit MountResourceJob(const QString& url, QObject* parent = nullptr);

    /**
     * A job that asks @p authenticator, which it holds, in the place of its signals
     * passwordRequested() and confirmationRequested(). The calls come in the job's thread, which
     * stands still until they return: the authenticator runs an event loop while it waits for its
     * user, in which this job may be cancelled or deleted. It is asked once for each answer that is
     * needed, and need not remember any.
     */
    MountResourceJob(
        QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent = nullptr);
    ~MountResourceJob() override;

    /// The user to log in as, where the URL names none; before start().
    void setUser(const QString& user);

    /**
     * How many milliseconds the program may say nothing while no question is open; 0, as by
     * default, for any. After that the job is ended as by cancel(), but with code 5. To be set
     * before start(). A tool says nothing while it waits for its server, so think of slow ones.
     */
    void setSilenceLimit(int milliseconds);
    /// The limit in milliseconds.
    int silenceLimit() const;

    /**
     * How many milliseconds a look at what is mounted may take before it counts as dead; 5000 by
     * default. To be set before start().
     */
    void setPatience(int milliseconds);

    /**
     * Whether the answers that follow are the last ones: when the server refuses such a password
     * the job ends with code 2, and the server is not tried once more for the next question. False
     * by default.
     */
    void setLastTry(bool isLast);

    /**
     * The program to start in the place of the installed `veyfm-mount`; for tests. What is
     * installed is found by the place of this library.
     */
    void setHelperProgram(const QString& program);
    /// That program, by its absolute path.
    QString helperProgram() const;

    /// Begins. Only the first call does anything.
    void start() override;

    /// The question that waits for an answer, or nullptr. It stands until it is answered or the
    /// job ends.
    const MountQuestion* question() const;

    /// What came of it, set before finished(); empty, null or false where it failed. @{

    /// The URL, with the user that was taken in the end.
    QString url() const;

    /// The directory or file that the URL names.
    QString localPath() const;

    /// The path of its entry in the tree of places; empty where there is none, as without the
    /// service and for "smb" URLs. The words are those of veyfm-mount's language: use entry().
    QString path() const;

    /**
     * Its entry in the tree of this process. Null without the service, for "smb" URLs, where the
     * service has not told of the mount within a second, and where the server took longer than five
     * seconds to say what lies at the path: localPath() is there all the same.
     */
    Entry entry() const;

    /// The directory on which the host is mounted; empty for "smb" URLs.
    QString directory() const;

    /// Whether this job has mounted it, and not somebody before.
    bool isNew() const;

    /// Whether the service knows of the mount; and why not, for the user. @{
    bool isShared() const;
    QString whyNotShared() const;
    /// @}
    /// @}

public Q_SLOTS:
    /**
     * Ends the job with code 2, from any state. It finishes when everything has been taken back,
     * which takes some milliseconds as a rule, or after five seconds, when the rest is left to the
     * program. A mount that has been handed over already stays, and the job ends well.
     */
    void cancel();

    /// Answers to the open question, in any later moment; without one of that kind they do nothing.
    /// No copy of the password is kept. An empty password is a password. Another user than that of
    /// the question begins the mount anew in that name. @{
    void answerPassword(const QString& user, const QString& password);
    /// Another user alone: for ftp and sftp the password is asked for when it is needed.
    void answerUser(const QString& user);
    void confirm(bool yes);
    /// @}

    /// Answers the open question, of any kind, by that the user does not want to answer. The job
    /// ends with code 2.
    void giveUp();

Q_SIGNALS:
    /// Asks for a password, to be answered by answerPassword() or giveUp(). At most one question is
    /// open at a time.
    void passwordRequested(const VeyFM::MountQuestion& question);

    /// Asks for a yes or no, to be answered by confirm() or giveUp().
    void confirmationRequested(const VeyFM::MountQuestion& question);

    /// The server has refused the last answer, which was for that user.
    void credentialsRejected(const QString& user);

    /// The last answer was right, or none was needed.
    void credentialsAccepted();

    /// The job waits since something else is going on; the text tells the user what.
    void waitingForOther(const QString& text);

private:
    Q_DISABLE_COPY(MountResourceJob)
    Q_DECLARE_PRIVATE(MountResourceJob)
};

} // namespace VeyFM

#endif
