// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfsscene.h"
#include "vfs/vfs.h"

#include <QTest>
#include <QUrl>

using namespace VeyFM;

/// The links in the directories of a path, as the URLs of entries show them resolved.
class TestVfsCanonicalPath : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void links_data();
    void links();
    void dropped_data();
    void dropped();
    void belowDesktop();
    void desktopBehindLinks();
    void desktopIsLink();
    void noDesktop();
    void desktopIsRoot();
    void linkToRoot();
    void notAbsolute();
    void rootItself();

private:
    QList<QUrl> urls(const QString& localPath) const
    {
        return VFS::ptr()->urlsFromEntries(makeEntry(text("x"), localPath, TypeFile));
    }
    QList<QUrl> files(const QString& localPath) const
    {
        return {QUrl::fromLocalFile(localPath)};
    }

    VfsScene m_scene;
};

void TestVfsCanonicalPath::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    for (const char* dir : {"d", "d/sub", "home/Desktop/real"}) {
        QVERIFY(m_scene.makeDir(dir));
    }
    for (const char* file : {"f", "d/f", "d/sub/f", "home/Desktop/real/f"}) {
        QVERIFY(m_scene.makeFile(file));
    }
    QVERIFY(m_scene.makeLink("d", "toD"));
    QVERIFY(m_scene.makeLink(m_scene.bytes("d"), "toDAbsolute"));
    QVERIFY(m_scene.makeLink("toD/sub", "throughLink"));
    QVERIFY(m_scene.makeLink("../f", "d/toF"));
    QVERIFY(m_scene.makeLink("../d", "d/toParent"));
    QVERIFY(m_scene.makeLink("f", "fileLink"));
    QVERIFY(m_scene.makeLink("gone", "dangling"));
    QVERIFY(m_scene.makeLink("cycle2", "cycle1"));
    QVERIFY(m_scene.makeLink("cycle1", "cycle2"));
    QVERIFY(m_scene.makeLink("self", "self"));
    QVERIFY(m_scene.makeChain("d", "chain", 60));
    QVERIFY(m_scene.makeLink("real", "home/Desktop/link"));
    QVERIFY(m_scene.makeLink("home", "toHome"));
    QVERIFY(m_scene.makeLink("home/Desktop", "toDesktop"));
}

void TestVfsCanonicalPath::init()
{
    qputenv("HOME", QFile::encodeName(m_scene.home()));
}

void TestVfsCanonicalPath::links_data()
{
    QTest::addColumn<QString>("result");
    const auto row = [](const char* path, const char* result) {
        QTest::newRow(path) << text(result);
    };
    row("d/f", "d/f");
    row("toD/f", "d/f");
    row("toDAbsolute/sub/f", "d/sub/f");
    row("toD/toParent/toParent/f", "d/f");
    row("chain1/f", "d/f");
    // The target is taken as it reads: links within it stay.
    row("throughLink/f", "toD/sub/f");
    // The last section is not looked at, be it a link, a cycle or nothing.
    row("toD", "toD");
    row("toD/toF", "d/toF");
    row("toD/gone", "d/gone");
    row("dangling", "dangling");
    row("cycle1", "cycle1");
    row("d/../toD/./f", "d/f");
    row("toD/../f", "f");
}

void TestVfsCanonicalPath::links()
{
    QFETCH(const QString, result);
    const QString path = m_scene.path(QTest::currentDataTag());
    QCOMPARE(urls(path), files(m_scene.path(result)));
}

void TestVfsCanonicalPath::dropped_data()
{
    QTest::addColumn<QString>("path");
    for (const char* path :
         {"gone/f", "d/gone/f", "f/x", "fileLink/x", "dangling/x", "cycle1/x", "cycle2/sub/x",
          "self/x", "toD/toF/x"}) {
        QTest::newRow(path) << m_scene.path(path);
    }
}

