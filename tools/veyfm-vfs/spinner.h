// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SPINNER_H
#define VEYFM_TOOL_SPINNER_H

class QString;

namespace VeyFM {
namespace Tool {

/**
 * The one line on standard error that shows that something takes its time, and how long already.
 *
 * It appears after half a second, on a terminal only, and goes away without a trace. A thread
 * draws it, since the thread that waits is blocked on the bus. All functions may be called from
 * any thread.
 */
namespace Spinner {

/// Begins to wait. A wait that runs already goes on as it is.
void begin(const QString& text);

/// Ends the wait, if there is one. What writes to the terminal does so first.
void end();

} // namespace Spinner

/// A wait as long as the object lives.
class Waiting
{
public:
    explicit Waiting(const QString& text)
    {
        Spinner::begin(text);
    }
    ~Waiting()
    {
        Spinner::end();
    }

private:
    Waiting(const Waiting&) = delete;
    Waiting& operator=(const Waiting&) = delete;
};

} // namespace Tool
} // namespace VeyFM

#endif
