// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountfuseentryjob.h"
#include "jobs/mounturljob.h"
#include "support/mountjobtest.h"
#include "support/outsidegroup.h"

using namespace VeyFM;

namespace {

const QString addMount = QStringLiteral("NetworkMountsManager.addMount");

} // namespace

/// From a URL to an entry of the tree, with scripted tools and a scripted service.
class MountFuseEntryJobTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void rootIsMounted_data();
    void rootIsMounted();
    void urlIsMountedByNow_data();
    void urlIsMountedByNow();
    void registersAndWaits();
    void ftpEndsLater();
    void endsAfterTheNews();
    void changedUserIsWhatItWaitsFor();
    void otherNewsLeaveItWaiting();
    void nullEntry();
    void twoJobsWaitForOneUrl();
    void silentServiceLeavesItWaiting();
    void smbMakesNoEntry();
    void errorsPassThrough_data();
    void errorsPassThrough();
    void outsideTheGroup_data();
    void outsideTheGroup();
    void cleanupTestCase();

private:
    void setNetworkMounts(const QJsonObject& mounts)
    {
        service->setValue(u"NetworkMountsManager.mounts"_s, mounts);
    }

    void announce(const QString& url, const QString& path)
    {
        service->emitSignal(
            u"NetworkMountsManager"_s, u"mountAdded"_s,
            {url, QJsonArray{path, u"/mnt"_s, int(TypeSFtpSharePlace)}});
    }

    QStringList registrations()
    {
        return service->takeCalls().filter(addMount);
    }
};

void MountFuseEntryJobTest::initTestCase()
{
    startVfsInGroup("{}");
}

void MountFuseEntryJobTest::init()
{
    service->load(object(R"({"echo": false})"));
    startScene("sshfs");
}

void MountFuseEntryJobTest::cleanup()
{
    endScene();
}

void MountFuseEntryJobTest::rootIsMounted_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("key");
    QTest::addColumn<QString>("path");
    QTest::newRow("root") << u"sftp://host/"_s << u"sftp://host/"_s << u"SFTP/m//"_s;
    QTest::newRow("path") << u"sftp://host/a/b%20c"_s << u"sftp://host/"_s << u"SFTP/m//a/b c"_s;
    QTest::newRow("another path") << u"sftp://host/d"_s << u"sftp://host/"_s << u"SFTP/m//d"_s;
    QTest::newRow("home") << u"sftp://host/~/a"_s << u"sftp://host/~/"_s << u"SFTP/m//a"_s;
    QTest::newRow("user and port")
        << u"ftp://bob@host:21/a"_s << u"ftp://bob@host:21/"_s << u"SFTP/m//a"_s;
    // Whatever the scheme.
    QTest::newRow("unknown scheme") << u"http://host/a"_s << u"http://host/"_s << u"SFTP/m//a"_s;
}

void MountFuseEntryJobTest::rootIsMounted()
{
    QFETCH(QString, url);
    QFETCH(QString, key);
    QFETCH(QString, path);
    setNetworkMounts({{key, QJsonArray{u"SFTP/m"_s, u"/mnt"_s, int(TypeSFtpSharePlace)}}});
    const auto job = makeJob<MountFuseEntryJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->path(), path);
    QVERIFY(!job->findChild<MountURLJob*>());
    QCOMPARE(service->takeCalls(), QStringList(u"NetworkMountsManager.mounts[]"_s));
}

void MountFuseEntryJobTest::urlIsMountedByNow_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("path");
    QTest::newRow("path") << u"sftp://host/a"_s << u"SFTP/m//a"_s;
    // Nothing is cut here.
    QTest::newRow("home") << u"sftp://host/~/a"_s << u"SFTP/m//~/a"_s;
}

void MountFuseEntryJobTest::urlIsMountedByNow()
{
    QFETCH(QString, url);
    QFETCH(QString, path);
    // Under the whole URL, where start() looked for that of the root.
    setNetworkMounts({{url, QJsonArray{u"SFTP/m"_s, u"/mnt"_s, int(TypeSFtpSharePlace)}}});
    tool->expect({});
    const auto job = makeJob<MountFuseEntryJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->path(), path);
    QCOMPARE(registrations(), QStringList());
}

