// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfsscene.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QTest>

using namespace VeyFM;

class TestVfsLocalPath : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void ofTexts();
    void ofPlaces();
    void ofShares_data();
    void ofShares();
    void ofMounts();
    void ofStoragePlaces();
    void withoutRule_data();
    void withoutRule();
    void ofUrls();
    void ofEntriesOffTheTree();
    void belowPlaces();
    void belowDirectoryOfTheRoot();
    void nodeThatIsNoPlace();

private:
    VfsScene m_scene;
};

void TestVfsLocalPath::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    QVERIFY(QDir::setCurrent(m_scene.path("work")));
}

void TestVfsLocalPath::ofTexts()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(vfs->localPath(text("Home/a/b")), m_scene.home() + text("/a/b"));
    QCOMPARE(vfs->localPath(text("Computer/Home")), m_scene.home());
    QCOMPARE(vfs->localPath(text("Computer")), QString());
    QCOMPARE(vfs->localPath(text("/usr/../etc")), text("/etc"));
    QCOMPARE(vfs->localPath(text("x")), m_scene.path("work/x"));
    QCOMPARE(vfs->localPath(text("/")), text("/"));
    QCOMPARE(vfs->localPath(text("file:///tmp/a%20b")), text("/tmp/a b"));
    QCOMPARE(vfs->localPath(text("http://host/x")), QString());
    QCOMPARE(vfs->localPath(text("sftp://host/x")), QString());
    QCOMPARE(vfs->localPath(QString()), QString());
}

void TestVfsLocalPath::ofPlaces()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(vfs->localPath(vfs->homeEntry()), m_scene.home());
    QCOMPARE(vfs->localPath(vfs->fileSystemEntry()), text("/"));
    for (const Entry& entry :
         {vfs->rootEntry(), vfs->computerEntry(), vfs->networkEntry(), vfs->favouritesEntry()}) {
        QCOMPARE(vfs->localPath(entry), QString());
    }
    // The stored field decides for directory places, whatever the tree knows of them.
    QCOMPARE(
        vfs->localPath(makeEntry(text("Home"), text("/stored"), TypeHomeDirPlace)),
        text("/stored"));
    QCOMPARE(vfs->localPath(makeEntry(text("Home"), QString(), TypeHomeDirPlace)), QString());
    // A pure place has none, even if something is stored.
    const Entry pure = makeEntry(text("Computer"), text("/stored"), TypeComputerPlace);
    QCOMPARE(vfs->localPath(pure), QString());
    QCOMPARE(pure.localPath(), text("/stored"));
}

void TestVfsLocalPath::ofShares_data()
{
    QTest::addColumn<int>("type");
    QTest::newRow("Samba share") << int(TypeSambaSharePlace);
    QTest::newRow("network bookmark") << int(TypeFavouriteNetworkPlace);
}

// What the tree knows now, and not what the entry was given once.
void TestVfsLocalPath::ofShares()
{
    QFETCH(const int, type);
    VFS* vfs = VFS::ptr();
    const QString path = text("Share") + QString::number(type);
    const Entry old = vfs->placeBase()->createPlace(path, type, QString());
    QCOMPARE(old.localPath(), QString());
    QVERIFY(old.isPurePlace());

    vfs->placeBase()->setPlaceLocalPath(old, text("/mnt/one"));
    QCOMPARE(vfs->localPath(old), text("/mnt/one"));
    QCOMPARE(old.localPath(), text("/mnt/one"));
    QVERIFY(old.isDirPlace());
    QCOMPARE(vfs->localPath(path + text("/x")), text("/mnt/one/x"));

    const Entry copy = vfs->placeBase()->placeEntry(path);
    vfs->placeBase()->setPlaceLocalPath(old, text("/mnt/two"));
    QCOMPARE(vfs->localPath(copy), text("/mnt/two"));
    QCOMPARE(copy.localPath(), text("/mnt/one"));

    QVERIFY(!vfs->placeBase()->destroyPlace(old));
    QCOMPARE(vfs->localPath(copy), QString());
}

void TestVfsLocalPath::ofMounts()
{
    for (const int type : {int(TypeFtpSharePlace), int(TypeSFtpSharePlace)}) {
        const Entry entry = makeEntry(text("FTP/host"), text("/mnt/ftp"), type);
        QCOMPARE(VFS::ptr()->localPath(entry), text("/mnt/ftp"));
        QCOMPARE(entry.localPath(), text("/mnt/ftp"));
    }
}

// Only the service knows where a device is mounted, so what is stored never counts.
void TestVfsLocalPath::ofStoragePlaces()
{
    for (const int type : {3500, 3503, 3507, 3999}) {
        const Entry entry = makeEntry(text("Storage devices/x"), text("/mnt/stored"), type);
        QCOMPARE(VFS::ptr()->localPath(entry), QString());
        QCOMPARE(entry.localPath(), QString());
        QVERIFY(entry.isPurePlace());
    }
}

void TestVfsLocalPath::withoutRule_data()
{
    QTest::addColumn<int>("type");
    for (const int type : {4002, 4003, 4004, 4100, 4499}) {
        QTest::newRow(qPrintable(QString::number(type))) << type;
    }
}

// To be a directory these need a local path, and to have one they would have to be directories.
void TestVfsLocalPath::withoutRule()
{
    QFETCH(const int, type);
    const Entry entry = makeEntry(text("Nowhere"), QString(), type);
    QCOMPARE(VFS::ptr()->localPath(entry), QString());
    QCOMPARE(entry.localPath(), QString());
    QVERIFY(!entry.isDirPlace());
    QVERIFY(entry.isPurePlace());
}

