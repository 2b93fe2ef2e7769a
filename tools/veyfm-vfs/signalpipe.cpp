// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "signalpipe.h"

#include "ending.h"

#include <atomic>
#include <cerrno>
#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

// All that the handler touches.
std::atomic<int> handlerDescriptor{-1};
std::atomic<bool> signalCaught{false};
static_assert(std::atomic<int>::is_always_lock_free && std::atomic<bool>::is_always_lock_free);

void sendByte(int descriptor, SignalPipe::Byte byte)
{
    if (::write(descriptor, &byte, 1) < 0) {
        // The pipe is full of what wakes the reader just as well.
    }
}

void handleSignal(int number)
{
    const int error = errno;
    noteCaughtSignal(number);
    // Not with the byte: what else got the signal may have an effect before the pipe is read.
    signalCaught = true;
    sendByte(handlerDescriptor, SignalPipe::Signal);
    errno = error;
}

} // namespace

SignalPipe::SignalPipe()
{
    signalCaught = false;
    if (::pipe2(m_pipe, O_CLOEXEC) == 0) {
        handlerDescriptor = m_pipe[1];
    }
}

SignalPipe::~SignalPipe()
{
    if (!isOpen()) {
        return;
    }
    handlerDescriptor = -1;
    ::close(m_pipe[0]);
    ::close(m_pipe[1]);
}

bool SignalPipe::isOpen() const
{
    return m_pipe[0] >= 0;
}

void SignalPipe::catchSignals(std::initializer_list<int> numbers, int flags)
{
    Q_ASSERT(numbers.size() <= sizeof m_handled / sizeof m_handled[0]);
    struct sigaction action = {};
    action.sa_handler = handleSignal;
    action.sa_flags = flags;
    for (const int number : numbers) {
        Handled& handled = m_handled[m_handledCount];
        handled.number = number;
        ::sigaction(number, nullptr, &handled.before);
        if (handled.before.sa_handler == SIG_IGN) {
            continue;
        }
        ::sigaction(number, &action, nullptr);
        ++m_handledCount;
    }
}

void SignalPipe::releaseSignals()
{
    for (int i = 0; i < m_handledCount; ++i) {
        ::sigaction(m_handled[i].number, &m_handled[i].before, nullptr);
    }
    m_handledCount = 0;
}

bool SignalPipe::hasCaught() const
{
    return signalCaught;
}

void SignalPipe::send(Byte byte)
{
    sendByte(m_pipe[1], byte);
}

SignalPipe::Byte SignalPipe::next(int milliseconds)
{
    pollfd poll = {m_pipe[0], POLLIN, 0};
    int ready = 0;
    do {
        ready = ::poll(&poll, 1, milliseconds);
    } while (ready < 0 && errno == EINTR);
    Byte byte = Nothing;
    if (ready < 1 || ::read(m_pipe[0], &byte, 1) != 1) {
        return Nothing;
    }
    return byte;
}

} // namespace Tool
} // namespace VeyFM
