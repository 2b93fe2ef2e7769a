// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/rerun.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QCoreApplication>
#include <QMap>
#include <QTest>

#include <sys/socket.h>
#include <sys/un.h>

using namespace VeyFM;

namespace {

QMap<QString, int> kindsByName(const EntryList& entries)
{
    QMap<QString, int> kinds;
    for (const Entry& entry : entries) {
        kinds.insert(entry.lastPathSection(), entry.type());
    }
    return kinds;
}

bool makeSocket(const QByteArray& path)
{
    const int fd = ::socket(AF_UNIX, SOCK_STREAM, 0);
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    qstrncpy(address.sun_path, path.constData(), sizeof address.sun_path);
    const bool ok = ::bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
    ::close(fd);
    return ok;
}

} // namespace

class TestVfsChilds : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void ofVirtualPlaces();
    void ofHome();
    void ofFileSystem();
    void placesFirst();
    void ofWhatIsNoDirectory();
    void ofUnmounted();
    void ofUnknownPlace();
    void ofArchive();
    void ofRelativeLocalPath();
    void kinds();
    void links();
    void skippedLinks();
    void extraChildren();
    void linksBelowClosedDirectory();
    void names();
    void invalidNames();
    void invalidLinks();
    void byteOrderMarks();
    void longNames();
    void closedDirectory();
    void goneDirectory();
    void pathsBelowOtherPath();
    void trailingSlash();
    void sharedText();
    void everyName();
    void plainEncoding();

private:
    Entry dir(const char* relative) const
    {
        return VFS::ptr()->entry(m_scene.path(relative));
    }

    VfsScene m_scene;
};

void TestVfsChilds::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
}

void TestVfsChilds::ofVirtualPlaces()
{
    VFS* vfs = VFS::ptr();
    const EntryList children = vfs->childs(vfs->computerEntry());
    QCOMPARE(
        children.paths(), (QStringList{
                              text("Home"), text("Desktop"), text("Trash"), text("Storage devices"),
                              text("File System")}));
    QCOMPARE(
        vfs->childs(vfs->rootEntry()).paths(),
        (QStringList{text("Favourites"), text("Computer"), text("Network")}));
}

void TestVfsChilds::ofHome()
{
    QVERIFY(m_scene.makeFile("home/file"));
    QVERIFY(m_scene.makeDir("home/dir"));
    const EntryList children = VFS::ptr()->childs(VFS::ptr()->homeEntry());
    const QMap<QString, int> expected{
        {text("file"), TypeFile},
        {text("dir"), TypeDir},
        {text("Desktop"), TypeDir},
        {text("Documents"), TypeDir},
        {text(".config"), TypeDir}};
    QCOMPARE(kindsByName(children), expected);
    for (const Entry& child : children) {
        QCOMPARE(child.path(), text("Home/") + child.fileName());
        QCOMPARE(child.localPath(), m_scene.home() + text("/") + child.fileName());
    }
}

void TestVfsChilds::ofFileSystem()
{
    VFS* vfs = VFS::ptr();
    const EntryList children = vfs->childs(vfs->fileSystemEntry());
    QVERIFY(children.paths().contains(text("/usr")));
    for (const Entry& child : children) {
        QCOMPARE(child.path(), text("/") + child.fileName());
        QCOMPARE(child.localPath(), child.path());
    }
}

// In the order of the tree, then the disk, and nothing is taken for the same.
void TestVfsChilds::placesFirst()
{
    VFSPlaceBase* tree = VFS::ptr()->placeBase();
    QVERIFY(m_scene.makeDir("bookmark"));
    QVERIFY(m_scene.makeFile("bookmark/twin"));
    const Entry place =
        tree->createPlace(text("Mark"), TypeFavouritePlace, m_scene.path("bookmark"));
    const Entry z = tree->createPlace(text("Mark/z"), TypeFavouritePlace, m_scene.path("work"));
    const Entry a = tree->createPlace(text("Mark/twin"), TypeFavouritePlace, m_scene.path("work"));
    QVERIFY(tree->addEntryToPlace(z, place));
    QVERIFY(tree->addEntryToPlace(a, place));
    const EntryList children = VFS::ptr()->childs(place);
    QCOMPARE(children.paths(), (QStringList{text("Mark/z"), text("Mark/twin"), text("Mark/twin")}));
    QCOMPARE(children[1].type(), int(TypeFavouritePlace));
    QCOMPARE(children[2].type(), int(TypeFile));
}

