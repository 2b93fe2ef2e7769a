// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/readdirhook.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"

#include <QMap>
#include <QTest>

#include <cstring>

using namespace VeyFM;

/**
 * Directories of file systems that do not tell the kind of their entries. There is none at hand in
 * every machine, so the records of an ordinary one are made to say DT_UNKNOWN.
 */
class TestVfsUnknownKinds : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void kinds();
    void dots();
    void emptyDirectory();
    void otherKindsOfDots();
    void whiteouts();
    void closedDirectories();
    void invalidNames();
    void containsDirsOrPlaces();

private:
    Entry dir(const char* relative) const
    {
        return VFS::ptr()->entry(m_scene.path(relative));
    }
    QMap<QString, int> kindsIn(const char* relative, VFS::EntryChildFilters filter = {}) const
    {
        QMap<QString, int> kinds;
        for (const Entry& entry : VFS::ptr()->childs(dir(relative), filter)) {
            kinds.insert(entry.fileName(), entry.type());
        }
        return kinds;
    }

    VfsScene m_scene;
};

void TestVfsUnknownKinds::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    QVERIFY(m_scene.makeDir("mixed"));
    QVERIFY(m_scene.makeDir("mixed/dir"));
    QVERIFY(m_scene.makeFile("mixed/file"));
    QVERIFY(m_scene.makeFifo("mixed/fifo"));
    QVERIFY(m_scene.makeLink("dir", "mixed/toDir"));
    QVERIFY(m_scene.makeLink("file", "mixed/toFile"));
    QVERIFY(m_scene.makeLink("gone", "mixed/dangling"));
    QVERIFY(m_scene.makeDir("empty"));
}

void TestVfsUnknownKinds::cleanup()
{
    ReaddirHook::clear();
}

// What can be opened as a directory is one, a link to one among them, and all else is a file.
void TestVfsUnknownKinds::kinds()
{
    ReaddirHook::set(ReaddirHook::hideKind);
    const QMap<QString, int> expected{{text("dir"), TypeDir},     {text("file"), TypeFile},
                                      {text("fifo"), TypeFile},   {text("toDir"), TypeDir},
                                      {text("toFile"), TypeFile}, {text("dangling"), TypeFile}};
    QCOMPARE(kindsIn("mixed"), expected);
    // No link is known, and so none is skipped.
    QCOMPARE(kindsIn("mixed", VFS::SkipSymLinks), expected);
}

void TestVfsUnknownKinds::dots()
{
    ReaddirHook::set(ReaddirHook::hideKind);
    for (const Entry& child : VFS::ptr()->childs(dir("mixed"))) {
        QVERIFY(child.fileName() != text("."));
        QVERIFY(child.fileName() != text(".."));
    }
}

void TestVfsUnknownKinds::emptyDirectory()
{
    ReaddirHook::set(ReaddirHook::hideKind);
    VFS::ptr()->stopGettingChilds();
    QCOMPARE(VFS::ptr()->childs(dir("empty")).size(), 0);
    // The stop is still there for the next one.
    QCOMPARE(VFS::ptr()->childs(dir("mixed")).size(), 0);
    QCOMPARE(VFS::ptr()->childs(dir("mixed")).size(), 6);
}

// Dots are dropped only from records of the two kinds that can have them.
void TestVfsUnknownKinds::otherKindsOfDots()
{
    ReaddirHook::set([](dirent* record) {
        if (record && std::strcmp(record->d_name, ".") == 0) {
            record->d_type = DT_REG;
        } else if (record && std::strcmp(record->d_name, "..") == 0) {
            record->d_type = DT_LNK;
        }
    });
    const QMap<QString, int> expected{{text("."), TypeFile}, {text(".."), TypeDirLink}};
    QCOMPARE(kindsIn("empty"), expected);
    VFS::ptr()->stopGettingChilds();
    QCOMPARE(VFS::ptr()->childs(dir("empty")).size(), 0);
    QCOMPARE(VFS::ptr()->childs(dir("empty")).size(), 2);
}

void TestVfsUnknownKinds::whiteouts()
{
    ReaddirHook::set([](dirent* record) {
        if (record && std::strcmp(record->d_name, "dir") == 0) {
            record->d_type = 14; // DT_WHT
        }
    });
    QCOMPARE(kindsIn("mixed").value(text("dir")), int(TypeFile));
}

void TestVfsUnknownKinds::closedDirectories()
{
    QVERIFY(m_scene.makeDir("outer"));
    QVERIFY(m_scene.makeDir("outer/closed"));
    QVERIFY(m_scene.closeDir("outer/closed"));
    const Entry outer = dir("outer");
    const Unprivileged unprivileged;
    QVERIFY(unprivileged.isDropped());
    QCOMPARE(VFS::ptr()->childs(outer)[0].type(), int(TypeDir));
    QVERIFY(VFS::ptr()->containsDirsOrPlaces(outer));
    ReaddirHook::set(ReaddirHook::hideKind);
    QCOMPARE(VFS::ptr()->childs(outer)[0].type(), int(TypeFile));
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(outer));
}

// A link that is not known to be one has to have a valid name like anything else.
void TestVfsUnknownKinds::invalidNames()
{
    QVERIFY(m_scene.makeDir("invalid"));
    QVERIFY(m_scene.makeDir("invalid/d\xff"));
    QVERIFY(m_scene.makeLink("..", "invalid/l\xff"));
    QCOMPARE(kindsIn("invalid").size(), 1);
    ReaddirHook::set(ReaddirHook::hideKind);
    QCOMPARE(kindsIn("invalid").size(), 0);
}

void TestVfsUnknownKinds::containsDirsOrPlaces()
{
    QVERIFY(m_scene.makeDir("flat"));
    QVERIFY(m_scene.makeFile("flat/file"));
    QVERIFY(m_scene.makeDir("linked"));
    QVERIFY(m_scene.makeLink("..", "linked/up"));
    ReaddirHook::set(ReaddirHook::hideKind);
    QVERIFY(VFS::ptr()->containsDirsOrPlaces(dir("mixed")));
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(dir("flat")));
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(dir("empty")));
    // A link to a directory does not count where it is known to be one, and does where it isn't.
    QVERIFY(VFS::ptr()->containsDirsOrPlaces(dir("linked")));
    ReaddirHook::clear();
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(dir("linked")));
}

QTEST_GUILESS_MAIN(TestVfsUnknownKinds)
#include "tst_vfs_unknownkinds.moc"
