// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountlock.h"
#include "support/helpersession.h"
#include "support/mountscene.h"
#include "support/slowdirectory.h"

#include <QTest>

#include <memory>
#include <vector>

/// What veyfm-mount does beside others, and with what they have mounted.
class MountHelperOthersTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void waitsForTheLock();
    void cancelledWhileItWaits();
    void waitsForTheLockOfAnotherUser();
    void lockCannotBeMade();
    void secondGoesOnWhereTheFirstGivesUp();
    void mountsThatAreThere();
    void mountThatIsDead();
    void mountThatIsSilent();
    void folderIsMissing();
    void folderIsMissingInAMountThatWasThere();
    void mountOfOthersMeanwhile();
    void unknownToTheService();
    void staleRegistration();

private:
    /// The lock as another program would have it. It is in the runtime directory of this test.
    static bool
    hold(VeyFM::Host::MountLock& lock, const MountScene& scene, const QString& directory)
    {
        return lock.open(scene.directory(directory), scene.directory()) && lock.tryLock();
    }
};

void MountHelperOthersTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void MountHelperOthersTest::waitsForTheLock()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    VeyFM::Host::MountLock lock;
    QVERIFY(hold(lock, scene, QStringLiteral("sftp/me@host")));
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    const QJsonObject waiting = session.next();
    QCOMPARE(textOf(waiting, "say"), QStringLiteral("waiting"));
    QCOMPARE(textOf(waiting, "text"), QStringLiteral("being mounted by another program"));
    QCOMPARE(scene.tool.runs(), 0);
    QVERIFY(!session.saysMore(100)); // Once is enough.
    lock.close();
    QCOMPARE(numberOf(session.end(), "code"), 0);
}

void MountHelperOthersTest::cancelledWhileItWaits()
{
    MountScene scene("sshfs");
    VeyFM::Host::MountLock lock;
    QVERIFY(hold(lock, scene, QStringLiteral("sftp/me@host")));
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("waiting"));
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(scene.tool.runs(), 0);
}

void MountHelperOthersTest::waitsForTheLockOfAnotherUser()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + QByteArrayList{"exit 1"});
    scene.tool.expect(Said::sshPassword("you") + Said::success());
    VeyFM::Host::MountLock lock;
    QVERIFY(hold(lock, scene, QStringLiteral("sftp/you@host")));
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("question"));
    session.answerPassword(1, "geheim", R"(,"user":"you")");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("waiting"));
    // The first one was given back, and nothing is left of it.
    VeyFM::Host::MountLock first;
    QVERIFY(hold(first, scene, QStringLiteral("sftp/me@host")));
    QVERIFY(!QFile::exists(scene.directory()));
    lock.close();
    QCOMPARE(numberOf(session.end(), "code"), 0);
    QCOMPARE(scene.tool.input(2), QByteArray("geheim\n"));
}

void MountHelperOthersTest::lockCannotBeMade()
{
    MountScene scene("sshfs");
    QProcessEnvironment environment = scene.environment();
    environment.insert(QStringLiteral("XDG_RUNTIME_DIR"), QStringLiteral("/nonexistent"));
    HelperSession session(environment);
    session.mount("sftp://me@host/");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    QVERIFY2(
        textOf(end, "text").startsWith(QLatin1String("/nonexistent/veyfm-vfs/locks: ")),
        qPrintable(textOf(end, "text")));
    QVERIFY(scene.isClean());
}

void MountHelperOthersTest::secondGoesOnWhereTheFirstGivesUp()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession first(scene.environment());
    first.mount("sftp://me@host/");
    QCOMPARE(textOf(first.next(), "say"), QStringLiteral("question"));
    HelperSession second(scene.environment());
    second.mount("sftp://me@host/");
    QCOMPARE(textOf(second.next(), "say"), QStringLiteral("waiting"));
    first.giveUp(1);
    QCOMPARE(numberOf(first.end(), "code"), 2);
    QCOMPARE(first.waitForEnd(), 1);
    scene.tool.expect(Said::success());
    QCOMPARE(numberOf(second.end(), "code"), 0);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    QVERIFY(QFile::exists(scene.directory(QStringLiteral("sftp"))));
}

