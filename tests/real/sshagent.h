// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SSHAGENT_H
#define VEYFM_TESTS_SSHAGENT_H

#include "real/sshserver.h"

#include <QFile>
#include <QProcess>
#include <QTemporaryDir>
#include <QTest>

/// An agent that holds the key of SshServer::clientKey(), for as long as the object lives.
class SshAgent
{
public:
    explicit SshAgent(const QString& key)
    {
        m_agent.start(
            QStringLiteral("ssh-agent"), {QStringLiteral("-D"), QStringLiteral("-a"), socket()});
        m_holdsKey = m_agent.waitForStarted() &&
                     QTest::qWaitFor([this] { return QFile::exists(socket()); }) && add(key);
    }
    ~SshAgent()
    {
        m_agent.terminate();
        m_agent.waitForFinished();
    }
    SshAgent(const SshAgent&) = delete;
    SshAgent& operator=(const SshAgent&) = delete;

    /// For SSH_AUTH_SOCK.
    QString socket() const
    {
        return m_directory.filePath(QStringLiteral("agent"));
    }

    bool holdsKey() const
    {
        return m_holdsKey;
    }

    bool isRunning() const
    {
        return m_agent.state() == QProcess::Running;
    }

private:
    bool add(const QString& key) const
    {
        QFile askpass(m_directory.filePath(QStringLiteral("askpass")));
        if (!askpass.open(QIODevice::WriteOnly)) {
            return false;
        }
        askpass.write(QByteArray("#!/bin/sh\necho ") + SshServer::passphrase + '\n');
        askpass.setPermissions(askpass.permissions() | QFile::ExeOwner);
        askpass.close();
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        environment.insert(QStringLiteral("SSH_AUTH_SOCK"), socket());
        environment.insert(QStringLiteral("SSH_ASKPASS"), askpass.fileName());
        environment.insert(QStringLiteral("SSH_ASKPASS_REQUIRE"), QStringLiteral("force"));
        QProcess add;
        add.setProcessEnvironment(environment);
        add.start(QStringLiteral("ssh-add"), {key});
        const bool isAdded = add.waitForFinished() && add.exitCode() == 0;
        return askpass.remove() && isAdded;
    }

    QTemporaryDir m_directory;
    QProcess m_agent;
    bool m_holdsKey = false;
};

#endif
