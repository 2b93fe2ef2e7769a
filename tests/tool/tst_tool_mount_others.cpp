// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

#include <fcntl.h>

#include <signal.h>

namespace {

constexpr int patience = 30000;

/// What another program mounts while "mount" runs.
class OtherMount
{
public:
    OtherMount(const char* type, const QString& directory)
    {
        const QByteArray path = QFile::encodeName(directory);
        QByteArray options;
        if (type == QByteArray("fuse")) {
            m_device = ::open("/dev/fuse", O_RDWR | O_CLOEXEC);
            options = "rootmode=40000,user_id=0,group_id=0,fd=" + QByteArray::number(m_device);
        }
        m_stands = ::mount("other", path.constData(), type, 0, options.constData()) == 0;
    }
    ~OtherMount()
    {
        if (m_device >= 0) {
            ::close(m_device);
        }
    }
    OtherMount(const OtherMount&) = delete;
    OtherMount& operator=(const OtherMount&) = delete;

    bool stands() const
    {
        return m_stands;
    }

private:
    int m_device = -1; ///< As long as it is open the mount is not dead, though nobody answers.
    bool m_stands = false;
};

/// A process that a shell starts before it becomes the program.
class OlderSibling
{
public:
    ~OlderSibling()
    {
        if (id() > 0) {
            ::kill(id(), SIGKILL);
        }
    }

    /// For a shell: $0 is the program.
    QStringList shellArguments(const char* line) const
    {
        const QString script =
            QStringLiteral("sleep 90 </dev/null >/dev/null 2>&1 & echo $! > \"$1\"; "
                           "exec \"$0\" %1");
        return {
            QStringLiteral("-c"), script.arg(QLatin1String(line)), toolPath(),
            m_directory.filePath(QStringLiteral("pid"))};
    }

    pid_t id() const
    {
        QFile file(m_directory.filePath(QStringLiteral("pid")));
        return file.open(QIODevice::ReadOnly) ? file.readAll().trimmed().toInt() : 0;
    }

private:
    QTemporaryDir m_directory;
};

} // namespace

/// When "mount" fails, the mounts and processes of others stay, and those of its own tools go.
class ToolMountOthersTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void duringQuestion_data();
    void duringQuestion();
    void duringQuestionOfRefusedMount();
    void besideFailingTool();
    void besideHungTool();
    void besideSilentService_data();
    void besideSilentService();
    void ofKilledTool();
    void ofKilledToolInUse();
    void ofKilledToolOfOtherUser();
    void ofToolThatAsksLater_data();
    void ofToolThatAsksLater();
    void ofToolThatAsksLaterRefused();
    void processStays();
    void processIsNoTool();
    void childrenAreIgnored();
};

void ToolMountOthersTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountOthersTest::duringQuestion_data()
{
    QTest::addColumn<QByteArray>("type");
    QTest::addColumn<QByteArray>("key");
    QTest::addColumn<QByteArray>("why");
    QTest::newRow("fuse, given up")
        << QByteArray("fuse") << QByteArray("\004") << QByteArray("cancelled");
    QTest::newRow("tmpfs, given up")
        << QByteArray("tmpfs") << QByteArray("\004") << QByteArray("cancelled");
    QTest::newRow("fuse, interrupted")
        << QByteArray("fuse") << QByteArray("\003") << QByteArray("interrupted");
    QTest::newRow("tmpfs, interrupted")
        << QByteArray("tmpfs") << QByteArray("\003") << QByteArray("interrupted");
}

