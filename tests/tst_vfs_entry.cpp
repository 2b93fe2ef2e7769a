// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/pathoracle.h"
#include "support/rerun.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QCoreApplication>
#include <QTest>
#include <QTranslator>

using namespace VeyFM;
using PathOracle::Answer;

namespace {

Answer answerFor(const QString& path)
{
    return Answer(VFS::ptr()->entry(path));
}
Answer answerFor(const char* path)
{
    return answerFor(text(path));
}

} // namespace

class TestVfsEntry : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void nothing();
    void workingDirectory();
    void goneWorkingDirectory();
    void topOfTheDisk();
    void placeBeatsFile();
    void placesInPaths();
    void belowPlaces();
    void directoryCalledLikeAPlace();
    void samba();
    void upFromTopLevel();
    void kinds_data();
    void kinds();
    void kindNotToBeSeen();
    void namesOfAnyBytes();
    void colons();
    void fileUrls();
    void ownUrls_data();
    void ownUrls();
    void ownUrlWithSlash();
    void carriedUrls_data();
    void carriedUrls();
    void refusedUrls_data();
    void refusedUrls();
    void translated();

private:
    VfsScene m_scene;
};

void TestVfsEntry::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    QVERIFY(m_scene.makeDir("work/sub"));
    QVERIFY(m_scene.makeFile("work/file"));
    QVERIFY(m_scene.makeDir("home/dir"));
    QVERIFY(m_scene.makeFile("home/dir/x"));
}

void TestVfsEntry::init()
{
    QVERIFY(QDir::setCurrent(m_scene.path("work")));
}

void TestVfsEntry::nothing()
{
    QVERIFY(VFS::ptr()->entry(QString()).isNull());
    QVERIFY(VFS::ptr()->entry(text("")).isNull());
    const Entry null = VFS::ptr()->entry(QString());
    QCOMPARE(null.type(), 0);
    QVERIFY(null.path().isNull());
}

void TestVfsEntry::workingDirectory()
{
    const QString work = m_scene.path("work");
    QCOMPARE(answerFor("."), Answer(work, work, TypeDir));
    QCOMPARE(answerFor("./"), Answer(work, work, TypeDir));
    QCOMPARE(answerFor("././"), Answer(work, work, TypeDir));
    QCOMPARE(answerFor("./file"), Answer(work + text("/file"), work + text("/file"), TypeFile));
    QCOMPARE(answerFor("file"), Answer(work + text("/file"), work + text("/file"), TypeFile));
    QCOMPARE(answerFor("sub/"), Answer(work + text("/sub"), work + text("/sub"), TypeDir));
    QCOMPARE(answerFor("gone/x"), Answer(work + text("/gone/x"), work + text("/gone/x"), 0));
    QCOMPARE(answerFor(".."), Answer(m_scene.root(), m_scene.root(), TypeDir));
    QCOMPARE(answerFor("sub/../file").path, work + text("/file"));
    QCOMPARE(answerFor(".hidden").path, work + text("/.hidden"));

    // It is read at each call, and its place does not count.
    QVERIFY(QDir::setCurrent(m_scene.home()));
    QCOMPARE(answerFor("."), Answer(m_scene.home(), m_scene.home(), TypeDir));
    QCOMPARE(answerFor("file").path, m_scene.home() + text("/file"));

    // Up from the top there is nothing, not even the top.
    QVERIFY(QDir::setCurrent(text("/")));
    QVERIFY(VFS::ptr()->entry(text("..")).isNull());
    QVERIFY(VFS::ptr()->entry(text(".")) != VFS::ptr()->fileSystemEntry());
    QCOMPARE(answerFor("usr").path, text("/usr"));
    QCOMPARE(answerFor("../usr").path, text("/usr"));
    QVERIFY(QDir::setCurrent(text("/usr")));
    QCOMPARE(VFS::ptr()->entry(text("..")), VFS::ptr()->fileSystemEntry());
}

void TestVfsEntry::goneWorkingDirectory()
{
    QVERIFY(m_scene.makeDir("work/leaving"));
    QVERIFY(QDir::setCurrent(m_scene.path("work/leaving")));
    QVERIFY(QDir().rmdir(m_scene.path("work/leaving")));
    QVERIFY(QDir::currentPath().isEmpty());
    QVERIFY(VFS::ptr()->entry(text(".")).isNull());
    QCOMPARE(answerFor("usr").path, text("/usr"));
}

