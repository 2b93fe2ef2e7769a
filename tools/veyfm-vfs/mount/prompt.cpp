// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/prompt.h"

#include "terminal.h"

#include <QEventLoop>
#include <QSocketNotifier>
#include <QStringList>
#include <QTimer>

#include <array>
#include <cerrno>
#include <chrono>
#include <fcntl.h>
#include <mutex>
#include <poll.h>
#include <signal.h>
#include <sys/eventfd.h>
#include <termios.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

// Signals that stop or end the program, which would leave the terminal without its echo, and the
// one that comes when it goes on after a stop that can't be seen, with other modes of the terminal
// perhaps. Those that the program ends on by itself come back as cancel().
constexpr std::array<int, 3> watchedSignals = {SIGTSTP, SIGQUIT, SIGCONT};

// A stop without effect is tried again so often, at this pace.
constexpr int mostStops = 20;
constexpr std::chrono::milliseconds pace(100);

// All that the handler touches.
std::atomic<int> pendingSignal{0};
std::atomic<int> wakeDescriptor{-1};
static_assert(std::atomic<int>::is_always_lock_free);

void wake(int descriptor)
{
    const quint64 one = 1;
    if (::write(descriptor, &one, sizeof one) < 0) {
        // It is awake already.
    }
}

void noteSignal(int number)
{
    const int error = errno;
    // SIGCONT comes along with others, and says the least.
    int none = 0;
    if (!pendingSignal.compare_exchange_strong(none, number) && number != SIGCONT) {
        pendingSignal = number;
    }
    wake(wakeDescriptor);
    errno = error;
}

/// As long as it lives, watched signals only wake a Prompt.
class SignalWatch
{
public:
    explicit SignalWatch(int descriptor)
    {
        pendingSignal = 0;
        wakeDescriptor = descriptor;
        struct sigaction action = {};
        action.sa_handler = noteSignal;
        action.sa_flags = SA_RESTART;
        for (size_t i = 0; i < watchedSignals.size(); ++i) {
            ::sigaction(watchedSignals[i], nullptr, &m_before[i]);
            if (m_before[i].sa_handler != SIG_IGN) {
                ::sigaction(watchedSignals[i], &action, nullptr);
            }
        }
    }
    ~SignalWatch()
    {
        for (size_t i = 0; i < watchedSignals.size(); ++i) {
            ::sigaction(watchedSignals[i], &m_before[i], nullptr);
        }
    }
    SignalWatch(const SignalWatch&) = delete;
    SignalWatch& operator=(const SignalWatch&) = delete;

private:
    std::array<struct sigaction, watchedSignals.size()> m_before = {};
};

/// Whether the terminal is for this program now, and not for the shell that has started it.
bool isInForeground(int terminal)
{
    return ::tcgetpgrp(terminal) == ::getpgrp();
}

class HiddenInput;

std::mutex hiddenLock; // For what follows.
HiddenInput* hiddenInput = nullptr;

/**
 * The terminal without its echo, between hide() and putBack().
 *
 * In the background its modes are those of another program: they are neither read nor changed,
 * which would stop this one.
 */
class HiddenInput
{
public:
    explicit HiddenInput(int terminal)
        : m_terminal(terminal)
    {
        const std::lock_guard<std::mutex> lock(hiddenLock);
        hiddenInput = this;
    }
    ~HiddenInput()
    {
        const std::lock_guard<std::mutex> lock(hiddenLock);
        hiddenInput = nullptr;
    }
    HiddenInput(const HiddenInput&) = delete;
    HiddenInput& operator=(const HiddenInput&) = delete;

    bool hide()
    {
        const std::lock_guard<std::mutex> lock(hiddenLock);
        // Where they could not be put back, the terminal may still have those without an echo.
        if (!m_isOwed && ::tcgetattr(m_terminal, &m_before) != 0) {
            return false;
        }
        termios hidden = m_before;
        hidden.c_lflag &= ~tcflag_t(ECHO | ECHOE | ECHOK | ECHONL);
        m_isOwed = true;
        return ::tcsetattr(m_terminal, TCSAFLUSH, &hidden) == 0;
    }
    void putBack()
    {
        const std::lock_guard<std::mutex> lock(hiddenLock);
        putBackLocked();
    }
    static void putBackFromElsewhere()
    {
        const std::lock_guard<std::mutex> lock(hiddenLock);
        if (hiddenInput) {
            hiddenInput->putBackLocked();
        }
    }

private:
    void putBackLocked()
    {
        if (m_isOwed && isInForeground(m_terminal)) {
            m_isOwed = ::tcsetattr(m_terminal, TCSAFLUSH, &m_before) != 0;
        }
    }

    const int m_terminal;
    termios m_before = {};
    bool m_isOwed = false; ///< m_before, to the terminal.
};

