// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "rememberingauthenticator.h"

#include <VeyFM/MountSFtpURLJob>

#include <utility>

// The texts for a password are left out: the FTP and SFTP jobs speak of denied access at their very
// first question. What has been refused is known here.
QString RememberingAuthenticator::requestPassword(
    bool /*isRetry*/, const QString& /*title*/, const QString& message, QString& user,
    bool* userChanged, bool* cancelled)
{
    m_isAnswerOpen = true;
    if (std::exchange(m_isNextDropped, false)) {
        return QString();
    }
    m_isOwnWords = protocol() == QLatin1String("sftp") &&
                   message != VeyFM::MountSFtpURLJob::tr("Enter host password for user:");
    if (m_hasGivenUp) {
        *cancelled = true;
        return QString();
    }
    if (m_isOwnWords) {
        const std::optional<QString> answer = askOther(message);
        m_hasGivenUp = !answer;
        *cancelled = m_hasGivenUp;
        return answer.value_or(QString());
    }
    Known& known = m_known[server()];
    if (!known.answer) {
        known.answer = ask(server(), user, known.wasRejected);
    }
    if (!known.answer) {
        m_hasGivenUp = true;
        *cancelled = true;
        return QString();
    }
    if (known.answer->user != user) {
        // The job starts again as this user, and asks again.
        user = known.answer->user;
        *userChanged = true;
        m_isAnswerOpen = false;
    }
    return known.answer->password;
}

void RememberingAuthenticator::credentialsRejected(const QString& /*user*/)
{
    m_known[server()] = {std::nullopt, true};
    // What was asked in other words is asked in them again, when the tool has started again.
    m_isNextDropped = m_isOwnWords;
}

void RememberingAuthenticator::credentialsAccepted()
{
    m_isAnswerOpen = false;
}

bool RememberingAuthenticator::askQuestion(const QString& /*title*/, const QString& text)
{
    m_isAnswerOpen = true;
    return confirm(text);
}

bool RememberingAuthenticator::isAnswerOpen() const
{
    return m_isAnswerOpen;
}
