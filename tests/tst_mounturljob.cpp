// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountftpurljob.h"
#include "jobs/mountsftpurljob.h"
#include "jobs/mountsmburljob.h"
#include "jobs/mounturljob.h"
#include "support/mountjobtest.h"
#include "support/outsidegroup.h"

using namespace VeyFM;

namespace {

const QByteArrayList listed = {"out Total number of bytes: 12\\n"};
const QByteArrayList denied = {"out NT_STATUS_ACCESS_DENIED\\n", "exit 1"};
const QByteArrayList asks = {"echo off", "out x@host's password: ", "read", "echo on"};

} // namespace

/// The choice of the job for a URL, with scripted tools and a scripted service.
class MountURLJobTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void unsupported_data();
    void unsupported();
    void smbEndsInStart();
    void sftpEndsInStart();
    void ftpEndsLater();
    void urlComesBackAsQtWritesIt();
    void changedUserShows();
    void errorsPassThrough_data();
    void errorsPassThrough();
    void smbOutsideTheGroup();
    void silenceOfSftpPassesThrough();
    void cleanupTestCase();
};

void MountURLJobTest::initTestCase()
{
    startVfsInGroup(R"({"values": {"SmbBrowser.smbNetworkLocalPath": "/net"}})");
}

void MountURLJobTest::cleanup()
{
    endScene();
}

void MountURLJobTest::unsupported_data()
{
    QTest::addColumn<QString>("url");
    for (const QString& url :
         {u"http://host"_s, u"file:///tmp"_s, u"smbs://host"_s, u"SMB://host/share"_s,
          u"FTP://host"_s, u"Sftp://host"_s, u"host"_s, u" ftp://host"_s, QString()}) {
        QTest::newRow(qPrintable(url)) << url;
    }
}

void MountURLJobTest::unsupported()
{
    QFETCH(QString, url);
    startScene("sshfs");
    const auto job = makeJob<MountURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"This network protocol is not supported"_s);
    QCOMPARE(job->url(), url);
    QVERIFY(job->localPath().isEmpty());
    QVERIFY(job->children().isEmpty());
    QCOMPARE(service->takeCalls(), QStringList());
}

void MountURLJobTest::smbEndsInStart()
{
    startScene("smbclient");
    tool->expect(listed);
    const QString url = u"smb://WG;bob@localhost/share/a%20b"_s;
    const auto job = makeJob<MountURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->url(), url);
    QCOMPARE(job->localPath(), u"/net/localhost/share/a%20b"_s);
    QVERIFY(job->findChild<MountSmbURLJob*>());
}

void MountURLJobTest::sftpEndsInStart()
{
    startScene("sshfs");
    tool->expect(asks);
    auth->answers = {Auth::password(u"x"_s)};
    const auto job = makeJob<MountURLJob>(u"sftp://host/a"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), mountDir(u"/sftp/host//a"_s));
    QVERIFY(job->findChild<MountSFtpURLJob*>());
}

void MountURLJobTest::ftpEndsLater()
{
    startScene("curlftpfs");
    tool->expect({});
    const auto job = makeJob<MountURLJob>(u"ftp://host/a"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 0);
    QVERIFY(job->findChild<MountFtpURLJob*>());
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), mountDir(u"/ftp/host//a"_s));
}

void MountURLJobTest::urlComesBackAsQtWritesIt()
{
    startScene("sshfs");
    tool->expect({});
    const auto job = makeJob<MountURLJob>(u"sftp://host/a%20b"_s);
    QCOMPARE(job->url(), u"sftp://host/a%20b"_s);
    job->start();
    QCOMPARE(job->url(), u"sftp://host/a b"_s);
}

void MountURLJobTest::changedUserShows()
{
    startScene("sshfs");
    tool->expect(asks);
    tool->expect({});
    auth->answers = {Auth::changeUser(u"bob"_s)};
    const auto job = makeJob<MountURLJob>(u"sftp://ann@host/a"_s);
    job->start();
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->url(), u"sftp://bob@host/a"_s);
}

void MountURLJobTest::errorsPassThrough_data()
{
    QTest::addColumn<QByteArray>("toolName");
    QTest::addColumn<QString>("url");
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<int>("cancels");
    QTest::addColumn<int>("code");
    QTest::addColumn<QString>("error");
    using Runs = QList<QByteArrayList>;
    const QString smb = u"smb://localhost/share"_s;
    QTest::newRow("smb given up") << QByteArray("smbclient") << smb << Runs{{"exit 1"}, denied} << 2
                                  << 2 << u"Login cancelled"_s;
    QTest::newRow("smb without a share") << QByteArray("smbclient") << u"smb://localhost"_s
                                         << Runs{} << 0 << 5 << u"Url must contain share name"_s;
    QTest::newRow("ftp fails") << QByteArray("curlftpfs") << u"ftp://host"_s << Runs{{"exit 1"}}
                               << 0 << 5 << u"Mounting ftp resource failed"_s;
    QTest::newRow("ftp given up") << QByteArray("curlftpfs") << u"ftp://host"_s
                                  << Runs{{"err Access denied", "exit 1"}} << 1 << 2
                                  << u"Accessing ftp resource was cancelled"_s;
    QTest::newRow("sftp fails") << QByteArray("sshfs") << u"sftp://host"_s << Runs{{"exit 1"}} << 0
                                << 5 << u"Mounting sftp resource failed"_s;
    QTest::newRow("sftp to an option")
        << QByteArray("sshfs") << u"sftp://[]-oProxyCommand=x@host/"_s << Runs{} << 0 << 5
        << u"Mounting sftp resource failed"_s;
    QTest::newRow("ftp with an option")
        << QByteArray("curlftpfs") << u"ftp://bob,allow_other@host/"_s << Runs{} << 0 << 5
        << u"Mounting ftp resource failed"_s;
    QTest::newRow("sftp given up") << QByteArray("sshfs") << u"sftp://host"_s
                                   << Runs{{"out Connection reset by peer", "exit 1"}} << 1 << 2
                                   << u"Accessing sftp resource was cancelled"_s;
}

void MountURLJobTest::errorsPassThrough()
{
    QFETCH(QByteArray, toolName);
    QFETCH(QString, url);
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(int, cancels);
    QFETCH(int, code);
    QFETCH(QString, error);
    startScene(toolName);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    for (int i = 0; i < cancels; ++i) {
        auth->answers.append(Auth::cancel());
    }
    const auto job = makeJob<MountURLJob>(url);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QVERIFY(finished.count() == 1 || finished.wait(20000));
    QCOMPARE(job->error(), code);
    QCOMPARE(job->errorString(), error);
    QCOMPARE(job->url(), url);
    QVERIFY(job->localPath().isEmpty());
}

void MountURLJobTest::smbOutsideTheGroup()
{
    startScene("smbclient");
    const auto job = makeJob<MountURLJob>(u"smb://localhost/share"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    if (!startOutsideGroup(job.get())) {
        QSKIP("can't leave the group \"fuse\"");
    }
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 4);
    QCOMPARE(job->errorString(), u"You must be in 'fuse' group in order to browse samba shares!"_s);
    QVERIFY(job->localPath().isEmpty());
}

void MountURLJobTest::silenceOfSftpPassesThrough()
{
    startScene("sshfs");
    tool->expect(asks + QByteArrayList({"exit 1"}));
    auth->answers = {Auth::cancel()};
    const auto job = makeJob<MountURLJob>(u"sftp://host"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
}

void MountURLJobTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(MountURLJobTest)
#include "tst_mounturljob.moc"
