// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_REPORT_H
#define VEYFM_TOOL_REPORT_H

#include <QString>

namespace VeyFM {
namespace Tool {

/// Prints "veyfm-vfs: <what>: <why>" to standard error, control characters escaped and
/// passwords in URLs left out.
void report(const QString& what, const QString& why);

/// report() of a name that is no text, by the numbers of its bytes where they are no ASCII.
void reportBytes(const QString& before, const QByteArray& name, const QString& why);

/// Prints a line to standard error as it is.
void say(const QString& line);

/// The line that report() prints, in the local encoding.
QByteArray reportLine(const QString& what, const QString& why);

/// The system's words for an errno value.
QString systemReason(int error);

/// Whether log messages of the library come to standard error. They do not at first: that
/// there is no service is ordinary, and no concern of somebody who lists a directory.
void setVerbose(bool verbose);

/// Sends log messages through this tool.
void installLogging();

QString versionText();

} // namespace Tool
} // namespace VeyFM

#endif
