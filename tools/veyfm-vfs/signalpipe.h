// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SIGNALPIPE_H
#define VEYFM_TOOL_SIGNALPIPE_H

#include <QtGlobal>

#include <initializer_list>

#include <signal.h>

namespace VeyFM {
namespace Tool {

/// Has signals come as bytes of a pipe, which a thread reads. One object at a time.
class SignalPipe
{
public:
    enum Byte : char {
        Nothing = 0, ///< None came in time.
        Signal = 's',
        Change = 'c', ///< The reader is to look at what another thread has changed.
        End = 'e',    ///< The reader is to end.
    };

    SignalPipe();
    /// Signals that were not released have no effect any more.
    ~SignalPipe();

    bool isOpen() const;

    /// Those that are ignored stay so.
    void catchSignals(std::initializer_list<int> numbers, int flags);

    /// Gives the signals back to what handled them before.
    void releaseSignals();

    /// Whether a signal came, read or not. From any thread.
    bool hasCaught() const;

    /// From any thread.
    void send(Byte byte);

    /// The next byte. -1 waits for ever.
    Byte next(int milliseconds);

private:
    Q_DISABLE_COPY(SignalPipe)

    struct Handled
    {
        int number;
        struct sigaction before;
    };

    Handled m_handled[3] = {};
    int m_handledCount = 0;
    int m_pipe[2] = {-1, -1};
};

} // namespace Tool
} // namespace VeyFM

#endif
