// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/rerun.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QCoreApplication>
#include <QTest>

using namespace VeyFM;

class TestVfsParents : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void ofPlaces();
    void ofTopLevel();
    void ofTop();
    void ofFiles();
    void belowPlaces();
    void throughComposite();
    void ofGoneDirectory();
    void treeAnswersFirst();
    void pathWithoutTail();
    void tailTwice();
    void linkByPathText();
    void linkBelowPlaceIsNotSeen();
    void ofUrls();
    void chains();
    void chainFromOtherRoot();
    void chainOfNothing();
    void fileSystemPathList();
    void history();
    void historyFromOtherRoot();
    void linkTargets();
    void linkTargetsBelowPlaces();
    void targetOfWhatIsNoLink();
    void placeRelated();
    void placeRelatives();
    void storageRelatives();
    void inNetwork();
    void networkOff();

private:
    Entry at(const char* path) const
    {
        return VFS::ptr()->entry(text(path));
    }
    Entry file(const char* relative) const
    {
        return VFS::ptr()->entry(m_scene.path(relative));
    }

    VfsScene m_scene;
};

void TestVfsParents::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    QVERIFY(m_scene.makeDir("home/a"));
    QVERIFY(m_scene.makeDir("home/a/b"));
    QVERIFY(m_scene.makeFile("home/a/b/file"));
    QVERIFY(m_scene.makeFile("work/file"));
    QVERIFY(QDir::setCurrent(m_scene.path("work")));
}

void TestVfsParents::ofPlaces()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(vfs->parent(vfs->homeEntry()), vfs->computerEntry());
    QCOMPARE(vfs->parent(vfs->homeEntry(), vfs->placesEntry()), vfs->placesEntry());
    QCOMPARE(vfs->parent(vfs->homeEntry(), vfs->computerEntry()), vfs->computerEntry());
    QCOMPARE(vfs->parent(vfs->fileSystemEntry()), vfs->computerEntry());
    QCOMPARE(vfs->parent(vfs->computerEntry()), vfs->rootEntry());
    QCOMPARE(vfs->parent(vfs->networkEntry()), vfs->rootEntry());
    QCOMPARE(vfs->parent(vfs->sambaNetworkEntry()), vfs->networkEntry());
    QVERIFY(vfs->hasParent(vfs->homeEntry()));
    for (const Entry& entry :
         {vfs->rootEntry(), vfs->placesEntry(), vfs->ftpNetworkEntry(), vfs->sftpNetworkEntry(),
          Entry()}) {
        QVERIFY(vfs->parent(entry).isNull());
        QVERIFY(!vfs->hasParent(entry));
    }
    // A place is no part of the disk, even where its directory lies below others.
    QVERIFY(vfs->parent(vfs->homeEntry(), vfs->networkEntry()).isNull());
    QVERIFY(vfs->parent(vfs->homeEntry(), Entry()).isNull());
    QVERIFY(vfs->parent(vfs->computerEntry(), vfs->placesEntry()).isNull());
}

void TestVfsParents::ofTopLevel()
{
    QCOMPARE(VFS::ptr()->parent(at("/usr")), VFS::ptr()->fileSystemEntry());
    QCOMPARE(VFS::ptr()->parent(at("/usr")).type(), int(TypeFileSystemRootPlace));
    // No matter whether it exists, and from any root.
    QCOMPARE(VFS::ptr()->parent(at("/nothing"), Entry()), VFS::ptr()->fileSystemEntry());
}

void TestVfsParents::ofTop()
{
    const Entry top = at("file:///");
    QCOMPARE(top.path(), text("/"));
    QVERIFY(VFS::ptr()->parent(top).isNull());
    QVERIFY(VFS::ptr()->parent(makeEntry(text("x"), text("noslash"), TypeFile)).isNull());
    QVERIFY(VFS::ptr()->parent(makeEntry(text("nobody/x"), QString(), TypeFile)).isNull());
}

void TestVfsParents::ofFiles()
{
    const Entry parent = VFS::ptr()->parent(file("work/file"));
    QCOMPARE(parent.path(), m_scene.path("work"));
    QCOMPARE(parent.localPath(), m_scene.path("work"));
    QCOMPARE(parent.type(), int(TypeDir));
    QCOMPARE(VFS::ptr()->parent(file("work/gone")).path(), m_scene.path("work"));
}

