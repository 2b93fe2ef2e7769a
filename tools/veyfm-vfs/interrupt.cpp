// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "interrupt.h"

#include "spinner.h"

#include <cerrno>
#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int graceMilliseconds = 500;
constexpr int partingMilliseconds = 2000;
constexpr char signalByte = 's';
constexpr char endByte = 'e';

// All that the handler touches.
std::atomic<int> handlerDescriptor{-1};
static_assert(std::atomic<int>::is_always_lock_free);

void handleSignal(int)
{
    const int error = errno;
    if (::write(handlerDescriptor, &signalByte, 1) < 0) {
        // The pipe holds a signal already.
    }
    errno = error;
}

/// The next byte of the pipe, or 0 when none comes in time. -1 waits for ever.
char nextByte(int descriptor, int milliseconds)
{
    pollfd poll = {descriptor, POLLIN, 0};
    int ready = 0;
    do {
        ready = ::poll(&poll, 1, milliseconds);
    } while (ready < 0 && errno == EINTR);
    char byte = 0;
    if (ready < 1 || ::read(descriptor, &byte, 1) != 1)
        return 0;
    return byte;
}

} // namespace

Interrupt::Interrupt(
    std::initializer_list<int> signalNumbers, int exitCode, std::function<void()> stop)
    : m_exitCode(exitCode)
    , m_stop(std::move(stop))
{
    if (::pipe2(m_pipe, O_CLOEXEC) != 0)
        return; // The signals keep their default effect, which ends the program as well.
    handlerDescriptor = m_pipe[1];

    // The signals are for the watching thread. A thread that waits for a file system would be
    // chosen, and never get to its handler.
    sigset_t signalSet;
    ::sigemptyset(&signalSet);
    for (const int number : signalNumbers)
        ::sigaddset(&signalSet, number);
    ::pthread_sigmask(SIG_BLOCK, &signalSet, &m_maskBefore);
    m_thread = std::thread([this, signalSet] {
        ::pthread_sigmask(SIG_UNBLOCK, &signalSet, nullptr);
        watch();
    });

    struct sigaction action = {};
    action.sa_handler = handleSignal;
    action.sa_flags = SA_RESTART | int(SA_RESETHAND);
    for (const int number : signalNumbers) {
        Handled& handled = m_handled[m_handledCount];
        handled.number = number;
        ::sigaction(number, nullptr, &handled.before);
        if (handled.before.sa_handler == SIG_IGN)
            continue;
        ::sigaction(number, &action, nullptr);
        ++m_handledCount;
    }
}

Interrupt::~Interrupt()
{
    for (int i = 0; i < m_handledCount; ++i)
        ::sigaction(m_handled[i].number, &m_handled[i].before, nullptr);
    if (m_thread.joinable()) {
        if (::write(m_pipe[1], &endByte, 1) == 1)
            m_thread.join();
        else
            m_thread.detach();
        ::pthread_sigmask(SIG_SETMASK, &m_maskBefore, nullptr);
    }
    handlerDescriptor = -1;
    ::close(m_pipe[0]);
    ::close(m_pipe[1]);
}

void Interrupt::setMessage(const QByteArray& message)
{
    const std::lock_guard<std::mutex> lock(m_messageLock);
    m_message = message;
}

bool Interrupt::wasRequested() const
{
    return m_requested;
}

void Interrupt::setWorkEnded()
{
    setMessage(QByteArray());
    m_workEnded = true;
}

void Interrupt::watch()
{
    if (nextByte(m_pipe[0], -1) != signalByte)
        return;
    m_requested = true;
    m_stop();
    if (nextByte(m_pipe[0], graceMilliseconds) != 0)
        return;
    if (m_workEnded && nextByte(m_pipe[0], partingMilliseconds) != 0)
        return;

    Spinner::end();
    const std::lock_guard<std::mutex> lock(m_messageLock);
    if (::write(STDERR_FILENO, m_message.constData(), size_t(m_message.size())) < 0) {
        // Nobody to tell.
    }
    ::_exit(m_exitCode);
}

} // namespace Tool
} // namespace VeyFM
