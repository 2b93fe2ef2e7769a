// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_INTERRUPT_H
#define VEYFM_TOOL_INTERRUPT_H

#include "signalpipe.h"

#include <QByteArray>

#include <atomic>
#include <functional>
#include <initializer_list>
#include <mutex>
#include <thread>

#include <signal.h>

namespace VeyFM {
namespace Tool {

/**
 * Ends work on a signal, as long as the object lives; one at a time.
 *
 * On the first signal a thread of this object calls @p stop and gives the work half a second to
 * come to its end by itself. Work that hangs, in the directory of a server that has gone or in
 * a pipe that nobody reads, is cut off then: the program writes the message and ends. It dies of
 * the signal in any case, see ending.h. A second signal has its default effect. Signals that are
 * ignored when the object is made stay ignored.
 *
 * The signals are blocked in the thread that makes the object, as long as it lives. A program
 * started meanwhile inherits that.
 */
class Interrupt
{
public:
    Interrupt(std::initializer_list<int> signalNumbers, std::function<void()> stop);
    ~Interrupt();

    /// What goes to standard error when work is cut off.
    void setMessage(const QByteArray& message);

    bool wasRequested() const;

    /// The work has come to its end on a signal, and has told so. What is left to do before the
    /// program ends may take two seconds more, and is cut off without a word.
    void setWorkEnded();

private:
    Q_DISABLE_COPY(Interrupt)

    void watch();

    sigset_t m_maskBefore = {};
    SignalPipe m_pipe;
    const std::function<void()> m_stop;
    std::atomic<bool> m_requested{false};
    std::atomic<bool> m_workEnded{false};
    std::mutex m_messageLock;
    QByteArray m_message;
    std::thread m_thread;
};

} // namespace Tool
} // namespace VeyFM

#endif
