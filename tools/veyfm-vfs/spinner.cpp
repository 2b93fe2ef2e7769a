// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "spinner.h"

#include "shown.h"
#include "terminal.h"

#include <QByteArray>
#include <QString>

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

    void begin(const QString& text)
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
        const QString frame = QLatin1Char(frames[m_frame]) + QString(QLatin1Char(' '));
        const QString time = QStringLiteral(" (%1 s)").arg(seconds);
        // The last column stays free: behind it some terminals begin a new line.
        const int columns = terminalWidth(STDERR_FILENO) - 1;
        const QString text = cutToWidth(m_text, columns - frame.size() - time.size());
        const QString line = cutToWidth(frame + text + time, columns);
        const QByteArray old = toItsStart();
        m_width = displayWidth(line);
        writeToTerminal(old + line.toLocal8Bit() + "\033[K");
    }

    void erase()
    {
        if (m_width > 0) {
            writeToTerminal(toItsStart() + "\033[K");
        }
        m_width = 0;
    }

    /// To the start of the line that is shown, which a terminal that became narrower has broken.
    QByteArray toItsStart() const
    {
        const int rows = std::max(m_width - 1, 0) / std::max(terminalWidth(STDERR_FILENO), 1);
        return rows > 0 ? "\r\033[" + QByteArray::number(rows) + "A\033[J" : QByteArray("\r");
    }

    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::thread m_thread;
    QString m_text;
    Clock::time_point m_start;
    size_t m_frame = 0;
    bool m_waiting = false;
    int m_width = 0; // Of the line that is shown; 0 for none.
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
        line->begin(escaped(shownText(text)));
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
