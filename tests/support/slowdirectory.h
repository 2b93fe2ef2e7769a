// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SLOWDIRECTORY_H
#define VEYFM_TESTS_SLOWDIRECTORY_H

#include <QString>

#include <atomic>
#include <thread>

/**
 * A directory that takes for ever to list and has another, "a", that it does not list: a file
 * system of its own, served by a thread of the test. It is mounted in a mount namespace that only
 * this process and its children see, which takes root and /dev/fuse.
 */
class SlowDirectory
{
public:
    enum Kind {
        Endless, ///< Another name, and another, and another.
        Stalled  ///< No answer to who reads it, like the directory of a server that has gone.
    };

    SlowDirectory(Kind kind, const QString& mountPoint);
    ~SlowDirectory();

    /// Why there is no such directory here; empty when there is one.
    QString problem() const;

    /// How many names readers have got, and for a stalled directory how many wait for one.
    int progress() const;

    /// Lets the readers of a stalled directory go, with an error. Later ones don't wait.
    void release();

private:
    Q_DISABLE_COPY(SlowDirectory)

    bool mount();
    void serve();
    void answer(quint64 id, int error, const void* data, size_t size);
    void answerLookup(quint64 id, const char* name);
    void answerNames(quint64 id, quint64 offset, size_t size);

    const Kind m_kind;
    const QString m_mountPoint;
    QString m_problem;
    int m_descriptor = -1;
    bool m_mounted = false;
    std::atomic<int> m_progress{0};
    std::atomic<quint64> m_waiting{0};
    std::atomic<bool> m_released{false};
    std::thread m_thread;
};

#endif
