// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "terminal.h"

#include <QTextStream>

#include <cerrno>
#include <utility>

#include <sys/signalfd.h>
#include <unistd.h>

namespace {

void show(const QString& text)
{
    QTextStream(stdout) << text << Qt::flush;
}

/// Blocks the signals that end a program, to read them from a descriptor, but for those that
/// whoever started this has switched off, as nohup does.
int descriptorOfSignals(sigset_t* ending)
{
    ::sigemptyset(ending);
    for (const int number : {SIGINT, SIGQUIT, SIGTERM, SIGHUP}) {
        struct sigaction action = {};
        ::sigaction(number, nullptr, &action);
        if (action.sa_handler != SIG_IGN) {
            ::sigaddset(ending, number);
        }
    }
    ::pthread_sigmask(SIG_BLOCK, ending, nullptr);
    return ::signalfd(-1, ending, SFD_CLOEXEC);
}

} // namespace

Terminal::Terminal()
    : m_signals(descriptorOfSignals(&m_endingSignals))
    , m_input(STDIN_FILENO, QSocketNotifier::Read)
    , m_signalNotifier(m_signals, QSocketNotifier::Read)
{
    m_input.setEnabled(false);
    connect(&m_input, &QSocketNotifier::activated, this, &Terminal::readLine);
    connect(&m_signalNotifier, &QSocketNotifier::activated, this, &Terminal::takeSignal);
    connect(&m_second, &QTimer::timeout, this, [this] {
        show(QStringLiteral("\rWaiting for %1 s").arg(qRound(m_waited.elapsed() / 1000.0)));
    });
    wait();
}

Terminal::~Terminal()
{
    endWait();
    endQuestion();
    ::close(m_signals);
}

void Terminal::wait()
{
    m_waited.start();
    if (::isatty(STDOUT_FILENO) != 0) {
        m_second.start(1000);
    }
}

void Terminal::endWait()
{
    if (m_second.isActive() && m_waited.elapsed() >= 1000) {
        show(QStringLiteral("\r\033[K"));
    }
    m_second.stop();
}

void Terminal::say(const QString& text)
{
    endWait();
    show(text + QLatin1Char('\n'));
    wait();
}

void Terminal::ask(
    const QString& prompt, Echo echo, const std::function<void(const QString&)>& takeAnswer)
{
    endWait();
    if (echo == Hidden && ::tcgetattr(STDIN_FILENO, &m_before) == 0) {
        termios hidden = m_before;
        hidden.c_lflag &= ~tcflag_t(ECHO);
        ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &hidden);
        m_isHidden = true;
    }
    m_takeAnswer = takeAnswer;
    m_input.setEnabled(true);
    show(prompt);
}

void Terminal::endQuestion()
{
    m_input.setEnabled(false);
    m_takeAnswer = nullptr;
    if (std::exchange(m_isHidden, false)) {
        ::tcsetattr(STDIN_FILENO, TCSAFLUSH, &m_before);
        show(QStringLiteral("\n"));
    }
}

// A byte at a time: what follows the line is for the next question, or for another program.
void Terminal::readLine()
{
    char byte = 0;
    const ssize_t size = ::read(STDIN_FILENO, &byte, 1);
    if (size < 0 && (errno == EINTR || errno == EAGAIN)) {
        return;
    }
    if (size > 0 && byte != '\n') {
        m_typed += byte;
        return;
    }
    QByteArray line = std::exchange(m_typed, QByteArray());
    const bool isEnd = size <= 0 && line.isEmpty();
    const std::function<void(const QString&)> takeAnswer = std::exchange(m_takeAnswer, nullptr);
    endQuestion();
    wait();
    takeAnswer(isEnd ? QString() : QString::fromLocal8Bit(line.isNull() ? "" : line));
    line.fill('\0');
}

void Terminal::takeSignal()
{
    signalfd_siginfo signal = {};
    if (::read(m_signals, &signal, sizeof signal) != ssize_t(sizeof signal)) {
        return;
    }
    m_received = int(signal.ssi_signo);
    m_signalNotifier.setEnabled(false);
    ::pthread_sigmask(SIG_UNBLOCK, &m_endingSignals, nullptr);
    endQuestion();
    say(QStringLiteral("Tidying up; a second Ctrl-C does not wait for that."));
    Q_EMIT interrupted();
}

void Terminal::leave()
{
    endWait();
    endQuestion();
    if (m_received != 0) {
        ::signal(m_received, SIG_DFL);
        ::raise(m_received);
    }
}
