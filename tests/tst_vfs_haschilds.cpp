// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfsscene.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QTest>

using namespace VeyFM;

namespace {

/// Fills a pending place, and counts how often it was asked to.
class Filler : public QObject
{
    Q_OBJECT

public:
    int calls = 0;

public Q_SLOTS:
    void fill(const QString&)
    {
        ++calls;
    }
};

} // namespace

/// The cheap questions about children, and single ones by name.
class TestVfsHasChilds : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void directories_data();
    void directories();
    void closedDirectories_data();
    void closedDirectories();
    void byType();
    void places();
    void pendingPlaces();
    void withoutLocalPath();
    void existence();
    void existenceOfPlaces();
    void existenceOfUrls();
    void child();
    void childOfWhatHasNone();
    void archives();

private:
    Entry dir(const char* relative) const
    {
        return VFS::ptr()->entry(m_scene.path(relative));
    }

    VfsScene m_scene;
};

void TestVfsHasChilds::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    for (const char* name : {"empty", "files", "dirs", "hidden", "links", "pipes", "invalid"}) {
        QVERIFY(m_scene.makeDir(name));
    }
    QVERIFY(m_scene.makeFile("files/x"));
    QVERIFY(m_scene.makeDir("dirs/x"));
    QVERIFY(m_scene.makeDir("hidden/.x"));
    QVERIFY(m_scene.makeLink("..", "links/up"));
    QVERIFY(m_scene.makeFifo("pipes/x"));
    QVERIFY(m_scene.makeDir("invalid/\xff"));
    QVERIFY(m_scene.makeLink("dirs", "toDirs"));
    QVERIFY(m_scene.makeLink("gone", "dangling"));
}

void TestVfsHasChilds::directories_data()
{
    QTest::addColumn<bool>("hasChilds");
    QTest::addColumn<bool>("containsDirs");
    // The dots count as children: only what can't be read has none.
    QTest::newRow("empty") << true << false;
    QTest::newRow("files") << true << false;
    QTest::newRow("dirs") << true << true;
    QTest::newRow("hidden") << true << true;
    // Links never count as directories.
    QTest::newRow("links") << true << false;
    QTest::newRow("pipes") << true << false;
    QTest::newRow("toDirs") << true << true;
    // Here a name need not be valid.
    QTest::newRow("invalid") << true << true;
    QTest::newRow("files/x") << false << false;
    QTest::newRow("pipes/x") << false << false;
    QTest::newRow("dangling") << false << false;
    QTest::newRow("gone") << false << false;
}

void TestVfsHasChilds::directories()
{
    QFETCH(const bool, hasChilds);
    QFETCH(const bool, containsDirs);
    const Entry entry = dir(QTest::currentDataTag());
    QCOMPARE(VFS::ptr()->hasChilds(entry), hasChilds);
    QCOMPARE(VFS::ptr()->containsDirsOrPlaces(entry), containsDirs);
    if (entry.isDir()) {
        QCOMPARE(hasChilds, QDir(entry.localPath()).count() != 0);
    }
}

void TestVfsHasChilds::closedDirectories_data()
{
    QTest::addColumn<int>("mode");
    QTest::addColumn<bool>("canRead");
    QTest::newRow("closed") << 0700 << false;
    QTest::newRow("enter only") << 0711 << false;
    QTest::newRow("read only") << 0744 << true;
    QTest::newRow("both") << 0755 << true;
}

void TestVfsHasChilds::closedDirectories()
{
    QFETCH(const int, mode);
    QFETCH(const bool, canRead);
    const QByteArray name = "mode" + QByteArray::number(mode, 8);
    QVERIFY(m_scene.makeDir(name));
    QVERIFY(m_scene.makeDir(name + "/x"));
    const Entry entry = dir(name.constData());
    if (::geteuid() != 0) {
        QSKIP("only root can make a directory that belongs to somebody else");
    }
    QVERIFY(m_scene.closeDir(name, mode_t(mode)));
    const Unprivileged unprivileged;
    QVERIFY(unprivileged.isDropped());
    QCOMPARE(VFS::ptr()->hasChilds(entry), canRead);
    QCOMPARE(QDir(entry.localPath()).count() != 0, canRead);
    QCOMPARE(VFS::ptr()->containsDirsOrPlaces(entry), canRead);
}

