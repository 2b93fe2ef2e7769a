// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/helpersession.h"
#include "support/mountscene.h"

#include <QElapsedTimer>
#include <QTest>

#include <sys/wait.h>

/// That nothing is left when a mount does not come to its end.
class MountHelperCancelTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void atAQuestion_data();
    void atAQuestion();
    void whileTheToolHangs();
    void whileTheToolIsStopped();
    void stubbornTool();
    void toolThatTidiesUp();
    void toolThatMountsAtTheEnd();
    void behindTheMount_data();
    void behindTheMount();
    void notTaken();
    void takenLivesOn();
    void busyMount();
    void workerIsKilled();
    void hostIsKilled();
    void silentService();
    void registrationIsForgotten();
    void olderDirectoriesStay();

private:
    static constexpr const char* prompt = "out me@host's password: ";

    /// Ends a session in one of the ways that there are.
    static void end(HelperSession& session, const QByteArray& way)
    {
        if (way == "cancel") {
            session.cancel();
        } else if (way == "end of input") {
            session.closeInput();
        } else {
            ::kill(pid_t(session.pid()), way.toInt());
        }
    }
    static void addWays()
    {
        QTest::addColumn<QByteArray>("way");
        QTest::newRow("cancel") << QByteArray("cancel");
        QTest::newRow("end of input") << QByteArray("end of input");
        QTest::newRow("SIGTERM") << QByteArray::number(SIGTERM);
        QTest::newRow("SIGINT") << QByteArray::number(SIGINT);
        QTest::newRow("SIGHUP") << QByteArray::number(SIGHUP);
    }
};

void MountHelperCancelTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void MountHelperCancelTest::atAQuestion_data()
{
    addWays();
}

void MountHelperCancelTest::atAQuestion()
{
    QFETCH(QByteArray, way);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("question"));
    const qint64 worker = session.workerId();
    QVERIFY(MountScene::isRunning(worker));
    end(session, way);
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 2);
    QCOMPARE(textOf(end, "text"), QStringLiteral("Accessing sftp resource was cancelled"));
    // By then, and not later.
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(!MountScene::isRunning(worker));
    QVERIFY(scene.isClean());
    QCOMPARE(session.waitForEnd(), 1);
}