void TestVfsChilds::ofWhatIsNoDirectory()
{
    VFS* vfs = VFS::ptr();
    QVERIFY(m_scene.makeFile("plain"));
    QCOMPARE(vfs->childs(dir("plain")).size(), 0);
    QCOMPARE(vfs->childs(Entry()).size(), 0);
    QCOMPARE(vfs->childs(vfs->entry(text("http://host/"))).size(), 0);
    // By its type, whatever the disk says.
    QCOMPARE(vfs->childs(makeEntry(text("/usr"), text("/usr"), TypeFile)).size(), 0);
    QCOMPARE(vfs->childs(makeEntry(text("/usr"), text("/usr"), TypeNone)).size(), 0);
    QVERIFY(vfs->childs(makeEntry(text("/usr"), text("/usr"), TypeDirLink)).size() > 0);
}

void TestVfsChilds::ofUnmounted()
{
    VFSPlaceBase* tree = VFS::ptr()->placeBase();
    const Entry disk = tree->createPlace(text("Disk"), TypeUsbDiskStoragePlace, m_scene.home());
    const Entry part = tree->createPlace(text("Disk/part"), TypeUsbDiskStoragePlace, QString());
    QVERIFY(tree->addEntryToPlace(part, disk));
    QCOMPARE(VFS::ptr()->childs(disk).paths(), QStringList{text("Disk/part")});

    const Entry share = tree->createPlace(text("Share"), TypeSambaSharePlace, QString());
    QCOMPARE(VFS::ptr()->childs(share).size(), 0);
    QVERIFY(m_scene.makeDir("share"));
    QVERIFY(m_scene.makeFile("share/x"));
    tree->setPlaceLocalPath(share, m_scene.path("share"));
    QCOMPARE(VFS::ptr()->childs(share).paths(), QStringList{text("Share/x")});
}

// The tree is asked about places that are in it, the disk about all.
void TestVfsChilds::ofUnknownPlace()
{
    QVERIFY(m_scene.makeDir("unknown"));
    QVERIFY(m_scene.makeFile("unknown/x"));
    const Entry unknown = makeEntry(text("Unknown"), m_scene.path("unknown"), TypeFavouritePlace);
    QCOMPARE(VFS::ptr()->childs(unknown).paths(), QStringList{text("Unknown/x")});
    // What is no place has no place children, even under the path of a place.
    const Entry posing = makeEntry(text("Computer"), m_scene.path("unknown"), TypeDir);
    QCOMPARE(VFS::ptr()->childs(posing).paths(), QStringList{text("Computer/x")});
}

void TestVfsChilds::ofArchive()
{
    QVERIFY(m_scene.makeDir("archive"));
    QVERIFY(m_scene.makeFile("archive/x"));
    const Entry archive =
        makeEntry(text("/a.zip"), m_scene.path("archive"), TypeArchiveFileMountPoint);
    const EntryList children = VFS::ptr()->childs(archive);
    QCOMPARE(children.paths(), QStringList{text("/a.zip/x")});
    QCOMPARE(children[0].localPath(), m_scene.path("archive/x"));
}

void TestVfsChilds::ofRelativeLocalPath()
{
    QVERIFY(m_scene.makeDir("relative"));
    QVERIFY(m_scene.makeFile("relative/x"));
    QVERIFY(QDir::setCurrent(m_scene.root()));
    const EntryList children = VFS::ptr()->childs(makeEntry(text("/p"), text("relative"), TypeDir));
    QCOMPARE(children.paths(), QStringList{text("/p/x")});
    QCOMPARE(children[0].localPath(), text("relative/x"));
}

