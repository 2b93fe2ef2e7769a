// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "patience.h"

#include "ending.h"
#include "report.h"
#include "restart.h"
#include "service.h"
#include "verb.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusPendingCallWatcher>
#include <QTimer>

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>

#include <signal.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds bound(3500);
constexpr std::chrono::milliseconds secondBound(1000); // Where it has begun again already.
constexpr std::chrono::milliseconds graceOfLoops(500);
constexpr std::chrono::seconds parting(2);
constexpr std::chrono::seconds pulse(1);
constexpr std::chrono::milliseconds pace(100);

void tell(int descriptor, const QByteArray& bytes)
{
    if (::write(descriptor, bytes.constData(), size_t(bytes.size())) < 0) {
        // Nobody to tell.
    }
}

/// The thread that counts the time, and what it has to know.
class Watch
{
public:
    void hold(int change)
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_holders += change;
        renewLocked();
        if (!m_isRunning) {
            m_isRunning = true;
            start();
        }
        m_changed.notify_one();
    }

    void renew()
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        renewLocked();
    }

    void boundParting(int exitCode)
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_exitCode = exitCode;
        if (m_isOver) {
            endAtOnce(exitCode);
        }
        ++m_holders;
        m_left = parting;
        m_isParting = true;
        m_changed.notify_one();
    }

    bool isOver()
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        return m_isOver;
    }

    void setVerb(const QString& name)
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_lineOfReads = reportLine(name, whySilent());
        m_lineOfChanges = reportLine(name, whySilentToChange());
    }

    // When the thread ends the program the lock is taken for good: nobody prints in between.

    void notePrinted()
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_hasPrinted = true;
    }

    void setOutputEnd(const QByteArray& bytes)
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_outputEnd = bytes;
    }

    void noteAsked()
    {
        const std::lock_guard<std::mutex> lock(m_lock);
        m_hasAsked = true;
    }

private:
    void renewLocked()
    {
        if (!m_isParting) {
            m_left = Restart::wasDone() ? secondBound : bound;
        }
    }

    void start()
    {
        // Signals are for those who handle them.
        sigset_t all;
        sigset_t before;
        ::sigfillset(&all);
        ::pthread_sigmask(SIG_BLOCK, &all, &before);
        std::thread([this] { run(); }).detach();
        ::pthread_sigmask(SIG_SETMASK, &before, nullptr);
    }

    void run()
    {
        std::unique_lock<std::mutex> lock(m_lock);
        while (true) {
            count(lock);
            m_isOver = true;
            if (m_isParting) {
                endAtOnce(m_exitCode);
            }
            if (!m_changed.wait_for(lock, graceOfLoops, [this] { return m_holders == 0; })) {
                leaveService();
            }
            m_left = bound;
        }
    }

    /// Until no time is left.
    void count(std::unique_lock<std::mutex>& lock)
    {
        while (m_left > Clock::duration::zero()) {
            if (m_holders == 0) {
                m_changed.wait(lock);
                continue;
            }
            const Clock::time_point begin = Clock::now();
            m_changed.wait_for(lock, pace);
            // A longer time is one in which the program was stopped.
            m_left -= std::min<Clock::duration>(Clock::now() - begin, 2 * pace);
        }
    }

    /// The main thread is blocked.
    [[noreturn]] void leaveService()
    {
        Spinner::end();
        if (!m_hasPrinted && !m_hasAsked && !Restart::wasDone()) {
            Restart::withoutService();
        }
        tell(STDOUT_FILENO, m_outputEnd);
        tell(STDERR_FILENO, m_hasAsked ? m_lineOfChanges : m_lineOfReads);
        endAtOnce(Failed);
    }

    std::mutex m_lock;
    std::condition_variable m_changed;
    Clock::duration m_left = bound;
    QByteArray m_outputEnd;
    QByteArray m_lineOfReads;
    QByteArray m_lineOfChanges;
    int m_holders = 0;
    int m_exitCode = Failed;
    bool m_isRunning = false;
    bool m_isParting = false;
    bool m_isOver = false;
    bool m_hasPrinted = false;
    bool m_hasAsked = false;
};

/// Never destroyed: the library asks the service behind main(), from a destructor.
Watch& watch()
{
    static Watch* const instance = new Watch;
    return *instance;
}

} // namespace

Patience::Patience()
{
    watch().hold(1);
}

Patience::~Patience()
{
    watch().hold(-1);
}

void Patience::setVerb(const QString& name)
{
    watch().setVerb(name);
}

void Patience::notePrinted()
{
    watch().notePrinted();
}

void Patience::setOutputEnd(const QByteArray& bytes)
{
    watch().setOutputEnd(bytes);
}

void Patience::noteAsked()
{
    watch().noteAsked();
}

void Patience::renew()
{
    watch().renew();
}

bool Patience::isOver()
{
    return watch().isOver();
}

void Patience::boundParting(int exitCode)
{
    watch().boundParting(exitCode);
}

AskingForChange::AskingForChange()
    : m_asking(QStringLiteral("Asking for the change"))
{
    Patience::noteAsked();
}

Heartbeat::Heartbeat()
{
    auto* const timer = new QTimer(this);
    connect(timer, &QTimer::timeout, this, [] {
        if (Patience::isOver()) {
            QCoreApplication::quit();
        }
    });
    timer->start(pace);
    ping();
}

void Heartbeat::ping()
{
    const auto* watcher =
        new QDBusPendingCallWatcher(QDBusConnection::sessionBus().asyncCall(pingMessage()), this);
    connect(
        watcher, &QDBusPendingCallWatcher::finished, this, [this](QDBusPendingCallWatcher* ended) {
            ended->deleteLater();
            if (isAnswer(ended->reply())) {
                Patience::renew();
            }
            QTimer::singleShot(pulse, this, &Heartbeat::ping);
        });
}

} // namespace Tool
} // namespace VeyFM