void TestVfsParents::belowPlaces()
{
    VFS* vfs = VFS::ptr();
    const Entry parent = vfs->parent(at("Home/a/b/file"));
    QCOMPARE(parent.path(), text("Home/a/b"));
    QCOMPARE(parent.localPath(), m_scene.home() + text("/a/b"));
    QCOMPARE(parent.type(), int(TypeDir));
    QCOMPARE(vfs->parent(at("Home/a")), vfs->homeEntry());
    QCOMPARE(vfs->parent(at("Home/a")).type(), int(TypeHomeDirPlace));
    // The other notation of the top of the disk comes back to its place.
    QCOMPARE(vfs->parent(at("/usr/../etc")), vfs->fileSystemEntry());
}

void TestVfsParents::throughComposite()
{
    VFSPlaceBase* tree = VFS::ptr()->placeBase();
    const Entry top = tree->createPlace(text("Top"), TypeFavouritePlace, m_scene.home());
    const Entry sub = tree->createPlace(text("Top/a"), TypeFavouritePlace, m_scene.path("home/a"));
    const Entry parent = VFS::ptr()->parent(at("Top/a/b"));
    QCOMPARE(parent.path(), text("Top/a"));
    QCOMPARE(parent.type(), int(TypeFavouritePlace));
    tree->destroyPlace(top);
    tree->destroyPlace(sub);
}

void TestVfsParents::ofGoneDirectory()
{
    QVERIFY(m_scene.makeDir("leaving"));
    QVERIFY(m_scene.makeFile("leaving/x"));
    const Entry entry = file("leaving/x");
    QVERIFY(VFS::ptr()->hasParent(entry));
    QVERIFY(QDir(m_scene.path("leaving")).removeRecursively());
    QVERIFY(VFS::ptr()->parent(entry).isNull());
    // A file in its place is no directory either.
    QVERIFY(m_scene.makeFile("leaving"));
    QVERIFY(VFS::ptr()->parent(entry).isNull());
}

void TestVfsParents::treeAnswersFirst()
{
    VFS* vfs = VFS::ptr();
    const Entry entry = file("work/file");
    QVERIFY(vfs->placeBase()->addEntryToPlace(entry, vfs->favouritesEntry()));
    QCOMPARE(vfs->parent(entry), vfs->favouritesEntry());
    // Seen from elsewhere it is a file on the disk.
    QCOMPARE(vfs->parent(entry, vfs->networkEntry()).path(), m_scene.path("work"));
    QVERIFY(vfs->placeBase()->removeEntryFromPlace(entry, vfs->favouritesEntry()));
    QCOMPARE(vfs->parent(entry).path(), m_scene.path("work"));
}

// The tail of the local path is cut out of the path. Where it does not occur, the last character
// goes, since the position -1 counts from the end. The length of the tail does not matter then.
void TestVfsParents::pathWithoutTail()
{
    const QString local = m_scene.path("work/file");
    const Entry parent = VFS::ptr()->parent(makeEntry(text("Something"), local, TypeFile));
    QCOMPARE(parent.path(), text("Somethin"));
    QCOMPARE(parent.localPath(), m_scene.path("work"));
    QCOMPARE(parent.type(), int(TypeDir));
    // What is left may be the path of a place, or nothing at all.
    QCOMPARE(
        VFS::ptr()->parent(makeEntry(text("Homer"), local, TypeFile)), VFS::ptr()->homeEntry());
    QVERIFY(VFS::ptr()->parent(makeEntry(text("x"), local, TypeFile)).isNull());
    QCOMPARE(
        VFS::ptr()->parent(makeEntry(text("x"), local, TypeFile)).localPath(),
        m_scene.path("work"));
    QVERIFY(VFS::ptr()->parent(makeEntry(QString(), local, TypeFile)).isNull());
}