void TestVfsLocalPath::ofUrls()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(
        vfs->localPath(makeEntry(text("file:///tmp/a%20b"), QString(), TypeNone)),
        text("/tmp/a b"));
    // Ahead of all that the type says, and with a host too.
    QCOMPARE(
        vfs->localPath(makeEntry(text("file:///tmp"), text("/stored"), TypeHomeDirPlace)),
        text("/tmp"));
    QCOMPARE(vfs->localPath(makeEntry(text("file://host/x"), QString(), TypeNone)), text("/x"));
    QCOMPARE(vfs->localPath(makeEntry(text("http://h/x"), text("/y"), TypeDir)), QString());
    QCOMPARE(vfs->localPath(makeEntry(text("vey-fm:Home"), QString(), TypeDir)), QString());
}

void TestVfsLocalPath::ofEntriesOffTheTree()
{
    VFS* vfs = VFS::ptr();
    // An entry that is no place goes by its path, not by its stored field.
    QCOMPARE(
        vfs->localPath(makeEntry(text("Home/x"), text("/stored"), TypeFile)),
        m_scene.home() + text("/x"));
    QCOMPARE(
        makeEntry(text("Home/x"), QString(), TypeFile).localPath(), m_scene.home() + text("/x"));
    // A path that begins with a slash is taken as it is.
    QCOMPARE(vfs->localPath(makeEntry(text("/a/../b//c/"), QString(), 0)), text("/a/../b//c/"));
    QCOMPARE(vfs->localPath(makeEntry(text("/a:b"), QString(), 0)), text("/a:b"));
    QCOMPARE(vfs->localPath(makeEntry(text("nobody/x"), QString(), TypeFile)), QString());
    QCOMPARE(vfs->localPath(makeEntry(QString(), text("/x"), TypeFile)), QString());
    QCOMPARE(vfs->localPath(makeEntry(text("./"), QString(), TypeFile)), QString());
    // Here no ".." is walked.
    QCOMPARE(
        vfs->localPath(makeEntry(text("Home/../x"), QString(), 0)), m_scene.home() + text("/../x"));
    QCOMPARE(vfs->localPath(makeEntry(text("File System/../x"), QString(), 0)), text("/../x"));
    QCOMPARE(
        vfs->localPath(makeEntry(text("Computer/File System/usr"), QString(), 0)), text("/usr"));
    QCOMPARE(vfs->localPath(makeEntry(text("Computer/Home"), QString(), 0)), m_scene.home());
}

void TestVfsLocalPath::belowPlaces()
{
    VFS* vfs = VFS::ptr();
    VFSPlaceBase* tree = vfs->placeBase();
    // The deepest place of a composite path gives the directory, and a virtual one gives none.
    tree->createPlace(text("Top"), TypeFavouritePlace, text("/srv/top"));
    tree->createPlace(text("Top/mid"), TypeFavouritePlace, text("/srv/mid"));
    tree->createPlace(text("Top/mid/low"), TypeSambaServerPlace, QString());
    QCOMPARE(vfs->localPath(text("Top/x/y")), text("/srv/top/x/y"));
    QCOMPARE(vfs->localPath(text("Top/mid/x")), text("/srv/mid/x"));
    QCOMPARE(vfs->localPath(text("Top/mid/low")), QString());
    QVERIFY(vfs->entry(text("Top/mid/low/x")).isNull());
    // A gap ends it: what lies behind is a name on the disk.
    tree->createPlace(text("Top/gap/low"), TypeFavouritePlace, text("/srv/low"));
    QCOMPARE(vfs->localPath(text("Top/gap/low")), text("/srv/low"));
    QCOMPARE(vfs->localPath(text("Top/gap/low/x")), text("/srv/top/gap/low/x"));
}

// The slash of the directory and that in front of the section both stay.
void TestVfsLocalPath::belowDirectoryOfTheRoot()
{
    const Entry twin =
        VFS::ptr()->placeBase()->createPlace(text("Twin"), TypeFavouritePlace, text("/"));
    QCOMPARE(VFS::ptr()->localPath(text("Twin/usr")), text("//usr"));
    QCOMPARE(VFS::ptr()->entry(text("Twin/usr")).path(), text("Twin/usr"));
    QCOMPARE(VFS::ptr()->entry(text("Twin/usr")).type(), int(TypeDir));
    VFS::ptr()->placeBase()->destroyPlace(twin);
}

// A service may send such a mount. Its stored path is all there is: to compute one would ask the
// same node again, without end.
void TestVfsLocalPath::nodeThatIsNoPlace()
{
    VFS* vfs = VFS::ptr();
    for (const int type : {int(TypeDir), int(TypeNone), 999, 10000, -1}) {
        const QString path = text("Strange") + QString::number(type);
        const Entry empty = vfs->placeBase()->createPlace(path, type, QString());
        QCOMPARE(empty.localPath(), QString());
        QCOMPARE(vfs->localPath(path), QString());
        QVERIFY(vfs->entry(path + text("/x")).isNull());
        vfs->placeBase()->setPlaceLocalPath(empty, text("/srv/strange"));
        QCOMPARE(vfs->localPath(path + text("/x")), text("/srv/strange/x"));
        QCOMPARE(empty.localPath(), text("/srv/strange"));
    }
}

QTEST_GUILESS_MAIN(TestVfsLocalPath)
#include "tst_vfs_localpath.moc"
