// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "consoleauthenticator.h"

#include <QTextStream>

#include <termios.h>
#include <unistd.h>

namespace {

/// What is typed does not show as long as this lives.
class HiddenInput
{
public:
    HiddenInput()
    {
        m_isTerminal = ::tcgetattr(STDIN_FILENO, &m_before) == 0;
        termios hidden = m_before;
        hidden.c_lflag &= ~tcflag_t(ECHO);
        if (m_isTerminal) {
            ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &hidden);
        }
    }
    ~HiddenInput()
    {
        if (m_isTerminal) {
            ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &m_before);
        }
    }

private:
    Q_DISABLE_COPY(HiddenInput)

    bool m_isTerminal = false;
    termios m_before = {};
};

/// A line; null at the end of the input.
QString readLine(const QString& prompt)
{
    static QTextStream input(stdin);
    QTextStream(stdout) << prompt << Qt::flush;
    return input.readLine();
}

/// The same for what is a secret.
QString readSecret(const QString& prompt)
{
    const HiddenInput hidden;
    const QString secret = readLine(prompt);
    QTextStream(stdout) << '\n';
    return secret;
}

/// What a server may have sent; control characters steer terminals.
QString harmless(const QString& text)
{
    QString shown;
    for (const QChar character : text) {
        const bool isHarmless = character.isPrint() || character == QLatin1Char('\n');
        shown += isHarmless ? character : QChar(QLatin1Char(' '));
    }
    return shown;
}

} // namespace

std::optional<Credentials>
ConsoleAuthenticator::ask(const QString& server, const QString& user, bool wasRejected)
{
    if (wasRejected) {
        QTextStream(stdout) << QStringLiteral("The login was refused.\n");
    }
    const QString name = readLine(QStringLiteral("User on %1 [%2]: ").arg(server, user));
    Credentials credentials = {name.isEmpty() ? user : name, QString()};
    if (credentials.user.isEmpty()) {
        return std::nullopt;
    }
    credentials.password = readSecret(QStringLiteral("Password: "));
    if (credentials.password.isNull()) {
        return std::nullopt;
    }
    return credentials;
}

std::optional<QString> ConsoleAuthenticator::askOther(const QString& text)
{
    const QString answer = readSecret(harmless(text));
    return answer.isNull() ? std::nullopt : std::make_optional(answer);
}

bool ConsoleAuthenticator::confirm(const QString& text)
{
    return readLine(harmless(text) + QLatin1Char(' ')) == QLatin1String("yes");
}