// The last occurrence, which need not be the end.
void TestVfsParents::tailTwice()
{
    const QString local = m_scene.path("work/file");
    const auto parentPath = [&local](const char* path) {
        return VFS::ptr()->parent(makeEntry(text(path), local, TypeFile)).path();
    };
    QCOMPARE(parentPath("Q/file/file"), text("Q/file"));
    QCOMPARE(parentPath("Q/file/x"), text("Q/x"));
    QCOMPARE(parentPath("Q/fileName"), text("QName"));
    // A local path that ends in a slash has a tail of that slash alone.
    const QString slashed = m_scene.path("work/");
    const Entry parent = VFS::ptr()->parent(makeEntry(text("/q/r"), slashed, TypeDir));
    QCOMPARE(parent.path(), text("/qr"));
    QCOMPARE(parent.localPath(), m_scene.path("work"));
}

void TestVfsParents::linkByPathText()
{
    QVERIFY(m_scene.makeLink("work", "toWork"));
    const Entry parent = VFS::ptr()->parent(file("toWork/file"));
    QCOMPARE(parent.path(), m_scene.path("toWork"));
    QCOMPARE(parent.type(), int(TypeDirLink));
}

// The path is looked at and not the local path, so a link below a place passes for a directory;
// and a link of that name in the working directory makes it one.
void TestVfsParents::linkBelowPlaceIsNotSeen()
{
    QVERIFY(m_scene.makeLink("a", "home/toA"));
    const Entry entry = at("Home/toA/b");
    QCOMPARE(at("Home/toA").type(), int(TypeDirLink));
    QCOMPARE(VFS::ptr()->parent(entry).path(), text("Home/toA"));
    QCOMPARE(VFS::ptr()->parent(entry).type(), int(TypeDir));

    QVERIFY(m_scene.makeDir("work/Home"));
    QVERIFY(m_scene.makeLink("nowhere", "work/Home/a"));
    QCOMPARE(at("Home/a").type(), int(TypeDir));
    QCOMPARE(VFS::ptr()->parent(at("Home/a/b")).type(), int(TypeDirLink));
}

void TestVfsParents::ofUrls()
{
    for (const char* url : {"http://host/a/b", "ftp://host/a/b", "mailto:x/y"}) {
        QVERIFY(VFS::ptr()->parent(at(url)).isNull());
    }
}

void TestVfsParents::chains()
{
    VFS* vfs = VFS::ptr();
    const EntryList chain = vfs->pathEntryList(at("Home/a/b/file"));
    QCOMPARE(
        chain.paths(), (QStringList{
                           text("_"), text("Computer"), text("Home"), text("Home/a"),
                           text("Home/a/b"), text("Home/a/b/file")}));
    QCOMPARE(chain.last().type(), int(TypeFile));
    QCOMPARE(
        vfs->pathEntryList(at("/usr/lib")).paths(),
        (QStringList{
            text("_"), text("Computer"), text("File System"), text("/usr"), text("/usr/lib")}));
    QCOMPARE(vfs->pathEntryList(vfs->rootEntry()).paths(), QStringList{text("_")});
    QCOMPARE(vfs->pathEntryList(vfs->placesEntry()).paths(), QStringList{text("Places")});
}

void TestVfsParents::chainFromOtherRoot()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(
        vfs->pathEntryList(at("Home/a"), vfs->placesEntry()).paths(),
        (QStringList{text("Places"), text("Home"), text("Home/a")}));
    QCOMPARE(
        vfs->pathEntryList(at("/usr"), vfs->networkEntry()).paths(),
        (QStringList{text("File System"), text("/usr")}));
}

void TestVfsParents::chainOfNothing()
{
    QCOMPARE(VFS::ptr()->pathEntryList(Entry()).size(), 0);
    // The chain ends where a directory is gone.
    QCOMPARE(
        VFS::ptr()->pathEntryList(file("gone/x/y")).paths(), QStringList{m_scene.path("gone/x/y")});
    QCOMPARE(
        VFS::ptr()->pathEntryList(at("http://host/a")).paths(), QStringList{text("http://host/a")});
}

void TestVfsParents::fileSystemPathList()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(vfs->fileSystemEntryPathList(vfs->rootEntry()), QStringList{text("Computer")});
    QCOMPARE(vfs->fileSystemEntryPathList(vfs->placesEntry()), QStringList());
    QCOMPARE(vfs->fileSystemEntryPathList(vfs->computerEntry()), QStringList());
    QCOMPARE(vfs->fileSystemEntryPathList(Entry()), QStringList());
}

