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
#include <vector>

#include <sys/types.h>

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
        TimedOut,    ///< It got no further in the time that it had.
        Interrupted, ///< By a signal.
    };

    End end = Finished;
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
 * Runs the jobs of a verb in the event loop, one after the other, and what asks the service and
 * blocks, and sees to it that each comes to an end.
 *
 * A job gets so many seconds in which neither it ends nor somebody is asked; those that the
 * program is stopped (Ctrl-Z) don't count. When they are over, or on SIGINT, SIGTERM or SIGHUP, the
 * authenticator cancels every question, and the job is stopped. What can't be stopped, since it
 * waits for the service, is cut off: the reason is reported, and the program exits. As long as the
 * object lives signals end only jobs, so a verb can clean up behind them. Another signal, half a
 * second behind the first or later, cuts off what is left of that. When the object has ended behind
 * a signal, others have no effect: see boundParting(). Signals that are ignored when the object is
 * made stay ignored.
 *
 * The signals are not blocked, and programs that are started meanwhile don't have them blocked.
 * One object at a time, and none beside an Interrupt.
 */
class JobWatch
{
public:
    JobWatch(QSharedPointer<TerminalAuthenticator> authenticator, int timeoutSeconds);
    ~JobWatch();

    /// What a cut off is reported of.
    void setCutOff(const QString& what);

    /**
     * Runs a job to its end, showing on the terminal what takes its time. The caller owns it: it
     * must not delete itself. To stop it @p cancel is called in its thread, again and again until
     * it finishes. A job without that is left where it stands, and the programs that this thread
     * has started for it are ended, since it may wait for one of them.
     */
    JobResult run(Job& job, const QString& doing, const std::function<void()>& cancel = {});

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

    void setLoop(QEventLoop* loop, const std::function<void()>& cancel);
    void setState(State state, bool clockRuns);
    State state();
    bool hasNextTurn();
    int millisecondsToWait();
    Clock::time_point runningTime() const;
    SignalPipe::Byte nextByte(int milliseconds);
    void watch();
    bool stop();
    void stopJob(Clock::duration elapsed);
    [[noreturn]] void cutOff();

    const QSharedPointer<TerminalAuthenticator> m_authenticator;
    const int m_timeoutSeconds;
    const std::vector<pid_t> m_otherChildren; ///< That no job has started.
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
    std::function<void()> m_cancel;
    QString m_what;

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
