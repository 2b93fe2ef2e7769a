// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_LOOPGAP_H
#define VEYFM_TESTS_LOOPGAP_H

#include <QElapsedTimer>
#include <QFile>
#include <QTimer>

#include <algorithm>

/**
 * Measures for how long the event loop of this thread stands still, by a timer of 5 ms.
 *
 * The time in which the thread would have run, but other programs had the processor, is taken off:
 * tests run side by side.
 */
class LoopGap
{
public:
    LoopGap()
    {
        m_timer.setTimerType(Qt::PreciseTimer);
        QObject::connect(&m_timer, &QTimer::timeout, &m_timer, [this] { tick(); });
        m_timer.start(5);
        m_delayed = delayed();
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
        m_largest = std::max(m_largest, m_last.nsecsElapsed() - (now - m_delayed));
        m_delayed = now;
        m_last.restart();
        ++m_ticks;
    }

    QTimer m_timer;
    QElapsedTimer m_last;
    qint64 m_delayed = 0;
    qint64 m_largest = 0;
    int m_ticks = 0;
};

#endif
