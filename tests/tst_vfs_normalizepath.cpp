// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/pathoracle.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QTest>

using namespace VeyFM;

class TestVfsNormalizePath : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void texts_data();
    void texts();
    void likeTheLongWay();
    void entriesLikeTheLongWay();
    void cleaningLikeTheLongWay();
    void manySections_data();
    void manySections();

private:
    // In front, since the tree takes its directories from the environment that this sets.
    VfsScene m_scene;
};

void TestVfsNormalizePath::initTestCase()
{
    VFS::initialize();
    VFSPlaceBase* tree = VFS::ptr()->placeBase();
    const Entry samba = VFS::ptr()->sambaNetworkEntry();
    const Entry workgroup = tree->createPlace(text("Samba/WG"), TypeSambaWorkgroupPlace, QString());
    const Entry host = tree->createPlace(text("Samba/WG/HOST"), TypeSambaServerPlace, QString());
    QVERIFY(tree->addEntryToPlace(workgroup, samba));
    QVERIFY(tree->addEntryToPlace(host, workgroup));
    // A place that hangs nowhere, and one in a place.
    tree->createPlace(text("Loose"), TypeFavouritePlace, m_scene.path("work"));
    const Entry held = tree->createPlace(text("Held"), TypeFavouritePlace, m_scene.path("work"));
    QVERIFY(tree->addEntryToPlace(held, VFS::ptr()->favouritesEntry()));
    QVERIFY(m_scene.makeDir("work/a"));
    QVERIFY(m_scene.makeDir("work/usr"));
    QVERIFY(m_scene.makeFile("work/a/b"));
    QVERIFY(m_scene.makeLink("a", "work/link"));
    QVERIFY(m_scene.makeFile("home/b"));
    QVERIFY(QDir::setCurrent(m_scene.path("work")));
}

void TestVfsNormalizePath::texts_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("normalized");
    const auto row = [](const char* path, const char* normalized) {
        QTest::newRow(path) << text(path) << text(normalized);
    };
    row("", "");
    row("/", "/");
    row("//", "");
    row("///", "");
    row(".", "");
    row("./", "");
    row("/.", "");
    row("..", "");
    row("/..", "");
    row("/../etc", "/etc");
    row("/usr/", "/usr");
    row("/usr//lib", "/usr/lib");
    row("/usr/./lib/.", "/usr/lib");
    row("/usr/lib/..", "/usr");
    row("/usr/...", "/usr/...");
    row("/usr/..x", "/usr/..x");
    row("/usr/.x", "/usr/.x");
    // Above a top-level directory the notation becomes that of the tree, and stays so.
    row("/usr/..", "File System");
    row("/usr/../etc", "File System/etc");
    row("/usr/../etc/..", "File System");
    row("/usr/../..", "Computer");
    row("/usr/../../..", "_");
    row("/usr/../../../..", "_");
    // A lone name is not left.
    row("name/..", "name");
    row("name/../..", "name");
    row("name/../other", "name/other");
    row("name/sub/..", "name");
    row("name//sub/./x/", "name/sub/x");
    // A text with a scheme is nobody's path.
    row("http://host/a/../b//", "http://host/a/../b//");
    row("notes:old/../x", "notes:old/../x");
    row("Home/a:b/..", "Home");
    // Sections that lead only to the next place are dropped.
    row("Home", "Home");
    row("Home/", "Home");
    row("Computer/Home", "Home");
    row("Computer//Home/", "Home");
    row("_/Computer/Home", "Home");
    row("Computer/Home/Pictures", "Home/Pictures");
    row("Computer/File System", "File System");
    row("Computer/File System/usr", "/usr");
    row("File System/usr", "/usr");
    row("File System/.", "");
    row("File System/..", "");
    row("File System/usr/..", "File System");
    row("Network/Samba", "Samba");
    row("Network/Samba/WG", "Network/Samba/WG");
    row("Samba/WG", "Samba/WG");
    row("Samba/WG/HOST/share", "Samba/WG/HOST/share");
    row("Samba/other", "Samba/other");
    row("Favourites/Held", "Held");
    // A lone place at the end is the result only where it hangs below the last one dropped.
    row("Home/Desktop", "Home/Desktop");
    row("Favourites/Home", "Favourites/Home");
    row("Computer/Computer", "Computer/Computer");
    row("Computer/Loose", "Computer/Loose");
    row("Home/Computer", "Home/Computer");
    row("Computer/nothing", "Computer/nothing");
    // Up from a place goes by the tree, seen from the root.
    row("Home/..", "Computer");
    row("Home/../..", "_");
    row("Computer/..", "_");
    row("Computer/../..", "_");
    row("Desktop/../x", "Computer/x");
    row("Samba/WG/HOST/..", "Samba/WG");
    row("Samba/WG/..", "Samba");
    row("Held/..", "Favourites");
    row("Loose/..", "Loose");
    row("Places/..", "Places");
    // The excess is cut before the walk and not again behind it.
    row("Home/../Home", "Computer/Home");
}

