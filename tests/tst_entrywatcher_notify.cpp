// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/entryscene.h"
#include "support/makeentry.h"

#include <QTest>

using namespace VeyFM;

namespace {

QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

const QStringList nothing;

bool notify(EntryScene& scene, const Entry& entry, bool anyWay)
{
    return QMetaObject::invokeMethod(
        &scene.watcher, "entryChangedNotify", Qt::DirectConnection, Q_ARG(Entry, entry),
        Q_ARG(bool, anyWay));
}

} // namespace

/// News that does not come from the kernel: resets, places, and what is passed over.
class TestEntryWatcherNotify : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void refreshable_data();
    void refreshable();
    void volatileTreesAreNotWatched();
    void volatileTreesAreReset();
    void volatileTreeThatIsWatched();
    void resetAnyWay();
    void resetOfWatchedPath();
    void resetOfEntryWithoutWatch();
    void resetOfUnknownEntry();
    void unknownEntryLeavesAKey();
    void anyWayIsOffByDefault();
    void forwarders();
    void disabledDropsEvents();
    void disabledDropsResets();
    void vfsNotifiesOne();
    void vfsNotifiesLists();
    void vfsNotifiesWatchedOnly();

private:
    QScopedPointer<EntryScene> m_scene;
};

void TestEntryWatcherNotify::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
}

void TestEntryWatcherNotify::init()
{
    m_scene.reset(new EntryScene);
    QVERIFY2(
        m_scene->watcher.isRefreshable(m_scene->tree.path()),
        "TMPDIR lies in a tree that is never watched");
    QVERIFY(m_scene->tree.makeDir("dir"));
}

void TestEntryWatcherNotify::cleanup()
{
    VFS::ptr()->entryWatcher()->clear();
    VFSPlaceBase* const tree = VFS::ptr()->placeBase();
    for (const char* name : {"Fav", "Volatile"}) {
        tree->destroyPlace(tree->placeEntry(text(name)));
    }
    m_scene.reset();
}

void TestEntryWatcherNotify::refreshable_data()
{
    QTest::addColumn<bool>("isRefreshable");
    QTest::newRow("") << true;
    QTest::newRow("/") << true;
    QTest::newRow("/home/u") << true;
    QTest::newRow("proc") << true;
    QTest::newRow("/home/proc") << true;
    QTest::newRow("/Proc") << true;
    QTest::newRow("/proc") << false;
    QTest::newRow("/proc/self") << false;
    QTest::newRow("/dev/null") << false;
    QTest::newRow("/sys/class") << false;
    QTest::newRow("/var") << false;
    QTest::newRow("/var/log") << false;
    // A test of text.
    QTest::newRow("/variable/x") << false;
    QTest::newRow("/device") << false;
    QTest::newRow("/system") << false;
}

void TestEntryWatcherNotify::refreshable()
{
    QFETCH(bool, isRefreshable);
    QCOMPARE(m_scene->watcher.isRefreshable(text(QTest::currentDataTag())), isRefreshable);
}

void TestEntryWatcherNotify::volatileTreesAreNotWatched()
{
    EntryScene& scene = *m_scene;
    for (const char* path : {"/proc", "/dev", "/sys", "/var", "/proc/self"}) {
        scene.watcher.addEntry(VFS::ptr()->entry(text(path)));
        QVERIFY(!scene.inotify->isPathRegistered(text(path)));
    }
    // Not even a place gets a key there.
    scene.watcher.addEntry(
        VFS::ptr()->placeBase()->createPlace(text("Volatile"), TypeFavouritePlace, text("/proc")));
    QVERIFY(!scene.inotify->isPathRegistered(text("/proc")));
    QVERIFY(scene.report("slotPathCreated", text("/proc"), "x"));
    QCOMPARE(scene.takeLog(), QStringList{text("created /proc/x")});
}

void TestEntryWatcherNotify::volatileTreesAreReset()
{
    EntryScene& scene = *m_scene;
    const Entry proc = VFS::ptr()->entry(text("/proc"));
    scene.watcher.addEntry(proc);
    QVERIFY(notify(scene, proc, false));
    QCOMPARE(scene.takeLog(), nothing);
    QVERIFY(notify(scene, proc, true));
    QCOMPARE(scene.takeLog(), QStringList{text("reset /proc")});

    scene.record(VFS::ptr()->entryWatcher());
    VFS::ptr()->notifyWatchers(proc);
    QCOMPARE(scene.takeLog(), QStringList{text("reset /proc")});
}