void writeAll(int descriptor, const QByteArray& bytes)
{
    int done = 0;
    while (done < bytes.size()) {
        const ssize_t written =
            ::write(descriptor, bytes.constData() + done, size_t(bytes.size() - done));
        if (written < 0 && errno != EINTR) {
            return; // A terminal that has gone shows at the next read.
        }
        if (written > 0) {
            done += int(written);
        }
    }
}

} // namespace

Prompt::Prompt()
    : m_terminal(::open("/dev/tty", O_RDWR | O_NOCTTY | O_CLOEXEC))
    , m_wake(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK))
{
}

Prompt::~Prompt()
{
    if (m_terminal >= 0) {
        ::close(m_terminal);
    }
    if (m_wake >= 0) {
        ::close(m_wake);
    }
}

bool Prompt::isAvailable() const
{
    return m_terminal >= 0;
}

void Prompt::show(const QString& lines)
{
    QString text = lines;
    text.remove(QLatin1Char('\r'));
    while (text.endsWith(QLatin1Char('\n'))) {
        text.chop(1);
    }
    const QStringList all = text.split(QLatin1Char('\n'));
    for (const QString& line : all) {
        writeAll(m_terminal, (escaped(line) + QLatin1Char('\n')).toLocal8Bit());
    }
}

bool Prompt::ask(const QString& question, Echo echo, Secret& answer)
{
    const QByteArray bytes = escaped(question).toLocal8Bit();
    HiddenInput input(m_terminal);
    while (waitForForeground()) {
        bool answered = false;
        {
            const SignalWatch signals(m_wake);
            if (echo == Hidden && !input.hide()) {
                return false;
            }
            writeAll(m_terminal, bytes);
            answered = readLine(m_terminal, answer);
            if (echo == Hidden || !answered) {
                writeAll(m_terminal, QByteArrayLiteral("\n"));
            }
            input.putBack();
        }
        const int signalNumber = pendingSignal;
        // Now for real. What was stopped goes on here, with the question again.
        if (signalNumber != 0) {
            ::raise(signalNumber);
        }
        if (answered || signalNumber == 0) {
            return answered;
        }
    }
    return false;
}

/// In the background stops the program, as reading would do, until the terminal is for it. False
/// when it won't be.
bool Prompt::waitForForeground()
{
    for (int stops = 0; stops < mostStops; ++stops) {
        if (m_cancelled) {
            return false;
        }
        if (isInForeground(m_terminal)) {
            return true;
        }
        // A shell looks after the group as a whole.
        ::kill(0, SIGTTIN);
        // A signal that came with the one to go on may be on its way to cancel() yet.
        QEventLoop loop;
        QTimer::singleShot(pace, &loop, &QEventLoop::quit);
        loop.exec();
    }
    m_isOutOfReach = true;
    return false;
}

bool Prompt::readLine(int descriptor, Secret& answer)
{
    answer.clear();
    bool any = false;
    while (waitForInput(descriptor)) {
        char byte = 0;
        const ssize_t size = ::read(descriptor, &byte, 1);
        if (size < 0 && (errno == EINTR || errno == EAGAIN)) {
            continue;
        }
        if (size == 0 && any) {
            return true; // A last line without its end.
        }
        if (size <= 0) {
            return false;
        }
        any = true;
        if (byte == '\n') {
            return true;
        }
        answer.append(byte);
        if (answer.isTooLong()) {
            return true;
        }
    }
    answer.clear();
    return false;
}

void Prompt::cancel()
{
    m_cancelled = true;
    wake(m_wake);
}

void Prompt::restoreTerminal()
{
    HiddenInput::putBackFromElsewhere();
}

bool Prompt::isCancelled() const
{
    return m_cancelled;
}

bool Prompt::isOutOfReach() const
{
    return m_isOutOfReach;
}

void Prompt::restart()
{
    m_cancelled = false;
}

bool Prompt::waitForInput(int descriptor) const
{
    while (true) {
        pollfd polled[] = {{descriptor, POLLIN, 0}, {m_wake, POLLIN, 0}};
        const int ready = ::poll(polled, 2, 0);
        if (ready < 0 && errno != EINTR) {
            return false;
        }
        if (polled[1].revents != 0 && !m_cancelled) {
            quint64 count = 0;
            [[maybe_unused]] const ssize_t size = ::read(m_wake, &count, sizeof count);
        }
        if (m_cancelled || pendingSignal != 0) {
            return false;
        }
        if (ready > 0 && polled[0].revents != 0) {
            return true;
        }
        // All else goes on meanwhile.
        QEventLoop loop;
        const QSocketNotifier input(descriptor, QSocketNotifier::Read);
        const QSocketNotifier woken(m_wake, QSocketNotifier::Read);
        QObject::connect(&input, &QSocketNotifier::activated, &loop, &QEventLoop::quit);
        QObject::connect(&woken, &QSocketNotifier::activated, &loop, &QEventLoop::quit);
        loop.exec();
    }
}

} // namespace Tool
} // namespace VeyFM
