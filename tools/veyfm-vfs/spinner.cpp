// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "spinner.h"

#include <QByteArray>
#include <QString>

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

constexpr std::chrono::milliseconds patience(500);
constexpr std::chrono::milliseconds pace(100);
constexpr char frames[] = {'|', '/', '-', '\\'};

void writeToTerminal(const QByteArray& bytes)
{
    if (::write(STDERR_FILENO, bytes.constData(), size_t(bytes.size())) < 0) {
        return; // Nobody to show it to.
    }
}

class Drawer
{
public:
    ~Drawer()
    {
        {
            const std::lock_guard<std::mutex> lock(m_mutex);
            m_quit = true;
            erase();
        }
        m_changed.notify_one();
        if (m_thread.joinable()) {
            m_thread.join();
        }
    }

    void begin(const QByteArray& text)
    {
        const std::lock_guard<std::mutex> lock(m_mutex);
        if (m_waiting) {
            return;
        }
        m_waiting = true;
        m_text = text;
        m_start = Clock::now();
        if (!m_thread.joinable()) {
            startThread();
        }
        m_changed.notify_one();
    }

    void end()
    {
        const std::lock_guard<std::mutex> lock(m_mutex);
        m_waiting = false;
        erase();
        m_changed.notify_one();
    }

private:
    void startThread()
    {
        // Signals are for those who handle them.
        sigset_t all;
        sigset_t before;
        ::sigfillset(&all);
        ::pthread_sigmask(SIG_BLOCK, &all, &before);
        m_thread = std::thread([this] { run(); });
        ::pthread_sigmask(SIG_SETMASK, &before, nullptr);
    }

    void run()
    {
        std::unique_lock<std::mutex> lock(m_mutex);
        while (!m_quit) {
            if (!m_waiting) {
                m_changed.wait(lock);
                continue;
            }
            const Clock::time_point now = Clock::now();
            if (now - m_start >= patience) {
                draw(now - m_start);
                m_changed.wait_for(lock, pace);
            } else {
                m_changed.wait_until(lock, m_start + patience);
            }
        }
    }

    void draw(Clock::duration elapsed)
    {
        const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(elapsed).count();
        m_frame = (m_frame + 1) % sizeof frames;
        writeToTerminal(
            QByteArray("\r") + frames[m_frame] + ' ' + m_text + " (" +
            QByteArray::number(qlonglong(seconds)) + " s)\033[K");
        m_shown = true;
    }

    void erase()
    {
        if (m_shown) {
            writeToTerminal("\r\033[K");
        }
        m_shown = false;
    }

    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::thread m_thread;
    QByteArray m_text;
    Clock::time_point m_start;
    size_t m_frame = 0;
    bool m_waiting = false;
    bool m_shown = false;
    bool m_quit = false;
};

/// Null where nobody would see it, or the terminal can't take a line back.
Drawer* drawer()
{
    static const QByteArray terminal = qgetenv("TERM");
    static const bool visible =
        ::isatty(STDERR_FILENO) == 1 && !terminal.isEmpty() && terminal != "dumb";
    if (!visible) {
        return nullptr;
    }
    static Drawer instance;
    return &instance;
}

} // namespace

void Spinner::begin(const QString& text)
{
    if (Drawer* const line = drawer()) {
        line->begin(text.toLocal8Bit());
    }
}

void Spinner::end()
{
    if (Drawer* const line = drawer()) {
        line->end();
    }
}

} // namespace Tool
} // namespace VeyFM