// Not the disk but the type says whether there is a directory to look at.
void TestVfsHasChilds::byType()
{
    const QString local = m_scene.path("dirs");
    for (const int type :
         {int(TypeFile), int(TypeFileLink), int(TypeNone), int(TypeCustomUrl),
          int(TypeComputerPlace), 10002}) {
        const Entry entry = makeEntry(text("/unknown"), local, type);
        QVERIFY(!VFS::ptr()->hasChilds(entry));
        QVERIFY(!VFS::ptr()->containsDirsOrPlaces(entry));
    }
    for (const int type :
         {int(TypeDir), int(TypeDirLink), int(TypeArchiveFileMountPoint), int(TypeFavouritePlace),
          int(TypeFtpSharePlace)}) {
        const Entry entry = makeEntry(text("/unknown"), local, type);
        QVERIFY(VFS::ptr()->hasChilds(entry));
        QVERIFY(VFS::ptr()->containsDirsOrPlaces(entry));
    }
    QVERIFY(!VFS::ptr()->hasChilds(Entry()));
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(Entry()));
}

void TestVfsHasChilds::places()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(vfs->hasChilds(vfs->computerEntry()));
    QVERIFY(vfs->containsDirsOrPlaces(vfs->computerEntry()));
    QVERIFY(!vfs->hasChilds(vfs->favouritesEntry()));
    QVERIFY(!vfs->containsDirsOrPlaces(vfs->favouritesEntry()));
    QVERIFY(vfs->hasChilds(vfs->homeEntry()));
    QVERIFY(vfs->containsDirsOrPlaces(vfs->homeEntry()));
    // A place that has place children needs no directory, or a readable one.
    VFSPlaceBase* tree = vfs->placeBase();
    const Entry lost = tree->createPlace(text("Lost"), TypeFavouritePlace, m_scene.path("gone"));
    QVERIFY(!vfs->hasChilds(lost));
    QVERIFY(tree->addEntryToPlace(vfs->homeEntry(), lost));
    QVERIFY(vfs->hasChilds(lost));
    QVERIFY(vfs->containsDirsOrPlaces(lost));
    // Only a place has place children.
    QVERIFY(!vfs->hasChilds(makeEntry(text("Computer"), QString(), TypeFile)));
    // A child that is a file makes the answer true as well: the tree is not asked for kinds.
    const Entry odd = tree->createPlace(text("Odd"), TypeFavouritesPlace, QString());
    QVERIFY(tree->addEntryToPlace(dir("files/x"), odd));
    QVERIFY(vfs->containsDirsOrPlaces(odd));
}

void TestVfsHasChilds::pendingPlaces()
{
    Filler filler;
    const Entry pending = VFS::ptr()->placeBase()->createPendingPlace(
        text("Pending"), TypeSambaNetworkPlace, &filler, "fill");
    QVERIFY(VFS::ptr()->hasChilds(pending));
    QVERIFY(VFS::ptr()->containsDirsOrPlaces(pending));
    QVERIFY(VFS::ptr()->isEntryExists(pending));
    QCOMPARE(filler.calls, 0);
    QCOMPARE(VFS::ptr()->childs(pending).size(), 0);
    QCOMPARE(filler.calls, 1);
    QVERIFY(!VFS::ptr()->hasChilds(pending));
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(pending));
    QCOMPARE(filler.calls, 1);
}

// An empty text names the working directory for one of the two, and nothing for the other.
void TestVfsHasChilds::withoutLocalPath()
{
    QVERIFY(QDir::setCurrent(m_scene.path("dirs")));
    const Entry nowhere = makeEntry(text("nowhere/x"), QString(), TypeDir);
    QCOMPARE(nowhere.localPath(), QString());
    QCOMPARE(VFS::ptr()->hasChilds(nowhere), QDir(QString()).count() != 0);
    QVERIFY(VFS::ptr()->hasChilds(nowhere));
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(nowhere));
    QCOMPARE(VFS::ptr()->childs(nowhere).size(), 0);
    QVERIFY(!VFS::ptr()->hasChilds(makeEntry(text("Device"), QString(), TypeUsbDiskStoragePlace)));
}

void TestVfsHasChilds::existence()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(vfs->isEntryExists(dir("files/x")));
    QVERIFY(vfs->isEntryExists(dir("pipes/x")));
    QVERIFY(vfs->isEntryExists(dir("toDirs")));
    QVERIFY(!vfs->isEntryExists(dir("dangling")));
    QVERIFY(!vfs->isEntryExists(dir("gone")));
    QVERIFY(!vfs->isEntryExists(Entry()));
    // Of the path and the local path the latter counts.
    QVERIFY(vfs->isEntryExists(makeEntry(text("/gone"), m_scene.path("files"), TypeDir)));
    QVERIFY(!vfs->isEntryExists(makeEntry(m_scene.path("files"), text("/gone"), TypeDir)));
    QVERIFY(dir("files").isExists());
}

