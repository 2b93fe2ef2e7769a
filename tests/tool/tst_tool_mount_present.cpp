// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"
#include "support/slowdirectory.h"

namespace {

const QString fuseRegister = QStringLiteral("FuseMountsManager.addMount");
const QString placeRegister = QStringLiteral("NetworkMountsManager.addMount");

} // namespace

/// What "mount" makes of what is mounted, or is said to be.
class ToolMountPresentTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void mountedAlready();
    void mountedUnknownToService();
    void mountedRefusedByService();
    void mountedWithoutService();
    void pathIsMissing();
    void deadMount();
    void silentMount();
    void hiddenMount();
    void homeOnFuse();
    void staleRegistration();
    void stalePlace();
    void staleRegistrationOfOtherUser();
    void mountOfOtherUserWithoutPlace();
};

void ToolMountPresentTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountPresentTest::mountedAlready()
{
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    QCOMPARE(mounted.problem(), QString());
    const QString url = QStringLiteral("sftp://me@host/");
    service.service().setValue(
        QStringLiteral("FuseMountsManager.mounts"), QJsonObject{{url, directory}});
    service.service().setValue(
        QStringLiteral("NetworkMountsManager.mounts"),
        QJsonObject{{url, QJsonArray{QStringLiteral("SFTP/me@host"), directory, 4003}}});
    const ToolResult result = scene.run("mount --json sftp://me@host/a");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    const QJsonObject object = result.json().at(0).toObject();
    QCOMPARE(
        object.value(QStringLiteral("localPath")).toString(), directory + QStringLiteral("/a"));
    QCOMPARE(object.value(QStringLiteral("path")).toString(), QStringLiteral("SFTP/me@host/a"));
    QCOMPARE(object.value(QStringLiteral("alreadyMounted")), QJsonValue(true));
    QCOMPARE(scene.tool.runs(), 0);
    QCOMPARE(service.service().takeCalls().filter(QStringLiteral("addMount")), QStringList());
}

void ToolMountPresentTest::mountedUnknownToService()
{
    // It was started again, say, or the mount was made without it.
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("remember"), true}});
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    const ToolResult result = scene.run("mount --json sftp://me@host/a");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    const QJsonObject object = result.json().at(0).toObject();
    QCOMPARE(object.value(QStringLiteral("path")).toString(), QStringLiteral("SFTP/me@host/a"));
    QCOMPARE(object.value(QStringLiteral("alreadyMounted")), QJsonValue(true));
    QCOMPARE(scene.tool.runs(), 0);
    const QStringList calls = service.service().takeCalls();
    QCOMPARE(
        calls.filter(fuseRegister),
        QStringList(registration(QStringLiteral("sftp://me@host/"), directory)));
    QCOMPARE(calls.filter(placeRegister).size(), 1);
}

void ToolMountPresentTest::mountedRefusedByService()
{
    // Nothing is mounted on top of what works.
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    const ToolResult result = scene.run("mount sftp://me@host/a");
    QCOMPARE(scene.tool.runs(), 0);
    QCOMPARE(
        result.err, failure(
                        "sftp://me@host/a", "other programs don't see this mount: the file manager "
                                            "service did not take it"));
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/me@host/a")));
}

void ToolMountPresentTest::mountedWithoutService()
{
    MountScene scene("sshfs");
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    const ToolResult result = scene.run("mount sftp://me@host/a");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/me@host/a")));
    QCOMPARE(scene.tool.runs(), 0);
}

void ToolMountPresentTest::pathIsMissing()
{
    MountScene scene("sshfs");
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    const ToolResult result = scene.run("mount --json sftp://me@host/b/c");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray("[]\n"));
    QCOMPARE(
        result.err,
        failure(
            "sftp://me@host/b/c", "it is mounted, but the server has no such file or directory: " +
                                      QFile::encodeName(directory) + "/b/c"));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void ToolMountPresentTest::deadMount()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    QCOMPARE(scene.run("mount sftp://me@host/").exitCode, 0);
    const ToolResult result = scene.run("mount sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(
        result.err,
        failure(
            "sftp://me@host/",
            "it was mounted before, but is dead (Transport endpoint is not connected): run "
            "fusermount3 -uz '" +
                QFile::encodeName(scene.directory(QStringLiteral("sftp/me@host"))) +
                "', then try again"));
    QCOMPARE(scene.tool.runs(), 1);
    // What was there is left alone.
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void ToolMountPresentTest::silentMount()
{
    MountScene scene("sshfs");
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Stalled, directory);
    const ToolResult result = scene.run("mount --timeout 1 sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(
        result.err.contains("it was mounted before, but is dead (it does not answer): run "),
        result.err.constData());
    QVERIFY(mounted.progress() > 0);
}