void TestVfsChilds::kinds()
{
    QVERIFY(m_scene.makeDir("kinds"));
    QVERIFY(m_scene.makeFile("kinds/file"));
    QVERIFY(m_scene.makeDir("kinds/dir"));
    QVERIFY(m_scene.makeFifo("kinds/fifo"));
    const QByteArray socketDir = m_scene.bytes("kinds");
    if (socketDir.size() < 90) {
        QVERIFY(makeSocket(socketDir + "/socket"));
    } else {
        QVERIFY(m_scene.makeFile("kinds/socket"));
    }
    QVERIFY(m_scene.makeFile("kinds/..."));
    QVERIFY(m_scene.makeFile("kinds/.hidden"));
    QVERIFY(m_scene.makeFile("kinds/..x"));
    // Whatever is neither a directory nor a link is a file here, unlike in VFS::entry().
    const QMap<QString, int> expected{{text("file"), TypeFile}, {text("dir"), TypeDir},
                                      {text("fifo"), TypeFile}, {text("socket"), TypeFile},
                                      {text("..."), TypeFile},  {text(".hidden"), TypeFile},
                                      {text("..x"), TypeFile}};
    QCOMPARE(kindsByName(VFS::ptr()->childs(dir("kinds"))), expected);

    const Entry dev = VFS::ptr()->entry(text("/dev"));
    const QMap<QString, int> devices = kindsByName(VFS::ptr()->childs(dev));
    QCOMPARE(devices.value(text("null")), int(TypeFile));
}

void TestVfsChilds::links()
{
    QVERIFY(m_scene.makeDir("links"));
    QVERIFY(m_scene.makeDir("links/dir"));
    QVERIFY(m_scene.makeFile("links/file"));
    QVERIFY(m_scene.makeFifo("links/fifo"));
    QVERIFY(m_scene.makeLink("dir", "links/toDir"));
    QVERIFY(m_scene.makeLink("toDir", "links/toLink"));
    QVERIFY(m_scene.makeLink(m_scene.bytes("links/dir"), "links/absolute"));
    QVERIFY(m_scene.makeLink("..", "links/up"));
    QVERIFY(m_scene.makeLink("file", "links/toFile"));
    QVERIFY(m_scene.makeLink("fifo", "links/toFifo"));
    QVERIFY(m_scene.makeLink("gone", "links/dangling"));
    QVERIFY(m_scene.makeLink("file/x", "links/notThere"));
    QVERIFY(m_scene.makeLink("self", "links/self"));
    QVERIFY(m_scene.makeLink("cycle2", "links/cycle1"));
    QVERIFY(m_scene.makeLink("cycle1", "links/cycle2"));
    QVERIFY(m_scene.makeLink("cycle1", "links/intoCycle"));
    QVERIFY(m_scene.makeLink("self/x", "links/belowSelf"));
    // The kernel gives up behind forty links, a listing does not.
    QVERIFY(m_scene.makeChain("dir", "links/chainD", 60));
    QVERIFY(m_scene.makeChain("file", "links/chainF", 60));
    QVERIFY(m_scene.makeChain("self", "links/chainC", 60));

    const QMap<QString, int> kinds = kindsByName(VFS::ptr()->childs(dir("links")));
    QCOMPARE(kinds.size(), 13 + 3 + 180);
    for (const char* name :
         {"toDir", "toLink", "absolute", "up", "chainD1", "chainD20", "chainD21", "chainD22",
          "chainD60"}) {
        QVERIFY2(kinds.value(text(name)) == TypeDirLink, name);
    }
    for (const char* name :
         {"toFile", "toFifo", "dangling", "notThere", "self", "cycle1", "cycle2", "intoCycle",
          "belowSelf", "chainF1", "chainF60", "chainC1", "chainC60"}) {
        QVERIFY2(kinds.value(text(name)) == TypeFileLink, name);
    }
}

