// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/realhelpertest.h"
#include "real/sshagent.h"

#include <QElapsedTimer>

#include <signal.h>

/// veyfm-mount against real servers, such as are silent too.
class RealMountHelperTest : public RealHelperTest
{
    Q_OBJECT

private Q_SLOTS:
    void firstContact();
    void wrongThenRightPassword_data();
    void wrongThenRightPassword();
    void takenLivesOn();
    void folderIsMissing();
    void silentServer_data();
    void silentServer();
    void stalledAmidAStage();
    void stoppedProcesses();
    void encryptedKey();
    void keyOfAnAgent();
    void behindAJumpHost_data();
    void behindAJumpHost();
    void otherUserOfAJumpHost();
};

void RealMountHelperTest::firstContact()
{
    // With a wrong password in the run in which the key is confirmed.
    KnownHosts::clear();
    HelperSession session;
    session.mount(aliceUrl());
    const QJsonObject key = session.next();
    QCOMPARE(textOf(key, "kind"), u"confirm"_s);
    QVERIFY(textOf(key, "message").contains(SshServer::fingerprint(Sandbox::serverHost)));
    session.confirm(1, true);
    const QJsonObject question = session.next();
    QCOMPARE(textOf(question, "user"), u"alice"_s);
    QCOMPARE(textOf(question, "host"), QString::fromLatin1(Sandbox::serverHost));
    QCOMPARE(flagOf(question, "retry"), false);
    session.answerPassword(2, Sandbox::wrongPassword);
    const QJsonObject again = session.next();
    QCOMPARE(textOf(again, "kind"), u"password"_s);
    QCOMPARE(flagOf(again, "retry"), true);
    session.answerPassword(3, passwordOf(Sandbox::alice));
    QCOMPARE(textOf(session.next(), "say"), u"accepted"_s);
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 0);
    QVERIFY(QFile::exists(textOf(end, "localPath") + u"/draft.txt"_s));
    session.closeInput();
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(leftovers(), QStringList());
}

void RealMountHelperTest::wrongThenRightPassword_data()
{
    QTest::addColumn<QByteArray>("url");
    QTest::newRow("sftp") << QByteArray("sftp://alice@server.test/");
    QTest::newRow("ftp") << QByteArray("ftp://alice@server.test/");
}

void RealMountHelperTest::wrongThenRightPassword()
{
    QFETCH(QByteArray, url);
    HelperSession session;
    session.mount(url);
    QCOMPARE(flagOf(session.next(), "retry"), false);
    session.answerPassword(1, Sandbox::wrongPassword);
    QCOMPARE(textOf(session.next(), "say"), u"rejected"_s);
    QCOMPARE(flagOf(session.next(), "retry"), true);
    session.answerPassword(2, passwordOf(Sandbox::alice));
    QCOMPARE(textOf(session.next(), "say"), u"accepted"_s);
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(mountDirs(), QStringList(textOf(end, "directory")));
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(leftovers(), QStringList());
}

void RealMountHelperTest::takenLivesOn()
{
    {
        HelperSession session;
        session.mount(aliceUrl());
        QCOMPARE(numberOf(answerAll(session, passwordOf(Sandbox::alice)), "code"), 0);
        session.take();
        QCOMPARE(session.waitForEnd(), 0);
    }
    const QString directory = mountDir(u"/sftp/alice@server.test~"_s);
    QCOMPARE(mountDirs(), QStringList(directory));
    QVERIFY(QFile::exists(directory + u"/papers/draft.txt"_s));
    QCOMPARE(processes(), QStringList({u"sshfs"_s, u"ssh"_s}));

    HelperSession second;
    second.mount(QByteArray("sftp://alice@") + Sandbox::serverHost + "/~");
    const QJsonObject end = second.next();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "mounted"), u"present"_s);
    QCOMPARE(textOf(end, "localPath"), directory);
    second.closeInput();
    QCOMPARE(second.waitForEnd(), 1);
    QCOMPARE(mountDirs(), QStringList(directory));
}

void RealMountHelperTest::folderIsMissing()
{
    HelperSession session;
    session.mount(QByteArray("sftp://alice@") + Sandbox::serverHost + "/~/missing");
    const QJsonObject end = answerAll(session, passwordOf(Sandbox::alice));
    QCOMPARE(numberOf(end, "code"), 1);
    const QString directory = mountDir(u"/sftp/alice@server.test~"_s);
    QCOMPARE(
        textOf(end, "text"), u"it is mounted, but the server has no such file or directory: "_s +
                                 directory + u"/missing"_s);
    QCOMPARE(textOf(end, "directory"), directory);
    QCOMPARE(session.waitForEnd(), 1);
    // There to look for it.
    QCOMPARE(mountDirs(), QStringList(directory));
    QVERIFY(QFile::exists(directory + u"/papers"_s));
}

