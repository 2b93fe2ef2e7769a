// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/watchedjob.h"

#include "commandline.h"
#include "ending.h"
#include "jobs/job.h"
#include "patience.h"
#include "report.h"
#include "session.h"
#include "spinner.h"

#include <QCoreApplication>
#include <QEventLoop>
#include <QFile>

#include <algorithm>
#include <signal.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int defaultTimeout = 60;
constexpr uint longestTimeout = 1000000; // Seconds; poll() takes milliseconds in an int.
constexpr std::chrono::seconds grace(7); // A mount that is cancelled takes five at most.
constexpr std::chrono::seconds graceOfTools(1);
constexpr std::chrono::milliseconds graceOfCalls(500);
constexpr std::chrono::milliseconds graceOfSignals(500); // timeout(1) sends each twice.
constexpr std::chrono::seconds parting(2);
constexpr int paceMilliseconds = 100;

std::atomic<bool> hadToStop{false};

/// The children of the main thread.
std::vector<pid_t> children()
{
    std::vector<pid_t> all;
    QFile file(QStringLiteral("/proc/self/task/%1/children").arg(::getpid()));
    if (file.open(QIODevice::ReadOnly)) {
        const QList<QByteArray> numbers = file.readAll().simplified().split(' ');
        for (const QByteArray& number : numbers) {
            const pid_t child = number.toInt();
            if (child > 0) {
                all.push_back(child);
            }
        }
    }
    return all;
}

/// A question takes them in the order in which one thread gets them; see Prompt.
void leaveSignalsToQuestions()
{
    sigset_t set;
    ::sigemptyset(&set);
    for (const int number : {SIGTSTP, SIGQUIT, SIGCONT}) {
        ::sigaddset(&set, number);
    }
    ::pthread_sigmask(SIG_BLOCK, &set, nullptr);
}

} // namespace

Option jobTimeoutOption()
{
    return {
        {QStringLiteral("timeout")},
        QStringLiteral("Give up after so long without progress (default: 60; 0: no bound)"),
        QStringLiteral("SECONDS"),
        {},
        true};
}

int jobTimeout(const Invocation& invocation)
{
    const QString option = QStringLiteral("timeout");
    return invocation.isSet(option)
               ? int(std::min(invocation.value(option).toUInt(), longestTimeout))
               : defaultTimeout;
}

void boundParting()
{
    if (!hadToStop) {
        return;
    }
    // A service that hangs keeps a process at its very end too.
    std::thread([] {
        std::this_thread::sleep_for(parting);
        endAtOnce(Failed);
    }).detach();
}

QString askService(const QString& what, int timeoutSeconds, const std::function<void()>& work)
{
    JobWatch watch(QSharedPointer<TerminalAuthenticator>::create(Login()), timeoutSeconds);
    watch.setCutOff(what);
    watch.call(work);
    return watch.wasInterrupted() ? watch.whyStopped() : QString();
}

JobWatch::JobWatch(QSharedPointer<TerminalAuthenticator> authenticator, int timeoutSeconds)
    : m_authenticator(std::move(authenticator))
    , m_timeoutSeconds(timeoutSeconds)
    , m_otherChildren(children())
{
    if (!m_pipe.isOpen()) {
        qFatal("no pipe for the watch of a job");
    }
    m_thread = std::thread([this] {
        leaveSignalsToQuestions();
        watch();
    });
    m_pipe.catchSignals({SIGINT, SIGTERM, SIGHUP}, SA_RESTART);
}

JobWatch::~JobWatch()
{
    m_pipe.send(SignalPipe::End);
    m_thread.join();
    // Behind a signal the verb ends, and another may be on its way: it does nothing any more.
    if (!wasInterrupted()) {
        m_pipe.releaseSignals();
    }
}

void JobWatch::setCutOff(const QString& what)
{
    const std::lock_guard<std::mutex> lock(m_lock);
    m_what = what;
}

bool JobWatch::wasInterrupted() const
{
    // Before the watch gets to it: smbclient ends by the same Ctrl-C, which reads as its success.
    return m_pipe.hasCaught();
}

QString JobWatch::whyStopped() const
{
    return wasInterrupted() ? QStringLiteral("interrupted")
                            : QStringLiteral("no progress within %1 s").arg(m_timeoutSeconds);
}

JobResult JobWatch::run(Job& job, const QString& doing, const std::function<void()>& cancel)
{
    job.setDeleteOnFinish(false);
    Patience::noteAsked();
    m_authenticator->beginJob();
    m_timedOut = false;
    JobResult result;
    result.end = JobResult::Interrupted;
    if (wasInterrupted()) {
        return result;
    }
    m_authenticator->setAskingHandler([this, doing](bool asking) {
        setState(InJob, !asking);
        if (!asking) {
            Spinner::begin(doing);
        }
    });
    QEventLoop loop;
    QObject::connect(&job, &Job::finished, &loop, [&](Job* finished) {
        result = {JobResult::Finished, finished->error(), finished->errorString()};
        m_authenticator->cancel(); // A question that is open has no job any more.
        loop.quit();
    });
    {
        const Waiting waiting(doing);
        setLoop(&loop, cancel);
        setState(InJob, true);
        job.start();
        if (result.end != JobResult::Finished) {
            loop.exec();
        }
        setState(Idle, false);
        setLoop(nullptr, {});
    }
    m_authenticator->setAskingHandler({});
    // What comes too late does not count: the caller cleans up behind it.
    if (wasInterrupted()) {
        result.end = JobResult::Interrupted;
    } else if (m_timedOut) {
        result.end = JobResult::TimedOut;
    }
    return result;
}