void ToolMountPresentTest::hiddenMount()
{
    // By another file system on top of it.
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    const QByteArray path = QFile::encodeName(directory);
    QCOMPARE(::mount("other", path.constData(), "tmpfs", 0, nullptr), 0);
    const ToolResult result = scene.run("mount --json sftp://me@host/");
    while (scene.mounts().size() > 1) {
        ::umount2(path.constData(), MNT_DETACH);
    }
    QCOMPARE(
        result.json().at(0).toObject().value(QStringLiteral("alreadyMounted")), QJsonValue(false));
    QCOMPARE(scene.tool.runs(), 1);
}

void ToolMountPresentTest::homeOnFuse()
{
    // One that is encrypted, say. This one takes no new directories, so there the tool fails.
    MountScene scene("sshfs");
    const SlowDirectory home(SlowDirectory::Endless, QFileInfo(scene.directory()).path());
    QCOMPARE(home.problem(), QString());
    scene.tool.expect({"exit 1"});
    const ToolResult result = scene.run("mount sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.err.contains("Mounting sftp resource failed"), result.err.constData());
    QCOMPARE(scene.tool.runs(), 1);
}

void ToolMountPresentTest::staleRegistration()
{
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    const QString url = QStringLiteral("sftp://me@host/");
    service.service().load(
        {{QStringLiteral("remember"), true},
         {QStringLiteral("values"),
          QJsonObject{
              {QStringLiteral("FuseMountsManager.mounts"), QJsonObject{{url, directory}}}}}});
    scene.tool.expect(Said::success());
    const ToolResult result = scene.run("mount --json sftp://me@host/a");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(
        result.json().at(0).toObject().value(QStringLiteral("alreadyMounted")), QJsonValue(false));
    QCOMPARE(
        service.service().takeCalls().filter(fuseRegister),
        QStringList({registration(url, QString()), registration(url, directory)}));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void ToolMountPresentTest::stalePlace()
{
    // The job that makes places would be content with the one that is there.
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    service.service().setValue(
        QStringLiteral("NetworkMountsManager.mounts"),
        QJsonObject{
            {QStringLiteral("sftp://me@host/"),
             QJsonArray{QStringLiteral("SFTP/me@host"), directory, 4003}}});
    scene.tool.expect(Said::success());
    const ToolResult result = scene.run("mount --json sftp://me@host/a");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    const QJsonObject object = result.json().at(0).toObject();
    QCOMPARE(object.value(QStringLiteral("path")).toString(), QStringLiteral("SFTP/me@host/a"));
    QCOMPARE(object.value(QStringLiteral("alreadyMounted")), QJsonValue(false));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void ToolMountPresentTest::staleRegistrationOfOtherUser()
{
    // Found by the job itself, when the name of the user has changed.
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("curlftpfs", &service);
    const QString directory = scene.directory(QStringLiteral("ftp/you@host"));
    const QString url = QStringLiteral("ftp://you@host/");
    service.service().load(
        {{QStringLiteral("remember"), true},
         {QStringLiteral("values"),
          QJsonObject{
              {QStringLiteral("FuseMountsManager.mounts"), QJsonObject{{url, directory}}}}}});
    scene.tool.expect({"err Error connecting to ftp: Access denied: 530\\n", "exit 1"});
    scene.tool.expect(Said::success());
    const auto session = scene.onTerminal("mount ftp://host/a");
    QVERIFY(session->waitFor("User name for ftp://host [root]: "));
    session->type("you\n");
    QCOMPARE(session->waitForEnd(), 0);
    QVERIFY2(
        session->output().endsWith(scene.line(QStringLiteral("ftp/you@host/a"))),
        session->output().constData());
    QCOMPARE(scene.tool.runs(), 2);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("ftp/you@host")));
}

void ToolMountPresentTest::mountOfOtherUserWithoutPlace()
{
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/you@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    service.service().load({{QStringLiteral("remember"), true}});
    service.service().setValue(
        QStringLiteral("FuseMountsManager.mounts"),
        QJsonObject{{QStringLiteral("sftp://you@host/"), directory}});
    scene.tool.expect(Said::sshPassword("root") + QByteArrayList{"exit 1"});
    const auto session = scene.onTerminal("mount --json sftp://host/a");
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("you\n");
    QCOMPARE(session->waitForEnd(), 0);
    QVERIFY2(
        session->output().contains("\"path\":\"SFTP/you@host/a\""), session->output().constData());
    QVERIFY(session->output().contains("\"alreadyMounted\":true"));
    QCOMPARE(scene.tool.runs(), 1);
    QCOMPARE(service.service().calls().filter(placeRegister).size(), 1);
}

QTEST_GUILESS_MAIN(ToolMountPresentTest)
#include "tst_tool_mount_present.moc"
