// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/knownhosts.h"
#include "real/realftptest.h"
#include "real/smbserver.h"
#include "support/terminalsession.h"
#include "support/toolscene.h"

#include <signal.h>

/// "veyfm-vfs mount" against real servers, as a person at a terminal meets it.
class RealToolTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();
    void firstContact();
    void keyRefused();
    void wrongPasswords();
    void otherUser();
    void addressOfVersion6();
    void cannotConnect_data();
    void cannotConnect();
    void otherPrompts();
    void otherPromptGivenUp();
    void descriptorOfAHostOfAnotherName();
    void interrupted();
    void fromDescriptor();
    void sambaLogin();
    void sambaMissing_data();
    void sambaMissing();
    void ftpLogin();
    void ftpMissing();
    void ftpInterrupted();

private:
    std::unique_ptr<TerminalSession> onTerminal(const char* line) const
    {
        // One that can't show a wait, which may come or not.
        QProcessEnvironment environment = m_service->environment();
        environment.insert(u"TERM"_s, u"dumb"_s);
        return std::make_unique<TerminalSession>(
            toolPath(), ToolScene::words(line), QDir::rootPath(), environment, 200);
    }

    static QByteArray keys(const char* text)
    {
        return QByteArray(text) + '\n';
    }

    static QString mountDir(const QString& relative)
    {
        return QDir::homePath() + u"/.vey-fm-vfs"_s + relative;
    }

    /// Where the service would show the Samba network.
    static QString sambaDir(const QString& relative)
    {
        return QDir::homePath() + u"/net"_s + relative;
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

    std::unique_ptr<ToolScene> m_service;
};

void RealToolTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    m_service = std::make_unique<ToolScene>(QJsonObject{
        {u"remember"_s, true},
        {u"values"_s, QJsonObject{{u"SmbBrowser.smbNetworkLocalPath"_s, sambaDir(QString())}}}});
    QVERIFY(m_service->isReady());
    KnownHosts::clear();
}

void RealToolTest::cleanup()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    const QStringList mounted = mountDirs();
    for (const QString& directory : mounted) {
        QCOMPARE(QProcess::execute(u"fusermount3"_s, {u"-u"_s, directory}), 0);
    }
    QDir(mountDir(QString())).removeRecursively();
    QTRY_VERIFY(processesNamed("ssh").isEmpty());
    QTRY_VERIFY(processesNamed("sshfs").isEmpty());
    QStringList findings = SecretWatch::takeFindings();
    findings.removeAll(u"smbclient environ"_s); // Where the contract puts it.
    QCOMPARE(findings, QStringList());
    QCOMPARE(SecretWatch::findFiles(), QStringList());
    QCOMPARE(m_service->service().violations(), QStringList());
    m_service.reset();
}

void RealToolTest::firstContact()
{
    const auto session = onTerminal("mount --json sftp://alice@server.test/~/papers");
    QVERIFY(session->waitFor(SshServer::fingerprint(Sandbox::serverHost).toLatin1()));
    QVERIFY(session->waitFor("Type yes or no: "));
    session->type("yes\n");
    QVERIFY(session->waitFor("Password for alice on sftp://server.test: "));
    session->type(keys(Sandbox::alice.password));
    QCOMPARE(session->waitForEnd(), 0);
    QVERIFY(!session->output().contains(Sandbox::alice.password));
    const QString papers = mountDir(u"/sftp/alice@server.test~/papers"_s);
    QVERIFY2(
        session->output().contains("\"localPath\":\"" + papers.toLatin1() + '"'),
        session->output().constData());
    QVERIFY(QFile::exists(papers + u"/draft.txt"_s));

    // Another program finds it, by its place too, and another URL of the host takes it.
    const ToolResult list = m_service->run("list SFTP/alice@server.test/papers");
    QCOMPARE(list.out, QByteArray("draft.txt\n"));
    const ToolResult again = m_service->run("mount sftp://alice@server.test/~");
    QCOMPARE(again.err, QByteArray());
    QCOMPARE(again.out, mountDir(u"/sftp/alice@server.test~\n"_s).toLatin1());
    QCOMPARE(mountDirs().size(), 1);

    const ToolResult missing = m_service->run("mount sftp://alice@server.test/~/missing");
    QCOMPARE(missing.exitCode, 1);
    QCOMPARE(missing.out, QByteArray());
    QCOMPARE(
        missing.err,
        "veyfm-vfs: sftp://alice@server.test/~/missing: it is mounted, but the server has no such "
        "file or directory: " +
            mountDir(u"/sftp/alice@server.test~/missing\n"_s).toLatin1());
    QCOMPARE(mountDirs().size(), 1);
}

