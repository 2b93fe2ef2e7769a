// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_WORKER_H
#define VEYFM_TESTS_WORKER_H

#include <QThread>

#include <functional>
#include <utility>

/**
 * A thread that is waited for with a bound. Not QThread::create(): what that runs is called from
 * within pthread_once(), by Qt, where the thread sanitizer is told to look away.
 */
class Worker : public QThread
{
public:
    explicit Worker(std::function<void()> work)
        : m_work(std::move(work))
    {
    }

protected:
    void run() override
    {
        m_work();
    }

private:
    const std::function<void()> m_work;
};

#endif
