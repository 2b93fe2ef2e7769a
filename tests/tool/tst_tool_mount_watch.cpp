// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

#include <QElapsedTimer>

namespace {

constexpr int patience = 30000;

} // namespace

/// Jobs of "mount" that would go on for ever.
class ToolMountWatchTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void hungTool_data();
    void hungTool();
    void stubbornTool();
    void toolThatTidiesUp();
    void answeringTakesNoTime();
    void beingStoppedTakesNoTime();
    void silentDescriptor();
    void hungSambaTool();
    void silentService();
    void refusingService();
    void stoppedService_data();
    void stoppedService();
    void serviceNeverAnswers();
    void olderMountsStay();
};

void ToolMountWatchTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountWatchTest::hungTool_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArray>("why");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                          << QByteArray("sshfs may be waiting for more than a password; look with "
                                        "'ssh me@host' whether the host answers and lets you in");
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/")
                         << QByteArray("curlftpfs waits for the server");
}

void ToolMountWatchTest::hungTool()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    QFETCH(const QByteArray, why);
    MountScene scene(tool);
    scene.tool.expect({"out Connecting.\\n", "fork", "hang"});
    const ToolResult result = scene.run("mount --timeout 1 " + url);
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(result.err, "veyfm-vfs: " + url + ": no progress within 1 s: " + why + '\n');
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QTRY_VERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::stubbornTool()
{
    // Its helper loses its parent before it is made to end.
    MountScene scene("sshfs");
    scene.tool.expect({"block 15", "fork", "hang"});
    const ToolResult result = scene.run("mount --timeout 1 sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.err.contains("no progress within 1 s"), result.err.constData());
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QTRY_VERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::toolThatTidiesUp()
{
    // As sshfs does with fusermount3: what it runs for that is not ended with it.
    MountScene scene("sshfs");
    scene.tool.expect({"block 15", "await 15", "unblock 15", "finish", "exit 1"});
    const ToolResult result = scene.run("mount --timeout 1 sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QVERIFY(scene.tool.hasFinished(1));
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::answeringTakesNoTime()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount --timeout 1 sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    // A person who is slower than that.
    QTest::qWait(1500);
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
}

void ToolMountWatchTest::beingStoppedTakesNoTime()
{
    MountScene scene("sshfs");
    scene.tool.expect(QByteArrayList{"block 10", "finish", "await 10"} + Said::success());
    QProcess process;
    scene.start(process, "mount --timeout 3 sftp://me@host/");
    QTRY_VERIFY_WITH_TIMEOUT(scene.tool.hasFinished(1), patience);
    const pid_t tool = scene.programOf(1);
    ::kill(tool, SIGSTOP);
    // Longer than the tool may take.
    QTest::qWait(3500);
    ::kill(tool, SIGCONT);
    ::kill(pid_t(scene.tool.processId(1)), SIGUSR1);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitCode(), 0);
    QCOMPARE(process.readAllStandardOutput(), scene.line(QStringLiteral("sftp/me@host")));
}

void ToolMountWatchTest::silentDescriptor()
{
    // A program that feeds the password takes no longer than the tool may; a person does.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    QProcess process;
    scene.start(process, "mount --timeout 1 --password-fd 0 sftp://me@host/");
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(
        process.readAllStandardError(),
        failure(
            "sftp://me@host/", "no progress within 1 s: no password came from the descriptor of "
                               "--password-fd"));
    QCOMPARE(process.exitCode(), 1);
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::hungSambaTool()
{
    // A look with a ticket that hangs would be followed by one as a guest, which a killed tool
    // passes.
    ToolScene service(
        scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), QStringLiteral("/net/smb")));
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    scene.tool.expect({"hang"});
    const ToolResult result = scene.run("mount --timeout 1 smb://host/share");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: smb://host/share: no progress within 1 s: smbclient "
                               "waits for the server\n"));
    QCOMPARE(scene.tool.runs(), 1);
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
}

void ToolMountWatchTest::silentService()
{
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("echo"), false}});
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::success());
    const ToolResult result = scene.run("mount --timeout 1 sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: sftp://me@host/: no progress within 1 s: the file "
                               "manager service does not tell of the mount\n"));
    QVERIFY(scene.isClean());
    QTRY_VERIFY(service.service().calls().contains(
        registration(QStringLiteral("sftp://me@host/"), QString())));
}

void ToolMountWatchTest::refusingService()
{
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load(
        {{QStringLiteral("echo"), false},
         {QStringLiteral("rules"),
          QJsonObject{
              {QStringLiteral("NetworkMountsManager.addMount"),
               QJsonArray{QJsonObject{
                   {QStringLiteral("signals"),
                    QJsonArray{QJsonArray{
                        QStringLiteral("NetworkMountsManager"), QStringLiteral("mountAdded"),
                        QJsonArray{
                            QStringLiteral("sftp://me@host/"),
                            QJsonArray{QString(), QString(), 0}}}}}}}}}}});
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::success());
    const ToolResult result = scene.run("mount sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: sftp://me@host/: Couldn't access resource: the file "
                               "manager service refuses the mount\n"));
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::stoppedService_data()
{
    QTest::addColumn<QByteArrayList>("last");
    // In a call to the bus a job can't be stopped: it is cut off. The mount goes all the same.
    QTest::newRow("the job calls it") << Said::success();
    // Nor can the end of the process.
    QTest::newRow("the process calls it at its end") << QByteArrayList{"hang"};
}

void ToolMountWatchTest::stoppedService()
{
    QFETCH(const QByteArrayList, last);
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::sshPassword() + last);
    const auto session = scene.onTerminal("mount --timeout 1 sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    service.service().stop();
    QElapsedTimer timer;
    timer.start();
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 1);
    // A call to the bus gives up after 25 seconds.
    QVERIFY(timer.elapsed() < 20000);
    service.service().resume();
    QVERIFY2(session->output().contains("no progress within 1 s"), session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::serviceNeverAnswers()
{
    // It is passed over, as one that is not there.
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::success());
    service.service().stop();
    QElapsedTimer timer;
    timer.start();
    const ToolResult mounted = scene.run("mount --no-input sftp://me@host/");
    const ToolResult share = scene.run("mount --no-input smb://host/share");
    // Each of several calls gives up after 25 seconds.
    const qint64 elapsed = timer.elapsed();
    service.service().resume();
    QVERIFY2(elapsed < 20000, qPrintable(QString::number(elapsed)));
    const QByteArray why = "the file manager service (org.veylabs.vey-fm.vfs) does not answer: ";
    QVERIFY2(
        mounted.err.startsWith(
            "veyfm-vfs: sftp://me@host/: other programs don't see this mount: " + why),
        mounted.err.constData());
    QCOMPARE(mounted.exitCode, 0);
    QVERIFY2(share.err.contains(why), share.err.constData());
    QCOMPARE(share.exitCode, 1);
    QCOMPARE(scene.tool.runs(), 1);
}

void ToolMountWatchTest::olderMountsStay()
{
    // Of another user on the same host, and a directory that somebody has made.
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    scene.tool.expect({"hang"});
    QCOMPARE(scene.run("mount sftp://you@host/").exitCode, 0);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    QCOMPARE(scene.run("mount --timeout 1 sftp://me@host/").exitCode, 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/you@host")));
}

QTEST_GUILESS_MAIN(ToolMountWatchTest)
#include "tst_tool_mount_watch.moc"