void RealToolTest::keyRefused()
{
    const auto session = onTerminal("mount sftp://alice@server.test/");
    QVERIFY(session->waitFor("Type yes or no: "));
    session->type("no\n");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith(
            "veyfm-vfs: sftp://alice@server.test/: the key of the host was not accepted\n"),
        session->output().constData());
    QVERIFY(!QFile::exists(mountDir(QString())));
}

void RealToolTest::wrongPasswords()
{
    KnownHosts::add(Sandbox::serverHost);
    const auto session = onTerminal("mount sftp://alice@server.test/");
    for (int i = 1; i <= 3; ++i) {
        QVERIFY(session->waitFor("Password for alice on sftp://server.test: ", i));
        session->type(keys(Sandbox::wrongPassword));
    }
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith(
            "veyfm-vfs: sftp://alice@server.test/: three passwords were refused\n"),
        session->output().constData());
    QVERIFY(!QFile::exists(mountDir(QString())));
}

void RealToolTest::otherUser()
{
    KnownHosts::add(Sandbox::serverHost);
    const auto session = onTerminal("mount sftp://server.test/~/name.txt");
    QVERIFY(session->waitFor("User name for sftp://server.test [tester]: "));
    session->type("bob\n");
    QVERIFY(session->waitFor("Password for bob on sftp://server.test: "));
    session->type(keys(Sandbox::wrongPassword));
    QVERIFY(session->waitFor("Access denied\nPassword for bob on sftp://server.test: "));
    session->type(keys(Sandbox::bob.password));
    QCOMPARE(session->waitForEnd(), 0);
    const QString name = mountDir(u"/sftp/bob@server.test~/name.txt"_s);
    QVERIFY(session->output().endsWith(name.toLatin1() + '\n'));
    QCOMPARE(fileContents(name), QByteArray("bob"));
}

void RealToolTest::addressOfVersion6()
{
    if (!Sandbox::hasVersion6()) {
        QSKIP("no IPv6 here");
    }
    KnownHosts::add("::1");
    const auto session = onTerminal("mount sftp://alice@[::1]/~/papers");
    QVERIFY2(
        session->waitFor("Password for alice on sftp://[::1]: "), session->output().constData());
    session->type(keys(Sandbox::alice.password));
    QCOMPARE(session->waitForEnd(), 0);
    const QByteArray papers = mountDir(u"/sftp/alice@::1~/papers"_s).toLatin1();
    QVERIFY2(session->output().endsWith(papers + '\n'), session->output().constData());

    const ToolResult list = m_service->run("list SFTP/alice@::1/papers");
    QCOMPARE(list.out, QByteArray("draft.txt\n"));
    const ToolResult again = m_service->run("mount --no-input sftp://alice@[::1]/~/papers");
    QCOMPARE(again.out, papers + '\n');
    const ToolResult mounts = m_service->run("mounts");
    QVERIFY2(mounts.out.startsWith("sftp://alice@[::1]/~/  "), mounts.out.constData());
}

void RealToolTest::cannotConnect_data()
{
    QTest::addColumn<QByteArray>("host");
    QTest::newRow("nobody listens") << QByteArray(Sandbox::closedHost);
    QTest::newRow("unknown host") << QByteArray("unknown.test");
}

void RealToolTest::cannotConnect()
{
    QFETCH(const QByteArray, host);
    const auto session = onTerminal("mount sftp://alice@" + host + '/');
    QCOMPARE(session->waitForEnd(), 1);
    // Now and then ssh has ended before sshfs writes to it, and the job sees another failure.
    const QByteArray line = "veyfm-vfs: sftp://alice@" + host + "/: ";
    const QByteArray help = "look with 'ssh alice@" + host + "' whether the host answers";
    QVERIFY2(session->output().startsWith(line), session->output().constData());
    QVERIFY2(session->output().contains(help), session->output().constData());
    QCOMPARE(session->output().count('\n'), 1);
    QVERIFY(!QFile::exists(mountDir(QString())));
}

