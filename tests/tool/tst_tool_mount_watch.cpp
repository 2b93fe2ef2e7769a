// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

#include <QElapsedTimer>
#include <QUuid>

namespace {

constexpr int patience = 30000;

QByteArray contents(const QString& path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

/// The processes whose command line or environment shows the text to others.
QStringList processesThatShow(const QByteArray& text)
{
    QStringList all;
    const QStringList names = QDir(QStringLiteral("/proc")).entryList(QDir::Dirs);
    for (const QString& name : names) {
        for (const char* file : {"cmdline", "environ"}) {
            const QString path = QStringLiteral("/proc/%1/%2").arg(name, QLatin1String(file));
            if (name.at(0).isDigit() && contents(path).contains(text))
                all.append(path);
        }
    }
    return all;
}

} // namespace

/// Jobs of "mount" that would go on for ever, or are interrupted.
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
    void silentDescriptor();
    void hungSambaTool();
    void silentService();
    void refusingService();
    void interruptedQuestion_data();
    void interruptedQuestion();
    void interruptedTwice();
    void interruptedAgain();
    void interruptedTool_data();
    void interruptedTool();
    void interruptedService();
    void stoppedService_data();
    void stoppedService();
    void serviceNeverAnswers_data();
    void serviceNeverAnswers();
    void interruptedWhereServiceNeverAnswers();
    void ignoredSignal();
    void toolsHaveNoSignalsBlocked_data();
    void toolsHaveNoSignalsBlocked();
    void noCoreFile();
    void passwordIsSeenNowhere_data();
    void passwordIsSeenNowhere();
    void olderMountsStay();

private:
    /// Waits until a run of the stand-in has got to its "fork".
    static bool waitForFork(const StandIn& tool, int run = 1)
    {
        return QTest::qWaitFor([&] { return tool.childId(run) > 0; }, patience);
    }

    static void start(QProcess& process, const MountScene& scene, const char* line)
    {
        process.setProcessEnvironment(scene.environment());
        process.start(
            QStringLiteral("setsid"),
            QStringList({QStringLiteral("--wait"), toolPath()}) + MountScene::words(line));
    }

    /// Sends a signal, and waits until a thread has taken it.
    static bool interrupt(pid_t pid)
    {
        ::kill(pid, SIGINT);
        const QString path = QStringLiteral("/proc/%1/status").arg(pid);
        return QTest::qWaitFor(
            [&path] { return contents(path).contains("\nShdPnd:\t0000000000000000"); }, patience);
    }

    /// The tool behind setsid.
    static pid_t toolOf(const StandIn& tool)
    {
        return tool.status(1, "PPid:").toInt();
    }
};

void ToolMountWatchTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty())
        QSKIP(qPrintable(problem));
}

void ToolMountWatchTest::hungTool_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArray>("why");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                          << QByteArray("sshfs may be waiting for more than a password; look with "
                                        "'ssh host' whether the host answers and lets you in");
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/")
                         << QByteArray("curlftpfs waits for the server");
}

void ToolMountWatchTest::hungTool()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    QFETCH(const QByteArray, why);
    MountScene scene(tool);
    scene.tool.expect({"out (me@host) Password: ", "fork", "hang"});
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

void ToolMountWatchTest::silentDescriptor()
{
    // A program that feeds the password takes no longer than the tool may; a person does.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    QProcess process;
    start(process, scene, "mount --timeout 1 --password-fd 0 sftp://me@host/");
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
    // A look with a ticket that hangs is followed by one as a guest, which a killed tool passes.
    ToolScene service(
        scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), QStringLiteral("/net/smb")));
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    scene.tool.expect({"hang"});
    scene.tool.expect({"hang"});
    const ToolResult result = scene.run("mount --timeout 1 smb://host/share");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: smb://host/share: no progress within 1 s: smbclient "
                               "waits for the server\n"));
    QCOMPARE(scene.tool.runs(), 2);
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(!MountScene::isRunning(scene.tool.processId(2)));
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

void ToolMountWatchTest::interruptedQuestion_data()
{
    QTest::addColumn<int>("number");
    QTest::newRow("Ctrl-C") << 0;
    QTest::newRow("SIGINT") << SIGINT;
    QTest::newRow("SIGTERM") << SIGTERM;
    QTest::newRow("SIGHUP") << SIGHUP;
}