void TestVfsParents::history()
{
    VFS* vfs = VFS::ptr();
    const auto history = [vfs](const char* path) {
        return vfs->exploreParentPlacesHistory(text(path));
    };
    // The root itself is left out, and the place that is the path too.
    QCOMPARE(history("Home"), QStringList{text("Computer")});
    QCOMPARE(history("Home/x"), (QStringList{text("Computer"), text("Home")}));
    QCOMPARE(history("Computer"), QStringList());
    QCOMPARE(history("Samba"), QStringList{text("Network")});
    QCOMPARE(history("Places"), QStringList());
    // A local path.
    QCOMPARE(history("/usr/lib"), (QStringList{text("Computer"), text("File System")}));
    QCOMPARE(history("/"), (QStringList{text("Computer"), text("File System")}));
    QCOMPARE(history("Homework/x"), QStringList());
    QCOMPARE(history("nothing"), QStringList());
    QCOMPARE(history(""), QStringList());
    QCOMPARE(history("http://host/"), QStringList());
}

void TestVfsParents::historyFromOtherRoot()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(
        vfs->exploreParentPlacesHistory(text("Home/x"), vfs->placesEntry()),
        QStringList{text("Home")});
    QCOMPARE(
        vfs->exploreParentPlacesHistory(text("/usr"), vfs->placesEntry()),
        QStringList{text("File System")});
    QCOMPARE(vfs->exploreParentPlacesHistory(text("Home"), Entry()), QStringList());
    QCOMPARE(vfs->exploreParentPlacesHistory(text("Home"), vfs->networkEntry()), QStringList());
}

void TestVfsParents::linkTargets()
{
    QVERIFY(m_scene.makeDir("targets"));
    QVERIFY(m_scene.makeFile("targets/file"));
    QVERIFY(m_scene.makeLink("file", "targets/relative"));
    QVERIFY(m_scene.makeLink("/usr", "targets/absolute"));
    QVERIFY(m_scene.makeLink("gone", "targets/dangling"));
    QVERIFY(m_scene.makeLink("relative", "targets/twice"));
    VFS* vfs = VFS::ptr();
    QCOMPARE(
        vfs->symLinkTargetEntry(file("targets/relative")).path(), m_scene.path("targets/file"));
    QCOMPARE(vfs->symLinkTargetEntry(file("targets/absolute")).path(), text("/usr"));
    QCOMPARE(
        vfs->symLinkTargetEntry(file("targets/dangling")).path(), m_scene.path("targets/gone"));
    QCOMPARE(vfs->symLinkTargetEntry(file("targets/dangling")).type(), int(TypeNone));
    // One step only.
    QCOMPARE(
        vfs->symLinkTargetEntry(file("targets/twice")).path(), m_scene.path("targets/relative"));
    QCOMPARE(vfs->symLinkTargetEntry(file("targets/twice")).type(), int(TypeFileLink));
}

void TestVfsParents::linkTargetsBelowPlaces()
{
    QVERIFY(m_scene.makeLink("a/b/file", "home/inside"));
    QVERIFY(m_scene.makeLink(m_scene.bytes("work/file"), "home/outside"));
    QVERIFY(m_scene.makeLink(".", "home/itself"));
    VFS* vfs = VFS::ptr();
    QCOMPARE(vfs->symLinkTargetEntry(at("Home/inside")).path(), text("Home/a/b/file"));
    QCOMPARE(vfs->symLinkTargetEntry(at("Home/inside")).type(), int(TypeFile));
    QCOMPARE(vfs->symLinkTargetEntry(at("Home/outside")).path(), m_scene.path("work/file"));
    QCOMPARE(vfs->symLinkTargetEntry(at("Home/itself")), vfs->homeEntry());
    // The root place stands above the disk as well, so a link on it leads below the place too.
    QVERIFY(m_scene.makeLink(m_scene.bytes("home/a"), "work/toHome"));
    QCOMPARE(vfs->symLinkTargetEntry(file("work/toHome")).path(), text("Home/a"));
}

