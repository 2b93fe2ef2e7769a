// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountsmburljob.h"
#include "support/mountjobtest.h"
#include "support/outsidegroup.h"

using namespace VeyFM;

namespace {

const QByteArrayList listed = {"out Total number of bytes: 12\\n"};
const QByteArrayList noTicket = {"exit 1"};
const QByteArrayList denied = {"out NT_STATUS_ACCESS_DENIED\\n", "exit 1"};
const QString networkPath = QStringLiteral("SmbBrowser.smbNetworkLocalPath");

} // namespace

/// From an "smb" URL to a local path, with a scripted `smbclient` and service.
class MountSmbURLJobTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void refusedUrls_data();
    void refusedUrls();
    void path_data();
    void path();
    void canonicalHostAfterATicket();
    void namesAreNoOptions_data();
    void namesAreNoOptions();
    void errorsOfTheCheckPassThrough();
    void noNetworkPath_data();
    void noNetworkPath();
    void checkIsAChildThatGoes();
    void outsideTheGroup();
    void cleanupTestCase();
};

void MountSmbURLJobTest::initTestCase()
{
    startVfsInGroup("{}");
}

void MountSmbURLJobTest::init()
{
    startScene("smbclient");
    service->setRules(networkPath, {});
    service->setValue(networkPath, u"/net"_s);
}

void MountSmbURLJobTest::cleanup()
{
    endScene();
}

void MountSmbURLJobTest::refusedUrls_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("error");
    const QString scheme = u"Url scheme is not smb"_s;
    QTest::newRow("other scheme") << u"ftp://host/share"_s << scheme;
    QTest::newRow("none") << u"host/share"_s << scheme;
    QTest::newRow("empty") << QString() << scheme;
    QTest::newRow("upper case") << u"SMB://host/share"_s << scheme;
    QTest::newRow("longer scheme") << u"smbs://host/share"_s << scheme;
    // The scheme is read from the text as it is, the rest from the trimmed one.
    QTest::newRow("blank before") << u" smb://host/share"_s << scheme;
    QTest::newRow("no slash") << u"smb:host"_s << u"Incorrect url"_s;
    QTest::newRow("scheme alone") << u"smb:"_s << u"Incorrect url"_s;
    QTest::newRow("no host") << u"smb:///share"_s << u"Url must contain host name"_s;
    QTest::newRow("nothing") << u"smb://"_s << u"Url must contain host name"_s;
    QTest::newRow("workgroup alone") << u"smb://WG;/share"_s << u"Url must contain host name"_s;
    // So a server can't be mounted.
    QTest::newRow("host alone") << u"smb://host"_s << u"Url must contain share name"_s;
    QTest::newRow("host and slash") << u"smb://host/"_s << u"Url must contain share name"_s;
    QTest::newRow("host and blank") << u"smb://host/ \n"_s << u"Url must contain share name"_s;
    QTest::newRow("no share") << u"smb://host//tail"_s << u"Url must contain share name"_s;
}

void MountSmbURLJobTest::refusedUrls()
{
    QFETCH(QString, url);
    QFETCH(QString, error);
    const auto job = makeJob<MountSmbURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), error);
    QCOMPARE(job->url(), url);
    QVERIFY(job->localPath().isEmpty());
    QCOMPARE(auth->calls, QStringList());
    QVERIFY(auth->protocol().isEmpty());
}

void MountSmbURLJobTest::path_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("network");
    QTest::addColumn<QString>("path");
    const QString plain = u"smb://LOCALHOST/share"_s;
    QTest::newRow("share") << plain << u"/net"_s << u"/net/LOCALHOST/share/"_s;
    QTest::newRow("slash behind") << plain + u"/"_s << u"/net"_s << u"/net/LOCALHOST/share/"_s;
    QTest::newRow("network with a slash") << plain << u"/net/"_s << u"/net/LOCALHOST/share/"_s;
    QTest::newRow("tail") << plain + u"/a/b c"_s << u"/net"_s << u"/net/LOCALHOST/share/a/b c"_s;
    QTest::newRow("tail with a slash")
        << plain + u"/a/"_s << u"/net"_s << u"/net/LOCALHOST/share/a/"_s;
    QTest::newRow("workgroup and user")
        << u"smb://WG;bob@LOCALHOST/share/a"_s << u"/net"_s << u"/net/LOCALHOST/share/a"_s;
    QTest::newRow("blanks behind")
        << plain + u"/a \n"_s << u"/net"_s << u"/net/LOCALHOST/share/a"_s;
    QTest::newRow("not decoded") << plain + u"/a%20b"_s << u"/net"_s
                                 << u"/net/LOCALHOST/share/a%20b"_s;
    // A single slash loses the first letter of the host.
    QTest::newRow("single slash") << u"smb:/xLOCALHOST/share"_s << u"/net"_s
                                  << u"/net/LOCALHOST/share/"_s;
}