void RealMountHelperTest::silentServer_data()
{
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArray>("tool");
    QTest::newRow("sftp") << QByteArray("sftp://alice@stalled.test/") << QByteArray("ssh");
    QTest::newRow("ftp") << QByteArray("ftp://alice@stalled.test/") << QByteArray("rclone");
}

void RealMountHelperTest::silentServer()
{
    QFETCH(QByteArray, url);
    QFETCH(QByteArray, tool);
    StallingServer::stallAfter(0);
    HelperSession session;
    session.mount(url);
    if (url.startsWith("ftp")) {
        const QJsonObject question = session.next();
        session.answerPassword(numberOf(question, "id"), passwordOf(Sandbox::alice));
    }
    QTRY_VERIFY(!processesNamed(tool.constData()).isEmpty());
    QVERIFY(!session.saysMore(200));
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(leftovers(), QStringList());
}

void RealMountHelperTest::stalledAmidAStage()
{
    // From the version of the server over the exchange of keys and the login to the first looks at
    // the files.
    addStalledHost();
    int stalled = 0;
    int mounted = 0;
    for (int bytes = 1; bytes < 20000; bytes += 1 + bytes / 4) {
        StallingServer::stallAfter(bytes);
        HelperSession session;
        session.mount("sftp://alice@stalled.test/~/papers", R"(,"patience":200)");
        bool isMounted = false;
        while (!StallingServer::hasStalled() && !isMounted) {
            if (!session.saysMore(20)) {
                continue;
            }
            const QJsonObject said = session.next();
            if (textOf(said, "say") == u"question"_s) {
                session.answerPassword(numberOf(said, "id"), passwordOf(Sandbox::alice));
            } else if (textOf(said, "say") == u"end"_s) {
                QCOMPARE(numberOf(said, "code"), 0);
                isMounted = true;
            }
        }
        (isMounted ? mounted : stalled) += 1;
        session.cancel();
        const QJsonObject end = session.end();
        QVERIFY(!end.isEmpty());
        QCOMPARE(session.waitForEnd(), 1);
        QVERIFY2(
            leftovers().isEmpty(),
            qPrintable(QString::number(bytes) + u": "_s + leftovers().join(u' ')));
    }
    QVERIFY(stalled > 5);
    QVERIFY(mounted > 0);
}

void RealMountHelperTest::stoppedProcesses()
{
    for (const char* name : {"ssh", "sshfs"}) {
        HelperSession session;
        session.mount(aliceUrl());
        QCOMPARE(textOf(session.next(), "say"), u"question"_s);
        for (const int pid : processesNamed(name)) {
            QCOMPARE(::kill(pid, SIGSTOP), 0);
        }
        session.answerPassword(1, passwordOf(Sandbox::alice));
        QVERIFY(!session.saysMore(100));
        QElapsedTimer time;
        time.start();
        session.cancel();
        QCOMPARE(numberOf(session.next(), "code"), 2);
        QVERIFY(time.elapsed() < 4000);
        QCOMPARE(session.waitForEnd(), 1);
        QCOMPARE(leftovers(), QStringList());
    }
}