void MountFuseEntryJobTest::registersAndWaits()
{
    service->load(object(R"({"echo": true})"));
    tool->expect({});
    const auto job = makeJob<MountFuseEntryJob>(u"sftp://bob@one/a/b%20c"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 0);
    QVERIFY(job->path().isEmpty());
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
    // The entry has the path of the URL in its local path, and gets it once more in its name.
    QCOMPARE(job->path(), u"SFTP/bob@one//a/b c"_s);
    QCOMPARE(
        registrations(),
        QStringList(
            addMount + u"[\"sftp://bob@one/a/b c\",[\"SFTP/bob@one\",\"%1\",4003]]"_s.arg(
                           mountDir(u"/sftp/bob@one//a/b c"_s))));
    QCOMPARE(treeLocalPath(u"SFTP/bob@one"_s), mountDir(u"/sftp/bob@one//a/b c"_s));
}

void MountFuseEntryJobTest::ftpEndsLater()
{
    service->load(object(R"({"echo": true})"));
    startScene("curlftpfs");
    tool->expect({});
    const auto job = makeJob<MountFuseEntryJob>(u"ftp://two/~/a"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->path(), u"FTP/two//~/a"_s);
}

void MountFuseEntryJobTest::endsAfterTheNews()
{
    tool->expect({});
    const auto job = makeJob<MountFuseEntryJob>(u"sftp://three/a"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    int endsWhenTold = -1;
    const auto connection =
        connect(vfs, &VFS::fuseMountAdded, this, [&] { endsWhenTold = finished.count(); });
    announce(u"sftp://three/a"_s, u"SFTP/three"_s);
    QVERIFY(finished.wait(20000));
    disconnect(connection);
    // This slot was connected behind that of the job, and still came first.
    QCOMPARE(endsWhenTold, 0);
    QCOMPARE(job->path(), u"SFTP/three//a"_s);
}

void MountFuseEntryJobTest::changedUserIsWhatItWaitsFor()
{
    tool->expect({"echo off", "out x's password: ", "read", "exit 1"});
    tool->expect({});
    auth->answers = {Auth::changeUser(u"bob"_s)};
    const auto job = makeJob<MountFuseEntryJob>(u"sftp://four/a"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(
        registrations(),
        QStringList(
            addMount + u"[\"sftp://bob@four/a\",[\"SFTP/bob@four\",\"%1\",4003]]"_s.arg(
                           mountDir(u"/sftp/bob@four//a"_s))));
    QSignalSpy told(vfs, &VFS::fuseMountAdded);
    announce(u"sftp://four/a"_s, u"SFTP/four"_s);
    QVERIFY(told.wait(20000));
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
    announce(u"sftp://bob@four/a"_s, u"SFTP/bob@four"_s);
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->path(), u"SFTP/bob@four//a"_s);
}

void MountFuseEntryJobTest::otherNewsLeaveItWaiting()
{
    tool->expect({});
    const auto job = makeJob<MountFuseEntryJob>(u"sftp://five/a"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QSignalSpy told(vfs, &VFS::fuseMountAdded);
    announce(u"sftp://five/"_s, u"SFTP/five"_s);
    announce(u"sftp://other/a"_s, QString());
    QTRY_COMPARE(told.count(), 2);
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
    QVERIFY(job->path().isEmpty());
    announce(u"sftp://five/a"_s, u"SFTP/five"_s);
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
}

void MountFuseEntryJobTest::nullEntry()
{
    tool->expect({});
    const auto job = makeJob<MountFuseEntryJob>(u"sftp://six/a"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    announce(u"sftp://six/a"_s, QString());
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 1);
    QCOMPARE(job->errorString(), u"Couldn't access resource"_s);
    QVERIFY(job->path().isEmpty());
}

void MountFuseEntryJobTest::twoJobsWaitForOneUrl()
{
    tool->expect({});
    tool->expect({});
    const auto first = makeJob<MountFuseEntryJob>(u"sftp://seven/a"_s);
    const auto second = makeJob<MountFuseEntryJob>(u"sftp://seven/a"_s);
    QSignalSpy firstEnd(first.get(), &Job::finished);
    QSignalSpy secondEnd(second.get(), &Job::finished);
    first->start();
    second->start();
    announce(u"sftp://seven/a"_s, u"SFTP/seven"_s);
    QTRY_COMPARE(firstEnd.count(), 1);
    QTRY_COMPARE(secondEnd.count(), 1);
    QCOMPARE(first->path(), u"SFTP/seven//a"_s);
    QCOMPARE(second->path(), u"SFTP/seven//a"_s);
}

void MountFuseEntryJobTest::silentServiceLeavesItWaiting()
{
    service->setRules(addMount, array(R"([{"error": "no"}])"));
    tool->expect({});
    const auto job = makeJob<MountFuseEntryJob>(u"sftp://eight/a"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
    QCOMPARE(registrations().size(), 1);
}

void MountFuseEntryJobTest::smbMakesNoEntry()
{
    startScene("smbclient");
    service->setValue(u"SmbBrowser.smbNetworkLocalPath"_s, u"/net"_s);
    tool->expect({"out Total number of bytes: 1\\n"});
    const auto job = makeJob<MountFuseEntryJob>(u"smb://localhost/share"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 1);
    QCOMPARE(job->errorString(), u"Can't create entry for url"_s);
    QCOMPARE(registrations(), QStringList());
}

void MountFuseEntryJobTest::errorsPassThrough_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<bool>("refused");
    QTest::addColumn<int>("code");
    QTest::addColumn<QString>("error");
    const QString unsupported = u"This network protocol is not supported"_s;
    QTest::newRow("scheme") << u"http://host"_s << false << 5 << unsupported;
    QTest::newRow("upper case") << u"SFTP://host"_s << false << 5 << unsupported;
    QTest::newRow("no tool may have it")
        << u"sftp:///a"_s << false << 5 << u"Mounting sftp resource failed"_s;
    QTest::newRow("option") << u"sftp://[]-oProxyCommand=x@host/"_s << false << 5
                            << u"Mounting sftp resource failed"_s;
    QTest::newRow("another host") << u"sftp://elsewhere%3a@host/"_s << false << 5
                                  << u"Mounting sftp resource failed"_s;
    QTest::newRow("given up") << u"sftp://host"_s << true << 2
                              << u"Accessing sftp resource was cancelled"_s;
}

void MountFuseEntryJobTest::errorsPassThrough()
{
    QFETCH(QString, url);
    QFETCH(bool, refused);
    QFETCH(int, code);
    QFETCH(QString, error);
    if (refused) {
        tool->expect({"out Connection reset by peer", "exit 1"});
        auth->answers = {Auth::cancel()};
    }
    const auto job = makeJob<MountFuseEntryJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), code);
    QCOMPARE(job->errorString(), error);
    QCOMPARE(registrations(), QStringList());
}