void TestVfsCanonicalPath::dropped()
{
    QFETCH(const QString, path);
    QCOMPARE(urls(path), QList<QUrl>());
    // Without notice: the others stay.
    const EntryList three(
        {makeEntry(text("a"), m_scene.path("f"), TypeFile), makeEntry(text("b"), path, TypeFile),
         makeEntry(text("c"), m_scene.path("toD/f"), TypeFile)});
    QCOMPARE(
        VFS::ptr()->urlsFromEntries(three), files(m_scene.path("f")) + files(m_scene.path("d/f")));
}

void TestVfsCanonicalPath::belowDesktop()
{
    // Nothing is resolved there, or looked at.
    const QString desktop = m_scene.home() + text("/Desktop");
    QCOMPARE(urls(desktop + text("/link/f")), files(desktop + text("/link/f")));
    QCOMPARE(urls(desktop + text("/gone/f")), files(desktop + text("/gone/f")));
    QCOMPARE(urls(desktop), files(desktop));
    // A name that only begins like it is not below it.
    QVERIFY(m_scene.makeLink("Desktop/real", "home/DesktopLink"));
    QCOMPARE(urls(desktop + text("Link/f")), files(desktop + text("/real/f")));
}

void TestVfsCanonicalPath::desktopBehindLinks()
{
    const QString desktop = m_scene.home() + text("/Desktop");
    QCOMPARE(urls(m_scene.path("toHome/Desktop/link/f")), files(desktop + text("/link/f")));
    // A link that leads straight to the desktop passes by the test for it.
    QCOMPARE(urls(m_scene.path("toDesktop/link/f")), files(desktop + text("/real/f")));
    QCOMPARE(urls(m_scene.path("toDesktop/gone/f")), QList<QUrl>());
}

void TestVfsCanonicalPath::desktopIsLink()
{
    QVERIFY(m_scene.makeDir("home2"));
    QVERIFY(m_scene.makeDir("home2/real"));
    QVERIFY(m_scene.makeDir("home2/real/d"));
    QVERIFY(m_scene.makeLink("real", "home2/Desktop"));
    QVERIFY(m_scene.makeLink("d", "home2/real/link"));
    qputenv("HOME", QFile::encodeName(m_scene.path("home2")));
    // It is the real directory that counts.
    QCOMPARE(urls(m_scene.path("home2/real/link/f")), files(m_scene.path("home2/real/link/f")));
    QCOMPARE(urls(m_scene.path("home2/Desktop/link/f")), files(m_scene.path("home2/real/d/f")));
}

void TestVfsCanonicalPath::noDesktop()
{
    QVERIFY(m_scene.makeDir("home3"));
    QVERIFY(m_scene.makeLink("../d", "home3/link"));
    qputenv("HOME", QFile::encodeName(m_scene.path("home3")));
    QCOMPARE(urls(m_scene.path("home3/link/f")), files(m_scene.path("d/f")));
}

void TestVfsCanonicalPath::desktopIsRoot()
{
    QVERIFY(m_scene.makeDir("home4"));
    QVERIFY(m_scene.makeLink("/", "home4/Desktop"));
    qputenv("HOME", QFile::encodeName(m_scene.path("home4")));
    // Everything is below it.
    QCOMPARE(urls(m_scene.path("toD/f")), files(m_scene.path("toD/f")));
    QCOMPARE(urls(m_scene.path("gone/f")), files(m_scene.path("gone/f")));
    QCOMPARE(urls(m_scene.path("d/../toD/f")), files(m_scene.path("toD/f")));
}

// Behind such a link each section still gets its slash.
void TestVfsCanonicalPath::linkToRoot()
{
    QVERIFY(m_scene.makeLink("/", "toRoot"));
    QCOMPARE(urls(m_scene.path("toRoot/usr/x")), files(text("//usr/x")));
}

void TestVfsCanonicalPath::notAbsolute()
{
    QVERIFY(QDir::setCurrent(m_scene.root()));
    QCOMPARE(urls(text("toD/f")), files(m_scene.path("d/f")));
}

void TestVfsCanonicalPath::rootItself()
{
    QCOMPARE(urls(text("/")), files(text("/")));
    QCOMPARE(urls(text("/usr")), files(text("/usr")));
}

QTEST_GUILESS_MAIN(TestVfsCanonicalPath)
#include "tst_vfs_canonicalpath.moc"
