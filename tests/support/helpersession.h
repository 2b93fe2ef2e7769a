// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_HELPERSESSION_H
#define VEYFM_TESTS_HELPERSESSION_H

#include <QDir>
#include <QElapsedTimer>
#include <QFile>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>

#include <signal.h>

/// veyfm-mount, as a host has it: lines in pipes.
class HelperSession
{
public:
    explicit HelperSession(
        const QProcessEnvironment& environment = QProcessEnvironment::systemEnvironment())
    {
        m_process.setProcessEnvironment(environment);
        m_process.start(QStringLiteral(VEYFM_MOUNT_HELPER), QStringList());
        m_process.waitForStarted();
        m_pid = m_process.processId();
        m_ready = next();
    }
    ~HelperSession()
    {
        m_process.closeWriteChannel();
        if (isRunning() && !m_process.waitForFinished(patience)) {
            qFatal("veyfm-mount does not end");
        }
    }
    HelperSession(const HelperSession&) = delete;
    HelperSession& operator=(const HelperSession&) = delete;

    static constexpr int patience = 30000;

    /// What it said at first.
    QJsonObject ready() const
    {
        return m_ready;
    }

    qint64 pid() const
    {
        return m_pid;
    }

    /// Says a line, which is given without its end.
    void say(const QByteArray& line)
    {
        m_process.write(line + '\n');
        m_process.waitForBytesWritten(patience);
    }

    void mount(const QByteArray& url, const QByteArray& more = QByteArray())
    {
        say(R"({"do":"mount","version":1,"url":")" + url + '"' + more + '}');
    }

    void answerPassword(int id, const QByteArray& password, const QByteArray& more = QByteArray())
    {
        say(R"({"do":"answer","password":true,"id":)" + QByteArray::number(id) + more + '}');
        say('"' + password + '"');
    }

    void confirm(int id, bool yes)
    {
        say(R"({"do":"answer","id":)" + QByteArray::number(id) + R"(,"yes":)" +
            (yes ? "true" : "false") + '}');
    }

    void giveUp(int id)
    {
        say(R"({"do":"answer","cancelled":true,"id":)" + QByteArray::number(id) + '}');
    }

    void cancel()
    {
        say(R"({"do":"cancel"})");
    }

    void take()
    {
        say(R"({"do":"take"})");
    }

    void closeInput()
    {
        m_process.closeWriteChannel();
    }

    /// What it says next; empty when it says no more.
    QJsonObject next()
    {
        QElapsedTimer time;
        time.start();
        while (!m_process.canReadLine()) {
            const bool isMore = m_process.waitForReadyRead(int(patience - time.elapsed()));
            if (!isMore) {
                return QJsonObject();
            }
        }
        return QJsonDocument::fromJson(m_process.readLine()).object();
    }

    /// Whether it says more within a time.
    bool saysMore(int milliseconds)
    {
        return m_process.canReadLine() || m_process.waitForReadyRead(milliseconds);
    }

    /// Passes over everything before the end.
    QJsonObject end()
    {
        QJsonObject object;
        do {
            object = next();
        } while (!object.isEmpty() && object.value(QStringLiteral("say")) != QLatin1String("end"));
        return object;
    }

    /// The exit code, or -1 when it crashes or does not end.
    int waitForEnd()
    {
        if (m_process.state() != QProcess::NotRunning && !m_process.waitForFinished(patience)) {
            return -1;
        }
        return m_process.exitStatus() == QProcess::NormalExit ? m_process.exitCode() : -1;
    }

    bool isRunning() const
    {
        return m_process.state() != QProcess::NotRunning;
    }

    QByteArray errors()
    {
        return m_process.readAllStandardError();
    }

    /// The half that mounts: its first child.
    qint64 workerId() const
    {
        QFile file(QStringLiteral("/proc/%1/task/%1/children").arg(m_pid));
        return file.open(QIODevice::ReadOnly)
                   ? file.readAll().simplified().split(' ').constFirst().toLongLong()
                   : 0;
    }

private:
    QProcess m_process;
    qint64 m_pid = 0;
    QJsonObject m_ready;
};

/// A member of what was said.
inline QString textOf(const QJsonObject& object, const char* name)
{
    return object.value(QLatin1String(name)).toString();
}
inline int numberOf(const QJsonObject& object, const char* name)
{
    return object.value(QLatin1String(name)).toInt(-1);
}
inline bool flagOf(const QJsonObject& object, const char* name)
{
    return object.value(QLatin1String(name)).toBool();
}

#endif