void TestVfsEntry::topOfTheDisk()
{
    const Answer top(text("File System"), text("/"), TypeFileSystemRootPlace);
    QCOMPARE(Answer(VFS::ptr()->fileSystemEntry()), top);
    for (const char* path : {"/", "//", "///", "/./", "/.//./", "File System", "/usr/.."}) {
        QCOMPARE(answerFor(path), top);
    }
    // No slash stands behind these dots.
    QVERIFY(VFS::ptr()->entry(text("/.")).isNull());
    QVERIFY(VFS::ptr()->entry(text("/..")).isNull());
    QCOMPARE(answerFor("/usr/"), Answer(text("/usr"), text("/usr"), TypeDir));
    QCOMPARE(answerFor("//usr"), Answer(text("/usr"), text("/usr"), TypeDir));
    QCOMPARE(answerFor("/usr/."), Answer(text("/usr"), text("/usr"), TypeDir));
}

void TestVfsEntry::placeBeatsFile()
{
    QVERIFY(m_scene.makeFile("work/Home"));
    QVERIFY(m_scene.makeFile("work/home"));
    QCOMPARE(VFS::ptr()->entry(text("Home")).type(), int(TypeHomeDirPlace));
    QCOMPARE(answerFor("./Home").path, m_scene.path("work/Home"));
    QCOMPARE(answerFor("./Home").type, int(TypeFile));
    QCOMPARE(answerFor("home").path, m_scene.path("work/home"));
}

void TestVfsEntry::placesInPaths()
{
    VFS* vfs = VFS::ptr();
    const Answer home(text("Home"), m_scene.home(), TypeHomeDirPlace);
    for (const char* path :
         {"Home", "Home/", "Home//", "Home/.", "Computer/Home", "Computer//Home",
          "Computer/./Home/", "_/Computer/Home", "Home/dir/.."}) {
        QCOMPARE(answerFor(path), home);
    }
    QCOMPARE(vfs->entry(text("Computer/File System")), vfs->fileSystemEntry());
    QCOMPARE(vfs->entry(text("Computer/File System")).type(), int(TypeFileSystemRootPlace));
    QCOMPARE(answerFor("Computer/File System/usr"), Answer(text("/usr"), text("/usr"), TypeDir));
    QCOMPARE(answerFor("File System/usr"), Answer(text("/usr"), text("/usr"), TypeDir));
    QCOMPARE(vfs->entry(text("Home/..")), vfs->computerEntry());
    QCOMPARE(vfs->entry(text("Home/..")).type(), int(TypeComputerPlace));
    QCOMPARE(vfs->entry(text("Home/../..")), vfs->rootEntry());
    QCOMPARE(vfs->entry(text("Computer/../../..")), vfs->rootEntry());
    QCOMPARE(vfs->entry(text("_")), vfs->rootEntry());
    QCOMPARE(vfs->entry(text("Network/Samba")).type(), int(TypeSambaNetworkPlace));
}

void TestVfsEntry::belowPlaces()
{
    const QString home = m_scene.home();
    QCOMPARE(answerFor("Home/dir/x"), Answer(text("Home/dir/x"), home + text("/dir/x"), TypeFile));
    QCOMPARE(
        answerFor("Computer/Home/dir"), Answer(text("Home/dir"), home + text("/dir"), TypeDir));
    QCOMPARE(
        answerFor("Home/no/thing"), Answer(text("Home/no/thing"), home + text("/no/thing"), 0));
    // A directory below Home, although there is a place for it.
    QCOMPARE(
        answerFor("Home/Desktop"), Answer(text("Home/Desktop"), home + text("/Desktop"), TypeDir));
    QVERIFY(VFS::ptr()->entry(text("Home/Desktop")) != VFS::ptr()->desktopEntry());
    QVERIFY(VFS::ptr()->entry(text("Home/Desktop")).isSimilar(VFS::ptr()->desktopEntry()));
    // The excess is cut before the walk upward and not again behind it.
    QCOMPARE(answerFor("Home/../Home"), Answer(text("Computer/Home"), home, TypeDir));
    // Nothing lies below a purely virtual place.
    for (const char* path :
         {"Computer/nothing", "Favourites/Home", "Network/x/y", "Places/x", "_/x"}) {
        QVERIFY2(VFS::ptr()->entry(text(path)).isNull(), path);
    }
    QCOMPARE(answerFor("Home/Computer").path, text("Home/Computer"));
}