void TestVfsParents::targetOfWhatIsNoLink()
{
    VFS* vfs = VFS::ptr();
    // No target is an empty one below the entry: the entry itself, seen through its place.
    QCOMPARE(vfs->symLinkTargetEntry(file("work/file")).path(), m_scene.path("work/file"));
    QCOMPARE(vfs->symLinkTargetEntry(file("home/a")).path(), text("Home/a"));
    // Without a local path either, only the slash is left.
    QCOMPARE(vfs->symLinkTargetEntry(vfs->computerEntry()), vfs->fileSystemEntry());
    QCOMPARE(vfs->symLinkTargetEntry(Entry()), vfs->fileSystemEntry());
}

void TestVfsParents::placeRelated()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(vfs->placeRelatedEntry(file("home/a/b")).path(), text("Home/a/b"));
    QCOMPARE(vfs->placeRelatedEntry(file("home/a/b")).localPath(), m_scene.home() + text("/a/b"));
    // The deepest place, and the directory of a place is the place.
    QCOMPARE(vfs->placeRelatedEntry(file("home/Desktop/x")).path(), text("Desktop/x"));
    QCOMPARE(vfs->placeRelatedEntry(file("home")), vfs->homeEntry());
    QCOMPARE(vfs->placeRelatedEntry(at("Home/Desktop")), vfs->desktopEntry());
    // Never through File System.
    QCOMPARE(vfs->placeRelatedEntry(file("work/file")).path(), m_scene.path("work/file"));
    QCOMPARE(vfs->placeRelatedEntry(at("/usr/../etc")).path(), text("/etc"));
    // As they are.
    QCOMPARE(vfs->placeRelatedEntry(vfs->desktopEntry()), vfs->desktopEntry());
    const Entry lowerPlace = makeEntry(text("Lower"), m_scene.path("home/a"), TypeFavouritePlace);
    QCOMPARE(vfs->placeRelatedEntry(lowerPlace).path(), text("Lower"));
    QCOMPARE(vfs->placeRelatedEntry(at("http://host/")).path(), text("http://host/"));
    QVERIFY(vfs->placeRelatedEntry(Entry()).isNull());
}

void TestVfsParents::placeRelatives()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(vfs->isPlaceRelativeEntry(vfs->homeEntry()));
    QVERIFY(vfs->isPlaceRelativeEntry(at("Home/a/b/file")));
    QVERIFY(vfs->isPlaceRelativeEntry(vfs->networkEntry()));
    QVERIFY(vfs->isPlaceRelativeEntry(vfs->rootEntry()));
    QVERIFY(vfs->isPlaceRelativeEntry(vfs->placesEntry()));
    // File System and Computer do not count, but the root above them does.
    QVERIFY(vfs->isPlaceRelativeEntry(vfs->computerEntry()));
    QVERIFY(vfs->isPlaceRelativeEntry(vfs->fileSystemEntry()));
    QVERIFY(vfs->isPlaceRelativeEntry(at("/usr/lib")));
    QVERIFY(vfs->isPlaceRelativeEntry(file("work/file")));
    // What has no way up to the root.
    QVERIFY(!vfs->isPlaceRelativeEntry(Entry()));
    QVERIFY(!vfs->isPlaceRelativeEntry(file("gone/x")));
    QVERIFY(!vfs->isPlaceRelativeEntry(at("http://host/")));
    QVERIFY(!vfs->isPlaceRelativeEntry(makeEntry(text("Loose"), QString(), TypeComputerPlace)));
}

void TestVfsParents::storageRelatives()
{
    VFS* vfs = VFS::ptr();
    VFSPlaceBase* tree = vfs->placeBase();
    const Entry disk = tree->createPlace(text("Disk"), TypeUsbDiskStoragePlace, QString());
    const Entry part = tree->createPlace(text("Part"), TypeFavouritePlace, m_scene.path("work"));
    QVERIFY(tree->addEntryToPlace(disk, vfs->favouritesEntry()));
    QVERIFY(tree->addEntryToPlace(part, disk));
    QVERIFY(vfs->isStoragePlaceRelativeEntry(disk));
    QVERIFY(vfs->isStoragePlaceRelativeEntry(part));
    QVERIFY(vfs->isStoragePlaceRelativeEntry(at("Part/file")));
    QVERIFY(vfs->isStoragePlaceRelativeEntry(makeEntry(text("x"), QString(), 3999)));
    for (const Entry& entry :
         {Entry(), vfs->homeEntry(), vfs->favouritesEntry(), vfs->storageDevicesEntry(),
          file("work/file"), makeEntry(text("x"), QString(), TypeSambaSharePlace)}) {
        QVERIFY(!vfs->isStoragePlaceRelativeEntry(entry));
    }
    EntryList entries({vfs->homeEntry(), at("/usr")});
    QVERIFY(!vfs->hasStoragePlaceRelativeEntries(entries));
    QVERIFY(!vfs->hasStoragePlaceRelativeEntries(EntryList()));
    entries.append(part);
    QVERIFY(vfs->hasStoragePlaceRelativeEntries(entries));
    QVERIFY(tree->destroyPlace(disk));
    QVERIFY(!tree->destroyPlace(part));
}