// From a jump host, and in other words than for a password.
void RealToolTest::otherPrompts()
{
    KnownHosts::add(Sandbox::serverHost);
    KnownHosts::add(Sandbox::otherHost);
    KnownHosts::setConfiguration("Host other.test\nProxyJump bob@server.test\n");
    const auto session = onTerminal("mount sftp://alice@other.test/~/name.txt");
    QVERIFY(session->waitFor("Password for bob on sftp://server.test: "));
    session->type(keys(Sandbox::bob.password));
    QVERIFY(session->waitFor("(alice@other.test) Password: "));
    session->type(keys(Sandbox::alice.password));
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(fileContents(mountDir(u"/sftp/alice@other.test~/name.txt"_s)), QByteArray("alice"));
}

void RealToolTest::otherPromptGivenUp()
{
    KnownHosts::add(Sandbox::serverHost);
    KnownHosts::setConfiguration("Host other.test\nProxyJump bob@server.test\n");
    const auto session = onTerminal("mount sftp://alice@other.test/");
    QVERIFY(session->waitFor("Password for bob on sftp://server.test: "));
    session->type("\004");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith("veyfm-vfs: sftp://alice@other.test/: cancelled\n"),
        session->output().constData());
    QTRY_VERIFY(processesNamed("ssh").isEmpty());
    QVERIFY(processesNamed("sshfs").isEmpty());
    QVERIFY(!QFile::exists(mountDir(QString())));
}

// By the name that the configuration has for it.
void RealToolTest::descriptorOfAHostOfAnotherName()
{
    KnownHosts::add(Sandbox::serverHost);
    KnownHosts::setConfiguration("Host work\nHostName server.test\n");
    QProcess process;
    process.setProcessEnvironment(m_service->environment());
    process.start(
        toolPath(), ToolScene::words("mount --password-fd 0 sftp://alice@work/~/name.txt"));
    process.write(keys(Sandbox::alice.password));
    process.closeWriteChannel();
    QVERIFY(process.waitForFinished());
    QCOMPARE(process.readAllStandardError(), QByteArray());
    QCOMPARE(process.exitCode(), 0);
}

void RealToolTest::interrupted()
{
    KnownHosts::add(Sandbox::serverHost);
    const auto session = onTerminal("mount sftp://alice@server.test/");
    QVERIFY(session->waitFor("Password for alice on sftp://server.test: "));
    QVERIFY(!processesNamed("ssh").isEmpty());
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session->output().endsWith("veyfm-vfs: sftp://alice@server.test/: interrupted\n"),
        session->output().constData());
    QTRY_VERIFY(processesNamed("ssh").isEmpty());
    QVERIFY(processesNamed("sshfs").isEmpty());
    QVERIFY(!QFile::exists(mountDir(QString())));
}

void RealToolTest::fromDescriptor()
{
    KnownHosts::add(Sandbox::serverHost);
    QProcess process;
    process.setProcessEnvironment(m_service->environment());
    process.start(
        toolPath(), ToolScene::words("mount --password-fd 0 sftp://alice@server.test/~/name.txt"));
    process.write(keys(Sandbox::alice.password));
    process.closeWriteChannel();
    QVERIFY(process.waitForFinished());
    QCOMPARE(process.readAllStandardError(), QByteArray());
    QCOMPARE(process.exitCode(), 0);
    const QString name = QFile::decodeName(process.readAllStandardOutput()).trimmed();
    QCOMPARE(fileContents(name), QByteArray("alice"));
}

void RealToolTest::sambaLogin()
{
    QVERIFY(QDir().mkpath(sambaDir(u"/server.test/public"_s)));
    QVERIFY(QDir().mkpath(sambaDir(u"/server.test/private/a"_s)));
    const ToolResult guest = m_service->run("mount smb://server.test/public");
    QCOMPARE(guest.err, QByteArray());
    QCOMPARE(guest.out, sambaDir(u"/server.test/public\n"_s).toLatin1());

    const auto session = onTerminal("mount smb://server.test/private/a");
    QVERIFY(session->waitFor("User name for smb://server.test/private [tester]: "));
    session->type("alice\n");
    QVERIFY(session->waitFor("Password for alice on smb://server.test/private: "));
    session->type(keys(Sandbox::wrongPassword));
    QVERIFY(session->waitFor("Logon failure for server.test/private\n"));
    QVERIFY(session->waitFor("User name for smb://server.test/private [alice]: "));
    session->type("\n");
    QVERIFY(session->waitFor("Password for alice on smb://server.test/private: ", 2));
    session->type(keys(Sandbox::alice.password));
    QCOMPARE(session->waitForEnd(), 0);
    QVERIFY2(
        session->output().endsWith(sambaDir(u"/server.test/private/a\n"_s).toLatin1()),
        session->output().constData());
    QVERIFY(!session->output().contains(Sandbox::alice.password));
}

