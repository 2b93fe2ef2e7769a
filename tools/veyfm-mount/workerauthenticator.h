// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_WORKERAUTHENTICATOR_H
#define VEYFM_MOUNT_WORKERAUTHENTICATOR_H

#include "jobs/authenticator.h"
#include "supervisorlink.h"

#include <QSet>

namespace VeyFM {
namespace Mount {

/**
 * Asks the host.
 *
 * After a refusal the FTP and SFTP jobs ask twice, and throw the first answer away. That question
 * shows by no tool running, and the host hears of the second alone. Where the host takes another
 * user the job of an FTP or SFTP URL is told that it was cancelled: the mount begins anew, on
 * another directory.
 */
class WorkerAuthenticator : public Authenticator
{
public:
    explicit WorkerAuthenticator(SupervisorLink& link);
    ~WorkerAuthenticator() override;

    QString requestPassword(
        bool isRetry, const QString& title, const QString& message, QString& user,
        bool* userChanged, bool* cancelled) override;
    void credentialsRejected(const QString& user) override;
    void credentialsAccepted() override;
    bool askQuestion(const QString& title, const QString& text) override;

    /// What stands for the user that a Samba job begins without.
    void setOfferedUser(const QString& user);

    /// The host whose user may be changed. Another one that asks is on the way there.
    void setMountHost(const QString& host);

    /// To be called before a job: forgets what the one before was told, but not what was refused.
    void beginJob();

    /// Whether the job told that a login has worked.
    bool wasAccepted() const;

    /// Whether the person does not want it any more: no question is asked then.
    bool isGivenUp() const;

    /// The user to begin anew with, null where there is none; none behind that.
    QString takeNewUser();

    /// Why a job was told that it was cancelled, where nobody wanted that.
    QString whyEnded() const;

    /**
     * To be called when a job has ended without a word. Whether it is worth to start another: an
     * SFTP job does not tell that a password was wrong if the key of the host was confirmed in
     * the same run. The next job asks again then.
     */
    bool isWorthAnotherJob();

private:
    QString resource() const;
    QString ask(MountProtocol::Question question, bool isUsed, QString& user, bool* cancelled);
    QString whyUnfit(const QString& user, bool isUserChanged, const QString& password) const;

    SupervisorLink& m_link;
    QString m_offeredUser;
    QString m_mountHost;
    QString m_newUser;
    QString m_keptPassword;       ///< Came with the new user. Null where there is none.
    QString m_keptFor;            ///< The resource.
    QSet<QString> m_refused;      ///< Resources.
    QSet<QString> m_asked;        ///< Since the tool has been started.
    bool m_passwordGiven = false; ///< Since the tool has been started.
    bool m_isLastTry = false;     ///< Whether the last answer is followed by no other.
    bool m_keyConfirmed = false;
    bool m_wasAccepted = false;
    bool m_isGivenUp = false;
    QString m_whyEnded;
};

} // namespace Mount
} // namespace VeyFM

#endif