void TestVfsChilds::skippedLinks()
{
    QVERIFY(m_scene.makeDir("skip"));
    QVERIFY(m_scene.makeFile("skip/file"));
    QVERIFY(m_scene.makeLink("file", "skip/toFile"));
    QVERIFY(m_scene.makeLink("..", "skip/toDir"));
    QVERIFY(m_scene.makeLink("self", "skip/self"));
    QVERIFY(m_scene.makeLink("x", "skip/bad\xff"));
    VFS* vfs = VFS::ptr();
    QCOMPARE(vfs->childs(dir("skip"), VFS::SkipSymLinks).paths(), {m_scene.path("skip/file")});
    QCOMPARE(vfs->childs(dir("skip")).size(), 5);
    // A link as the entry itself is no matter of the filter.
    QVERIFY(m_scene.makeLink("skip", "toSkip"));
    QCOMPARE(vfs->childs(dir("toSkip"), VFS::SkipSymLinks).paths(), {m_scene.path("toSkip/file")});
}

void TestVfsChilds::extraChildren()
{
    VFS* vfs = VFS::ptr();
    QCOMPARE(int(VFS::SkipSymLinks), 1);
    QCOMPARE(int(VFS::WithExtraChildren), 2);
    QVERIFY(m_scene.makeDir("extra"));
    QVERIFY(m_scene.makeFile("extra/x"));
    QVERIFY(m_scene.makeLink("x", "extra/l"));
    // There never are any.
    QCOMPARE(vfs->childs(dir("extra"), VFS::WithExtraChildren), vfs->childs(dir("extra")));
    QCOMPARE(
        vfs->childs(dir("extra"), VFS::WithExtraChildren | VFS::SkipSymLinks).paths(),
        {m_scene.path("extra/x")});
    QCOMPARE(
        vfs->childs(vfs->computerEntry(), VFS::WithExtraChildren),
        vfs->childs(vfs->computerEntry()));
}

void TestVfsChilds::linksBelowClosedDirectory()
{
    QVERIFY(m_scene.makeDir("behind"));
    QVERIFY(m_scene.makeDir("behind/closed"));
    QVERIFY(m_scene.makeDir("behind/closed/dir"));
    QVERIFY(m_scene.makeLink("closed/dir", "behind/link"));
    QVERIFY(m_scene.makeLink("closed", "behind/toClosed"));
    QVERIFY(m_scene.closeDir("behind/closed"));
    const Entry behind = dir("behind");
    const Unprivileged unprivileged;
    QVERIFY(unprivileged.isDropped());
    const QMap<QString, int> expected{
        {text("closed"), TypeDir}, {text("link"), TypeFileLink}, {text("toClosed"), TypeDirLink}};
    QCOMPARE(kindsByName(VFS::ptr()->childs(behind)), expected);
}

void TestVfsChilds::names()
{
    QVERIFY(m_scene.makeDir("names"));
    const QList<QByteArray> all{
        "a b",
        "a:b",
        "gr\xc3\xbc\xc3\x9f",
        "\xf0\x9f\x90\xa7",
        "back\\slash",
        "new\nline",
        "\x01\x7f",
        "%41",
        "#x?y",
        "~",
        "-rf",
        "e\xcc\x81",
        "\xef\xbf\xbd",
        "a\xef\xbb\xbf"};
    for (const QByteArray& name : all) {
        QVERIFY(m_scene.makeFile("names/" + name));
    }
    const EntryList children = VFS::ptr()->childs(dir("names"));
    QCOMPARE(children.size(), all.size());
    for (const Entry& child : children) {
        QVERIFY(all.contains(child.fileName().toUtf8()));
        QCOMPARE(child.path(), m_scene.path("names/") + child.fileName());
        QCOMPARE(child.localPath(), child.path());
        QVERIFY(child.exists());
    }
    // A colon in a name makes no URL of a child.
    QCOMPARE(VFS::ptr()->child(dir("names"), text("a:b")).type(), int(TypeFile));
}

