// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfstest.h"

using namespace VeyFM;

/// What is read while VFS is being made, which must not ask for VFS again, whatever it is.
class StartUpdatesTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void kindsAreLinkedBeforeTheBookmarks();
    void mountsComeInTheOrderOfTheirUrls();
    void oddEntriesAreNavigable();
    void absolutePathsMakeNoPlace();
    void cleanupTestCase();
};

void StartUpdatesTest::initTestCase()
{
    // An empty stored local path and a storage type make an entry ask VFS for its local path.
    const QByteArray script = R"({"values": {
        "NetworkMountsManager.mounts": {
            "sftp://s": ["SFTP/s", "/m/s", 4003],
            "ftp://z": ["FTP/z", "/m/z", 4002],
            "ftp://a": ["FTP/a", "/m/a", 4002],
            "smb://n": ["FTP/n", "/m/n", 4002],
            "ftp://1": ["Storage devices/ghost", "", 3500],
            "ftp://2": ["Odd/share", "", 4002],
            "ftp://3": ["Odd/storage", "/stored", 3507],
            "ftp://4": ["/absolute", "", 10001],
            "sftp://etc": ["/etc", "/elsewhere", 4003],
            "sftp://usr": ["//usr", "/elsewhere", 4003],
            "sftp://top": ["/", "/elsewhere", 4003],
            "ftp://5": ["Odd/url", "", 30100],
            "ftp://6": ["Odd/type", "", -2147483648],
            "ftp://7": ["Home", "/elsewhere", 2001],
            "ftp://8": ["", "/unnamed", 4002]},
        "NetworkPlacesManager.networkPlaces": [["B", "ftp://b", ""]]}})";
    QVERIFY(startVfs(script));
}

void StartUpdatesTest::kindsAreLinkedBeforeTheBookmarks()
{
    QCOMPARE(
        childPaths(u"Network"_s), QStringList({u"Samba"_s, u"FTP"_s, u"SFTP"_s, u"Network/B"_s}));
    QCOMPARE(
        service->takeCalls(),
        QStringList(
            {u"Service.incrementProcessRef[]"_s, u"FavouritePlacesManager.favouritePlaces[]"_s,
             u"NetworkMountsManager.mounts[]"_s, u"NetworkPlacesManager.networkPlaces[]"_s}));
}

void StartUpdatesTest::mountsComeInTheOrderOfTheirUrls()
{
    QCOMPARE(
        childPaths(u"FTP"_s),
        QStringList(
            {u"Storage devices/ghost"_s, u"Odd/share"_s, u"Odd/storage"_s, u"Odd/url"_s,
             u"Odd/type"_s, u"Home"_s, QString(), u"FTP/a"_s, u"FTP/z"_s}));
    QCOMPARE(childPaths(u"SFTP"_s), QStringList(u"SFTP/s"_s));
    // What was there stays as it was.
    QCOMPARE(treeLocalPath(u"Home"_s), QDir::homePath());
}

void StartUpdatesTest::oddEntriesAreNavigable()
{
    const EntryList mounts = vfs->childs(vfs->ftpNetworkEntry());
    QCOMPARE(mounts.size(), 9);
    for (const Entry& entry : mounts) {
        entry.localPath();
        entry.isDirPlace();
        vfs->childs(entry);
        vfs->hasChilds(entry);
        vfs->pathEntryList(entry);
        vfs->getUrlForEntry(entry);
        QCOMPARE(vfs->entry(entry.path()).path().isEmpty(), entry.path().isEmpty());
    }
}

void StartUpdatesTest::absolutePathsMakeNoPlace()
{
    for (const QString& path : {u"/absolute"_s, u"/etc"_s, u"//usr"_s, u"/"_s}) {
        QVERIFY2(!vfs->placeBase()->hasPlace(path), qPrintable(path));
    }
    QCOMPARE(vfs->entry(u"/etc"_s).localPath(), u"/etc"_s);
    QCOMPARE(vfs->localPath(u"/etc/passwd"_s), u"/etc/passwd"_s);
}

void StartUpdatesTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(StartUpdatesTest)
#include "tst_placeupdates_start.moc"
