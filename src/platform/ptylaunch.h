// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYSU_PTYLAUNCH_H
#define VEYSU_PTYLAUNCH_H

#include "uniquefd.h"

#include <QByteArray>
#include <QList>

#include <sys/types.h>

namespace VeySu {

/// A child process on a terminal of its own. Whoever holds it has to wait for the process.
struct PtyChild
{
    UniqueFd master; ///< Our side of the terminal.
    UniqueFd handle; ///< Turns readable when the process ends (a pidfd).
    pid_t pid = -1;  ///< -1 when nothing was started, or when it was waited for.
};

/// The exit status of a tool that could not be started, as shells have it.
constexpr int NotStartedStatus = 127;

/**
 * Starts @p command, found on `PATH` unless it holds a slash, as PtyProcess::exec() describes.
 * A tool that the kernel refuses to run ends with NotStartedStatus.
 *
 * @return A child with pid -1 when the command was not found, or there is no terminal or no
 * process to be had.
 */
PtyChild launchOnPty(const QByteArray& command, const QList<QByteArray>& args);

} // namespace VeySu

#endif