void ToolMountOthersTest::duringQuestion()
{
    QFETCH(const QByteArray, type);
    QFETCH(const QByteArray, key);
    QFETCH(const QByteArray, why);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    const OtherMount other(type.constData(), scene.directory(QStringLiteral("sftp/me@host")));
    QVERIFY(other.stands());
    session->type(key);
    QCOMPARE(session->waitForEnd(), key == "\003" ? 128 + SIGINT : 1);
    QVERIFY2(session->output().contains(why), session->output().constData());
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void ToolMountOthersTest::duringQuestionOfRefusedMount()
{
    // The tool is answered, and mounts on top of it.
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("echo"), false}});
    MountScene scene("sshfs", &service);
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount --timeout 1 sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    const OtherMount other("tmpfs", scene.directory(QStringLiteral("sftp/me@host")));
    QVERIFY(other.stands());
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    // A dead mount would not tell.
    QVERIFY(QFile::exists(scene.directory(QStringLiteral("sftp/me@host"))));
}

void ToolMountOthersTest::besideFailingTool()
{
    // Two at once, and the other was faster.
    MountScene scene("sshfs");
    scene.tool.expect({"hang"});
    QProcess process;
    process.setProcessEnvironment(scene.environment());
    process.start(toolPath(), MountScene::words("mount sftp://me@host/"));
    QTRY_VERIFY_WITH_TIMEOUT(scene.tool.processId(1) > 0, patience);
    const OtherMount other("fuse", scene.directory(QStringLiteral("sftp/me@host")));
    QVERIFY(other.stands());
    ::kill(pid_t(scene.tool.processId(1)), SIGKILL);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitCode(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void ToolMountOthersTest::besideHungTool()
{
    MountScene scene("sshfs");
    scene.tool.expect({"hang"});
    QProcess process;
    process.setProcessEnvironment(scene.environment());
    process.start(toolPath(), MountScene::words("mount --timeout 2 sftp://me@host/"));
    QTRY_VERIFY_WITH_TIMEOUT(scene.tool.processId(1) > 0, patience);
    const OtherMount other("fuse", scene.directory(QStringLiteral("sftp/me@host")));
    QVERIFY(other.stands());
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitCode(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void ToolMountOthersTest::besideSilentService_data()
{
    QTest::addColumn<bool>("isMounted");
    QTest::newRow("mount") << true;
    QTest::newRow("directory") << false;
}

void ToolMountOthersTest::besideSilentService()
{
    // The job asks it before it starts the tool, and is cut off there.
    QFETCH(const bool, isMounted);
    ToolScene service;
    QVERIFY(service.isReady());
    const QString mounts = QStringLiteral("FuseMountsManager.mounts");
    service.service().setRules(
        mounts, {QJsonObject{{QStringLiteral("value"), QJsonObject()}},
                 QJsonObject{{QStringLiteral("silent"), true}}});
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    QProcess process;
    process.setProcessEnvironment(scene.environment());
    process.start(toolPath(), MountScene::words("mount --timeout 0 sftp://me@host/"));
    QTRY_COMPARE_WITH_TIMEOUT(service.service().calls().filter(mounts).size(), 2, patience);
    std::unique_ptr<OtherMount> other;
    if (isMounted) {
        other = std::make_unique<OtherMount>("fuse", directory);
        QVERIFY(other->stands());
    }
    process.terminate();
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), SIGTERM);
    QCOMPARE(scene.tool.runs(), 0);
    QCOMPARE(scene.mounts().size(), isMounted ? 1 : 0);
    if (!isMounted) {
        QVERIFY(QFile::exists(directory));
    }
}

void ToolMountOthersTest::ofKilledTool()
{
    MountScene scene("sshfs");
    scene.tool.expect({"block 15", "mount", "hang"});
    const ToolResult result = scene.run("mount --timeout 1 sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.err.contains("no progress within 1 s"), result.err.constData());
    QVERIFY(scene.isClean());
}

void ToolMountOthersTest::ofKilledToolInUse()
{
    // By somebody who looks into it, which keeps it from going at once.
    MountScene scene("sshfs");
    scene.tool.expect({"block 15", "mount", "hang"});
    QProcess process;
    process.setProcessEnvironment(scene.environment());
    process.start(toolPath(), MountScene::words("mount --timeout 0 sftp://me@host/"));
    QTRY_VERIFY_WITH_TIMEOUT(!scene.mounts().isEmpty(), patience);
    const QByteArray path = QFile::encodeName(scene.directory(QStringLiteral("sftp/me@host")));
    const int user = ::open(path.constData(), O_PATH | O_CLOEXEC);
    QVERIFY(user >= 0);
    process.terminate();
    const bool ended = process.waitForFinished(patience);
    ::close(user);
    QVERIFY(ended);
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), SIGTERM);
    QVERIFY(scene.isClean());
}

void ToolMountOthersTest::ofKilledToolOfOtherUser()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + QByteArrayList{"exit 1"});
    scene.tool.expect({"block 15", "mount", "hang"});
    const auto session = scene.onTerminal("mount --timeout 0 sftp://host/");
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("you\n");
    QTRY_COMPARE_WITH_TIMEOUT(
        scene.mounts(), QStringList(QStringLiteral("sftp/you@host")), patience);
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QCOMPARE(scene.tool.runs(), 2);
    QVERIFY(scene.isClean());
}

