// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_MOUNTSCENE_H
#define VEYFM_TESTS_MOUNTSCENE_H

#include "support/privatemounts.h"
#include "support/standin.h"
#include "support/terminalsession.h"
#include "support/toolscene.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>

#include <memory>

#include <signal.h>
#include <sys/mount.h>
#include <unistd.h>

/// veyfm-vfs in a home of its own, with a stand-in for a tool that mounts, and with a service or
/// without.
class MountScene
{
public:
    explicit MountScene(const QByteArray& toolName, const ToolScene* service = nullptr)
        : tool(toolName)
        , m_service(service)
    {
    }
    ~MountScene()
    {
        const QStringList mounted = mounts();
        for (const QString& relative : mounted) {
            ::umount2(QFile::encodeName(directory(relative)).constData(), MNT_DETACH);
        }
    }
    MountScene(const MountScene&) = delete;
    MountScene& operator=(const MountScene&) = delete;

    /// On a terminal that can't show a wait, which may come or not.
    QProcessEnvironment environment() const
    {
        QProcessEnvironment all = m_service ? m_service->environment() : toolEnvironment();
        all.insert(QStringLiteral("TERM"), QStringLiteral("dumb"));
        all.insert(QStringLiteral("HOME"), m_home.path());
        all.insert(QStringLiteral("XDG_CONFIG_HOME"), m_home.filePath(QStringLiteral(".config")));
        all.insert(QStringLiteral("XDG_DATA_HOME"), m_home.filePath(QStringLiteral(".data")));
        return all;
    }

    /// Below the root of all mounts.
    QString directory(const QString& relative = QString()) const
    {
        const QString root = m_home.filePath(QStringLiteral(".vey-fm-vfs"));
        return relative.isEmpty() ? root : root + QLatin1Char('/') + relative;
    }

    QByteArray line(const QString& relative) const
    {
        return QFile::encodeName(directory(relative)) + '\n';
    }

    static QStringList words(const char* line)
    {
        return ToolScene::words(line);
    }

    /// In a session of its own, and so without a terminal.
    ToolResult run(const char* line) const
    {
        return runProgram(
            QStringLiteral("setsid"),
            QStringList({QStringLiteral("--wait"), toolPath()}) + words(line), QString(),
            environment());
    }

    /// As run(), to be waited for.
    void start(QProcess& process, const char* line) const
    {
        process.setProcessEnvironment(environment());
        process.start(
            QStringLiteral("setsid"),
            QStringList({QStringLiteral("--wait"), toolPath()}) + words(line));
    }

    /// Runs a line of the shell without a terminal; $0 is the program, and $1 a file with the text.
    ToolResult runShell(const char* line, const QByteArray& text) const
    {
        QTemporaryDir directory;
        if (!createFile(directory.path(), "text", text)) {
            return ToolResult();
        }
        return runProgram(
            QStringLiteral("setsid"),
            {QStringLiteral("--wait"), QStringLiteral("/bin/sh"), QStringLiteral("-c"),
             QString::fromUtf8(line), toolPath(), directory.filePath(QStringLiteral("text"))},
            QString(), environment());
    }

    std::unique_ptr<TerminalSession> onTerminal(const char* line) const
    {
        return std::make_unique<TerminalSession>(
            toolPath(), words(line), m_home.path(), environment(), 200);
    }

    /// Whether a run has left nothing below the home.
    bool isClean() const
    {
        return !QFile::exists(directory()) && mounts().isEmpty();
    }

    /// What is mounted below the home, without its path.
    QStringList mounts() const
    {
        QStringList all;
        QFile file(QStringLiteral("/proc/thread-self/mountinfo"));
        if (!file.open(QIODevice::ReadOnly)) {
            return all;
        }
        const QList<QByteArray> lines = file.readAll().split('\n');
        for (const QByteArray& line : lines) {
            const QString path = QFile::decodeName(
                line.split(' ').value(4).replace("\\040", " ").replace("\\134", "\\"));
            if (path.startsWith(directory() + QLatin1Char('/'))) {
                all.append(path.mid(directory().size() + 1));
            }
        }
        return all;
    }

    /// The process of the program that a run of the tool goes back to; 0 where there is none any
    /// more.
    pid_t programOf(int run) const
    {
        pid_t pid = pid_t(tool.parentId(run));
        while (pid > 1) {
            QFile file(QStringLiteral("/proc/%1/stat").arg(pid));
            const QByteArray stat = file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
            if (stat.contains(" (veyfm-vfs) ")) {
                return pid;
            }
            pid = stat.mid(stat.lastIndexOf(')') + 2).split(' ').value(1).toInt();
        }
        return 0;
    }

    /// One that has ended may wait for a while until somebody takes note of it.
    static bool isRunning(qint64 pid)
    {
        QFile file(QStringLiteral("/proc/%1/stat").arg(pid));
        return file.open(QIODevice::ReadOnly) && !file.readAll().contains(") Z ");
    }

    StandIn tool;

private:
    QTemporaryDir m_home;
    const ToolScene* const m_service;
};

/// What the program says when a URL is not mounted.
inline QByteArray failure(const QByteArray& url, const QByteArray& why)
{
    return "veyfm-vfs: " + url + ": " + why + '\n';
}

/// The call that tells the service of a mount.
inline QString registration(const QString& url, const QString& directory)
{
    return QStringLiteral("FuseMountsManager.addMount[\"%1\",\"%2\"]").arg(url, directory);
}

/// What the tools say.
namespace Said {

/// The question of sshfs for a password, up to the end of the answer.
inline QByteArrayList sshPassword(const QByteArray& user = "me")
{
    return {"echo off", "out " + user + "@host's password: ", "read", "out \\n", "echo on"};
}

inline QByteArrayList sshRefusal()
{
    return {"out read: Connection reset by peer\\n", "exit 1"};
}

inline QByteArrayList sshHostKey()
{
    return {
        "out The authenticity of host 'host (192.0.2.1)' can't be established.\\n"
        "ED25519 key fingerprint is SHA256:c2VjcmV0.\\n"
        "This key is not known by any other names.\\n"
        "Are you sure you want to continue connecting (yes/no/[fingerprint])? ",
        "read"};
}

inline QByteArrayList ftpPassword(const QByteArray& user = "me")
{
    return {"err Enter host password for user '" + user + "':", "read"};
}

inline QByteArrayList ftpRefusal()
{
    return {"drained", "err Error connecting to ftp: Access denied: 530\\n", "exit 1"};
}

inline QByteArrayList success()
{
    return {"mount"};
}

} // namespace Said

#endif
