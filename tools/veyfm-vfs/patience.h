// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_PATIENCE_H
#define VEYFM_TOOL_PATIENCE_H

#include "spinner.h"

#include <QByteArray>
#include <QObject>

namespace VeyFM {
namespace Tool {

/**
 * The time that the file manager service may let the program wait: three and a half seconds.
 *
 * As long as an object lives, its thread asks the service something, and may be blocked in the
 * library, where each call takes up to 25 seconds. When the time is over, isOver() tells a loop
 * so. A thread that is blocked can't be told: another one then has the program begin again
 * without the service, see restart.h, or end with an error, where something was printed or asked
 * for that must not be done twice.
 *
 * The time begins anew with each object and behind it. That in which the program is stopped
 * (Ctrl-Z) does not count. Objects belong to the main thread.
 */
class Patience
{
public:
    Patience();
    ~Patience();

    /// Whose name an error bears.
    static void setVerb(const QString& name);

    /// Something is about to be printed, or a change to be asked for. @{
    static void notePrinted();
    static void noteAsked();
    /// @}

    /// What standard output lacks, should the program end now: the end of a JSON array.
    static void setOutputEnd(const QByteArray& bytes);

    /// The service has shown that it lives: the time begins anew.
    static void renew();

    /// Whether the time was over. Nothing more is to be asked then.
    static bool isOver();

    /// All is done. The end of the program, which asks the service too, may take two seconds, and
    /// is left out where the time was over before.
    static void boundParting(int exitCode);

private:
    Patience(const Patience&) = delete;
    Patience& operator=(const Patience&) = delete;
};

/// Asks the service, and shows that it does.
class Asking
{
public:
    explicit Asking(const QString& text)
        : m_waiting(text)
    {
    }

private:
    const Waiting m_waiting;
    const Patience m_patience;
};

/// Asks the service for a change.
class AskingForChange
{
public:
    AskingForChange();

private:
    const Asking m_asking;
};

/**
 * Patience in an event loop, where it is no fault of the service that nothing comes for a while.
 * As long as the object lives, pings show whether the service is there. When the time is over it
 * quits all loops.
 */
class Heartbeat : public QObject
{
public:
    Heartbeat();

private:
    void ping();

    const Patience m_patience;
};

} // namespace Tool
} // namespace VeyFM

#endif