void JobWatch::call(const std::function<void()>& work)
{
    if (wasInterrupted()) {
        return;
    }
    const Waiting waiting(waitingForService());
    setState(InCall, true);
    work();
    setState(Idle, false);
}

void JobWatch::setLoop(QEventLoop* loop, const std::function<void()>& cancel)
{
    const std::lock_guard<std::mutex> lock(m_lock);
    m_loop = loop;
    m_cancel = cancel;
}

void JobWatch::setState(State state, bool clockRuns)
{
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        if (m_state == Idle && state != Idle) {
            ++m_turn;
        }
        m_state = state;
        m_clockRuns = clockRuns && m_timeoutSeconds > 0;
        m_isNew = true;
    }
    m_pipe.send(SignalPipe::Change);
}

JobWatch::State JobWatch::state()
{
    const std::lock_guard<std::mutex> lock(m_lock);
    return m_state;
}

bool JobWatch::hasNextTurn()
{
    const std::lock_guard<std::mutex> lock(m_lock);
    return m_turn != m_timedOutTurn;
}

/// How long to wait; -1 where nothing bounds a job or call. When there is no time left it has timed
/// out.
int JobWatch::millisecondsToWait()
{
    const std::lock_guard<std::mutex> lock(m_lock);
    if (m_isNew) {
        m_deadline = runningTime() + std::chrono::seconds(m_timeoutSeconds);
    }
    m_isNew = false;
    if (m_state == Idle || !m_clockRuns) {
        return -1;
    }
    const auto left =
        std::chrono::duration_cast<std::chrono::milliseconds>(m_deadline - runningTime()).count();
    m_timedOut = left < 0;
    if (m_timedOut) {
        m_timedOutTurn = m_turn;
    }
    return left < 0 ? 0 : int(std::min<qint64>(left + 1, paceMilliseconds));
}

/// A clock that stands while the program is stopped.
JobWatch::Clock::time_point JobWatch::runningTime() const
{
    return Clock::now() - m_lost;
}

/// The next byte of the pipe. A wait that takes longer than it may shows that the program was
/// stopped meanwhile (Ctrl-Z).
SignalPipe::Byte JobWatch::nextByte(int milliseconds)
{
    const Clock::time_point latest = Clock::now() + std::chrono::milliseconds(milliseconds);
    const SignalPipe::Byte byte = m_pipe.next(milliseconds);
    const Clock::time_point time = Clock::now();
    if (milliseconds >= 0 && time > latest) {
        m_lost += time - latest;
    }
    return byte;
}

void JobWatch::watch()
{
    while (true) {
        const int milliseconds = millisecondsToWait();
        if (milliseconds != 0) {
            const SignalPipe::Byte byte = nextByte(milliseconds);
            if (byte == SignalPipe::End) {
                return;
            }
            if (byte != SignalPipe::Signal) {
                continue;
            }
            m_interrupted = true;
        }
        if (!stop()) {
            return;
        }
    }
}

/// False when the object ends.
bool JobWatch::stop()
{
    hadToStop = true;
    const Clock::time_point begin = runningTime();
    Clock::time_point signalled = begin;
    while (true) {
        // Again and again, since a job may start another tool only now.
        const State now = state();
        // The next one may have begun already, and has its own time.
        if ((now == Idle || hasNextTurn()) && !m_interrupted) {
            return true;
        }
        if (now == InJob) {
            m_authenticator->cancel();
            stopJob(runningTime() - begin);
        }
        const SignalPipe::Byte byte = nextByte(paceMilliseconds);
        if (byte == SignalPipe::End) {
            return false;
        }
        const Clock::time_point time = runningTime();
        if (byte == SignalPipe::Signal && !m_interrupted) {
            m_interrupted = true;
            signalled = time;
        } else if (byte == SignalPipe::Signal && time - signalled >= graceOfSignals) {
            cutOff();
        }
        if (time - begin >= grace || (now == InCall && time - begin >= graceOfCalls)) {
            cutOff();
        }
    }
}

void JobWatch::stopJob(Clock::duration elapsed)
{
    const std::lock_guard<std::mutex> lock(m_lock);
    if (!m_loop) {
        return;
    }
    if (m_cancel) {
        QMetaObject::invokeMethod(m_loop, m_cancel, Qt::QueuedConnection);
        return;
    }
    QMetaObject::invokeMethod(m_loop, &QEventLoop::quit, Qt::QueuedConnection);
    const std::vector<pid_t> all = children();
    for (const pid_t child : all) {
        if (std::find(m_otherChildren.begin(), m_otherChildren.end(), child) ==
            m_otherChildren.end()) {
            ::kill(child, elapsed < graceOfTools ? SIGTERM : SIGKILL);
        }
    }
}

void JobWatch::cutOff()
{
    Spinner::end();
    QString what;
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        what = m_what;
    }
    Prompt::restoreTerminal();
    const bool isServiceSilent = state() == InCall && !wasInterrupted();
    report(
        what, isServiceSilent
                  ? whyStopped() + QStringLiteral(": the file manager service does not answer")
                  : whyStopped());
    endAtOnce(Failed);
}

} // namespace Tool
} // namespace VeyFM