void ToolMountWatchTest::interruptedQuestion()
{
    QFETCH(const int, number);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("half");
    if (number == 0)
        session->type("\003");
    else
        ::kill(session->processId(), number);
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith("\nveyfm-vfs: sftp://me@host/: interrupted\n"),
        session->output().constData());
    QVERIFY(!session->output().contains("half"));
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::interruptedTwice()
{
    // At once, as timeout(1) does it.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    QVERIFY(!session->hasEcho());
    QVERIFY(interrupt(session->processId()));
    ::kill(session->processId(), SIGINT);
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith("\nveyfm-vfs: sftp://me@host/: interrupted\n"),
        session->output().constData());
    QVERIFY(session->hasEcho());
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::interruptedAgain()
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
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY(timer.elapsed() < 4000);
    service.service().resume();
    QVERIFY2(
        session->output().endsWith("veyfm-vfs: sftp://me@host/: interrupted\n"),
        session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::interruptedTool_data()
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

void ToolMountWatchTest::interruptedTool()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    QFETCH(const int, number);
    MountScene scene(tool);
    scene.tool.expect({"fork", "hang"});
    QProcess process;
    start(process, scene, "mount --timeout 0 " + url);
    QVERIFY(waitForFork(scene.tool));
    ::kill(toolOf(scene.tool), number);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitCode(), 1);
    QCOMPARE(process.readAllStandardError(), "veyfm-vfs: " + url + ": interrupted\n");
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QTRY_VERIFY(!MountScene::isRunning(scene.tool.childId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::interruptedService()
{
    // When the mount stands already.
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("echo"), false}});
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::success());
    QProcess process;
    start(process, scene, "mount --timeout 0 sftp://me@host/");
    QTRY_VERIFY_WITH_TIMEOUT(
        !service.service()
             .calls()
             .filter(QStringLiteral("NetworkMountsManager.addMount"))
             .isEmpty(),
        patience);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    ::kill(toolOf(scene.tool), SIGINT);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitCode(), 1);
    QCOMPARE(
        process.readAllStandardError(), QByteArray("veyfm-vfs: sftp://me@host/: interrupted\n"));
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

void ToolMountWatchTest::serviceNeverAnswers_data()
{
    QTest::addColumn<QByteArray>("url");
    for (const char* url : {"sftp://me@host/", "ftp://host/", "smb://host/share"})
        QTest::newRow(url) << QByteArray(url);
}

void ToolMountWatchTest::serviceNeverAnswers()
{
    QFETCH(const QByteArray, url);
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    service.service().stop();
    QElapsedTimer timer;
    timer.start();
    const ToolResult result = scene.run("mount --timeout 1 --no-input " + url);
    // Each of several calls gives up after 25 seconds.
    const qint64 elapsed = timer.elapsed();
    service.service().resume();
    QVERIFY(elapsed < 20000);
    QCOMPARE(
        result.err,
        failure(url, "no progress within 1 s: the file manager service does not answer"));
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(scene.tool.runs(), 0);
    QVERIFY(scene.isClean());
}

void ToolMountWatchTest::interruptedWhereServiceNeverAnswers()
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
    QCOMPARE(session.waitForEnd(), 1);
    QVERIFY(timer.elapsed() < 5000);
    service.service().resume();
    QVERIFY2(
        session.output().endsWith("\r\033[Kveyfm-vfs: sftp://me@host/: interrupted\n"),
        session.output().constData());
}

void ToolMountWatchTest::ignoredSignal()
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

void ToolMountWatchTest::toolsHaveNoSignalsBlocked_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::newRow("sshfs") << QByteArray("sshfs") << QByteArray("sftp://me@host/");
    QTest::newRow("curlftpfs") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/");
    QTest::newRow("smbclient") << QByteArray("smbclient") << QByteArray("smb://host/share");
}

void ToolMountWatchTest::toolsHaveNoSignalsBlocked()
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

void ToolMountWatchTest::noCoreFile()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + QByteArrayList{"fork", "hang"});
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    const QByteArray none = "Max core file size        0                    0 ";
    const QByteArray limits = contents(QStringLiteral("/proc/%1/limits").arg(session->processId()));
    QVERIFY2(limits.contains(none), limits.constData());
    session->type("geheim\n");
    QVERIFY(waitForFork(scene.tool));
    QVERIFY(
        contents(QStringLiteral("/proc/%1/limits").arg(scene.tool.processId(1))).contains(none));
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 1);
}

void ToolMountWatchTest::passwordIsSeenNowhere_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArrayList>("run");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                          << Said::sshPassword() + QByteArrayList{"fork", "hang"};
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/")
                         << Said::ftpPassword() + QByteArrayList{"fork", "hang"};
}

void ToolMountWatchTest::passwordIsSeenNowhere()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    QFETCH(const QByteArrayList, run);
    const QByteArray password = QUuid::createUuid().toByteArray(QUuid::Id128);
    MountScene scene(tool);
    scene.tool.expect(run);
    const auto session = scene.onTerminal("mount --verbose --timeout 0 " + url);
    QVERIFY(session->waitFor("Password for me on "));
    session->type(password + '\n');
    QVERIFY(waitForFork(scene.tool));
    QCOMPARE(scene.tool.input(1), password + '\n');
    QCOMPARE(processesThatShow(password), QStringList());
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY(!session->output().contains(password));
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
