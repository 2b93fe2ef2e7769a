// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "interrupt.h"

#include "ending.h"
#include "spinner.h"
#include "verb.h"

#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int graceMilliseconds = 500;
constexpr int partingMilliseconds = 2000;

} // namespace

Interrupt::Interrupt(std::initializer_list<int> signalNumbers, std::function<void()> stop)
    : m_stop(std::move(stop))
{
    if (!m_pipe.isOpen()) {
        return; // The signals keep their default effect, which ends the program as well.
    }

    // The signals are for the watching thread. A thread that waits for a file system would be
    // chosen, and never get to its handler.
    sigset_t signalSet;
    ::sigemptyset(&signalSet);
    for (const int number : signalNumbers) {
        ::sigaddset(&signalSet, number);
    }
    ::pthread_sigmask(SIG_BLOCK, &signalSet, &m_maskBefore);
    m_thread = std::thread([this, signalSet] {
        ::pthread_sigmask(SIG_UNBLOCK, &signalSet, nullptr);
        watch();
    });

    m_pipe.catchSignals(signalNumbers, SA_RESTART | int(SA_RESETHAND));
}

Interrupt::~Interrupt()
{
    m_pipe.releaseSignals();
    if (!m_thread.joinable()) {
        return;
    }
    m_pipe.send(SignalPipe::End);
    m_thread.join();
    ::pthread_sigmask(SIG_SETMASK, &m_maskBefore, nullptr);
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
    if (m_pipe.next(-1) != SignalPipe::Signal) {
        return;
    }
    m_requested = true;
    m_stop();
    if (m_pipe.next(graceMilliseconds) != SignalPipe::Nothing) {
        return;
    }
    if (m_workEnded && m_pipe.next(partingMilliseconds) != SignalPipe::Nothing) {
        return;
    }

    Spinner::end();
    const std::lock_guard<std::mutex> lock(m_messageLock);
    if (::write(STDERR_FILENO, m_message.constData(), size_t(m_message.size())) < 0) {
        // Nobody to tell.
    }
    endAtOnce(Failed);
}

} // namespace Tool
} // namespace VeyFM