// Of two neighbouring places the first is dropped, so what lies below such a directory can't be
// named through the place above it.
void TestVfsEntry::directoryCalledLikeAPlace()
{
    const VFS* vfs = VFS::ptr();
    QVERIFY(m_scene.makeDir("home/Trash"));
    QVERIFY(m_scene.makeFile("home/Trash/x"));
    QCOMPARE(vfs->entry(text("Home/Trash/x")).path(), text("Trash/x"));
    QCOMPARE(vfs->localPath(text("Home/Trash/x")), vfs->trashEntry().localPath() + text("/x"));
    QCOMPARE(vfs->entry(text("Home/Home/y")).path(), text("Home/y"));
    QCOMPARE(vfs->entry(text("Home/File System/etc")).path(), text("/etc"));
    QVERIFY(vfs->entry(text("Home/Computer/z")).isNull());

    // The directory alone is found, and its listing knows where its entries are.
    const Entry directory = vfs->entry(text("Home/Trash"));
    QCOMPARE(directory.localPath(), m_scene.path("home/Trash"));
    const EntryList children = vfs->childs(directory);
    QCOMPARE(children.paths(), QStringList{text("Home/Trash/x")});
    QCOMPARE(children.first().localPath(), m_scene.path("home/Trash/x"));
    QVERIFY(QDir(directory.localPath()).removeRecursively());
}

void TestVfsEntry::samba()
{
    VFS* vfs = VFS::ptr();
    VFSPlaceBase* tree = vfs->placeBase();
    QVERIFY(vfs->entry(text("Network/Samba/WG")).isNull());
    QVERIFY(vfs->entry(text("Samba/WG")).isNull());

    const Entry workgroup = tree->createPlace(text("Samba/WG"), TypeSambaWorkgroupPlace, QString());
    const Entry host = tree->createPlace(text("Samba/WG/HOST"), TypeSambaServerPlace, QString());
    const Entry share =
        tree->createPlace(text("Samba/WG/HOST/share"), TypeSambaSharePlace, m_scene.home());
    QVERIFY(tree->addEntryToPlace(workgroup, vfs->sambaNetworkEntry()));
    QVERIFY(tree->addEntryToPlace(host, workgroup));
    QVERIFY(tree->addEntryToPlace(share, host));

    QCOMPARE(vfs->entry(text("Samba/WG")).type(), int(TypeSambaWorkgroupPlace));
    QCOMPARE(vfs->entry(text("Samba//WG/./HOST/")).type(), int(TypeSambaServerPlace));
    QCOMPARE(
        answerFor("Samba/WG/HOST/share/dir/x"),
        Answer(text("Samba/WG/HOST/share/dir/x"), m_scene.home() + text("/dir/x"), TypeFile));
    QVERIFY(vfs->entry(text("Samba/WG/HOST/other")).isNull());
    // Composite paths stay whole, and nothing of that name hangs below Network.
    QVERIFY(vfs->entry(text("Network/Samba/WG")).isNull());
    QCOMPARE(vfs->entry(text("Samba/WG/..")), vfs->sambaNetworkEntry());
    QCOMPARE(vfs->entry(text("Samba/..")), vfs->networkEntry());
}

void TestVfsEntry::upFromTopLevel()
{
    const Entry roundabout = VFS::ptr()->entry(text("/usr/../etc"));
    const Entry direct = VFS::ptr()->entry(text("/etc"));
    QCOMPARE(roundabout.path(), text("File System/etc"));
    QCOMPARE(direct.path(), text("/etc"));
    QCOMPARE(roundabout.localPath(), direct.localPath());
    QCOMPARE(roundabout.type(), int(TypeDir));
    QVERIFY(roundabout != direct);
    QVERIFY(roundabout.isSimilar(direct));
}

