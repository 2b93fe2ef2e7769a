// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/readdirhook.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QAtomicInt>
#include <QElapsedTimer>
#include <QTest>

#include <thread>
#include <vector>

using namespace VeyFM;

namespace {

int openDescriptors()
{
    return QDir(text("/proc/self/fd")).entryList(QDir::AllEntries | QDir::System).size();
}

} // namespace

/// Listings that are told to give up.
class TestVfsStop : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void pendingStop();
    void placeChildrenToo();
    void severalStopsAreOne();
    void emptyDirectoryLeavesIt_data();
    void emptyDirectoryLeavesIt();
    void skippedLinkTakesIt();
    void invalidNameTakesIt();
    void othersDoNotLook();
    void runningListing();
    void behindLastRecord();
    void abandonedStream();
    void fromAnotherThread();
    void oneStopOneReader();
    void whileMainThreadWorks();

private:
    Entry dir(const char* relative) const
    {
        return VFS::ptr()->entry(m_scene.path(relative));
    }
    bool isStopPending() const
    {
        return VFS::ptr()->childs(dir("probe")).isEmpty();
    }

    VfsScene m_scene;
};

void TestVfsStop::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    QVERIFY(m_scene.makeDir("probe"));
    QVERIFY(m_scene.makeFile("probe/x"));
    QVERIFY(m_scene.makeDir("empty"));
    QVERIFY(m_scene.makeDir("big"));
    for (int i = 0; i < 2000; ++i) {
        QVERIFY(m_scene.makeFile("big/" + QByteArray::number(i)));
    }
}

void TestVfsStop::cleanup()
{
    ReaddirHook::clear();
    QVERIFY2(!isStopPending(), "a test has left a stop behind");
}

void TestVfsStop::pendingStop()
{
    VFS::ptr()->stopGettingChilds();
    QVERIFY(VFS::ptr()->childs(dir("probe")).isEmpty());
    QCOMPARE(VFS::ptr()->childs(dir("probe")).size(), 1);
    QCOMPARE(VFS::ptr()->childs(dir("big")).size(), 2000);
}

void TestVfsStop::placeChildrenToo()
{
    VFSPlaceBase* tree = VFS::ptr()->placeBase();
    const Entry place = tree->createPlace(text("Mark"), TypeFavouritePlace, m_scene.path("probe"));
    QVERIFY(tree->addEntryToPlace(VFS::ptr()->homeEntry(), place));
    QCOMPARE(VFS::ptr()->childs(place).size(), 2);
    VFS::ptr()->stopGettingChilds();
    QCOMPARE(VFS::ptr()->childs(place, VFS::WithExtraChildren).size(), 0);
    QCOMPARE(VFS::ptr()->childs(place).size(), 2);
}

void TestVfsStop::severalStopsAreOne()
{
    VFS::ptr()->stopGettingChilds();
    VFS::ptr()->stopGettingChilds();
    VFS::ptr()->stopGettingChilds();
    QVERIFY(isStopPending());
    QVERIFY(!isStopPending());
}

void TestVfsStop::emptyDirectoryLeavesIt_data()
{
    QTest::addColumn<Entry>("entry");
    QTest::newRow("empty") << dir("empty");
    QTest::newRow("file") << dir("probe/x");
    QTest::newRow("gone") << makeEntry(m_scene.path("gone"), m_scene.path("gone"), TypeDir);
    QTest::newRow("virtual place") << VFS::ptr()->computerEntry();
    QTest::newRow("null") << Entry();
}

// No record, no look at the flag: the dots are passed over before.
void TestVfsStop::emptyDirectoryLeavesIt()
{
    QFETCH(const Entry, entry);
    const int usual = VFS::ptr()->childs(entry).size();
    VFS::ptr()->stopGettingChilds();
    QCOMPARE(VFS::ptr()->childs(entry).size(), usual);
    QVERIFY(isStopPending());
    QVERIFY(!isStopPending());
}

void TestVfsStop::skippedLinkTakesIt()
{
    QVERIFY(m_scene.makeDir("links"));
    QVERIFY(m_scene.makeLink("gone", "links/only"));
    VFS::ptr()->stopGettingChilds();
    QCOMPARE(VFS::ptr()->childs(dir("links"), VFS::SkipSymLinks).size(), 0);
    QVERIFY(!isStopPending());
}