namespace {

const QList<QByteArray> invalid{
    "\xff",
    "bad\xff",
    "\xc3",
    "x\xc3y",
    "\xed\xa0\x80",
    "\xc0\xaf",
    "\xf8\x88\x80\x80\x80",
    "\xe2\x82",
    "\x80\x80",
    "\xf4\x90\x80\x80"};

} // namespace

void TestVfsChilds::invalidNames()
{
    QVERIFY(m_scene.makeDir("invalid"));
    QVERIFY(m_scene.makeFile("invalid/good"));
    for (const QByteArray& name : invalid) {
        QVERIFY(m_scene.makeFile("invalid/" + name));
        QVERIFY(m_scene.makeDir("invalid/d" + name));
        QVERIFY(m_scene.makeFifo("invalid/p" + name));
    }
    QCOMPARE(VFS::ptr()->childs(dir("invalid")).paths(), {m_scene.path("invalid/good")});

    QByteArrayList leftOut = {"of before"};
    const EntryList children = VFS::ptr()->childsAndLeftOut(dir("invalid"), {}, &leftOut);
    QCOMPARE(children.paths(), {m_scene.path("invalid/good")});
    QByteArrayList expected;
    for (const QByteArray& name : invalid) {
        expected << name << 'd' + name << 'p' + name;
    }
    std::sort(leftOut.begin(), leftOut.end());
    std::sort(expected.begin(), expected.end());
    QCOMPARE(leftOut, expected);
}

// A link stays, under what its name reads as, and so leads nowhere.
void TestVfsChilds::invalidLinks()
{
    QVERIFY(m_scene.makeDir("invalidLinks"));
    for (const QByteArray& name : invalid) {
        QVERIFY(m_scene.makeLink("..", "invalidLinks/" + name));
    }
    const EntryList children = VFS::ptr()->childs(dir("invalidLinks"));
    QCOMPARE(children.size(), invalid.size());
    for (const Entry& child : children) {
        QCOMPARE(child.type(), int(TypeFileLink));
        QVERIFY(child.path().contains(QChar(QChar::ReplacementCharacter)));
        QCOMPARE(child.localPath(), child.path());
        QVERIFY(!child.exists());
    }
    QByteArrayList leftOut;
    QCOMPARE(
        VFS::ptr()->childsAndLeftOut(dir("invalidLinks"), VFS::SkipSymLinks, &leftOut).size(), 0);
    QCOMPARE(leftOut, QByteArrayList());

    // Where something else goes by what the name reads as, that is looked at.
    QVERIFY(m_scene.makeDir("aliased"));
    QVERIFY(m_scene.makeLink("gone", "aliased/\xff"));
    QVERIFY(m_scene.makeLink("..", "aliased/\xef\xbf\xbd"));
    for (const Entry& child : VFS::ptr()->childs(dir("aliased"))) {
        QCOMPARE(child.path(), m_scene.path("aliased/") + QChar(QChar::ReplacementCharacter));
        QCOMPARE(child.type(), int(TypeDirLink));
    }
    QCOMPARE(VFS::ptr()->childs(dir("aliased")).size(), 2);
}

