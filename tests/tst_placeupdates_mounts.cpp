// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfstest.h"

using namespace VeyFM;

/// How the tree follows mounts of network resources.
class MountUpdatesTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void kindsHaveNoParentAtFirst();
    void otherSchemesMakeNoPlace();
    void nullEntry();
    void firstFtpMountLinksFtp();
    void secondFtpMount();
    void sameMountAgain();
    void sftpHasItsOwnPlace();
    void placesAboveAreNotHungBelow();
    void absolutePathsMakeNoPlace();
    void cleanupTestCase();

private:
    QStringList mountNews(const QString& url, const QJsonArray& entry)
    {
        return news(u"NetworkMountsManager"_s, u"mountAdded"_s, {url, entry});
    }
};

void MountUpdatesTest::initTestCase()
{
    QVERIFY(startVfs("{}"));
}

void MountUpdatesTest::kindsHaveNoParentAtFirst()
{
    QCOMPARE(childPaths(u"Network"_s), QStringList(u"Samba"_s));
    QVERIFY(vfs->placeBase()->hasPlace(u"FTP"_s));
    QVERIFY(vfs->parent(vfs->ftpNetworkEntry()).isNull());
}

void MountUpdatesTest::otherSchemesMakeNoPlace()
{
    for (const QString& url : {u"smb://h/s"_s, u"http://h"_s, u"h"_s, QString()}) {
        QCOMPARE(
            mountNews(url, array(R"(["FTP/other", "/m", 4002])")),
            QStringList(u"mountAdded %1 -"_s.arg(url)));
        QVERIFY(!vfs->placeBase()->hasPlace(u"FTP/other"_s));
    }
}

void MountUpdatesTest::nullEntry()
{
    QCOMPARE(
        mountNews(u"ftp://h"_s, array(R"(["", "/m", 4002])")),
        QStringList(u"mountAdded ftp://h -"_s));
    QCOMPARE(childPaths(u"Network"_s), QStringList(u"Samba"_s));
}

void MountUpdatesTest::firstFtpMountLinksFtp()
{
    QCOMPARE(
        mountNews(u"ftp://h"_s, array(R"(["FTP/h", "/m/h", 4002])")),
        QStringList(
            {u"created FTP"_s, u"created FTP/h=/m/h"_s, u"mountAdded ftp://h FTP/h=/m/h"_s}));
    QCOMPARE(childPaths(u"Network"_s), QStringList({u"Samba"_s, u"FTP"_s}));
}

void MountUpdatesTest::secondFtpMount()
{
    QCOMPARE(
        mountNews(u"ftp://k"_s, array(R"(["FTP/k", "/m/k", 4002])")),
        QStringList({u"created FTP/k=/m/k"_s, u"mountAdded ftp://k FTP/k=/m/k"_s}));
    QCOMPARE(childPaths(u"FTP"_s), QStringList({u"FTP/h"_s, u"FTP/k"_s}));
}

void MountUpdatesTest::sameMountAgain()
{
    // The place as it is, whatever comes with the news.
    QCOMPARE(
        mountNews(u"ftp://h/deeper"_s, array(R"(["FTP/h", "/other", 4002])")),
        QStringList(u"mountAdded ftp://h/deeper FTP/h=/m/h"_s));
    QCOMPARE(childPaths(u"FTP"_s).size(), 2);
}

void MountUpdatesTest::sftpHasItsOwnPlace()
{
    QCOMPARE(
        mountNews(u"sftp://h"_s, array(R"(["SFTP/h", "/m/s", 4003])")),
        QStringList(
            {u"created SFTP"_s, u"created SFTP/h=/m/s"_s, u"mountAdded sftp://h SFTP/h=/m/s"_s}));
    QCOMPARE(childPaths(u"Network"_s), QStringList({u"Samba"_s, u"FTP"_s, u"SFTP"_s}));
}

void MountUpdatesTest::placesAboveAreNotHungBelow()
{
    // A service that calls a mount after a place above would make a ring of the tree.
    for (const QString& path : {u"Network"_s, u"_"_s, u"Places"_s, u"FTP"_s}) {
        mountNews(u"ftp://ring"_s, {path, u"/m"_s, 4002});
        QCOMPARE(childPaths(u"FTP"_s), QStringList({u"FTP/h"_s, u"FTP/k"_s}));
    }
    // Side by side, but not in turn.
    mountNews(u"ftp://side"_s, array(R"(["SFTP", "/m", 4003])"));
    mountNews(u"sftp://side"_s, array(R"(["FTP", "/m", 4002])"));
    QCOMPARE(childPaths(u"FTP"_s).last(), u"SFTP"_s);
    QCOMPARE(childPaths(u"SFTP"_s), QStringList(u"SFTP/h"_s));
    QCOMPARE(
        vfs->pathEntryList(vfs->entry(u"SFTP/h"_s)).paths(),
        QStringList({u"_"_s, u"Network"_s, u"SFTP"_s, u"SFTP/h"_s}));
}

void MountUpdatesTest::absolutePathsMakeNoPlace()
{
    // Whoever can tell the service of a mount must not be able to lead "/etc" elsewhere.
    const QStringList before = childPaths(u"SFTP"_s);
    for (const QString& path :
         {u"/etc"_s, u"//etc"_s, u"/etc/"_s, u"/"_s, u"//"_s, u"/etc/passwd"_s, u"/../etc"_s}) {
        for (const QString& url : {u"ftp://redirect"_s, u"sftp://redirect"_s}) {
            for (const int type : {4002, 4003, 2005, 3500, 10001}) {
                QCOMPARE(
                    mountNews(url, {path, u"/elsewhere"_s, type}),
                    QStringList(u"mountAdded %1 -"_s.arg(url)));
            }
        }
        QVERIFY2(!vfs->placeBase()->hasPlace(path), qPrintable(path));
        QVERIFY2(
            !vfs->entry(path).isPlace() || path == u"/"_s || path == u"//"_s, qPrintable(path));
    }
    QCOMPARE(childPaths(u"SFTP"_s), before);
    QCOMPARE(vfs->localPath(u"/etc/passwd"_s), u"/etc/passwd"_s);
    QCOMPARE(vfs->localPath(u"/etc"_s), u"/etc"_s);
    QCOMPARE(vfs->entry(u"/"_s), vfs->fileSystemEntry());
}

void MountUpdatesTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(MountUpdatesTest)
#include "tst_placeupdates_mounts.moc"
