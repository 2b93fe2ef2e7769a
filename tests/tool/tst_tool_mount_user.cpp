// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"
#include "support/outsidegroup.h"
#include "support/reachable.h"

#include <cerrno>
#include <cstring>
#include <grp.h>

namespace {

/// One who is not root, with a runtime directory to write in.
class Outsider
{
public:
    Outsider()
    {
        qputenv("XDG_RUNTIME_DIR", QFile::encodeName(m_runtime.path()));
    }

private:
    const OutsideGroup m_outside;
    const QTemporaryDir m_runtime;
};

} // namespace

/// "mount" as one who is not root.
class ToolMountUserTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void outsideTheGroup();
    void hungTool();
    void closedToDumps();
};

void ToolMountUserTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
    QVERIFY2(makeReachable(QFile::encodeName(toolPath())), std::strerror(errno));
    QVERIFY2(makeReachable(QFile::encodeName(toolSource(QString()))), std::strerror(errno));
}

void ToolMountUserTest::outsideTheGroup()
{
    const Outsider outsider;
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    const ToolResult result = scene.run("mount sftp://me@host/");
    const QByteArray group = ::getgrnam("fuse") ? "" : "sudo groupadd --system fuse && ";
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err,
        failure(
            "sftp://me@host/", "only members of the group 'fuse' can do that: run '" + group +
                                   "sudo usermod -aG fuse nobody', then log in again"));
    QCOMPARE(scene.tool.runs(), 0);
    QVERIFY(scene.isClean());
}

void ToolMountUserTest::hungTool()
{
    // A process that leaves no core file is closed to others of its user, but not to itself.
    const Outsider outsider;
    MountScene scene("sshfs");
    scene.tool.expect({"hang"});
    const ToolResult result = scene.run("mount --timeout 1 sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.err.contains("no progress within 1 s"), result.err.constData());
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QVERIFY(scene.isClean());
}

void ToolMountUserTest::closedToDumps()
{
    // What the kernel would write no core file of belongs to root in /proc, whoever runs it.
    const Outsider outsider;
    const auto ownerOf = [](qint64 pid) {
        return QFileInfo(QStringLiteral("/proc/%1/environ").arg(pid)).ownerId();
    };
    // Nor would it of a program that its user can't read.
    QVERIFY(QFileInfo(toolPath()).isReadable());
    MountScene scene("sshfs");
    scene.tool.expect({"hang"});
    QProcess process;
    process.setProcessEnvironment(scene.environment());
    process.start(toolPath(), MountScene::words("mount sftp://me@host/"));
    QTRY_VERIFY_WITH_TIMEOUT(scene.tool.processId(1) > 0, 30000);
    QCOMPARE(ownerOf(process.processId()), 0U);
    QCOMPARE(ownerOf(scene.tool.processId(1)), ::getuid());
    process.terminate();
    QVERIFY(process.waitForFinished());
}

QTEST_GUILESS_MAIN(ToolMountUserTest)
#include "tst_tool_mount_user.moc"