void TestVfsEntry::kinds_data()
{
    QVERIFY(m_scene.makeDir("kinds"));
    QVERIFY(m_scene.makeFile("kinds/file"));
    QVERIFY(m_scene.makeDir("kinds/dir"));
    QVERIFY(m_scene.makeFifo("kinds/fifo"));
    QVERIFY(m_scene.makeLink("file", "kinds/fileLink"));
    QVERIFY(m_scene.makeLink("dir", "kinds/dirLink"));
    QVERIFY(m_scene.makeLink("dirLink", "kinds/dirLinkLink"));
    QVERIFY(m_scene.makeLink("fifo", "kinds/fifoLink"));
    QVERIFY(m_scene.makeLink("gone", "kinds/dangling"));
    QVERIFY(m_scene.makeLink("cycle2", "kinds/cycle1"));
    QVERIFY(m_scene.makeLink("cycle1", "kinds/cycle2"));
    QVERIFY(m_scene.makeChain("dir", "kinds/chain", 60));
    QVERIFY(m_scene.makeLink("/dev/null", "kinds/deviceLink"));

    QTest::addColumn<QString>("path");
    QTest::addColumn<int>("type");
    const auto row = [this](const char* name, int type) {
        QTest::newRow(name) << m_scene.path(text("kinds/") + text(name)) << type;
    };
    row("file", TypeFile);
    row("dir", TypeDir);
    row("fileLink", TypeFileLink);
    row("dirLink", TypeDirLink);
    row("dirLinkLink", TypeDirLink);
    row("dirLink/../file", TypeFile);
    // What is neither a file nor a directory has no type, unlike in a listing.
    row("fifo", TypeNone);
    row("fifoLink", TypeNone);
    row("deviceLink", TypeNone);
    row("dangling", TypeNone);
    row("cycle1", TypeNone);
    row("file/below", TypeNone);
    row("gone", TypeNone);
    // The kernel gives up behind forty links, and so does this.
    row("chain1", TypeNone);
    row("chain40", TypeDirLink);
    QTest::newRow("device") << text("/dev/null") << int(TypeNone);
}

void TestVfsEntry::kinds()
{
    QFETCH(const QString, path);
    QFETCH(const int, type);
    const Entry entry = VFS::ptr()->entry(path);
    QVERIFY(!entry.isNull());
    QCOMPARE(entry.type(), type);
    QCOMPARE(Answer(entry), PathOracle::entry(path));
}

void TestVfsEntry::kindNotToBeSeen()
{
    QVERIFY(m_scene.makeDir("closed"));
    QVERIFY(m_scene.makeFile("closed/file"));
    QVERIFY(m_scene.closeDir("closed"));
    const Unprivileged unprivileged;
    QVERIFY(unprivileged.isDropped());
    const QString path = m_scene.path("closed/file");
    QCOMPARE(answerFor(path), Answer(path, path, TypeNone));
    QCOMPARE(answerFor(m_scene.path("closed")).type, int(TypeDir));
}

void TestVfsEntry::namesOfAnyBytes()
{
    const QString longName(255, QLatin1Char('n'));
    const QString path = m_scene.path(longName);
    QVERIFY(m_scene.makeFile(longName.toLatin1()));
    QCOMPARE(answerFor(path), Answer(path, path, TypeFile));
    // One more than a name can have.
    QCOMPARE(answerFor(path + text("n")).type, int(TypeNone));

    const QString accents = m_scene.path("gr\xc3\xbc\xc3\x9f dich");
    QVERIFY(m_scene.makeFile("gr\xc3\xbc\xc3\x9f dich"));
    QCOMPARE(answerFor(accents), Answer(accents, accents, TypeFile));

    for (int value = 1; value < 0x100; ++value) {
        const QString odd = QString(255, QChar(value));
        const QString at = m_scene.path(odd);
        if (value != '/') {
            QCOMPARE(VFS::ptr()->entry(at).localPath(), at);
        }
        QVERIFY(
            VFS::ptr()->entry(text("Home/") + odd).localPath().startsWith(m_scene.home()) ||
            value == '/');
    }
    // No system call can be asked about such a path.
    const QString withNul = m_scene.path("work") + QChar(0) + text("x");
    QCOMPARE(VFS::ptr()->entry(withNul).type(), int(TypeNone));
    QCOMPARE(VFS::ptr()->entry(withNul).path(), withNul);
    const QString halfPair = m_scene.path("x") + QChar(0xd800);
    QCOMPARE(VFS::ptr()->entry(halfPair).type(), int(TypeNone));
}

