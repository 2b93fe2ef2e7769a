// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_CURLFTPFSSCENE_H
#define VEYFM_TESTS_CURLFTPFSSCENE_H

#include "support/standin.h"

#include <QProcess>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QTest>

/// The curlftpfs that does its work with rclone.
inline QString curlftpfsPath()
{
    return QStringLiteral(VEYFM_CURLFTPFS_FOLDER "/curlftpfs");
}

/// Skips the tests where it would hand over to a real one. For initTestCase().
#define SKIP_WITH_REAL_CURLFTPFS()                                                                 \
    do {                                                                                           \
        if (!QStandardPaths::findExecutable(QStringLiteral("curlftpfs")).isEmpty())                \
            QSKIP("this system has a real curlftpfs");                                             \
    } while (false)

/// A run of it.
class Curlftpfs
{
public:
    ~Curlftpfs()
    {
        if (process.state() != QProcess::NotRunning) {
            process.kill();
            process.waitForFinished();
        }
    }

    void start(const QStringList& arguments, const QString& program = curlftpfsPath())
    {
        process.start(program, arguments);
    }

    /// Waits for the question, and has it alone in one read.
    bool waitForPrompt(const QByteArray& user)
    {
        process.setReadChannel(QProcess::StandardError);
        return process.waitForReadyRead(20000) &&
               process.readAllStandardError() == "Enter host password for user '" + user + "':";
    }

    void answer(const QByteArray& line)
    {
        process.write(line);
        process.closeWriteChannel();
    }

    /// The exit code, -1 for one that crashed or takes too long.
    int waitForEnd()
    {
        const bool finished =
            process.state() == QProcess::NotRunning || process.waitForFinished(30000);
        errors = process.readAllStandardError();
        output = process.readAllStandardOutput();
        return finished && process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1;
    }

    QProcess process;
    /// What it has printed since the prompt, after its end. @{
    QByteArray errors;
    QByteArray output;
    /// @}
};

/// A curlftpfs whose rclone plays what the test says.
class CurlftpfsScene
{
public:
    QString mountPoint() const
    {
        return m_directory.path();
    }

    /// The arguments for a host, with more in front of it.
    QStringList arguments(const QString& host, const QStringList& options = {}) const
    {
        return options + QStringList({host, mountPoint()});
    }

    /// Has rclone hide the password, and then mount as the lines say.
    void expectMount(const QByteArrayList& lines)
    {
        rclone.expect({"read", "out OBSCURED\\n"});
        rclone.expect(lines);
    }

    /// The process of the rclone that mounts, once it runs; 0 when it takes too long.
    qint64 waitForRclone() const
    {
        return QTest::qWaitFor([&] { return rclone.processId(2) > 0; }, 20000) ? rclone.processId(2)
                                                                               : 0;
    }

    StandIn rclone{"rclone"};

private:
    QTemporaryDir m_directory;
};

#endif