void TestVfsParents::inNetwork()
{
    VFS* vfs = VFS::ptr();
    // Plain text, with nothing asked of the tree and no slash behind the word.
    for (const char* path :
         {"Network", "Network/x", "Networking", "Samba", "Samba/WG", "Sambal", "FTP", "FTP/host/x",
          "FTPS", "SFTP", "SFTP/u@host", "SFTPx"}) {
        QVERIFY2(vfs->isEntryInNetwork(makeEntry(text(path), QString(), TypeNone)), path);
    }
    for (const char* path :
         {"", "Home", "/Network", "network", "Net", "ftp://host", "samba", "Computer/Network",
          "/usr"}) {
        QVERIFY2(!vfs->isEntryInNetwork(makeEntry(text(path), QString(), TypeDir)), path);
    }
    EntryList entries({vfs->homeEntry()});
    QVERIFY(!vfs->hasNetworkRelativeEntries(EntryList()));
    QVERIFY(!vfs->hasNetworkRelativeEntries(entries));
    entries.append(vfs->sambaNetworkEntry());
    QVERIFY(vfs->hasNetworkRelativeEntries(entries));
}

void TestVfsParents::networkOff()
{
    QVERIFY(rerunPasses("network-off"));
}

/// In a process whose user has no network places.
class TestVfsParentsNetworkOff : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void everythingIsInNetwork()
    {
        QVERIFY(QDir().mkpath(m_scene.path("home/.config/veylabs")));
        QFile settings(m_scene.path("home/.config/veylabs/vey-fm-vfs.conf"));
        QVERIFY(settings.open(QIODevice::WriteOnly));
        QVERIFY(settings.write("[Network]\nEnabled=false\n") > 0);
        settings.close();
        VFS::initialize();
        VFS* vfs = VFS::ptr();
        QVERIFY(vfs->networkEntry().isNull());
        QVERIFY(vfs->sambaNetworkEntry().isNull());
        // The empty words are in front of every path.
        for (const Entry& entry :
             {vfs->homeEntry(), vfs->entry(text("/usr")), vfs->entry(text("http://host/")),
              vfs->rootEntry()}) {
            QVERIFY(vfs->isEntryInNetwork(entry));
            QVERIFY(vfs->hasNetworkRelativeEntries(entry));
            // There are no bookmarks to go by, though.
            QCOMPARE(vfs->getUrlForEntry(entry), QString());
        }
        QVERIFY(vfs->entry(text("Samba")).path() != text("Samba"));
        QVERIFY(vfs->smbShareEntry(text("s"), text("h"), text("w")).isNull());
        // These cut paths by the empty words too.
        QCOMPARE(vfs->createEntryForUrl(text("ftp://u@srv/"), text("/mnt")).path(), text("/u@srv"));
        QCOMPARE(vfs->smbWorkgroup(vfs->entry(text("/usr/lib"))), text("lib"));
        QCOMPARE(
            vfs->childs(vfs->rootEntry()).paths(),
            (QStringList{text("Favourites"), text("Computer")}));
        QCOMPARE(vfs->childs(vfs->placesEntry()).size(), 6);
    }

private:
    VfsScene m_scene;
};

int main(int argc, char** argv)
{
    const QCoreApplication app(argc, argv);
    if (isRerun(argc, argv, "network-off")) {
        return runTests<TestVfsParentsNetworkOff>(argv);
    }
    TestVfsParents tests;
    return QTest::qExec(&tests, argc, argv);
}

#include "tst_vfs_parents.moc"