void TestEntryWatcherNotify::volatileTreeThatIsWatched()
{
    // A link can bring in what is never watched by itself. It still gives no reset.
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeLink("/proc", "link"));
    scene.watcher.addEntry(scene.plain("link"));
    QVERIFY(scene.inotify->isPathRegistered(text("/proc")));
    QVERIFY(notify(scene, VFS::ptr()->entry(text("/proc")), false));
    QCOMPARE(scene.takeLog(), nothing);
    QVERIFY(notify(scene, scene.plain("link"), false));
    QCOMPARE(scene.takeLog(), QStringList{text("reset ~/link")});
}

void TestEntryWatcherNotify::resetAnyWay()
{
    EntryScene& scene = *m_scene;
    for (const Entry& entry : {Entry(), scene.plain("missing"), VFS::ptr()->computerEntry()}) {
        QVERIFY(notify(scene, entry, true));
    }
    QCOMPARE(
        scene.log,
        (QStringList{text("reset (null)"), text("reset ~/missing"), text("reset Computer")}));
}

void TestEntryWatcherNotify::resetOfWatchedPath()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.plain("dir"));
    QVERIFY(notify(scene, scene.plain("dir"), false));
    QCOMPARE(scene.takeLog(), QStringList{text("reset ~/dir")});
    // By its path alone: nobody ever added this one.
    QVERIFY(notify(scene, scene.place("Fav", "dir"), false));
    QCOMPARE(scene.takeLog(), QStringList{text("reset Fav")});
}

void TestEntryWatcherNotify::resetOfEntryWithoutWatch()
{
    EntryScene& scene = *m_scene;
    const Entry place = scene.place("Fav", "missing");
    scene.watcher.addEntry(place);
    QVERIFY(!scene.isRegistered("missing"));
    QVERIFY(notify(scene, place, false));
    QCOMPARE(scene.takeLog(), QStringList{text("reset Fav")});
    // Its twin is in the set, and a stranger of the same directory is not.
    QVERIFY(notify(scene, scene.plain("missing"), false));
    QCOMPARE(scene.takeLog(), QStringList{text("reset ~/missing")});
    const Entry stranger = makeEntry(text("Stranger"), scene.tree.path("missing"), TypeDir);
    QVERIFY(notify(scene, stranger, false));
    QCOMPARE(scene.takeLog(), nothing);

    // A virtual place too.
    const Entry computer = VFS::ptr()->computerEntry();
    QVERIFY(notify(scene, computer, false));
    QCOMPARE(scene.takeLog(), nothing);
    scene.watcher.addEntry(computer);
    QVERIFY(notify(scene, computer, false));
    QCOMPARE(scene.takeLog(), QStringList{text("reset Computer")});
}

void TestEntryWatcherNotify::resetOfUnknownEntry()
{
    EntryScene& scene = *m_scene;
    QVERIFY(notify(scene, scene.plain("dir"), false));
    QVERIFY(notify(scene, scene.place("Fav", "dir"), false));
    QVERIFY(notify(scene, Entry(), false));
    QCOMPARE(scene.takeLog(), nothing);
}

void TestEntryWatcherNotify::unknownEntryLeavesAKey()
{
    EntryScene& scene = *m_scene;
    const QString dir = scene.tree.path("dir");
    QVERIFY(scene.report("slotPathCreated", dir, "x"));
    QCOMPARE(scene.takeLog(), QStringList{text("created ~/dir/x")});

    QVERIFY(notify(scene, scene.plain("dir"), false));
    // The path has a key now, and nobody in it to be told.
    QVERIFY(scene.report("slotPathCreated", dir, "x"));
    QCOMPARE(scene.takeLog(), nothing);
    // Whoever watches it from now on is.
    scene.watcher.addEntry(scene.plain("dir"));
    QVERIFY(scene.report("slotPathCreated", dir, "x"));
    QCOMPARE(scene.takeLog(), QStringList{text("created ~/dir/x")});
}