void MountHelperCancelTest::whileTheToolHangs()
{
    // Its helper goes to the background, as that of sshfs.
    MountScene scene("sshfs");
    scene.tool.expect({"fork", "hang"});
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QTRY_VERIFY(scene.tool.childId(1) != 0);
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::whileTheToolIsStopped()
{
    MountScene scene("sshfs");
    scene.tool.expect({"fork", "hang"});
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QTRY_VERIFY(scene.tool.childId(1) != 0);
    ::kill(pid_t(scene.tool.processId(1)), SIGSTOP);
    ::kill(pid_t(scene.tool.childId(1)), SIGSTOP);
    ::kill(pid_t(session.workerId()), SIGSTOP);
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::stubbornTool()
{
    MountScene scene("sshfs");
    scene.tool.expect({"block 15", "fork", "hang"});
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QTRY_VERIFY(scene.tool.childId(1) != 0);
    QElapsedTimer time;
    time.start();
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QVERIFY(time.elapsed() >= 2000);
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::toolThatTidiesUp()
{
    // As sshfs does with fusermount3: what it runs for that is not ended with it.
    MountScene scene("sshfs");
    scene.tool.expect({"block 15", prompt, "await 15", "unblock 15", "finish", "exit 1"});
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("question"));
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QVERIFY(scene.tool.hasFinished(1));
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::toolThatMountsAtTheEnd()
{
    // What can't be stopped is seen behind its end.
    MountScene scene("sshfs");
    scene.tool.expect({"block 15", prompt, "await 15", "mount", "hang"});
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("question"));
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(scene.tool.receivedSignals(1), QByteArray("15\n"));
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::behindTheMount_data()
{
    addWays();
}

void MountHelperCancelTest::behindTheMount()
{
    QFETCH(QByteArray, way);
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    end(session, way);
    const QJsonObject end = session.next();
    QCOMPARE(textOf(end, "say"), QStringLiteral("end"));
    QCOMPARE(numberOf(end, "code"), 2);
    QVERIFY(scene.isClean());
    QCOMPARE(session.waitForEnd(), 1);
}

void MountHelperCancelTest::notTaken()
{
    // With what serves it.
    MountScene scene("curlftpfs");
    scene.tool.expect({"fork", "mount"});
    HelperSession session(scene.environment());
    session.mount("ftp://me@host/");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    QVERIFY(MountScene::isRunning(scene.tool.childId(1)));
    session.closeInput();
    QCOMPARE(session.waitForEnd(), 1);
    QVERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::takenLivesOn()
{
    MountScene scene("curlftpfs");
    scene.tool.expect({"fork", "mount"});
    HelperSession session(scene.environment());
    session.mount("ftp://me@host/");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    session.take();
    session.closeInput();
    QCOMPARE(session.waitForEnd(), 0);
    QVERIFY(MountScene::isRunning(scene.tool.childId(1)));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("ftp/me@host")));
    ::kill(pid_t(scene.tool.childId(1)), SIGKILL);
}

void MountHelperCancelTest::busyMount()
{
    // By a program that waits in there.
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    const int inside = ::open(
        QFile::encodeName(scene.directory(QStringLiteral("sftp/me@host"))).constData(),
        O_PATH | O_CLOEXEC);
    QVERIFY(inside >= 0);
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QVERIFY(scene.isClean());
    ::close(inside);
}

void MountHelperCancelTest::workerIsKilled()
{
    MountScene scene("sshfs");
    scene.tool.expect({"fork", "hang"});
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QTRY_VERIFY(scene.tool.childId(1) != 0);
    ::kill(pid_t(session.workerId()), SIGKILL);
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    QCOMPARE(
        textOf(end, "text"), QStringLiteral("the worker of veyfm-mount has ended unexpectedly"));
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
    QCOMPARE(session.waitForEnd(), 1);
}

void MountHelperCancelTest::hostIsKilled()
{
    MountScene scene("sshfs");
    scene.tool.expect({"fork", "hang"});
    // The shell is the host, and has an end of the pipe.
    QProcess host;
    host.setProcessEnvironment(scene.environment());
    host.start(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"),
         QStringLiteral("mkfifo \"$1\" && { \"$0\" <\"$1\" & exec 3>\"$1\"; echo $!; "
                        "echo '{\"do\":\"mount\",\"version\":1,\"url\":\"sftp://me@host/\"}' >&3; "
                        "read line; }"),
         QStringLiteral(VEYFM_MOUNT_HELPER),
         QFileInfo(scene.directory()).dir().filePath(QStringLiteral("fifo"))});
    QVERIFY(host.waitForStarted());
    QTRY_VERIFY(host.canReadLine());
    const qint64 helper = host.readLine().toLongLong();
    QTRY_VERIFY(scene.tool.childId(1) != 0);
    QVERIFY(MountScene::isRunning(helper));
    ::kill(pid_t(host.processId()), SIGKILL);
    QTRY_VERIFY(!MountScene::isRunning(helper));
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
    host.waitForFinished();
}

void MountHelperCancelTest::silentService()
{
    // The worker waits in a call; the supervisor makes none.
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load(
        ruleOf(QStringLiteral("FuseMountsManager.mounts"), {{QStringLiteral("silent"), true}}));
    MountScene scene("sshfs", &service);
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QTRY_VERIFY(!service.service().calls().filter(QStringLiteral("FuseMounts")).isEmpty());
    QElapsedTimer time;
    time.start();
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QVERIFY(time.elapsed() < 2000);
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::registrationIsForgotten()
{
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("remember"), true}});
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    const QJsonObject mounted = session.end();
    QCOMPARE(numberOf(mounted, "code"), 0);
    QCOMPARE(flagOf(mounted, "shared"), true);
    QCOMPARE(textOf(mounted, "path"), QStringLiteral("SFTP/me@host"));
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    const QString url = QStringLiteral("sftp://me@host/");
    QCOMPARE(
        service.service().takeCalls().filter(QStringLiteral("FuseMountsManager.addMount")),
        QStringList(
            {registration(url, scene.directory(QStringLiteral("sftp/me@host"))),
             registration(url, QString())}));
    QVERIFY(scene.isClean());
}

void MountHelperCancelTest::olderDirectoriesStay()
{
    MountScene scene("sshfs");
    QVERIFY(QDir().mkpath(scene.directory(QStringLiteral("sftp/me@host"))));
    QVERIFY(QDir().mkpath(scene.directory(QStringLiteral("sftp/you@host"))));
    scene.tool.expect(Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(scene.mounts(), QStringList());
    QVERIFY(QFile::exists(scene.directory(QStringLiteral("sftp/me@host"))));
    QVERIFY(QFile::exists(scene.directory(QStringLiteral("sftp/you@host"))));
}

QTEST_GUILESS_MAIN(MountHelperCancelTest)
#include "tst_mounthelper_cancel.moc"
