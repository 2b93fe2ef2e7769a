// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/terminalsession.h"

#include <QElapsedTimer>
#include <QFile>
#include <QVector>

#include <cerrno>
#include <poll.h>
#include <pty.h>
#include <signal.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>

namespace {

constexpr int patience = 30000;

QVector<char*> pointers(QList<QByteArray>& texts)
{
    QVector<char*> result;
    for (QByteArray& text : texts) {
        result.append(text.data());
    }
    result.append(nullptr);
    return result;
}

} // namespace

TerminalSession::TerminalSession(
    const QString& program, const QStringList& arguments, const QString& directory,
    const QProcessEnvironment& environment, int columns)
{
    QList<QByteArray> argumentTexts = {QFile::encodeName(program)};
    for (const QString& argument : arguments) {
        argumentTexts.append(QFile::encodeName(argument));
    }
    QList<QByteArray> environmentTexts;
    const QStringList variables = environment.toStringList();
    for (const QString& variable : variables) {
        environmentTexts.append(QFile::encodeName(variable));
    }
    // Between fork and exec nothing may allocate.
    const QVector<char*> argv = pointers(argumentTexts);
    const QVector<char*> envp = pointers(environmentTexts);
    const QByteArray cwd = QFile::encodeName(directory);

    winsize size = {};
    size.ws_row = 24;
    size.ws_col = ushort(columns);
    m_pid = ::forkpty(&m_master, nullptr, nullptr, &size);
    if (m_pid != 0) {
        return;
    }
    termios settings = {};
    ::tcgetattr(STDOUT_FILENO, &settings);
    settings.c_oflag &= ~tcflag_t(OPOST);
    ::tcsetattr(STDOUT_FILENO, TCSANOW, &settings);
    if (::chdir(cwd.constData()) == 0) {
        ::execve(argv.constFirst(), argv.constData(), envp.constData());
    }
    ::_exit(127);
}

TerminalSession::~TerminalSession()
{
    if (m_pid > 0) {
        ::kill(m_pid, SIGKILL);
        ::waitpid(m_pid, nullptr, 0);
    }
    if (m_master >= 0) {
        ::close(m_master);
    }
}

void TerminalSession::type(const QByteArray& keys)
{
    if (::write(m_master, keys.constData(), size_t(keys.size())) != keys.size()) {
        m_output += "[typing failed]";
    }
}

TerminalSession::Read TerminalSession::readOnce()
{
    pollfd poll = {m_master, POLLIN, 0};
    if (::poll(&poll, 1, 100) == 0) {
        return Read::Nothing;
    }
    char buffer[4096];
    const ssize_t size = ::read(m_master, buffer, sizeof buffer);
    // EIO is how a pseudo-terminal says that nobody has the other side open.
    if (size <= 0) {
        return size < 0 && errno == EINTR ? Read::Nothing : Read::End;
    }
    m_output.append(buffer, int(size));
    return Read::Some;
}

bool TerminalSession::waitFor(const QByteArray& text, int times)
{
    QElapsedTimer timer;
    timer.start();
    while (m_output.count(text) < times) {
        if (timer.hasExpired(patience) || readOnce() == Read::End) {
            return m_output.count(text) >= times;
        }
    }
    return true;
}

int TerminalSession::waitForEnd()
{
    QElapsedTimer timer;
    timer.start();
    while (readOnce() != Read::End) {
        if (timer.hasExpired(patience)) {
            return -1;
        }
    }
    int status = 0;
    if (::waitpid(m_pid, &status, 0) != m_pid) {
        return -1;
    }
    m_pid = -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

bool TerminalSession::hasEcho() const
{
    termios settings = {};
    return ::tcgetattr(m_master, &settings) == 0 && (settings.c_lflag & ECHO) != 0;
}

QByteArray TerminalSession::output() const
{
    return m_output;
}

pid_t TerminalSession::processId() const
{
    return m_pid;
}
