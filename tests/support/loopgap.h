// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_LOOPGAP_H
#define VEYFM_TESTS_LOOPGAP_H

#include <QElapsedTimer>
#include <QFile>
#include <QTimer>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <thread>

/**
 * Measures for how long the event loop of this thread stands still, by a timer of 5 ms.
 *
 * Tests run side by side, and on a busy machine everybody stands still now and then. So the time in
 * which the thread would have run, but others had the processor, is taken off, and what a thread
 * that does nothing else than to sleep for 5 ms was late meanwhile.
 */
class LoopGap
{
public:
    LoopGap()
    {
        m_timer.setTimerType(Qt::PreciseTimer);
        QObject::connect(&m_timer, &QTimer::timeout, &m_timer, [this] { tick(); });
        m_timer.start(5);
        m_referee = std::thread([this] { referee(); });
        restart();
    }
    ~LoopGap()
    {
        m_isOver = true;
        m_referee.join();
    }
    LoopGap(const LoopGap&) = delete;
    LoopGap& operator=(const LoopGap&) = delete;

    /// Behind something that stands still on purpose.
    void restart()
    {
        m_delayed = delayed();
        m_late = 0;
        m_last.start();
    }

    /// Milliseconds from one turn to the next, at most.
    double largest() const
    {
        return double(m_largest) / 1e6;
    }

    /// How often the timer came.
    int ticks() const
    {
        return m_ticks;
    }

private:
    /// Nanoseconds that this thread has waited for a processor.
    static qint64 delayed()
    {
        QFile file(QStringLiteral("/proc/thread-self/schedstat"));
        return file.open(QIODevice::ReadOnly) ? file.readAll().split(' ').value(1).toLongLong() : 0;
    }

    void tick()
    {
        const qint64 now = delayed();
        const qint64 others = std::max(now - m_delayed, 2 * m_late.exchange(0));
        m_largest = std::max(m_largest, m_last.nsecsElapsed() - others);
        m_delayed = now;
        m_last.restart();
        ++m_ticks;
    }

    void referee()
    {
        constexpr auto interval = std::chrono::milliseconds(5);
        while (!m_isOver) {
            QElapsedTimer clock;
            clock.start();
            std::this_thread::sleep_for(interval);
            m_late += std::max(clock.nsecsElapsed() - qint64(6e6), qint64(0));
        }
    }

    QTimer m_timer;
    QElapsedTimer m_last;
    qint64 m_delayed = 0;
    qint64 m_largest = 0;
    int m_ticks = 0;
    std::atomic<qint64> m_late{0}; ///< Nanoseconds.
    std::atomic<bool> m_isOver{false};
    std::thread m_referee;
};

#endif
