// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef TERMINAL_H
#define TERMINAL_H

#include <QElapsedTimer>
#include <QObject>
#include <QSocketNotifier>
#include <QTimer>

#include <functional>

#include <signal.h>
#include <termios.h>

/// The terminal of a program that goes on while somebody thinks and types. While nothing is asked
/// it counts the seconds of the wait. To be made before there are other threads.
class Terminal : public QObject
{
    Q_OBJECT

public:
    enum Echo { Shown, Hidden };

    Terminal();
    ~Terminal() override;

    void say(const QString& text);

    /// The answer comes later, in the event loop: a line, or null at the end of the input.
    void
    ask(const QString& prompt, Echo echo, const std::function<void(const QString&)>& takeAnswer);

    /// Gives the terminal back as it was. Does not return where a signal has interrupted: ends the
    /// program by it.
    void leave();

Q_SIGNALS:
    /// Ctrl-C, or another signal that ends a program. A second one does so at once.
    void interrupted();

private:
    void wait();
    void endWait();
    void endQuestion();
    void readLine();
    void takeSignal();

    sigset_t m_endingSignals = {};
    const int m_signals;
    int m_received = 0; ///< The number of a signal.
    QSocketNotifier m_input;
    QSocketNotifier m_signalNotifier;
    QTimer m_second;
    QElapsedTimer m_waited;
    std::function<void(const QString&)> m_takeAnswer;
    QByteArray m_typed;
    termios m_before = {};
    bool m_isHidden = false;
};

#endif