void RealMountHelperTest::encryptedKey()
{
    KnownHosts::add(Sandbox::keyHost);
    KnownHosts::setConfiguration(
        "Host key.test\nIdentityFile " + QFile::encodeName(SshServer::clientKey(Sandbox::keyHost)) +
        '\n');
    HelperSession session;
    session.mount("sftp://alice@key.test/~");
    const QJsonObject question = session.next();
    QCOMPARE(textOf(question, "kind"), u"password"_s);
    QVERIFY(textOf(question, "message").contains(u"Enter passphrase for key"_s));
    QCOMPARE(textOf(question, "host"), QString::fromLatin1(Sandbox::keyHost));
    QCOMPARE(flagOf(question, "retry"), false);
    session.answerPassword(numberOf(question, "id"), Sandbox::wrongPassword);
    // It is asked for once, and then the login is refused.
    QJsonObject said = session.next();
    QCOMPARE(textOf(said, "say"), u"rejected"_s);
    said = session.next();
    QCOMPARE(flagOf(said, "retry"), true);
    session.answerPassword(numberOf(said, "id"), SshServer::passphrase);
    QCOMPARE(textOf(session.next(), "say"), u"accepted"_s);
    QCOMPARE(numberOf(session.next(), "code"), 0);
    session.cancel();
    QCOMPARE(numberOf(session.end(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(leftovers(), QStringList());

    HelperSession cancelled;
    cancelled.mount("sftp://alice@key.test/~");
    QCOMPARE(textOf(cancelled.next(), "say"), u"question"_s);
    cancelled.cancel();
    QCOMPARE(numberOf(cancelled.end(), "code"), 2);
    QCOMPARE(cancelled.waitForEnd(), 1);
    QCOMPARE(leftovers(), QStringList());
}

void RealMountHelperTest::keyOfAnAgent()
{
    KnownHosts::add(Sandbox::keyHost);
    const QString key = SshServer::clientKey(Sandbox::keyHost);
    KnownHosts::setConfiguration("Host key.test\nIdentityFile " + QFile::encodeName(key) + '\n');
    SshAgent agent(key);
    QVERIFY(agent.holdsKey());
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(u"SSH_AUTH_SOCK"_s, agent.socket());

    HelperSession session(environment);
    session.mount("sftp://alice@key.test/~");
    QCOMPARE(textOf(session.next(), "say"), u"accepted"_s);
    QCOMPARE(numberOf(session.next(), "code"), 0);
    session.cancel();
    QCOMPARE(numberOf(session.end(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(leftovers(), QStringList());
    // It was not started by the helper.
    QVERIFY(agent.isRunning());
}

void RealMountHelperTest::behindAJumpHost_data()
{
    QTest::addColumn<int>("answers");
    QTest::addColumn<int>("bytes");
    constexpr int all = 1 << 30;
    QTest::newRow("at the first question") << 0 << all;
    QTest::newRow("at the second question") << 1 << all;
    QTest::newRow("behind a host that stalls") << 1 << 0;
    QTest::newRow("behind the mount") << 2 << all;
}

void RealMountHelperTest::behindAJumpHost()
{
    // Each of the two has an ssh of its own.
    QFETCH(int, answers);
    QFETCH(int, bytes);
    addStalledHost();
    KnownHosts::setConfiguration("Host stalled.test\n  ProxyJump bob@server.test\n");
    StallingServer::stallAfter(bytes);
    HelperSession session;
    session.mount("sftp://alice@stalled.test/");
    const char* const hosts[] = {Sandbox::serverHost, Sandbox::stalledHost};
    const SandboxAccount accounts[] = {Sandbox::bob, Sandbox::alice};
    for (int i = 0; i <= answers; ++i) {
        if (i == 1 && bytes == 0) {
            QTRY_VERIFY(StallingServer::hasStalled());
            break;
        }
        const QJsonObject said = session.next();
        if (i == 2) {
            QCOMPARE(textOf(said, "say"), u"accepted"_s);
            QCOMPARE(numberOf(session.next(), "code"), 0);
            break;
        }
        QCOMPARE(textOf(said, "host"), QString::fromLatin1(hosts[i]));
        QCOMPARE(textOf(said, "user"), QString::fromLatin1(accounts[i].name));
        QCOMPARE(flagOf(said, "retry"), false);
        if (i < answers) {
            session.answerPassword(numberOf(said, "id"), passwordOf(accounts[i]));
        }
    }
    QVERIFY(processesNamed("ssh").size() >= 2);
    session.cancel();
    QCOMPARE(numberOf(session.end(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(leftovers(), QStringList());
}

void RealMountHelperTest::otherUserOfAJumpHost()
{
    addStalledHost();
    KnownHosts::setConfiguration("Host stalled.test\n  ProxyJump bob@server.test\n");
    StallingServer::stallAfter(0);
    HelperSession session;
    session.mount("sftp://alice@stalled.test/");
    QCOMPARE(textOf(session.next(), "user"), u"bob"_s);
    session.answerPassword(1, passwordOf(Sandbox::alice), R"(,"user":"alice")");
    const QJsonObject again = session.next();
    QCOMPARE(numberOf(again, "id"), 2);
    QCOMPARE(
        textOf(again, "message"),
        u"server.test is a host on the way: its user can't be changed here"_s);
    session.cancel();
    QCOMPARE(numberOf(session.end(), "code"), 2);
}

int main(int argc, char** argv)
{
    return runHelperTests<RealMountHelperTest>(argc, argv);
}

#include "tst_real_mounthelper.moc"