void TestVfsEntry::colons()
{
    QVERIFY(m_scene.makeFile("work/notes:old"));
    const QString file = m_scene.path("work/notes:old");
    // A scheme that nobody knows, and no file.
    QVERIFY(VFS::ptr()->entry(text("notes:old")).isNull());
    QCOMPARE(answerFor("./notes:old"), Answer(file, file, TypeFile));
    QCOMPARE(answerFor(file), Answer(file, file, TypeFile));
    QVERIFY(VFS::ptr()->entry(text("a1+-.b:x")).isNull());
    // No schemes: a digit or nothing in front, a blank, an underscore, a slash.
    for (const char* name : {"1a:b", ":b", "a b:c", "a_b:c", "sub/a:b"}) {
        QCOMPARE(answerFor(name).path, m_scene.path(text("work/") + text(name)));
    }
    QCOMPARE(answerFor("Home/a:b").localPath, m_scene.home() + text("/a:b"));
}

void TestVfsEntry::fileUrls()
{
    QVERIFY(m_scene.makeFile("work/a b"));
    const QString blank = m_scene.path("work/a b");
    const QString base = text("file://") + m_scene.path("work");
    QCOMPARE(answerFor(base + text("/a%20b")), Answer(blank, blank, TypeFile));
    QCOMPARE(answerFor(base + text("/a b")), Answer(blank, blank, TypeFile));
    QCOMPARE(VFS::ptr()->entry(text("file:///tmp/a%20b")).localPath(), text("/tmp/a b"));
    QCOMPARE(answerFor(text("FILE://") + m_scene.path("work/file")).type, int(TypeFile));
    QCOMPARE(answerFor(text("file:") + m_scene.path("work/file")).type, int(TypeFile));
    QCOMPARE(answerFor(base + text("/")).path, m_scene.path("work"));
    QCOMPARE(answerFor(base + text("/sub/../file")).path, m_scene.path("work/file"));
    QCOMPARE(answerFor("file:///usr/../etc").path, text("File System/etc"));
    // Here "/" keeps its own notation.
    QCOMPARE(answerFor("file:///"), Answer(text("/"), text("/"), TypeDir));
    for (const char* url : {"file://host/tmp", "file://localhost/tmp", "file:"}) {
        QVERIFY2(VFS::ptr()->entry(text(url)).isNull(), url);
    }
}

void TestVfsEntry::ownUrls_data()
{
    QTest::addColumn<QString>("path");
    QTest::newRow("Computer") << VFS::ptr()->computerEntry().path();
    QTest::newRow("Home") << VFS::ptr()->homeEntry().path();
    QTest::newRow("Trash") << VFS::ptr()->trashEntry().path();
    QTest::newRow("Desktop") << VFS::ptr()->desktopEntry().path();
    QTest::newRow("Documents") << m_scene.home() + text("/Documents");
    QTest::newRow("FileSystem") << text("File System");
    QTest::newRow("File System") << text("File System");
    QTest::newRow("File%20System") << text("File System");
    QTest::newRow("Favourites") << text("Favourites");
    QTest::newRow("Storage devices") << text("Storage devices");
    QTest::newRow("Network") << text("Network");
    QTest::newRow("Places") << text("Places");
    QTest::newRow("_") << text("_");
    for (const char* nothing :
         {"/Home", "//Home", "home", "Home/", "Home/dir", "Computer/Home", "Filesystem", "", "x"}) {
        QTest::newRow(nothing) << QString();
    }
}

void TestVfsEntry::ownUrls()
{
    QFETCH(const QString, path);
    const QString place = text(QTest::currentDataTag());
    const Entry entry = VFS::ptr()->entry(text("vey-fm:") + place);
    QCOMPARE(entry.path(), path);
    QCOMPARE(VFS::ptr()->entry(text("VEY-FM:") + place).path(), path);
    if (place == QLatin1String("Documents")) {
        QCOMPARE(entry.type(), int(TypeDir));
    }
}

void TestVfsEntry::ownUrlWithSlash()
{
    QVERIFY(VFS::ptr()->entry(text("vey-fm:/Odd")).isNull());
    const Entry odd =
        VFS::ptr()->placeBase()->createPlace(text("/Odd"), TypeFavouritePlace, m_scene.home());
    QCOMPARE(VFS::ptr()->entry(text("vey-fm:/Odd")).type(), int(TypeFavouritePlace));
    VFS::ptr()->placeBase()->destroyPlace(odd);
}

