// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "consoleauthenticator.h"

#include <QTextStream>

#include <iterator>

#include <signal.h>
#include <termios.h>
#include <unistd.h>

namespace {

constexpr int endingSignals[] = {SIGINT, SIGQUIT, SIGTERM, SIGHUP};

termios before = {}; // Of the terminal. Not of the object below: the handler reads it.

/// Puts the terminal back. The signal comes again behind this, and then has its usual effect.
void endBySignal(int number)
{
    ::tcsetattr(STDIN_FILENO, TCSANOW, &before);
    ::raise(number);
}

/// What is typed does not show as long as this lives, nor longer where Ctrl-C ends the program.
class HiddenInput
{
public:
    HiddenInput()
    {
        m_isTerminal = ::tcgetattr(STDIN_FILENO, &before) == 0;
        if (!m_isTerminal) {
            return;
        }
        struct sigaction ending = {};
        ending.sa_handler = endBySignal;
        ending.sa_flags = int(SA_RESETHAND);
        for (size_t i = 0; i < std::size(endingSignals); ++i) {
            ::sigaction(endingSignals[i], &ending, &m_actions[i]);
            if (m_actions[i].sa_handler == SIG_IGN) {
                ::sigaction(endingSignals[i], &m_actions[i], nullptr);
            }
        }
        termios hidden = before;
        hidden.c_lflag &= ~tcflag_t(ECHO);
        ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &hidden);
    }
    ~HiddenInput()
    {
        if (!m_isTerminal) {
            return;
        }
        ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &before);
        for (size_t i = 0; i < std::size(endingSignals); ++i) {
            ::sigaction(endingSignals[i], &m_actions[i], nullptr);
        }
    }

private:
    Q_DISABLE_COPY(HiddenInput)

    bool m_isTerminal = false;
    struct sigaction m_actions[std::size(endingSignals)] = {};
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
