// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_PROMPT_H
#define VEYFM_TOOL_PROMPT_H

#include "mount/secret.h"

#include <QString>

#include <atomic>

namespace VeyFM {
namespace Tool {

/**
 * Asks the person at the controlling terminal, wherever standard input and output go.
 *
 * While a password is typed the terminal shows nothing; it is put back as it was at the end, and
 * also while the program is stopped (Ctrl-Z) and before a signal ends it. A question is asked in
 * the foreground only: in the background the program stops until a shell brings it there.
 *
 * While it waits, an event loop runs.
 */
class Prompt
{
public:
    enum Echo { Hidden, Shown };

    Prompt();
    ~Prompt();

    /// Whether there is a terminal.
    bool isAvailable() const;

    /// Shows lines, control characters in them escaped.
    void show(const QString& lines);

    /// Shows a question and reads a line. False when the person or cancel() gave up.
    bool ask(const QString& question, Echo echo, Secret& answer);

    /// Reads a line of a descriptor, without its end, or so much as shows that it is too long.
    /// False when there is none, and when cancel() gave up.
    bool readLine(int descriptor, Secret& answer);

    /// Ends the question that is open and all that come until restart(). From any thread.
    void cancel();
    bool isCancelled() const;
    void restart();

    /// Whether a question was given up since the program is in the background and nobody can bring
    /// it to the foreground.
    bool isOutOfReach() const;

    /// Puts the terminal back before the program is cut off. From any thread.
    static void restoreTerminal();

private:
    Q_DISABLE_COPY(Prompt)

    bool waitForForeground();
    bool waitForInput(int descriptor) const;

    int m_terminal = -1;
    int m_wake = -1; ///< An eventfd, readable after cancel() and signals.
    std::atomic<bool> m_cancelled{false};
    bool m_isOutOfReach = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
