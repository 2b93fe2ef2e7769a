// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

#include <QElapsedTimer>

#include <signal.h>

namespace {

constexpr int patience = 30000;

QByteArray contents(const QString& path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

} // namespace

/// Jobs of "mount" that are interrupted.
class ToolMountSignalsTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void interruptedQuestion_data();
    void interruptedQuestion();
    void interruptedTwice();
    void interruptedAgain();
    void interruptedTool_data();
    void interruptedTool();
    void interruptedWithItsTool();
    void interruptedService();
    void interruptedWhereServiceNeverAnswers();
    void ignoredSignal();
    void toolsHaveNoSignalsBlocked_data();
    void toolsHaveNoSignalsBlocked();

private:
    /// Sends a signal, and waits until a thread has taken it.
    static bool interrupt(pid_t pid)
    {
        ::kill(pid, SIGINT);
        const QString path = QStringLiteral("/proc/%1/status").arg(pid);
        return QTest::qWaitFor(
            [&path] { return contents(path).contains("\nShdPnd:\t0000000000000000"); }, patience);
    }
};

void ToolMountSignalsTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountSignalsTest::interruptedQuestion_data()
{
    QTest::addColumn<int>("number");
    QTest::newRow("Ctrl-C") << 0;
    QTest::newRow("SIGINT") << SIGINT;
    QTest::newRow("SIGTERM") << SIGTERM;
    QTest::newRow("SIGHUP") << SIGHUP;
}

void ToolMountSignalsTest::interruptedQuestion()
{
    QFETCH(const int, number);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("half");
    if (number == 0) {
        session->type("\003");
    } else {
        ::kill(session->processId(), number);
    }
    QCOMPARE(session->waitForEnd(), 128 + (number == 0 ? SIGINT : number));
    QVERIFY2(
        session->output().endsWith("\nveyfm-vfs: sftp://me@host/: interrupted\n"),
        session->output().constData());
    QVERIFY(!session->output().contains("half"));
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountSignalsTest::interruptedTwice()
{
    // At once, as timeout(1) does it.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    QVERIFY(!session->hasEcho());
    QVERIFY(interrupt(session->processId()));
    ::kill(session->processId(), SIGINT);
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session->output().endsWith("\nveyfm-vfs: sftp://me@host/: interrupted\n"),
        session->output().constData());
    QVERIFY(session->hasEcho());
    QVERIFY(scene.isClean());
}

void ToolMountSignalsTest::interruptedAgain()
{
    // By a person who has enough of waiting for a job that can't be stopped.
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount --timeout 0 sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    service.service().stop();
    session->type("geheim\n");
    QTRY_COMPARE_WITH_TIMEOUT(
        scene.mounts(), QStringList(QStringLiteral("sftp/me@host")), patience);
    QElapsedTimer timer;
    timer.start();
    session->type("\003");
    QTest::qWait(700);
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QVERIFY(timer.elapsed() < 4000);
    service.service().resume();
    QVERIFY2(
        session->output().endsWith("veyfm-vfs: sftp://me@host/: interrupted\n"),
        session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountSignalsTest::interruptedTool_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<int>("number");
    for (const int number : {SIGINT, SIGTERM}) {
        QTest::addRow("sftp %d", number)
            << QByteArray("sshfs") << QByteArray("sftp://me@host/") << number;
        QTest::addRow("ftp %d", number)
            << QByteArray("curlftpfs") << QByteArray("ftp://me@host/") << number;
    }
}

void ToolMountSignalsTest::interruptedTool()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    QFETCH(const int, number);
    MountScene scene(tool);
    scene.tool.expect({"fork", "hang"});
    QProcess process;
    scene.start(process, "mount --timeout 0 " + url);
    QTRY_VERIFY_WITH_TIMEOUT(scene.tool.childId(1) > 0, patience);
    ::kill(scene.programOf(1), number);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), number);
    QCOMPARE(process.readAllStandardError(), "veyfm-vfs: " + url + ": interrupted\n");
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QTRY_VERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountSignalsTest::interruptedWithItsTool()
{
    // smbclient that ends by the same Ctrl-C reads as one that was let in.
    ToolScene service(
        scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), QStringLiteral("/net/smb")));
    QVERIFY(service.isReady());
    for (int i = 0; i < 5; ++i) {
        MountScene scene("smbclient", &service);
        scene.tool.expect({"exit 1"}); // Without a ticket.
        scene.tool.expect({"interrupt"});
        const ToolResult result = scene.run("mount smb://host/share");
        QCOMPARE(result.err, QByteArray("veyfm-vfs: smb://host/share: interrupted\n"));
        QCOMPARE(result.exitCode, 128 + SIGINT);
        QCOMPARE(result.out, QByteArray());
    }
}

