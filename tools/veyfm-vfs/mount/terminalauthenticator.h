// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_TERMINALAUTHENTICATOR_H
#define VEYFM_TOOL_TERMINALAUTHENTICATOR_H

#include "jobs/authenticator.h"
#include "mount/login.h"
#include "mount/prompt.h"
#include "mount/secret.h"

#include <QHash>

#include <functional>

namespace VeyFM {
namespace Tool {

/**
 * Answers the jobs of one command with what the person at the terminal types, or with what the
 * command line gives in place of that.
 *
 * There are three tries, and one for a password that is not typed. Then, and when the person gives
 * up, every question of the job is answered with "cancelled", and whyGivenUp() says why.
 *
 * What ssh asks in other words than for a password is asked in its words. Where nobody can be, it
 * has to do without the passphrase of a key, and a password that is not typed goes to the host of
 * the URL alone, not to one on the way.
 *
 * From the first object on the process leaves no core file.
 */
class TerminalAuthenticator : public Authenticator
{
public:
    explicit TerminalAuthenticator(const Login& login);
    ~TerminalAuthenticator() override;

    QString requestPassword(
        bool isRetry, const QString& title, const QString& message, QString& user,
        bool* userChanged, bool* cancelled) override;
    void credentialsRejected(const QString& user) override;
    void credentialsAccepted() override;
    bool askQuestion(const QString& title, const QString& text) override;

    /// To be called before a job: forgets what was told of the one before. The tries at one
    /// resource are counted on.
    void beginJob();

    /// Whom the URL of the next job names. The user may be empty, and its questions may change
    /// that.
    void setAccount(const QString& user, const QString& host);

    /// What a person types to look at the host of an SFTP job.
    QString sshCommand() const;

    /// Why such a job failed, and that.
    QString withSshCommand(const char* why) const;

    /// Whether the job told that a login has worked.
    bool wasAccepted() const;

    /// Whether the job was stopped while it waited for --password-fd.
    bool isDescriptorSilent() const;

    /// Whom the job logs in as by now; may be empty.
    QString user() const;

    /// Whether the last answer was the last one of all, should it be refused.
    bool isLastTry() const;

    /// Why a job was given up, with what helps: a question had no answer, or the last answer was
    /// refused. Empty when all had one, and there are more.
    QString whyGivenUp() const;

    /// Called with true before a person is asked and with false behind, in the thread of the job.
    void setAskingHandler(std::function<void(bool)> handler);

    /// Answers every question of the running job with "cancelled", from any thread.
    void cancel();

private:
    class Asking;

    /// What became of the answers to one question.
    struct Tries
    {
        int count = 0;
        bool wasRefused = false;
    };

    QString resource() const;
    QString whose(const QString& user) const;
    bool isOnTheWay() const;
    bool isPersonAsked() const;
    bool isUserAsked(const QString& user) const;
    QString answerOwnWords(const QString& question, const QString& user, bool* cancelled);
    QString whyNoAnswer(const QString& needed, const QString& options) const;
    QString whyNotAnswered() const;
    QString whyNoMoreTries() const;
    QString whyNoUserName(QString& user);
    QString whyNoPassword(const QString& user, const QString& question, Secret& password);
    QString whyNotFromDescriptor(const QString& user, Secret& password);
    void noteChangedUser(const QString& user);
    QString giveUp(const QString& why, bool* cancelled);

    const Login m_login;
    Prompt m_prompt;
    QString m_user;
    QString m_host;
    std::function<void(bool)> m_askingHandler;

    QHash<QString, Tries> m_tries; ///< By resource, or by the question that is not its password.
    bool m_descriptorRead = false;
    bool m_isDescriptorSilent = false;
    bool m_wasAccepted = false;
    QString m_whyGivenUp;
};

} // namespace Tool
} // namespace VeyFM

#endif
