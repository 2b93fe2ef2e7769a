// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_TERMINALSESSION_H
#define VEYFM_TESTS_TERMINALSESSION_H

#include <QByteArray>
#include <QProcessEnvironment>
#include <QString>
#include <QStringList>

#include <sys/types.h>

/// A program on a pseudo-terminal that is its controlling terminal, as a person runs it.
class TerminalSession
{
public:
    /// @p directory is the working directory; lines come as they were written, without "\r".
    TerminalSession(
        const QString& program, const QStringList& arguments, const QString& directory,
        const QProcessEnvironment& environment, int columns = 80);
    /// Kills what still runs.
    ~TerminalSession();

    /// Types something.
    void type(const QByteArray& keys);

    /// Reads on until @p text has come so many times; false when the program ends or takes too
    /// long.
    bool waitFor(const QByteArray& text, int times = 1);

    /// Reads to the end. The exit code as a shell has it, 128 and its number for a signal; -1 for a
    /// program that takes too long.
    int waitForEnd();

    /// Whether the terminal shows what is typed.
    bool hasEcho() const;

    /// All that has been read.
    QByteArray output() const;

    pid_t processId() const;

private:
    Q_DISABLE_COPY(TerminalSession)

    enum class Read { Some, Nothing, End };
    Read readOnce();

    int m_master = -1;
    pid_t m_pid = -1;
    QByteArray m_output;
};

#endif