void ToolMountSignalsTest::interruptedService()
{
    // When the mount stands already.
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("echo"), false}});
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::success());
    QProcess process;
    scene.start(process, "mount --timeout 0 sftp://me@host/");
    QTRY_VERIFY_WITH_TIMEOUT(
        !service.service()
             .calls()
             .filter(QStringLiteral("NetworkMountsManager.addMount"))
             .isEmpty(),
        patience);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    ::kill(scene.programOf(1), SIGINT);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), SIGINT);
    QCOMPARE(
        process.readAllStandardError(), QByteArray("veyfm-vfs: sftp://me@host/: interrupted\n"));
    QVERIFY(scene.isClean());
}

void ToolMountSignalsTest::interruptedWhereServiceNeverAnswers()
{
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    service.service().stop();
    QProcessEnvironment environment = scene.environment();
    environment.insert(QStringLiteral("TERM"), QStringLiteral("xterm"));
    TerminalSession session(
        toolPath(), MountScene::words("mount --timeout 0 sftp://me@host/"), QDir::rootPath(),
        environment);
    QVERIFY(session.waitFor(" Waiting for the file manager service ("));
    QElapsedTimer timer;
    timer.start();
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY(timer.elapsed() < 5000);
    service.service().resume();
    QVERIFY2(
        session.output().endsWith("\r\033[Kveyfm-vfs: sftp://me@host/: interrupted\n"),
        session.output().constData());
}

void ToolMountSignalsTest::ignoredSignal()
{
    // What a shell does to what it starts in the background.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    TerminalSession session(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"), QStringLiteral("trap '' INT; exec \"$0\" mount sftp://me@host/"),
         toolPath()},
        QDir::rootPath(), scene.environment());
    QVERIFY(session.waitFor("Password for me on sftp://host: "));
    ::kill(session.processId(), SIGINT);
    session.type("geheim\n");
    QCOMPARE(session.waitForEnd(), 0);
}

void ToolMountSignalsTest::toolsHaveNoSignalsBlocked_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::newRow("sshfs") << QByteArray("sshfs") << QByteArray("sftp://me@host/");
    QTest::newRow("curlftpfs") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/");
    QTest::newRow("smbclient") << QByteArray("smbclient") << QByteArray("smb://host/share");
}

void ToolMountSignalsTest::toolsHaveNoSignalsBlocked()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    ToolScene service(
        scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), QStringLiteral("/net/smb")));
    QVERIFY(service.isReady());
    MountScene scene(tool, &service);
    scene.tool.expect({"out Total number of bytes: 1\\n", "exit 0"});
    scene.run("mount " + url);
    QCOMPARE(scene.tool.runs(), 1);
    QCOMPARE(scene.tool.status(1, "SigBlk:"), QByteArray(16, '0'));
    // SIGINT and SIGTERM, that is.
    bool isNumber = false;
    const quint64 ignored = scene.tool.status(1, "SigIgn:").toULongLong(&isNumber, 16);
    QVERIFY(isNumber);
    QCOMPARE(ignored & ((1U << (SIGINT - 1)) | (1U << (SIGTERM - 1))), quint64(0));
}

QTEST_GUILESS_MAIN(ToolMountSignalsTest)
#include "tst_tool_mount_signals.moc"
