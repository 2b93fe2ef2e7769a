// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SANDBOXSYSTEM_H
#define VEYFM_TESTS_SANDBOXSYSTEM_H

#include <QByteArray>
#include <QString>

/// How a sandbox makes a machine of its namespaces. All as root in its first process.
namespace SandboxSystem {

constexpr const char* directory = "/run/sandbox";
constexpr const char* logDirectory = "/run/sandbox/log";

/// Takes the namespaces but for that of processes, and fills them. What is missing, or nothing.
QString prepare();

/// Puts a file in the place of an existing one.
bool replaceFile(const QByteArray& path, const QByteArray& content, unsigned mode = 0644);

/// Puts an empty folder in the place of an existing one.
bool replaceDirectory(const QByteArray& path);

/// A new file; false when it can't be written.
bool writeFile(const QByteArray& path, const QByteArray& content, unsigned mode = 0644);

/// What the servers have printed.
QByteArray logs();

} // namespace SandboxSystem

#endif
