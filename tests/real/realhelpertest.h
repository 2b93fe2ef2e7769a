// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_REALHELPERTEST_H
#define VEYFM_TESTS_REALHELPERTEST_H

#include "real/knownhosts.h"
#include "real/realftptest.h"
#include "real/stallingserver.h"
#include "support/helpersession.h"

#include <QTest>

#include <memory>

/// The base of tests of veyfm-mount in a sandbox.
class RealHelperTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init()
    {
        SKIP_WITHOUT_SANDBOX();
        KnownHosts::clear();
        KnownHosts::add(Sandbox::serverHost);
    }
    void cleanup()
    {
        if (!Sandbox::isEntered()) {
            return;
        }
        const QStringList mounted = mountDirs();
        for (const QString& directory : mounted) {
            QCOMPARE(QProcess::execute(u"fusermount3"_s, {u"-u"_s, directory}), 0);
        }
        QDir(mountDir()).removeRecursively();
        QTRY_COMPARE(processes(), QStringList());
        QStringList findings = SecretWatch::takeFindings();
        findings.removeAll(u"smbclient environ"_s); // Where the contract puts it.
        QCOMPARE(findings, QStringList());
        QCOMPARE(SecretWatch::findFiles(), QStringList());
    }

protected:
    static QByteArray passwordOf(const SandboxAccount& account)
    {
        return account.password;
    }

    static QString mountDir(const QString& relative = QString())
    {
        return QDir::homePath() + u"/.vey-fm-vfs"_s + relative;
    }

    static QStringList mountDirs()
    {
        QStringList result;
        const QList<QByteArray> lines = fileContents(u"/proc/self/mounts"_s).split('\n');
        for (const QByteArray& line : lines) {
            const QString directory = QFile::decodeName(line.split(' ').value(1));
            if (directory.startsWith(mountDir(u"/"_s))) {
                result.append(directory);
            }
        }
        return result;
    }

    /// What a mount needs, or has needed, and what is left of it.
    static QStringList leftovers()
    {
        QStringList result = mountDirs();
        if (QFile::exists(mountDir())) {
            result += mountDir();
        }
        return result + processes();
    }

    /// Those that still run, by their programs.
    static QStringList processes()
    {
        QStringList result;
        for (const char* name :
             {"veyfm-mount", "sshfs", "ssh", "fusermount3", "rclone", "curlftpfs", "smbclient",
              "ssh-askpass"}) {
            const QList<int> pids = processesNamed(name);
            for (const int pid : pids) {
                const QByteArray stat = fileContents(u"/proc/%1/stat"_s.arg(pid));
                // Some have ended when one looks.
                if (stat != "unreadable" && !stat.contains(") Z ")) {
                    result += QString::fromLatin1(name);
                }
            }
        }
        return result;
    }

    /// Answers all questions, with yes or the password, up to the end.
    static QJsonObject answerAll(HelperSession& session, const QByteArray& password)
    {
        while (true) {
            const QJsonObject said = session.next();
            const QString kind = textOf(said, "say");
            if (kind == u"end"_s || said.isEmpty()) {
                return said;
            }
            if (textOf(said, "kind") == u"confirm"_s) {
                session.confirm(numberOf(said, "id"), true);
            } else if (kind == u"question"_s) {
                session.answerPassword(numberOf(said, "id"), password);
            }
        }
    }

    /// What stands behind it is server.test.
    static void addStalledHost()
    {
        QFile known(KnownHosts::path());
        QVERIFY(known.open(QIODevice::Append));
        known.write(
            QByteArray(Sandbox::stalledHost) + ' ' + SshServer::publicKey(Sandbox::serverHost) +
            '\n');
    }

    static QByteArray aliceUrl()
    {
        return QByteArray("sftp://alice@") + Sandbox::serverHost + "/~/papers";
    }
};

/// server.test serves SSH and FTP, other.test SSH with questions that no job knows, and
/// stalled.test as much as a test likes.
class HelperSandbox : public Sandbox
{
public:
    HelperSandbox()
        : Sandbox(
              {"/usr/bin/sshfs", "/usr/bin/fusermount3", "/usr/bin/smbclient", "/usr/bin/rclone"})
    {
        addServer(std::make_unique<SecretWatch>());
        addServer(std::make_unique<SshServer>(serverHost));
        addServer(std::make_unique<SshServer>(otherHost, SshServer::KeyboardInteractive));
        addServer(std::make_unique<SshServer>(keyHost, SshServer::Key));
        addServer(std::make_unique<FtpServer>(serverHost));
        addServer(std::make_unique<StallingServer>());
    }
};

/// main() of a test in there.
template <typename Tests>
int runHelperTests(int argc, char** argv)
{
    HelperSandbox sandbox;
    return sandbox.run([&] {
        useCurlftpfsAdapter();
        return runSandboxTests<Tests>(argc, argv);
    });
}

#endif
