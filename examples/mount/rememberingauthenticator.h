// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef REMEMBERINGAUTHENTICATOR_H
#define REMEMBERINGAUTHENTICATOR_H

#include <VeyFM/Authenticator>

#include <QHash>

#include <optional>

struct Credentials
{
    QString user;
    QString password;
};

/**
 * Asks a person once for what a job asks twice.
 *
 * After a refused login, and after the person changed the user name, the FTP and SFTP jobs ask
 * once for their own use and once more when the tool has started again. The second time they get
 * the same answer from here, until the server has refused it; each server its own, since a jump
 * host may stand before the one of the URL. A person who has given up is not asked again either,
 * though the Samba job would. What SSH asks in other words than for a password, such as a one-time
 * code, is not remembered.
 */
class RememberingAuthenticator : public VeyFM::Authenticator
{
public:
    QString requestPassword(
        bool isRetry, const QString& title, const QString& message, QString& user,
        bool* userChanged, bool* cancelled) override;
    void credentialsRejected(const QString& user) override;
    void credentialsAccepted() override;
    bool askQuestion(const QString& title, const QString& text) override;

    /**
     * Whether an answer was given and nobody has said what became of it. When the start() of
     * an SFTP mount returns like this and the job has not finished, it never will: the person
     * gave up, did not trust the host, or the login failed right after the host was trusted.
     */
    bool isAnswerOpen() const;

protected:
    /// Asks for a user name and a password. The name must not be empty: without one the jobs
    /// can't tell that it was refused. Nothing when the person gives up.
    virtual std::optional<Credentials>
    ask(const QString& server, const QString& user, bool wasRejected) = 0;

    /// Asks for what the text, which is SSH's or the server's, says. Nothing when the person gives
    /// up.
    virtual std::optional<QString> askOther(const QString& text) = 0;

    /// Asks for a yes or a no.
    virtual bool confirm(const QString& text) = 0;

private:
    struct Known
    {
        std::optional<Credentials> answer;
        bool wasRejected = false;
    };

    QHash<QString, Known> m_known; ///< By server.
    bool m_hasGivenUp = false;
    bool m_isOwnWords = false;    ///< The last question.
    bool m_isNextDropped = false; ///< What the job gets for its next question is of no use to it.
    bool m_isAnswerOpen = false;
};

#endif
