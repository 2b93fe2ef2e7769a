// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/updatescene.h"

#include <QTest>

#include <signal.h>

using namespace UpdateScene;

/// "veyfm-vfs update" that is interrupted, or waits for what never comes.
class ToolUpdateWatchTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void interrupted_data();
    void interrupted();
    void questionBehindHungTool();
    void interruptedScan();
    void stuckService();
    void stuckServiceTakesItsTime();
    void stoppedService();
};

void ToolUpdateWatchTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolUpdateWatchTest::interrupted_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("entry");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("Network/work");
    QTest::newRow("Samba") << QByteArray("smbclient") << QByteArray("Network/share");
}

void ToolUpdateWatchTest::interrupted()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, entry);
    ToolScene service(known());
    QVERIFY(service.isReady());
    MountScene scene(tool, &service);
    scene.tool.alsoStandFor("curlftpfs");
    scene.tool.expect({"hang"});
    const auto session = scene.onTerminal("update " + entry + " Network/files");
    QTRY_VERIFY(MountScene::isRunning(scene.tool.processId(1)));
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session->output().endsWith("veyfm-vfs: " + entry + ": interrupted\n"),
        session->output().constData());
    // The others are left alone, and nothing stays behind.
    QCOMPARE(scene.tool.allRuns().filter(QStringLiteral("curlftpfs")), QStringList());
    QVERIFY(scene.isClean());
    QTRY_VERIFY(!MountScene::isRunning(scene.tool.processId(1)));
}

void ToolUpdateWatchTest::questionBehindHungTool()
{
    ToolScene service(known());
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    scene.tool.expect({"hang"});
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("update --timeout 1 Network/work Network/home");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    QVERIFY(session->output().contains("veyfm-vfs: Network/work: no progress within 1 s"));
    // A person who takes longer than the program may take to part.
    QTest::qWait(2500);
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith(scene.line(QStringLiteral("sftp/me@host~"))),
        session->output().constData());
}

void ToolUpdateWatchTest::interruptedScan()
{
    ToolScene service(known());
    QVERIFY(service.isReady());
    const auto session = std::make_unique<TerminalSession>(
        toolPath(), ToolScene::words("update Samba Samba/WG"), QDir::tempPath(),
        service.environment(), 200);
    QVERIFY(session->waitFor(" Updating Samba ("));
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session->output().endsWith("veyfm-vfs: Samba: interrupted\n"),
        session->output().constData());
}

void ToolUpdateWatchTest::stuckService()
{
    ToolScene service(known());
    QVERIFY(service.isReady());
    service.service().setRules(
        QStringLiteral("SmbBrowser.workgroups"), {QJsonObject{{QStringLiteral("silent"), true}}});
    TerminalSession session(
        toolPath(), ToolScene::words("update Samba/WG"), QDir::tempPath(), service.environment());
    QVERIFY(session.waitFor(" Waiting for the file manager service ("));
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session.output().endsWith("\r\033[Kveyfm-vfs: Samba/WG: interrupted\n"),
        session.output().constData());
}

void ToolUpdateWatchTest::stuckServiceTakesItsTime()
{
    ToolScene service(known());
    QVERIFY(service.isReady());
    service.service().setRules(
        QStringLiteral("SmbBrowser.workgroups"), {QJsonObject{{QStringLiteral("silent"), true}}});
    const ToolResult result = service.run("update --timeout 1 Samba/WG");
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: Samba/WG: no progress within 1 s: the file manager "
                               "service does not answer\n"));
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
}

void ToolUpdateWatchTest::stoppedService()
{
    ToolScene service(known());
    QVERIFY(service.isReady());
    service.service().stop();
    const ToolResult result = service.run("update Network/work");
    service.service().resume();
    QVERIFY2(
        result.err.startsWith("veyfm-vfs: update: the file manager service "
                              "(org.veylabs.vey-fm.vfs) does not answer: "),
        result.err.constData());
    QCOMPARE(result.exitCode, 1);
}

QTEST_GUILESS_MAIN(ToolUpdateWatchTest)
#include "tst_tool_update_watch.moc"
