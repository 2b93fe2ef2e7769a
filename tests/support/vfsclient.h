// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_VFSCLIENT_H
#define VEYFM_TESTS_VFSCLIENT_H

#include <QProcess>
#include <QTest>

/// Another process with the library; see vfsclient/main.cpp for what it understands. It gets the
/// session bus and the home of this process.
class VfsClient
{
public:
    ~VfsClient()
    {
        if (process.state() != QProcess::NotRunning) {
            process.kill();
            process.waitForFinished();
        }
    }

    /// Starts it and waits until its tree stands. Other arguments than none are for main().
    bool start(const QStringList& arguments = {})
    {
        process.start(QStringLiteral(VEYFM_VFS_CLIENT), arguments);
        return waitFor(QStringLiteral("ready"));
    }

    void send(const QString& command)
    {
        process.write(command.toLocal8Bit() + '\n');
    }

    /// Waits for a line of output, and drops what came before it.
    bool waitFor(const QString& line)
    {
        return QTest::qWaitFor(
            [&] {
                while (process.canReadLine()) {
                    const QString read = QString::fromLocal8Bit(process.readLine()).trimmed();
                    if (read == line) {
                        return true;
                    }
                    passed << read;
                }
                return false;
            },
            20000);
    }

    /// Has it return from main() and waits for its end; its exit code, or -1.
    int quit()
    {
        send(QStringLiteral("quit"));
        return waitForEnd();
    }

    int waitForEnd()
    {
        if (process.state() != QProcess::NotRunning && !process.waitForFinished(40000)) {
            return -1;
        }
        return process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1;
    }

    QString errorOutput()
    {
        return QString::fromLocal8Bit(process.readAllStandardError());
    }

    QProcess process;
    /// Lines that waitFor() passed over.
    QStringList passed;
};

#endif
