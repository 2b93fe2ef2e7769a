// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolrunner.h"

#include <QFile>
#include <QJsonDocument>
#include <QMap>

#include <fcntl.h>
#include <unistd.h>

QList<QByteArray> ToolResult::lines() const
{
    QList<QByteArray> all = out.split('\n');
    if (!all.isEmpty() && all.constLast().isEmpty()) {
        all.removeLast();
    }
    return all;
}

QJsonArray ToolResult::json() const
{
    return QJsonDocument::fromJson(out).array();
}

QString toolPath()
{
    return QFile::decodeName(VEYFM_TOOL);
}

QString toolSource(const QString& name)
{
    return QFile::decodeName(VEYFM_TOOL_SOURCE) + QLatin1Char('/') + name;
}

QProcessEnvironment toolEnvironment(const QMap<QString, QString>& variables)
{
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.remove(QStringLiteral("NO_COLOR"));
    environment.remove(QStringLiteral("COLUMNS"));
    environment.insert(QStringLiteral("TERM"), QStringLiteral("xterm"));
    for (auto it = variables.begin(); it != variables.end(); ++it) {
        if (it.value().isNull()) {
            environment.remove(it.key());
        } else {
            environment.insert(it.key(), it.value());
        }
    }
    return environment;
}

ToolResult runProgram(
    const QString& program, const QStringList& arguments, const QString& directory,
    const QProcessEnvironment& environment)
{
    QProcess process;
    process.setProcessEnvironment(environment);
    if (!directory.isEmpty()) {
        process.setWorkingDirectory(directory);
    }
    process.setStandardInputFile(QProcess::nullDevice());
    process.start(program, arguments);
    ToolResult result;
    if (process.waitForFinished(60000)) {
        result.exitCode =
            process.exitCode() + (process.exitStatus() == QProcess::NormalExit ? 0 : 128);
    }
    result.out = process.readAllStandardOutput();
    result.err = process.readAllStandardError();
    return result;
}

ToolResult runTool(
    const QStringList& arguments, const QString& directory, const QProcessEnvironment& environment)
{
    return runProgram(toolPath(), arguments, directory, environment);
}

bool createFile(const QString& directory, const QByteArray& name, const QByteArray& content)
{
    const QByteArray path = QFile::encodeName(directory) + '/' + name;
    const int descriptor = ::open(path.constData(), O_CREAT | O_WRONLY | O_CLOEXEC, 0644);
    if (descriptor < 0) {
        return false;
    }
    const bool written =
        ::write(descriptor, content.constData(), size_t(content.size())) == content.size();
    return ::close(descriptor) == 0 && written;
}