void MountSmbURLJobTest::path()
{
    QFETCH(QString, url);
    QFETCH(QString, network);
    QFETCH(QString, path);
    service->setValue(networkPath, network);
    tool->expect(noTicket);
    tool->expect(listed);
    const auto job = makeJob<MountSmbURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), path);
    QCOMPARE(job->url(), url);
    QCOMPARE(tool->arguments(2), QByteArrayList({"//LOCALHOST/share", "-U", "%", "-c", "du"}));
    QCOMPARE(auth->domain(), url.contains(u"WG;"_s) ? u"WG"_s : QString());
    QCOMPARE(service->takeCalls(), QStringList(networkPath + u"[]"_s));
}

void MountSmbURLJobTest::canonicalHostAfterATicket()
{
    tool->expect(listed);
    const auto job = makeJob<MountSmbURLJob>(u"smb://LOCALHOST/share/a"_s);
    job->start();
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/net/localhost/share/a"_s);
}

void MountSmbURLJobTest::namesAreNoOptions_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("path");
    QTest::newRow("share") << u"smb://host/pub -N -c \"get payload .bashrc\""_s
                           << u"/net/host/pub -N -c \"get payload .bashrc\"/"_s;
    QTest::newRow("host") << u"smb://host -L x/pub/a"_s << u"/net/host -L x/pub/a"_s;
}

void MountSmbURLJobTest::namesAreNoOptions()
{
    QFETCH(QString, url);
    QFETCH(QString, path);
    const auto job = makeJob<MountSmbURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(tool->runs(), 0);
    QCOMPARE(job->error(), 0); // As where smbclient is missing.
    QCOMPARE(job->localPath(), path);
}

void MountSmbURLJobTest::errorsOfTheCheckPassThrough()
{
    tool->expect(noTicket);
    tool->expect(denied);
    auth->answers = {Auth::cancel(), Auth::cancel()};
    const auto job = makeJob<MountSmbURLJob>(u"smb://LOCALHOST/share"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Login cancelled"_s);
    QVERIFY(job->localPath().isEmpty());
    QCOMPARE(service->takeCalls(), QStringList());
}

void MountSmbURLJobTest::noNetworkPath_data()
{
    QTest::addColumn<QByteArray>("rule");
    QTest::newRow("empty") << QByteArray(R"([{"value": ""}])");
    QTest::newRow("error") << QByteArray(R"([{"error": "no network"}])");
}

void MountSmbURLJobTest::noNetworkPath()
{
    QFETCH(QByteArray, rule);
    service->setRules(networkPath, array(rule));
    tool->expect(listed);
    const auto job = makeJob<MountSmbURLJob>(u"smb://LOCALHOST/share"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Can't get local path for samba network"_s);
    QVERIFY(job->localPath().isEmpty());
}

void MountSmbURLJobTest::checkIsAChildThatGoes()
{
    tool->expect(listed);
    const auto job = makeJob<MountSmbURLJob>(u"smb://LOCALHOST/share"_s);
    job->start();
    QCOMPARE(job->children().size(), 1);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(job->children().isEmpty());
}

void MountSmbURLJobTest::outsideTheGroup()
{
    const auto job = makeJob<MountSmbURLJob>(u"smb://LOCALHOST/share"_s);
    if (!startOutsideGroup(job.get())) {
        QSKIP("can't leave the group \"fuse\"");
    }
    QCOMPARE(job->error(), 4);
    QCOMPARE(job->errorString(), u"You must be in 'fuse' group in order to browse samba shares!"_s);
}

void MountSmbURLJobTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(MountSmbURLJobTest)
#include "tst_mountsmburljob.moc"
