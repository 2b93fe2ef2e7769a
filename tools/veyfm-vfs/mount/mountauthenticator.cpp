// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/mountauthenticator.h"

namespace VeyFM {
namespace Tool {

void MountAuthenticator::setQuestionHandler(std::function<void(bool asking)> handler)
{
    m_questionHandler = std::move(handler);
}

bool MountAuthenticator::hasMounted() const
{
    return m_hasMounted;
}

QString MountAuthenticator::requestPassword(
    bool isRetry, const QString& title, const QString& message, QString& user, bool* userChanged,
    bool* cancelled)
{
    noteQuestion(true);
    QString password = TerminalAuthenticator::requestPassword(
        isRetry, title, message, user, userChanged, cancelled);
    noteQuestion(false);
    return password;
}

bool MountAuthenticator::askQuestion(const QString& title, const QString& text)
{
    noteQuestion(true);
    const bool yes = TerminalAuthenticator::askQuestion(title, text);
    noteQuestion(false);
    return yes;
}

void MountAuthenticator::credentialsAccepted()
{
    m_hasMounted = true;
    TerminalAuthenticator::credentialsAccepted();
}

void MountAuthenticator::noteQuestion(bool asking) const
{
    if (m_questionHandler && !m_hasMounted) {
        m_questionHandler(asking);
    }
}

} // namespace Tool
} // namespace VeyFM
