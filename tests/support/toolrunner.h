// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_TOOLRUNNER_H
#define VEYFM_TESTS_TOOLRUNNER_H

#include <QByteArray>
#include <QJsonArray>
#include <QProcess>
#include <QString>
#include <QStringList>

/// What a run of veyfm-vfs left behind.
struct ToolResult
{
    /// As a shell has it, 128 and its number for a signal; -1 for a run that took too long.
    int exitCode = -1;
    QByteArray out;
    QByteArray err;

    QList<QByteArray> lines() const;
    QJsonArray json() const; ///< Empty when the output is no JSON array.
};

QString toolPath();

/// A file of the tool's source directory.
QString toolSource(const QString& name);

/// The environment of the test with some variables set; a null value unsets one.
QProcessEnvironment toolEnvironment(const QMap<QString, QString>& variables = {});

/// Runs the tool with its output in pipes.
ToolResult runTool(
    const QStringList& arguments, const QString& directory = QString(),
    const QProcessEnvironment& environment = toolEnvironment());

/// Runs any program in the same way.
ToolResult runProgram(
    const QString& program, const QStringList& arguments, const QString& directory = QString(),
    const QProcessEnvironment& environment = toolEnvironment());

/// Creates an empty file of any name, also one that is no text.
bool createFile(const QString& directory, const QByteArray& name, const QByteArray& content = {});

#endif