void TestVfsNormalizePath::texts()
{
    QFETCH(const QString, path);
    QFETCH(const QString, normalized);
    QCOMPARE(VFS::ptr()->normalizePath(path), normalized);
    QCOMPARE(PathOracle::normalizePath(path), normalized);
}

namespace {

const QStringList words{
    text("."),       text(".."),      text(".."),          text("a"),     text("b"),
    text("usr"),     text("..."),     text("Home"),        text("Home"),  text("Computer"),
    text("Desktop"), text("_"),       text("File System"), text("Samba"), text("WG"),
    text("HOST"),    text("Network"), text("Favourites"),  text("Held"),  text("Loose"),
    text("Places"),  text("link"),    text("x y"),         text("tmp"),   text("\xc3\xa9"),
};

} // namespace

void TestVfsNormalizePath::likeTheLongWay()
{
    QRandomGenerator random(20260101);
    const QStringList more = words + QStringList{text("a:b"), text(":"), text("http:"), text(" ")};
    for (int i = 0; i < 20000; ++i) {
        const QString path = PathOracle::randomPath(&random, more);
        const QString expected = PathOracle::normalizePath(path);
        const QString actual = VFS::ptr()->normalizePath(path);
        QVERIFY2(
            actual == expected, qPrintable(QStringLiteral("\"%1\" gives \"%2\" in place of \"%3\"")
                                               .arg(path, actual, expected)));
    }
}

void TestVfsNormalizePath::entriesLikeTheLongWay()
{
    QRandomGenerator random(20260102);
    for (int i = 0; i < 20000; ++i) {
        const QString path = PathOracle::randomPath(&random, words);
        QVERIFY(!PathOracle::hasScheme(path));
        const PathOracle::Answer expected = PathOracle::entry(path);
        const PathOracle::Answer actual(VFS::ptr()->entry(path));
        if (!(actual == expected)) {
            qWarning("for \"%s\"", qPrintable(path));
            QCOMPARE(actual, expected);
        }
    }
}

// A listing cleans the path of what it lists, and says so in the paths of the children.
void TestVfsNormalizePath::cleaningLikeTheLongWay()
{
    QVERIFY(m_scene.makeDir("one"));
    QVERIFY(m_scene.makeFile("one/n"));
    const QString local = m_scene.path("one");
    QRandomGenerator random(20260103);
    QStringList paths{
        text("a//b"), text("a/./b"), text("a/.//.///b"), text("./a"),    text(".//a"),
        text("a/."),  text("a/.."),  text("a/../b"),     text("//a"),    text("/./a"),
        text("/./"),  text("/"),     text(""),           text("a/..//"), text("./"),
    };
    for (int i = 0; i < 500; ++i) {
        paths.append(PathOracle::randomPath(
            &random, {text("."), text("."), text(".."), text("a"), text(".b"), text("")}));
    }
    for (const QString& path : qAsConst(paths)) {
        const EntryList children = VFS::ptr()->childs(makeEntry(path, local, TypeDir));
        QCOMPARE(children.size(), 1);
        QCOMPARE(children[0].path(), PathOracle::cleanPath(path + text("/n")));
        QCOMPARE(children[0].localPath(), local + text("/n"));
    }
}

void TestVfsNormalizePath::manySections_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("normalized");
    const int count = 100000;
    const QString down = text("/a").repeated(count);
    QTest::newRow("down") << down << down;
    QTest::newRow("below a place") << text("Home") + down << text("Home") + down;
    QTest::newRow("dots") << text("/./").repeated(count) << QString();
    QTest::newRow("in and out") << text("/x") + text("/a/..").repeated(count) << text("/x");
    QTest::newRow("up") << text("Home") + text("/..").repeated(count) << text("_");
    QTest::newRow("places") << text("Computer/").repeated(count) << text("Computer/Computer");
    const QString half = text("/a").repeated(count / 2);
    QTest::newRow("down and up") << half + text("/..").repeated(count / 2 - 1) << text("/a");
}

void TestVfsNormalizePath::manySections()
{
    QFETCH(const QString, path);
    QFETCH(const QString, normalized);
    QVERIFY(VFS::ptr()->normalizePath(path) == normalized);
    VFS::ptr()->entry(path);
}

QTEST_GUILESS_MAIN(TestVfsNormalizePath)
#include "tst_vfs_normalizepath.moc"