// At the head of a text the decoder takes these three bytes for a mark and drops them. Within a
// path, which is where a name stands, they are a character.
void TestVfsChilds::byteOrderMarks()
{
    QVERIFY(m_scene.makeDir("marks"));
    QVERIFY(m_scene.makeFile("marks/\xef\xbb\xbfile"));
    QVERIFY(m_scene.makeDir("marks/\xef\xbb\xbf"
                            "dir"));
    QVERIFY(m_scene.makeLink(
        "..", "marks/\xef\xbb\xbf"
              "link"));
    EntryList children = VFS::ptr()->childs(dir("marks"));
    children.sort(true);
    QCOMPARE(children.size(), 3);
    const QString names[] = {
        QStringLiteral("\ufeffdir"), QStringLiteral("\ufeffile"), QStringLiteral("\ufefflink")};
    const int types[] = {TypeDir, TypeFile, TypeDirLink};
    for (int i = 0; i < 3; ++i) {
        QCOMPARE(children[i].path(), m_scene.path("marks/") + names[i]);
        QCOMPARE(children[i].localPath(), children[i].path());
        QCOMPARE(children[i].type(), types[i]);
        QVERIFY(children[i].isExists());
    }
}

void TestVfsChilds::longNames()
{
    QVERIFY(m_scene.makeDir("long"));
    int valid = 0;
    for (int value = 1; value < 0x100; ++value) {
        if (value == '/') {
            continue;
        }
        QVERIFY(m_scene.makeFile("long/" + QByteArray(255, char(value))));
        valid += value < 0x80 ? 1 : 0;
    }
    // Two bytes a character, and one to fill up.
    QVERIFY(m_scene.makeFile("long/" + QByteArray("\xc3\xa9").repeated(127) + "x"));
    const EntryList children = VFS::ptr()->childs(dir("long"));
    QCOMPARE(children.size(), valid + 1);
    for (const Entry& child : children) {
        QCOMPARE(child.fileName().toUtf8().size(), 255);
        QVERIFY(child.exists());
    }
    // Below a place, where both texts are made.
    VFSPlaceBase* tree = VFS::ptr()->placeBase();
    const Entry place = tree->createPlace(text("Long"), TypeFavouritePlace, m_scene.path("long"));
    const EntryList below = VFS::ptr()->childs(place);
    QCOMPARE(below.size(), valid + 1);
    for (int i = 0; i < below.size(); ++i) {
        QCOMPARE(below[i].localPath(), children[i].localPath());
        QCOMPARE(below[i].path(), text("Long/") + children[i].fileName());
    }
}

void TestVfsChilds::closedDirectory()
{
    VFSPlaceBase* tree = VFS::ptr()->placeBase();
    QVERIFY(m_scene.makeDir("closed"));
    QVERIFY(m_scene.makeFile("closed/x"));
    const Entry place =
        tree->createPlace(text("Closed"), TypeFavouritePlace, m_scene.path("closed"));
    QVERIFY(tree->addEntryToPlace(VFS::ptr()->homeEntry(), place));
    QCOMPARE(VFS::ptr()->childs(place).size(), 2);
    QVERIFY(m_scene.closeDir("closed", 0311));
    const Unprivileged unprivileged;
    QVERIFY(unprivileged.isDropped());
    QCOMPARE(VFS::ptr()->childs(place).paths(), {text("Home")});
    QCOMPARE(VFS::ptr()->childs(dir("closed")).size(), 0);
    QCOMPARE(VFS::ptr()->childs(dir("closed"), VFS::WithExtraChildren).size(), 0);
}

void TestVfsChilds::goneDirectory()
{
    const Entry gone = makeEntry(m_scene.path("gone"), m_scene.path("gone"), TypeDir);
    QCOMPARE(VFS::ptr()->childs(gone).size(), 0);
    // A file that passes for a directory.
    QVERIFY(m_scene.makeFile("poser"));
    const Entry poser = makeEntry(m_scene.path("poser"), m_scene.path("poser"), TypeDir);
    QCOMPARE(VFS::ptr()->childs(poser).size(), 0);
}