void TestVfsStop::invalidNameTakesIt()
{
    QVERIFY(m_scene.makeDir("invalid"));
    QVERIFY(m_scene.makeFile("invalid/\xff"));
    VFS::ptr()->stopGettingChilds();
    QCOMPARE(VFS::ptr()->childs(dir("invalid")).size(), 0);
    QVERIFY(!isStopPending());
}

void TestVfsStop::othersDoNotLook()
{
    QVERIFY(m_scene.makeDir("upper"));
    QVERIFY(m_scene.makeDir("upper/lower"));
    VFS::ptr()->stopGettingChilds();
    QVERIFY(VFS::ptr()->containsDirsOrPlaces(dir("upper")));
    QVERIFY(VFS::ptr()->hasChilds(dir("upper")));
    QVERIFY(VFS::ptr()->entry(m_scene.path("upper/lower")).isDir());
    QVERIFY(isStopPending());
}

void TestVfsStop::runningListing()
{
    int records = 0;
    ReaddirHook::set([&records](dirent*) {
        if (++records == 500) {
            VFS::ptr()->stopGettingChilds();
        }
    });
    QCOMPARE(VFS::ptr()->childs(dir("big")).size(), 0);
    // It gives up at once: the record at hand is the last. A dot or two may come in between.
    QVERIFY2(records >= 500 && records <= 502, qPrintable(QString::number(records)));
    QVERIFY(!isStopPending());
}

void TestVfsStop::behindLastRecord()
{
    ReaddirHook::set([](dirent* record) {
        if (!record) {
            VFS::ptr()->stopGettingChilds();
        }
    });
    QCOMPARE(VFS::ptr()->childs(dir("big")).size(), 2000);
    ReaddirHook::clear();
    QVERIFY(isStopPending());
}

// A cancelled listing does not close its directory.
void TestVfsStop::abandonedStream()
{
    const int before = openDescriptors();
    QCOMPARE(VFS::ptr()->childs(dir("big")).size(), 2000);
    QCOMPARE(openDescriptors(), before);
    VFS::ptr()->stopGettingChilds();
    QVERIFY(VFS::ptr()->childs(dir("big")).isEmpty());
    QCOMPARE(openDescriptors(), before + 1);
}

void TestVfsStop::fromAnotherThread()
{
    std::thread([] { VFS::ptr()->stopGettingChilds(); }).join();
    QVERIFY(isStopPending());
}

void TestVfsStop::oneStopOneReader()
{
    const Entry big = dir("big");
    QAtomicInt cancelled;
    QAtomicInt whole;
    VFS::ptr()->stopGettingChilds();
    std::vector<std::thread> readers;
    for (int i = 0; i < 4; ++i) {
        readers.emplace_back([&] {
            const int size = VFS::ptr()->childs(big).size();
            cancelled.fetchAndAddRelaxed(size == 0 ? 1 : 0);
            whole.fetchAndAddRelaxed(size == 2000 ? 1 : 0);
        });
    }
    for (std::thread& reader : readers) {
        reader.join();
    }
    QCOMPARE(cancelled.loadRelaxed(), 1);
    QCOMPARE(whole.loadRelaxed(), 3);
}

// A worker lists a directory that never ends, and the main thread makes it stop.
void TestVfsStop::whileMainThreadWorks()
{
    const Entry big = dir("big");
    QAtomicInt records;
    ReaddirHook::set([&records](dirent*) { records.fetchAndAddRelaxed(1); }, ReaddirHook::Endless);
    QAtomicInt size(-1);
    std::thread worker([&] { size.storeRelease(VFS::ptr()->childs(big).size()); });
    QTRY_VERIFY_WITH_TIMEOUT(records.loadRelaxed() > 5000, 30000);
    QCOMPARE(size.loadAcquire(), -1);
    // Walks in this thread do not wait for it.
    QCOMPARE(VFS::ptr()->parent(VFS::ptr()->homeEntry()), VFS::ptr()->computerEntry());
    QCOMPARE(VFS::ptr()->entry(text("Home/..")), VFS::ptr()->computerEntry());
    VFS::ptr()->stopGettingChilds();
    worker.join();
    QCOMPARE(size.loadAcquire(), 0);
}

QTEST_GUILESS_MAIN(TestVfsStop)
#include "tst_vfs_stop.moc"