// Nothing but the tree is asked about a place.
void TestVfsHasChilds::existenceOfPlaces()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(vfs->isEntryExists(vfs->rootEntry()));
    QVERIFY(vfs->isEntryExists(vfs->computerEntry()));
    QVERIFY(!vfs->trashEntry().exists());
    QVERIFY(vfs->isEntryExists(vfs->trashEntry()));
    QVERIFY(
        !vfs->isEntryExists(makeEntry(text("Unknown"), m_scene.path("files"), TypeFavouritePlace)));
    QVERIFY(!vfs->isEntryExists(makeEntry(text("vey-fm:x"), m_scene.home(), TypeFavouritePlace)));
}

void TestVfsHasChilds::existenceOfUrls()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(vfs->isEntryExists(vfs->entry(text("mailto:someone@host"))));
    QVERIFY(!vfs->isEntryExists(vfs->entry(text("http://host/"))));
    QVERIFY(!vfs->isEntryExists(vfs->entry(text("qthelp://host/"))));
    QVERIFY(!vfs->isEntryExists(vfs->entry(text("ftp://host/"))));
    QVERIFY(!vfs->isEntryExists(vfs->entry(text("MAILTO:someone@host"))));
    QVERIFY(vfs->isEntryExists(makeEntry(text("vey-fm:whatever"), QString(), TypeNone)));
    QVERIFY(!vfs->isEntryExists(makeEntry(text("VEY-FM:whatever"), QString(), TypeNone)));
    QVERIFY(!vfs->isEntryExists(makeEntry(text("vey-fm"), QString(), TypeNone)));
}

void TestVfsHasChilds::child()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(m_scene.makeDir("home/sub"));
    QCOMPARE(vfs->child(vfs->homeEntry(), text("sub")).path(), text("Home/sub"));
    QCOMPARE(vfs->child(vfs->homeEntry(), text("sub")).type(), int(TypeDir));
    QCOMPARE(vfs->child(vfs->homeEntry(), text("no")).path(), text("Home/no"));
    QCOMPARE(vfs->child(vfs->homeEntry(), text("no")).type(), int(TypeNone));
    QCOMPARE(vfs->child(vfs->fileSystemEntry(), text("usr")).path(), text("/usr"));
    QCOMPARE(vfs->child(vfs->fileSystemEntry(), text("/usr")).path(), text("/usr"));
    QCOMPARE(vfs->child(vfs->fileSystemEntry(), QString()), vfs->fileSystemEntry());
    QCOMPARE(vfs->child(dir("files"), text("x")).path(), m_scene.path("files/x"));
    QCOMPARE(vfs->child(dir("files"), text("x")).type(), int(TypeFile));
    QCOMPARE(vfs->child(dir("toDirs"), text("x")).type(), int(TypeDir));
    QCOMPARE(vfs->child(dir("files"), text("..")).path(), m_scene.root());
    QCOMPARE(vfs->child(dir("files"), text("a:b")).path(), m_scene.path("files/a:b"));
    // It goes through resolution, so a place of that name comes first.
    VFSPlaceBase* tree = vfs->placeBase();
    tree->createPlace(text("Home/held"), TypeFavouritePlace, m_scene.path("dirs"));
    QCOMPARE(vfs->child(vfs->homeEntry(), text("held")).type(), int(TypeFavouritePlace));
}

void TestVfsHasChilds::childOfWhatHasNone()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(vfs->child(dir("files/x"), text("y")).isNull());
    QVERIFY(vfs->child(dir("gone"), text("y")).isNull());
    QVERIFY(vfs->child(vfs->computerEntry(), text("Home")).isNull());
    QVERIFY(vfs->child(Entry(), text("y")).isNull());
    QVERIFY(vfs->child(vfs->entry(text("http://host/")), text("y")).isNull());
    // A device that is not mounted may have a child by its path, but there is nothing behind it.
    const Entry device = makeEntry(text("Device"), QString(), TypeUsbDiskStoragePlace);
    vfs->placeBase()->createPlace(text("Device"), TypeUsbDiskStoragePlace, QString());
    QVERIFY(vfs->child(device, text("y")).isNull());
    vfs->placeBase()->createPlace(text("Device/y"), TypeUsbDiskStoragePlace, QString());
    QCOMPARE(vfs->child(device, text("y")).path(), text("Device/y"));
    const Entry archive = makeEntry(m_scene.path("dirs"), QString(), TypeArchiveFileMountPoint);
    QCOMPARE(vfs->child(archive, text("x")).path(), m_scene.path("dirs/x"));
}

void TestVfsHasChilds::archives()
{
    VFS* vfs = VFS::ptr();
    const Entry archive = makeEntry(text("/a.zip"), text("/a.zip"), TypeArchiveFileMountPoint);
    for (const Entry& entry : {Entry(), archive, vfs->homeEntry(), dir("files/x")}) {
        QVERIFY(!vfs->isSupportedFileArchive(entry));
    }
}

QTEST_GUILESS_MAIN(TestVfsHasChilds)
#include "tst_vfs_haschilds.moc"