void TestEntryWatcherNotify::anyWayIsOffByDefault()
{
    EntryScene& scene = *m_scene;
    QVERIFY(QMetaObject::invokeMethod(
        &scene.watcher, "entryChangedNotify", Qt::DirectConnection,
        Q_ARG(Entry, scene.plain("dir"))));
    QCOMPARE(scene.takeLog(), nothing);
}

void TestEntryWatcherNotify::forwarders()
{
    EntryScene& scene = *m_scene;
    for (bool disabled : {false, true}) {
        scene.watcher.setDisabled(disabled);
        scene.watcher.notifyEntryCreated(scene.plain("dir"));
        scene.watcher.notifyEntryDeleted(VFS::ptr()->computerEntry());
        scene.watcher.notifyEntryChanged(Entry());
        QCOMPARE(
            scene.log,
            (QStringList{text("created ~/dir"), text("deleted Computer"), text("changed (null)")}));
        scene.log.clear();
    }
}

void TestEntryWatcherNotify::disabledDropsEvents()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    scene.watcher.setDisabled(true);
    QVERIFY(scene.isRegistered("dir"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), nothing);
    // A plain directory, by the other road.
    QVERIFY(scene.report("slotPathCreated", scene.tree.path("elsewhere"), "x"));
    QCOMPARE(scene.takeLog(), nothing);

    // What came meanwhile is lost, and what comes from now on is told.
    scene.watcher.setDisabled(false);
    QCOMPARE(scene.processedLog(), nothing);
    QVERIFY(scene.tree.remove("dir/x"));
    QCOMPARE(scene.processedLog(), (QStringList{text("deleted Fav/x"), text("deleted ~/dir/x")}));
}

void TestEntryWatcherNotify::disabledDropsResets()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.plain("dir"));
    scene.watcher.setDisabled(true);
    QVERIFY(notify(scene, scene.plain("dir"), true));
    QVERIFY(notify(scene, scene.plain("dir"), false));
    QCOMPARE(scene.takeLog(), nothing);
    // Nor is a key left behind.
    QVERIFY(notify(scene, scene.plain("other"), false));
    scene.watcher.setDisabled(false);
    QVERIFY(scene.report("slotPathCreated", scene.tree.path("other"), "x"));
    QCOMPARE(scene.takeLog(), QStringList{text("created ~/other/x")});
}

void TestEntryWatcherNotify::vfsNotifiesOne()
{
    EntryScene& scene = *m_scene;
    scene.record(VFS::ptr()->entryWatcher());
    VFS::ptr()->notifyWatchers(scene.plain("missing"));
    QCOMPARE(scene.takeLog(), QStringList{text("reset ~/missing")});
}

void TestEntryWatcherNotify::vfsNotifiesLists()
{
    EntryScene& scene = *m_scene;
    scene.record(VFS::ptr()->entryWatcher());
    EntryList list;
    list << scene.plain("b") << scene.plain("a") << scene.plain("b");
    VFS::ptr()->notifyWatchers(list);
    const QStringList expected{text("reset ~/b"), text("reset ~/a"), text("reset ~/b")};
    QCOMPARE(scene.log, expected);
    scene.log.clear();
    VFS::ptr()->directNotifyWatchers(list, true);
    QCOMPARE(scene.log, expected);
    scene.log.clear();
    VFS::ptr()->notifyWatchers(EntryList());
    QCOMPARE(scene.log, nothing);
}

void TestEntryWatcherNotify::vfsNotifiesWatchedOnly()
{
    EntryScene& scene = *m_scene;
    EntryWatcher* const watcher = VFS::ptr()->entryWatcher();
    scene.record(watcher);
    watcher->addEntry(scene.plain("dir"));
    EntryList list;
    list << scene.plain("other") << scene.plain("dir") << VFS::ptr()->computerEntry();
    VFS::ptr()->directNotifyWatchers(list, false);
    QCOMPARE(scene.log, QStringList{text("reset ~/dir")});
}

QTEST_GUILESS_MAIN(TestEntryWatcherNotify)
#include "tst_entrywatcher_notify.moc"