void RealToolTest::sambaMissing_data()
{
    QTest::addColumn<QByteArray>("host");
    QTest::addColumn<QByteArray>("url");
    QTest::newRow("share") << QByteArray("server.test") << QByteArray("smb://server.test/missing");
    QTest::newRow("nobody listens") << QByteArray(Sandbox::closedHost)
                                    << QByteArray("smb://") + Sandbox::closedHost + "/public";
    QTest::newRow("unknown host") << QByteArray("unknown.test")
                                  << QByteArray("smb://unknown.test/public");
}

void RealToolTest::sambaMissing()
{
    QFETCH(const QByteArray, host);
    QFETCH(const QByteArray, url);
    const ToolResult result = m_service->run("mount " + url);
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QVERIFY2(result.err.contains(": there is nothing at "), result.err.constData());
    QVERIFY2(result.err.contains("'smbclient -L " + host + '\''), result.err.constData());
}

void RealToolTest::ftpMissing()
{
    const auto session = onTerminal("mount ftp://bob@server.test/missing");
    QVERIFY(session->waitFor("Password for bob on ftp://server.test: "));
    session->type(keys(Sandbox::bob.password));
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().contains(": it is mounted, but the server has no such file or directory"),
        session->output().constData());
    QCOMPARE(mountDirs(), QStringList(mountDir(u"/ftp/bob@server.test"_s)));
}

void RealToolTest::ftpLogin()
{
    const auto session = onTerminal("mount ftp://bob@server.test/papers");
    QVERIFY(session->waitFor("Password for bob on ftp://server.test: "));
    session->type(keys(Sandbox::wrongPassword));
    QVERIFY(session->waitFor("Access denied\nPassword for bob on ftp://server.test: "));
    session->type(keys(Sandbox::bob.password));
    QCOMPARE(session->waitForEnd(), 0);
    const QString papers = mountDir(u"/ftp/bob@server.test/papers"_s);
    QVERIFY2(session->output().endsWith(papers.toLatin1() + '\n'), session->output().constData());
    QVERIFY(!session->output().contains(Sandbox::bob.password));

    const ToolResult list = m_service->run("list FTP/bob@server.test/papers");
    QCOMPARE(list.out, QByteArray("draft.txt\n"));
    const ToolResult mounts = m_service->run("mounts");
    QCOMPARE(mounts.lines().size(), 1);
    QVERIFY2(mounts.out.contains("mounted"), mounts.out.constData());
}

void RealToolTest::ftpInterrupted()
{
    const auto session = onTerminal("mount ftp://bob@server.test/");
    QVERIFY(session->waitFor("Password for bob on ftp://server.test: "));
    QVERIFY(!processesNamed("curlftpfs").isEmpty());
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QTRY_VERIFY(processesNamed("curlftpfs").isEmpty());
    QVERIFY(!QFile::exists(mountDir(QString())));
}

int main(int argc, char** argv)
{
    Sandbox sandbox(
        {"/usr/bin/sshfs", "/usr/bin/fusermount3", "/usr/bin/smbclient", "/usr/bin/rclone"});
    sandbox.addServer(std::make_unique<SecretWatch>());
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::serverHost));
    sandbox.addServer(
        std::make_unique<SshServer>(Sandbox::otherHost, SshServer::KeyboardInteractive));
    if (Sandbox::hasVersion6()) {
        sandbox.addServer(std::make_unique<SshServer>("::1"));
    }
    sandbox.addServer(std::make_unique<SmbServer>());
    sandbox.addServer(std::make_unique<FtpServer>(Sandbox::serverHost));
    return sandbox.run([&] {
        useCurlftpfsAdapter();
        return runSandboxTests<RealToolTest>(argc, argv);
    });
}

#include "tst_real_tool.moc"
