// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/prompt.h"

#include "terminal.h"

#include <QStringList>

#include <array>
#include <cerrno>
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

// Signals that stop or end the program, which would leave the terminal without its echo. Those
// that the program ends on by itself come back as cancel().
constexpr std::array<int, 2> watchedSignals = {SIGTSTP, SIGQUIT};

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
    pendingSignal = number;
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
            if (m_before[i].sa_handler != SIG_IGN)
                ::sigaction(watchedSignals[i], &action, nullptr);
        }
    }
    ~SignalWatch()
    {
        for (size_t i = 0; i < watchedSignals.size(); ++i)
            ::sigaction(watchedSignals[i], &m_before[i], nullptr);
    }
    SignalWatch(const SignalWatch&) = delete;
    SignalWatch& operator=(const SignalWatch&) = delete;

private:
    std::array<struct sigaction, watchedSignals.size()> m_before = {};
};

class HiddenInput;

std::mutex hiddenLock; // For what follows.
const HiddenInput* hiddenInput = nullptr;

/// The terminal without its echo, as long as the object lives.
class HiddenInput
{
public:
    explicit HiddenInput(int terminal)
        : m_terminal(terminal)
        , m_changed(::tcgetattr(terminal, &m_before) == 0)
    {
        if (!m_changed)
            return;
        const std::lock_guard<std::mutex> lock(hiddenLock);
        termios hidden = m_before;
        hidden.c_lflag &= ~tcflag_t(ECHO | ECHOE | ECHOK | ECHONL);
        m_changed = ::tcsetattr(terminal, TCSAFLUSH, &hidden) == 0;
        hiddenInput = this;
    }
    ~HiddenInput()
    {
        const std::lock_guard<std::mutex> lock(hiddenLock);
        hiddenInput = nullptr;
        putBack();
    }
    HiddenInput(const HiddenInput&) = delete;
    HiddenInput& operator=(const HiddenInput&) = delete;

    bool isHidden() const
    {
        return m_changed;
    }
    void putBack() const
    {
        if (m_changed)
            ::tcsetattr(m_terminal, TCSAFLUSH, &m_before);
    }

private:
    const int m_terminal;
    termios m_before = {};
    bool m_changed;
};

void writeAll(int descriptor, const QByteArray& bytes)
{
    int done = 0;
    while (done < bytes.size()) {
        const ssize_t written =
            ::write(descriptor, bytes.constData() + done, size_t(bytes.size() - done));
        if (written < 0 && errno != EINTR)
            return; // A terminal that has gone shows at the next read.
        if (written > 0)
            done += int(written);
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
    if (m_terminal >= 0)
        ::close(m_terminal);
    if (m_wake >= 0)
        ::close(m_wake);
}

bool Prompt::isAvailable() const
{
    return m_terminal >= 0;
}

void Prompt::show(const QString& lines)
{
    QString text = lines;
    text.remove(QLatin1Char('\r'));
    while (text.endsWith(QLatin1Char('\n')))
        text.chop(1);
    const QStringList all = text.split(QLatin1Char('\n'));
    for (const QString& line : all)
        writeAll(m_terminal, (escaped(line) + QLatin1Char('\n')).toLocal8Bit());
}

bool Prompt::ask(const QString& question, Echo echo, Secret& answer)
{
    const QByteArray bytes = escaped(question).toLocal8Bit();
    while (true) {
        int signalNumber = 0;
        bool answered = false;
        {
            const SignalWatch signals(m_wake);
            const HiddenInput hidden(echo == Hidden ? m_terminal : -1);
            if (echo == Hidden && !hidden.isHidden())
                return false;
            writeAll(m_terminal, bytes);
            answered = readLine(m_terminal, answer);
            signalNumber = pendingSignal;
            if (echo == Hidden || !answered)
                writeAll(m_terminal, QByteArrayLiteral("\n"));
        }
        if (signalNumber == 0)
            return answered;
        // Now for real. What was stopped goes on here, with the question again.
        ::raise(signalNumber);
    }
}

bool Prompt::readLine(int descriptor, Secret& answer)
{
    answer.clear();
    bool any = false;
    while (waitForInput(descriptor)) {
        char byte = 0;
        const ssize_t size = ::read(descriptor, &byte, 1);
        if (size < 0 && (errno == EINTR || errno == EAGAIN))
            continue;
        if (size == 0 && any)
            return true; // A last line without its end.
        if (size <= 0)
            return false;
        any = true;
        if (byte == '\n')
            return true;
        answer.append(byte);
        if (answer.isTooLong())
            return true;
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
    const std::lock_guard<std::mutex> lock(hiddenLock);
    if (hiddenInput)
        hiddenInput->putBack();
}

bool Prompt::isCancelled() const
{
    return m_cancelled;
}

void Prompt::restart()
{
    m_cancelled = false;
}

bool Prompt::waitForInput(int descriptor) const
{
    while (true) {
        pollfd polled[] = {{descriptor, POLLIN, 0}, {m_wake, POLLIN, 0}};
        const int ready = ::poll(polled, 2, -1);
        if (ready < 0 && errno != EINTR)
            return false;
        if (polled[1].revents != 0 && !m_cancelled) {
            quint64 count = 0;
            [[maybe_unused]] const ssize_t size = ::read(m_wake, &count, sizeof count);
        }
        if (m_cancelled || pendingSignal != 0)
            return false;
        if (ready > 0 && polled[0].revents != 0)
            return true;
    }
}

} // namespace Tool
} // namespace VeyFM