// The path of a child is made from the path, its local path from the local path.
void TestVfsChilds::pathsBelowOtherPath()
{
    QVERIFY(m_scene.makeDir("two"));
    QVERIFY(m_scene.makeFile("two/\xc3\xa9"));
    const Entry entry = makeEntry(text("Home/.//two/./"), m_scene.path("two"), TypeDir);
    const EntryList children = VFS::ptr()->childs(entry);
    QCOMPARE(children.size(), 1);
    QCOMPARE(children[0].path(), text("Home/two/\xc3\xa9"));
    QCOMPARE(children[0].localPath(), m_scene.path("two/\xc3\xa9"));
    // The path of the File System place turns back into a slash, also for other directories.
    const Entry posing = makeEntry(text("File System"), m_scene.path("two"), TypeDir);
    QCOMPARE(VFS::ptr()->childs(posing).paths(), {text("/\xc3\xa9")});
}

void TestVfsChilds::trailingSlash()
{
    QVERIFY(m_scene.makeDir("slash"));
    QVERIFY(m_scene.makeFile("slash/x"));
    const QString with = m_scene.path("slash/");
    const EntryList children = VFS::ptr()->childs(makeEntry(with, with, TypeDir));
    QCOMPARE(children.size(), 1);
    QCOMPARE(children[0].path(), with + text("x"));
    QCOMPARE(children[0].localPath(), with + text("x"));
    // A local path is not cleaned, but for the one slash at its end.
    const QString doubled = m_scene.path("/./slash//");
    QCOMPARE(
        VFS::ptr()->childs(makeEntry(with, doubled, TypeDir))[0].localPath(), doubled + text("x"));
}

void TestVfsChilds::sharedText()
{
    QVERIFY(m_scene.makeDir("shared"));
    QVERIFY(m_scene.makeFile("shared/ascii"));
    QVERIFY(m_scene.makeFile("shared/\xc3\xa9"));
    for (const Entry& child : VFS::ptr()->childs(dir("shared"))) {
        // One text in memory where both are equal.
        const QString path = child.path();
        const QString local = child.localPath();
        QCOMPARE(
            static_cast<const void*>(path.constData()),
            static_cast<const void*>(local.constData()));
    }
}

void TestVfsChilds::everyName()
{
    QVERIFY(m_scene.makeDir("many"));
    QStringList expected;
    for (int i = 0; i < 3000; ++i) {
        const QByteArray name = "entry" + QByteArray::number(i);
        QVERIFY(m_scene.makeFile("many/" + name));
        expected.append(m_scene.path("many/") + QString::fromLatin1(name));
    }
    QStringList paths = VFS::ptr()->childs(dir("many")).paths();
    paths.sort();
    expected.sort();
    QCOMPARE(paths, expected);
}

void TestVfsChilds::plainEncoding()
{
    qputenv("LC_ALL", "C");
    const bool passed = rerunPasses("plain-encoding");
    qputenv("LC_ALL", "C.UTF-8");
    QVERIFY(passed);
}

/// In a locale without any encoding.
class TestVfsChildsPlain : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void names()
    {
        QVERIFY(m_scene.makeDir("names"));
        QVERIFY(m_scene.makeFile("names/plain"));
        QVERIFY(m_scene.makeFile("names/\xc3\xa9"));
        QVERIFY(m_scene.makeLink("..", "names/plainLink"));
        QVERIFY(m_scene.makeLink("..", "names/\xc3\xa9Link"));
        const QByteArray name("\xc3\xa9");
        const bool isTold = QString::fromLocal8Bit(name).toLocal8Bit() == name;
        const EntryList children = VFS::ptr()->childs(VFS::ptr()->entry(m_scene.path("names")));
        QCOMPARE(children.size(), isTold ? 4 : 3);
        QVERIFY(children.paths().contains(m_scene.path("names/plain")));
    }

private:
    VfsScene m_scene;
};

int main(int argc, char** argv)
{
    const QCoreApplication app(argc, argv);
    if (isRerun(argc, argv, "plain-encoding")) {
        return runTests<TestVfsChildsPlain>(argv);
    }
    TestVfsChilds tests;
    return QTest::qExec(&tests, argc, argv);
}

#include "tst_vfs_childs.moc"
