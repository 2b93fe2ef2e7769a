// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_WATCHEDJOB_H
#define VEYFM_TOOL_WATCHEDJOB_H

#include "mount/terminalauthenticator.h"
#include "signalpipe.h"

#include <QSharedPointer>

#include <atomic>
#include <chrono>
#include <functional>
#include <mutex>
#include <thread>

class QEventLoop;

namespace VeyFM {

class Job;

namespace Tool {

class Invocation;

/// How a job came to its end.
struct JobResult
{
    enum End {
        Finished,    ///< By itself, with the code and text below.
        Silent,      ///< Without a word: it will not finish any more.
        NotStarted,  ///< Its tool could not be started; the text says why.
        TimedOut,    ///< It got no further in the time that it had.
        Interrupted, ///< By a signal.
    };

    End end = Silent;
    int code = 0; ///< Job::error().
    QString text; ///< Job::errorString().

    bool isOk() const
    {
        return end == Finished && code == 0;
    }
};

/// --timeout of a verb that runs jobs under watch.
Option jobTimeoutOption();

/// Its value in seconds; 0 for no bound.
int jobTimeout(const Invocation& invocation);

/// To be called when the verb has ended. Where a job had to be stopped, what the program still does
/// may take two seconds more, and is cut off then.
void boundParting();

/**
 * Runs the jobs of a verb, one after the other, and sees to it that each comes to an end: jobs
 * may by their contract stay unfinished for ever, and some block their thread.
 *
 * A job gets so many seconds in which neither it ends nor somebody is asked; those that the
 * program is stopped (Ctrl-Z) don't count. When they are over, or on SIGINT, SIGTERM or SIGHUP, a
 * thread of this object has the authenticator cancel every question, and ends the tools that the
 * job has started and starts, until it comes back. One that does not is cut off after five seconds:
 * the cleaning is done, the reason is reported, and the program exits. As long as the object lives
 * signals end only jobs, so a verb can clean up behind them. Another signal, half a second behind
 * the first or later, cuts off what is left of that. When the object has ended behind a signal,
 * others have no effect: see boundParting(). Signals that are ignored when the object is made stay
 * ignored.
 *
 * The signals are not blocked, and programs that are started meanwhile don't have them blocked.
 * One object at a time, and none beside an Interrupt.
 */
class JobWatch
{
public:
    JobWatch(QSharedPointer<TerminalAuthenticator> authenticator, int timeoutSeconds);
    ~JobWatch();

    /// What a cut off is reported of, and what is done before it, in another thread.
    void setCutOff(const QString& what, const std::function<void()>& cleanUp = {});

    /// Runs a job to its end, showing on the terminal what takes its time. The caller owns it:
    /// it must not delete itself.
    JobResult run(Job& job, const QString& doing);

    /// Does what may block on the service, unless a signal came before. It has the time of a job,
    /// and is cut off behind that, or half a second after a signal.
    void call(const std::function<void()>& work);

    /// Whether a signal came. The verb then ends, and says so once.
    bool wasInterrupted() const;

    /// The words for a job that timed out or was interrupted.
    QString whyStopped() const;

private:
    Q_DISABLE_COPY(JobWatch)

    using Clock = std::chrono::steady_clock;

    enum State { Idle, InJob, InCall };

    JobResult resultOf(Job& job);
    bool wasStopped() const;
    void setState(State state, bool clockRuns);
    State state();
    bool hasNextTurn();
    int millisecondsToWait();
    Clock::time_point runningTime() const;
    SignalPipe::Byte nextByte(int milliseconds);
    void watch();
    bool stop();
    void quitLoop();
    [[noreturn]] void cutOff();

    const QSharedPointer<TerminalAuthenticator> m_authenticator;
    const int m_timeoutSeconds;
    SignalPipe m_pipe;
    std::atomic<bool> m_interrupted{false}; ///< Whether the thread has seen the signal.
    std::atomic<bool> m_timedOut{false};

    std::mutex m_lock; ///< For what follows.
    State m_state = Idle;
    int m_turn = 0;         ///< Counts jobs and calls.
    int m_timedOutTurn = 0; ///< The last one that had no time left.
    bool m_clockRuns = false;
    bool m_isNew = false; ///< Its time begins when the thread takes note.
    QEventLoop* m_loop = nullptr;
    QString m_what;
    std::function<void()> m_cleanUp;

    // Of the thread alone.
    Clock::duration m_lost{0}; ///< The time that the program was stopped.
    Clock::time_point m_deadline;

    std::thread m_thread;
};

/// JobWatch::call() where there is no job, with a watch of its own. That a signal came, in words,
/// or empty.
QString askService(const QString& what, int timeoutSeconds, const std::function<void()>& work);

} // namespace Tool
} // namespace VeyFM

#endif
