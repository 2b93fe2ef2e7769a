// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/knownhosts.h"
#include "real/realftptest.h"
#include "real/stallingserver.h"
#include "support/helpersession.h"

#include <QElapsedTimer>
#include <QTest>

#include <algorithm>
#include <memory>
#include <vector>

#include <signal.h>
#include <unistd.h>

/// veyfm-mount against real servers: what is mounted, and that nothing is left of what is not.
class RealMountHelperTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();
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
    void behindAJumpHost();
    void cancelledAtAnyMoment();
    void hostKilledAtAnyMoment();
    void threeAtOnce();

private:
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

    static QByteArray aliceUrl()
    {
        return QByteArray("sftp://alice@") + Sandbox::serverHost + "/~/papers";
    }
};

void RealMountHelperTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    KnownHosts::clear();
    KnownHosts::add(Sandbox::serverHost);
}

void RealMountHelperTest::cleanup()
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
    KnownHosts::add(Sandbox::serverHost); // A line to take the key from.
    QFile known(KnownHosts::path());
    QVERIFY(known.open(QIODevice::Append));
    known.write(
        QByteArray(Sandbox::stalledHost) + ' ' + SshServer::publicKey(Sandbox::serverHost) + '\n');
    known.close();
    int stalled = 0;
    int mounted = 0;
    for (int bytes = 1; bytes < 4000; bytes += 160) {
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
    // Nobody holds it, so that ssh asks for what opens it.
    const QString key = QDir::homePath() + u"/.ssh/id_ed25519"_s;
    QCOMPARE(
        QProcess::execute(
            u"ssh-keygen"_s,
            {u"-q"_s, u"-t"_s, u"ed25519"_s, u"-N"_s, u"phrase-4-key"_s, u"-f"_s, key}),
        0);
    HelperSession session;
    session.mount(QByteArray("sftp://alice@") + Sandbox::otherHost + "/~/papers");
    if (!session.saysMore(1000)) {
        QVERIFY(!processesNamed("ssh").isEmpty());
    }
    session.cancel();
    QCOMPARE(numberOf(session.end(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QFile::remove(key);
    QFile::remove(key + u".pub"_s);
    QCOMPARE(leftovers(), QStringList());
}

void RealMountHelperTest::behindAJumpHost()
{
    // Each of the two has an ssh of its own.
    QFile config(QDir::homePath() + u"/.ssh/config"_s);
    QVERIFY(config.open(QIODevice::WriteOnly));
    config.write("Host stalled.test\n  ProxyJump bob@server.test\n");
    config.close();
    StallingServer::stallAfter(0);
    HelperSession session;
    session.mount("sftp://alice@stalled.test/");
    QCOMPARE(textOf(session.next(), "say"), u"question"_s);
    QVERIFY(processesNamed("ssh").size() >= 2);
    session.answerPassword(1, passwordOf(Sandbox::bob));
    QTRY_VERIFY(StallingServer::hasStalled());
    session.cancel();
    QCOMPARE(numberOf(session.end(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QVERIFY(config.remove());
    QCOMPARE(leftovers(), QStringList());
}

void RealMountHelperTest::cancelledAtAnyMoment()
{
    constexpr int moments = 100;
    QElapsedTimer time;
    time.start();
    {
        HelperSession session;
        session.mount(aliceUrl());
        QCOMPARE(numberOf(answerAll(session, passwordOf(Sandbox::alice)), "code"), 0);
        session.cancel();
        QCOMPARE(session.waitForEnd(), 1);
    }
    const qint64 whole = time.nsecsElapsed();
    int cancelled = 0;
    for (int moment = 0; moment < moments; ++moment) {
        const qint64 due = whole * moment / moments;
        time.start();
        HelperSession session;
        session.mount(aliceUrl());
        while (time.nsecsElapsed() < due) {
            const int left = int((due - time.nsecsElapsed()) / 1000000);
            if (!session.saysMore(left)) {
                continue;
            }
            const QJsonObject said = session.next();
            if (textOf(said, "say") == u"question"_s) {
                session.answerPassword(numberOf(said, "id"), passwordOf(Sandbox::alice));
            }
        }
        session.cancel();
        QJsonObject last;
        for (QJsonObject said = session.next(); !said.isEmpty(); said = session.next()) {
            last = said;
        }
        QCOMPARE(textOf(last, "say"), u"end"_s);
        QCOMPARE(numberOf(last, "code"), 2);
        QCOMPARE(session.waitForEnd(), 1);
        ++cancelled;
        QVERIFY2(
            leftovers().isEmpty(), qPrintable(u"at %1 %: "_s.arg(moment) + leftovers().join(u' ')));
    }
    QCOMPARE(cancelled, moments);
}

void RealMountHelperTest::hostKilledAtAnyMoment()
{
    // The shell is the host, and holds the ends of both pipes.
    const QString script = QStringLiteral(
        "rm -f in out; mkfifo in out; \"$0\" <in >out & exec 3>in 4<out\n"
        "echo '{\"do\":\"mount\",\"version\":1,\"url\":\"%1\"}' >&3\n"
        "while read line <&4; do case $line in *'\"question\"'*)\n"
        "echo '{\"do\":\"answer\",\"id\":1,\"password\":true}' >&3; read password; echo "
        "\"$password\" >&3;;\n"
        "*) echo \"$line\";; esac; done");
    constexpr int moments = 20;
    qint64 whole = 0;
    for (int moment = 0; moment <= moments; ++moment) {
        QElapsedTimer time;
        time.start();
        QProcess host;
        host.setWorkingDirectory(QDir::homePath());
        host.start(
            u"/bin/sh"_s, {u"-c"_s, script.arg(QString::fromLatin1(aliceUrl())),
                           QStringLiteral(VEYFM_MOUNT_HELPER)});
        QVERIFY(host.waitForStarted());
        host.write('"' + passwordOf(Sandbox::alice) + "\"\n");
        const qint64 due = whole * moment / moments;
        QByteArray said;
        // The first time up to the end.
        while (whole == 0 ? !said.contains("\"code\":0") : time.elapsed() < due) {
            host.waitForReadyRead(int(std::max<qint64>(1, due - time.elapsed())));
            said += host.readAll();
            QVERIFY(time.elapsed() < HelperSession::patience);
        }
        whole = whole == 0 ? std::max<qint64>(1, time.elapsed()) : whole;
        host.kill();
        QVERIFY(host.waitForFinished());
        QTRY_COMPARE_WITH_TIMEOUT(leftovers(), QStringList(), 10000);
    }
    QFile::remove(QDir::homePath() + u"/in"_s);
    QFile::remove(QDir::homePath() + u"/out"_s);
}

void RealMountHelperTest::threeAtOnce()
{
    constexpr int rounds = 200;
    for (int round = 0; round < rounds; ++round) {
        std::vector<std::unique_ptr<HelperSession>> sessions;
        for (int i = 0; i < 3; ++i) {
            sessions.push_back(std::make_unique<HelperSession>());
        }
        for (const auto& session : sessions) {
            session->mount(aliceUrl());
        }
        int made = 0;
        int present = 0;
        std::vector<bool> ended(sessions.size(), false);
        while (std::find(ended.begin(), ended.end(), false) != ended.end()) {
            for (size_t i = 0; i < sessions.size(); ++i) {
                if (ended[i] || !sessions[i]->saysMore(5)) {
                    continue;
                }
                const QJsonObject said = sessions[i]->next();
                if (textOf(said, "say") == u"question"_s) {
                    sessions[i]->answerPassword(numberOf(said, "id"), passwordOf(Sandbox::alice));
                } else if (textOf(said, "say") == u"end"_s) {
                    QVERIFY2(numberOf(said, "code") == 0, qPrintable(textOf(said, "text")));
                    made += textOf(said, "mounted") == u"new"_s;
                    present += textOf(said, "mounted") == u"present"_s;
                    ended[i] = true;
                    sessions[i]->take();
                }
            }
        }
        QCOMPARE(made, 1);
        QCOMPARE(present, 2);
        const QString directory = mountDir(u"/sftp/alice@server.test~"_s);
        QCOMPARE(mountDirs(), QStringList(directory));
        sessions.clear();
        QCOMPARE(QProcess::execute(u"fusermount3"_s, {u"-u"_s, directory}), 0);
    }
}

int main(int argc, char** argv)
{
    Sandbox sandbox(
        {"/usr/bin/sshfs", "/usr/bin/fusermount3", "/usr/bin/smbclient", "/usr/bin/rclone"});
    sandbox.addServer(std::make_unique<SecretWatch>());
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::serverHost));
    sandbox.addServer(
        std::make_unique<SshServer>(Sandbox::otherHost, SshServer::KeyboardInteractive));
    sandbox.addServer(std::make_unique<FtpServer>(Sandbox::serverHost));
    sandbox.addServer(std::make_unique<StallingServer>());
    return sandbox.run([&] {
        useCurlftpfsAdapter();
        return runSandboxTests<RealMountHelperTest>(argc, argv);
    });
}

#include "tst_real_mounthelper.moc"