void TestVfsEntry::carriedUrls_data()
{
    QTest::addColumn<int>("type");
    QTest::newRow("mailto:someone@host") << int(TypeCustomUrl);
    QTest::newRow("http://host/a/../b//c?q#f") << int(TypeCustomUrl);
    QTest::newRow("http:") << int(TypeCustomUrl);
    QTest::newRow("HTTP://Host/%41 b") << int(TypeCustomUrl);
    QTest::newRow("qthelp://x/doc") << int(TypeCustomUrl);
    QTest::newRow("ftp://user@host/dir/") << int(TypeFuseUrl);
    QTest::newRow("sftp://host:22/~/x") << int(TypeFuseUrl);
    QTest::newRow("SFTP:x") << int(TypeFuseUrl);
}

void TestVfsEntry::carriedUrls()
{
    QFETCH(const int, type);
    const QString url = text(QTest::currentDataTag());
    const Entry entry = VFS::ptr()->entry(url);
    QCOMPARE(entry.path(), url);
    QCOMPARE(entry.type(), type);
    QVERIFY(entry.localPath().isEmpty());
}

void TestVfsEntry::refusedUrls_data()
{
    QTest::addColumn<QString>("url");
    for (const char* url :
         {"smb://host/share/", "smb:/", "https://host/", "ftps://host/", "x:", "fish://host/",
          "data:,x", "httpx://host/"}) {
        QTest::newRow(url) << text(url);
    }
}

void TestVfsEntry::refusedUrls()
{
    QFETCH(const QString, url);
    QVERIFY(VFS::ptr()->entry(url).isNull());
}

void TestVfsEntry::translated()
{
    QVERIFY(rerunPasses("translated"));
}

/// A language in which every word of the tree has a "-x" behind it.
class Translation : public QTranslator
{
    Q_OBJECT

public:
    QString translate(const char* context, const char* source, const char*, int) const override
    {
        return qstrcmp(context, "VeyFM::VFS") == 0 ? text(source) + text("-x") : QString();
    }
    bool isEmpty() const override
    {
        return false;
    }
};

class TestVfsEntryTranslated : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void words()
    {
        VFS::initialize();
        QVERIFY(QCoreApplication::installTranslator(&m_translation));
        VFS* vfs = VFS::ptr();
        QCOMPARE(vfs->homeEntry().path(), text("Home-x"));
        QCOMPARE(vfs->rootEntry().path(), text("_"));
        // Six words are the same in every language.
        QCOMPARE(vfs->entry(text("vey-fm:Computer")), vfs->computerEntry());
        QCOMPARE(vfs->entry(text("vey-fm:Home")), vfs->homeEntry());
        QCOMPARE(vfs->entry(text("vey-fm:Trash")), vfs->trashEntry());
        QCOMPARE(vfs->entry(text("vey-fm:Desktop")), vfs->desktopEntry());
        QCOMPARE(vfs->entry(text("vey-fm:Documents")), vfs->documentsEntry());
        QCOMPARE(vfs->entry(text("vey-fm:FileSystem")), vfs->fileSystemEntry());
        QVERIFY(!vfs->entry(text("vey-fm:FileSystem")).isNull());
        // All others go by the word that the user reads.
        QVERIFY(vfs->entry(text("vey-fm:Favourites")).isNull());
        QCOMPARE(vfs->entry(text("vey-fm:Favourites-x")), vfs->favouritesEntry());
        QCOMPARE(vfs->entry(text("vey-fm:Home-x")), vfs->homeEntry());
        QVERIFY(vfs->entry(text("Home")) != vfs->homeEntry());
        QCOMPARE(vfs->entry(text("Computer-x/File System-x/usr")).path(), text("/usr"));
        QCOMPARE(vfs->entry(text("/usr/..")).path(), text("File System-x"));
    }

private:
    VfsScene m_scene;
    Translation m_translation;
};

int main(int argc, char** argv)
{
    const QCoreApplication app(argc, argv);
    if (isRerun(argc, argv, "translated")) {
        return runTests<TestVfsEntryTranslated>(argv);
    }
    TestVfsEntry tests;
    return QTest::qExec(&tests, argc, argv);
}

#include "tst_vfs_entry.moc"