void ToolMountOthersTest::ofToolThatAsksLater_data()
{
    QTest::addColumn<QByteArray>("key");
    QTest::newRow("interrupted") << QByteArray("\003");
    QTest::newRow("no progress") << QByteArray("geheim\n");
}

void ToolMountOthersTest::ofToolThatAsksLater()
{
    // sshfs mounts before it connects, and leaves a dead mount when it is killed.
    QFETCH(const QByteArray, key);
    MountScene scene("sshfs");
    scene.tool.expect(
        QByteArrayList{"block 15", "mount"} + Said::sshPassword() + QByteArrayList{"hang"});
    const auto session = scene.onTerminal("mount --timeout 1 sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    session->type(key);
    QCOMPARE(session->waitForEnd(), key == "\003" ? 128 + SIGINT : 1);
    QVERIFY(scene.isClean());
}

void ToolMountOthersTest::ofToolThatAsksLaterRefused()
{
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("echo"), false}});
    MountScene scene("sshfs", &service);
    scene.tool.expect(QByteArrayList{"mount"} + Said::sshPassword());
    const auto session = scene.onTerminal("mount --timeout 1 sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().contains("the file manager service does not tell of the mount"),
        session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountOthersTest::processStays()
{
    const OlderSibling sibling;
    MountScene scene("sshfs");
    scene.tool.expect({"hang"});
    const ToolResult result = runProgram(
        QStringLiteral("/bin/sh"), sibling.shellArguments("mount --timeout 1 sftp://me@host/"),
        QString(), scene.environment());
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.err.contains("no progress within 1 s"), result.err.constData());
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(MountScene::isRunning(sibling.id()));
}

void ToolMountOthersTest::processIsNoTool()
{
    // The question that is thrown away shows by no tool running.
    const OlderSibling sibling;
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    scene.tool.expect(Said::sshPassword() + Said::success());
    TerminalSession session(
        QStringLiteral("/bin/sh"), sibling.shellArguments("mount sftp://me@host/"),
        QDir::rootPath(), scene.environment(), 200);
    QVERIFY(session.waitFor("Password for me on sftp://host: "));
    session.type("wrong\n");
    QVERIFY(session.waitFor("Access denied\nPassword for me on sftp://host: "));
    session.type("right\n");
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(session.output().count("Password for"), 2);
    QCOMPARE(scene.tool.input(2), QByteArray("right\n"));
}

void ToolMountOthersTest::childrenAreIgnored()
{
    // By who started the program: nobody would learn how a tool has ended.
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    const ToolResult result = runProgram(
        QStringLiteral("/usr/bin/env"),
        {QStringLiteral("--ignore-signal=CHLD"), toolPath(), QStringLiteral("mount"),
         QStringLiteral("sftp://me@host/")},
        QString(), scene.environment());
    QVERIFY2(result.exitCode == 0, result.err.constData());
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/me@host")));
}

QTEST_GUILESS_MAIN(ToolMountOthersTest)
#include "tst_tool_mount_others.moc"