void MountHelperOthersTest::mountsThatAreThere()
{
    MountScene scene("sshfs");
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    QCOMPARE(mounted.problem(), QString());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/a");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "mounted"), QStringLiteral("present"));
    QCOMPARE(textOf(end, "localPath"), directory + QLatin1String("/a"));
    QCOMPARE(textOf(end, "directory"), directory);
    // It is none that could be taken back.
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    QCOMPARE(scene.tool.runs(), 0);
}

void MountHelperOthersTest::mountThatIsDead()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    {
        HelperSession session(scene.environment());
        session.mount("sftp://me@host/");
        QCOMPARE(numberOf(session.end(), "code"), 0);
        session.take();
        QCOMPARE(session.waitForEnd(), 0);
    }
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QCOMPARE(
        textOf(end, "text"),
        QStringLiteral("it was mounted before, but is dead (Transport endpoint is not connected): "
                       "run fusermount3 -uz '%1', then try again")
            .arg(directory));
    QCOMPARE(textOf(end, "directory"), directory);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void MountHelperOthersTest::mountThatIsSilent()
{
    MountScene scene("sshfs");
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Stalled, directory);
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/", R"(,"patience":200)");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    QVERIFY2(
        textOf(end, "text").contains(QLatin1String("is dead (it does not answer): run ")),
        qPrintable(textOf(end, "text")));
    // Though one that looks at it can't be ended.
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void MountHelperOthersTest::folderIsMissing()
{
    // Of a share, which is there without being mounted.
    QTemporaryDir network;
    ToolScene service(scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), network.path()));
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    scene.tool.expect({"out Total number of bytes: 1\\n"});
    HelperSession session(scene.environment());
    session.mount("smb://localhost/share/a");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 1);
    QVERIFY2(
        textOf(end, "text").startsWith(QLatin1String("there is nothing at ")),
        qPrintable(textOf(end, "text")));
    QCOMPARE(session.waitForEnd(), 1);
}

void MountHelperOthersTest::folderIsMissingInAMountThatWasThere()
{
    MountScene scene("sshfs");
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/b");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 1);
    QCOMPARE(
        textOf(end, "text"),
        QStringLiteral("it is mounted, but the server has no such file or directory: %1/b")
            .arg(directory));
    QCOMPARE(textOf(end, "directory"), directory);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void MountHelperOthersTest::mountOfOthersMeanwhile()
{
    // By a program that knows of no lock.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    scene.tool.expect({"mount", "hang"});
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("question"));
    QProcess other;
    other.start(
        QStringLiteral("sshfs"),
        {QStringLiteral("host:"), scene.directory(QStringLiteral("sftp/me@host"))});
    QTRY_COMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    session.cancel();
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
    other.kill();
    QVERIFY(other.waitForFinished());
}

void MountHelperOthersTest::unknownToTheService()
{
    ToolScene service;
    QVERIFY(service.isReady());
    service.service().load({{QStringLiteral("remember"), true}});
    MountScene scene("sshfs", &service);
    const QString directory = scene.directory(QStringLiteral("sftp/me@host"));
    QVERIFY(QDir().mkpath(directory));
    const SlowDirectory mounted(SlowDirectory::Endless, directory);
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/a");
    const QJsonObject end = session.end();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "mounted"), QStringLiteral("present"));
    QCOMPARE(textOf(end, "path"), QStringLiteral("SFTP/me@host/a"));
    QCOMPARE(flagOf(end, "shared"), true);
    QCOMPARE(
        service.service().takeCalls().filter(QStringLiteral("FuseMountsManager.addMount")),
        QStringList(registration(QStringLiteral("sftp://me@host/"), directory)));
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
}

void MountHelperOthersTest::staleRegistration()
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
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/a");
    const QJsonObject end = session.end();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "mounted"), QStringLiteral("new"));
    QCOMPARE(textOf(end, "path"), QStringLiteral("SFTP/me@host/a"));
    QCOMPARE(
        service.service().takeCalls().filter(QStringLiteral("FuseMountsManager.addMount")),
        QStringList({registration(url, QString()), registration(url, directory)}));
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
}

QTEST_GUILESS_MAIN(MountHelperOthersTest)
#include "tst_mounthelper_others.moc"
