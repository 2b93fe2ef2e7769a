// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "rememberingauthenticator.h"

// The texts that come in are left out: the FTP and SFTP jobs speak of denied access at their very
// first question. What has been refused is known here.
QString RememberingAuthenticator::requestPassword(
    bool /*isRetry*/, const QString& /*title*/, const QString& /*message*/, QString& user,
    bool* userChanged, bool* cancelled)
{
    m_isAnswerOpen = true;
    if (!m_answer && !m_hasGivenUp) {
        m_answer = ask(server(), user, m_wasRejected);
        m_hasGivenUp = !m_answer;
    }
    if (m_hasGivenUp) {
        *cancelled = true;
        return QString();
    }
    if (m_answer->user != user) {
        // The job starts again as this user, and asks again.
        user = m_answer->user;
        *userChanged = true;
        m_isAnswerOpen = false;
    }
    return m_answer->password;
}

void RememberingAuthenticator::credentialsRejected(const QString& /*user*/)
{
    m_answer.reset();
    m_wasRejected = true;
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