void MountFuseEntryJobTest::outsideTheGroup_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("scheme");
    QTest::newRow("sftp") << u"sftp://host/a"_s << u"sftp"_s;
    // With another code than that of a job that looks at the share.
    QTest::newRow("smb") << u"smb://host/share"_s << u"smb"_s;
    QTest::newRow("none") << u"host"_s << QString();
    // Nobody looks whether it is there already.
    QTest::newRow("mounted") << u"sftp://mounted/a"_s << u"sftp"_s;
}

void MountFuseEntryJobTest::outsideTheGroup()
{
    QFETCH(QString, url);
    QFETCH(QString, scheme);
    setNetworkMounts(
        {{u"sftp://mounted/"_s, QJsonArray{u"SFTP/m"_s, u"/mnt"_s, int(TypeSFtpSharePlace)}}});
    const auto job = makeJob<MountFuseEntryJob>(url);
    QSignalSpy finished(job.get(), &Job::finished);
    if (!startOutsideGroup(job.get())) {
        QSKIP("can't leave the group \"fuse\"");
    }
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 2);
    QCOMPARE(
        job->errorString(),
        u"You must be in 'fuse' group in order to view urls with protocol '%1'!"_s.arg(scheme));
    QVERIFY(job->path().isEmpty());
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(service->takeCalls(), QStringList());
}

void MountFuseEntryJobTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(MountFuseEntryJobTest)
#include "tst_mountfuseentryjob.moc"
