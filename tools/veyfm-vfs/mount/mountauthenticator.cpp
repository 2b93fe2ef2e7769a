// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/mountauthenticator.h"

namespace VeyFM {
namespace Tool {

void MountAuthenticator::setAskedHandler(std::function<void()> handler)
{
    m_askedHandler = std::move(handler);
}

bool MountAuthenticator::hasMounted() const
{
    return m_hasMounted;
}

QString MountAuthenticator::requestPassword(
    bool isRetry, const QString& title, const QString& message, QString& user, bool* userChanged,
    bool* cancelled)
{
    QString password = TerminalAuthenticator::requestPassword(
        isRetry, title, message, user, userChanged, cancelled);
    noteAsked();
    return password;
}

bool MountAuthenticator::askQuestion(const QString& title, const QString& text)
{
    const bool yes = TerminalAuthenticator::askQuestion(title, text);
    noteAsked();
    return yes;
}

void MountAuthenticator::credentialsAccepted()
{
    m_hasMounted = true;
    TerminalAuthenticator::credentialsAccepted();
}

void MountAuthenticator::noteAsked() const
{
    if (m_askedHandler && !m_hasMounted)
        m_askedHandler();
}

} // namespace Tool
} // namespace VeyFM
