// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/entryscene.h"
#include "support/makeentry.h"

#include <QFile>
#include <QMetaMethod>
#include <QSignalSpy>
#include <QTest>

#include <sys/stat.h>

using namespace VeyFM;

// What it holds may change without a break of the binary interface.
static_assert(sizeof(EntryWatcher) == sizeof(QObject) + sizeof(void*));

namespace {

QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

template <typename... Texts>
QStringList lines(Texts... texts)
{
    QStringList result{text(texts)...};
    result.sort();
    return result;
}

const QStringList nothing;

} // namespace

/// The news of the kernel, told as news about entries.
class TestEntryWatcher : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void placeHasTwoIdentities();
    void entriesCarryEverything();
    void throughTheEventLoop();
    void entryBelowPlace();
    void plainDirectory();
    void plainDirectoryGoesAway();
    void attributesOfTheDirectoryItself();
    void directoryOfPlaceGoesAway();
    void keyGoesWithTheDirectory();
    void missingDirectoryKeepsItsKey();
    void linksBringTheirFolder();
    void linkReplacedWithKey();
    void linkReplacedWithoutKey();
    void insideLinkedDirectory();
    void changedLinksWithKey();
    void changedLinksWithoutKey();
    void removingThePlaceLeavesTheWatch();
    void removingThePlainTwinFirst();
    void removingPlainEntry();
    void removingOneOfTwoPlaces();
    void plainEntriesAreNotCounted();
    void twinComesBack();
    void virtualPlacesShareTheEmptyKey();
    void clear();
    void slotsMayChangeTheSet();
    void slotsMayRunAnEventLoop();
    void watchedAgainAfterOverflow();
    void signalOrder();

private:
    QScopedPointer<EntryScene> m_scene;
};

void TestEntryWatcher::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
}

void TestEntryWatcher::init()
{
    m_scene.reset(new EntryScene);
    QVERIFY2(
        m_scene->watcher.isRefreshable(m_scene->tree.path()),
        "TMPDIR lies in a tree that is never watched");
    QVERIFY(m_scene->tree.makeDir("dir"));
}

void TestEntryWatcher::cleanup()
{
    VFSPlaceBase* const tree = VFS::ptr()->placeBase();
    for (const char* name : {"Fav", "Fav2"}) {
        tree->destroyPlace(tree->placeEntry(text(name)));
    }
    m_scene.reset();
}

void TestEntryWatcher::placeHasTwoIdentities()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    QVERIFY(scene.isRegistered("dir"));

    QVERIFY(scene.tree.write("dir/x"));
    QCOMPARE(
        scene.processedLog(),
        lines("created Fav/x", "created ~/dir/x", "changed Fav/x", "changed ~/dir/x"));
    QVERIFY(scene.tree.rename("dir/x", "dir/y"));
    QCOMPARE(
        scene.processedLog(),
        lines("deleted Fav/x", "deleted ~/dir/x", "created Fav/y", "created ~/dir/y"));
    QCOMPARE(::chmod(scene.tree.bytes("dir/y").constData(), 0600), 0);
    QCOMPARE(scene.processedLog(), lines("attributes Fav/y", "attributes ~/dir/y"));
    QVERIFY(scene.tree.remove("dir/y"));
    QCOMPARE(scene.processedLog(), lines("deleted Fav/y", "deleted ~/dir/y"));
}

void TestEntryWatcher::entriesCarryEverything()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    QVERIFY(scene.tree.makeDir("dir/sub"));
    QCOMPARE(scene.processedLog(), lines("created Fav/sub", "created ~/dir/sub"));
    for (const Entry& entry : qAsConst(scene.entries)) {
        QCOMPARE(entry.localPath(), scene.tree.path("dir/sub"));
        QCOMPARE(entry.type(), int(TypeDir));
    }
}

void TestEntryWatcher::throughTheEventLoop()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.plain("dir"));
    QSignalSpy created(&scene.watcher, &EntryWatcher::entryCreated);
    QVERIFY(scene.tree.write("dir/x"));
    QVERIFY(created.wait());
    QCOMPARE(created.first().first().value<Entry>(), scene.plain("dir/x"));
}

void TestEntryWatcher::entryBelowPlace()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeDir("dir/sub"));
    scene.place("Fav", "dir");
    scene.watcher.addEntry(VFS::ptr()->entry(text("Fav/sub")));

    QVERIFY(scene.tree.write("dir/sub/x"));
    QVERIFY(scene.processedLog().contains(text("created Fav/sub/x")));
    QVERIFY(scene.tree.remove("dir/sub/x"));
    QCOMPARE(scene.processedLog(), lines("deleted Fav/sub/x", "deleted ~/dir/sub/x"));
    // No place, so it dies with its directory.
    QVERIFY(scene.tree.remove("dir/sub"));
    QCOMPARE(scene.processedLog(), lines("deleted Fav/sub", "deleted ~/dir/sub"));
}

void TestEntryWatcher::plainDirectory()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.write("dir/x"));
    scene.watcher.addEntry(scene.plain("dir"));
    QVERIFY(scene.tree.write("dir/x"));
    QCOMPARE(scene.processedLog(), lines("changed ~/dir/x"));
    QVERIFY(scene.tree.remove("dir/x"));
    QCOMPARE(scene.processedLog(), lines("deleted ~/dir/x"));
}

void TestEntryWatcher::plainDirectoryGoesAway()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.plain("dir"));
    QVERIFY(scene.tree.remove("dir"));
    // The slash behind the path is gone.
    QCOMPARE(scene.processedLog(), lines("deleted ~/dir"));
    QVERIFY(!scene.isRegistered("dir"));
}

void TestEntryWatcher::attributesOfTheDirectoryItself()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    QCOMPARE(::chmod(scene.tree.bytes("dir").constData(), 0700), 0);
    QCOMPARE(scene.processedLog(), lines("attributes Fav", "attributes ~/dir"));
}

void TestEntryWatcher::directoryOfPlaceGoesAway()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    QVERIFY(scene.tree.remove("dir"));
    // A place does not die with its directory, and its twin does.
    QCOMPARE(scene.processedLog(), lines("changed Fav", "deleted ~/dir"));
}

void TestEntryWatcher::keyGoesWithTheDirectory()
{
    EntryScene& scene = *m_scene;
    const Entry place = scene.place("Fav", "dir");
    scene.watcher.addEntry(place);
    QVERIFY(scene.tree.remove("dir"));
    scene.processedLog();

    QVERIFY(scene.tree.makeDir("dir"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), nothing);
    QVERIFY(scene.report("slotPathCreated", scene.tree.path("dir"), "x"));
    QCOMPARE(scene.takeLog(), lines("created ~/dir/x"));

    scene.watcher.addEntry(place);
    QVERIFY(scene.tree.makeDir("dir/y"));
    QCOMPARE(scene.processedLog(), lines("created Fav/y", "created ~/dir/y"));
}

void TestEntryWatcher::missingDirectoryKeepsItsKey()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.place("Fav", "missing"));
    QVERIFY(!scene.isRegistered("missing"));
    QVERIFY(scene.report("slotPathChanged", scene.tree.path("missing")));
    QCOMPARE(scene.takeLog(), lines("changed Fav", "changed ~/missing"));
    // Its twin was no directory when it was made, and has no children.
    QVERIFY(scene.report("slotPathCreated", scene.tree.path("missing"), "x"));
    QCOMPARE(scene.takeLog(), lines("created Fav/x", "created (null)"));
}

void TestEntryWatcher::linksBringTheirFolder()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeDir("links"));
    QVERIFY(scene.tree.makeLink("../dir", "links/link"));
    scene.watcher.addEntry(scene.plain("links/link"));
    QVERIFY(scene.isRegistered("links/link"));
    QVERIFY(scene.isRegistered("links"));
    QVERIFY(scene.isRegistered("dir"));
    // And that is where one sees it moved away.
    QVERIFY(scene.tree.rename("links/link", "moved"));
    QVERIFY(scene.processedLog().contains(text("deleted ~/links/link")));
}

void TestEntryWatcher::linkReplacedWithKey()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeLink("/usr", "dir/link"));
    scene.place("Fav", "dir");
    scene.watcher.addEntry(VFS::ptr()->entry(text("Fav/link")));
    QVERIFY(scene.tree.remove("dir/link"));
    QVERIFY(scene.tree.makeLink("/etc", "dir/link"));
    const QStringList log = scene.processedLog();
    QCOMPARE(log.filter(text("reset")), lines("reset Fav/link", "reset ~/dir/link"));
    QCOMPARE(log.filter(text("changed")), nothing);
    QCOMPARE(log.filter(text("deleted")), nothing);
}

void TestEntryWatcher::linkReplacedWithoutKey()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeLink("/usr", "link"));
    scene.watcher.addEntry(scene.plain("link"));
    QVERIFY(scene.tree.remove("link"));
    QVERIFY(scene.tree.makeLink("/etc", "link"));
    const QStringList log = scene.processedLog();
    QCOMPARE(log.filter(text("reset")), lines("reset ~/link"));
    QCOMPARE(log.filter(text("changed")), nothing);
}

void TestEntryWatcher::insideLinkedDirectory()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeLink("dir", "link"));
    scene.watcher.addEntry(scene.plain("link"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created ~/dir/x", "created ~/link/x"));
}

// With a key the disk is asked: any link is reset.
void TestEntryWatcher::changedLinksWithKey()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.write("dir/file"));
    QVERIFY(scene.tree.makeLink("/usr", "dir/todir"));
    QVERIFY(scene.tree.makeLink("file", "dir/tofile"));
    QVERIFY(scene.tree.makeLink("nowhere", "dir/dangling"));
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    const QString dir = scene.tree.path("dir");

    QVERIFY(scene.report("slotPathChanged", dir, "todir"));
    QCOMPARE(scene.takeLog(), lines("reset Fav/todir", "reset ~/dir/todir"));
    QVERIFY(scene.report("slotPathChanged", dir, "tofile"));
    QCOMPARE(scene.takeLog(), lines("reset Fav/tofile", "reset ~/dir/tofile"));
    QVERIFY(scene.report("slotPathChanged", dir, "dangling"));
    QCOMPARE(scene.takeLog(), lines("reset Fav/dangling", "reset ~/dir/dangling"));
    QVERIFY(scene.report("slotPathChanged", dir, "file"));
    QCOMPARE(scene.takeLog(), lines("changed Fav/file", "changed ~/dir/file"));

    // Only what changed is reset.
    QVERIFY(scene.report("slotPathDeleted", dir, "todir"));
    QCOMPARE(scene.takeLog(), lines("deleted Fav/todir", "deleted ~/dir/todir"));
    QVERIFY(scene.report("slotPathCreated", dir, "todir"));
    QCOMPARE(scene.takeLog(), lines("created Fav/todir", "created ~/dir/todir"));
    QVERIFY(scene.report("slotPathAttributesChanged", dir, "todir"));
    QCOMPARE(scene.takeLog(), lines("attributes Fav/todir", "attributes ~/dir/todir"));
}

// Without one the entry is: only a link to a directory is.
void TestEntryWatcher::changedLinksWithoutKey()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.write("dir/file"));
    QVERIFY(scene.tree.makeLink("/usr", "dir/todir"));
    QVERIFY(scene.tree.makeLink("file", "dir/tofile"));
    QVERIFY(scene.tree.makeLink("nowhere", "dir/dangling"));
    const QString dir = scene.tree.path("dir");

    QVERIFY(scene.report("slotPathChanged", dir, "todir"));
    QCOMPARE(scene.takeLog(), lines("reset ~/dir/todir"));
    QVERIFY(scene.report("slotPathChanged", dir, "tofile"));
    QCOMPARE(scene.takeLog(), lines("changed ~/dir/tofile"));
    QVERIFY(scene.report("slotPathChanged", dir, "dangling"));
    QCOMPARE(scene.takeLog(), lines("changed ~/dir/dangling"));
    QVERIFY(scene.report("slotPathDeleted", dir, "todir"));
    QCOMPARE(scene.takeLog(), lines("deleted ~/dir/todir"));
    QVERIFY(scene.report("slotPathAttributesChanged", dir, "todir"));
    QCOMPARE(scene.takeLog(), lines("attributes ~/dir/todir"));
}

void TestEntryWatcher::removingThePlaceLeavesTheWatch()
{
    EntryScene& scene = *m_scene;
    const Entry place = scene.place("Fav", "dir");
    scene.watcher.addEntry(place);
    scene.watcher.removeEntry(place);
    // The key is gone and the watch is not, so news come by the road of plain directories.
    QVERIFY(scene.isRegistered("dir"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created ~/dir/x"));
    // Now it is a plain directory like any other.
    scene.watcher.removeEntry(scene.plain("dir"));
    QVERIFY(!scene.isRegistered("dir"));
}

void TestEntryWatcher::removingThePlainTwinFirst()
{
    EntryScene& scene = *m_scene;
    const Entry place = scene.place("Fav", "dir");
    scene.watcher.addEntry(place);
    scene.watcher.removeEntry(scene.plain("dir"));
    QVERIFY(scene.isRegistered("dir"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created Fav/x"));
    // Nothing is left of the set this time, so the watch ends.
    scene.watcher.removeEntry(place);
    QVERIFY(!scene.isRegistered("dir"));
    QVERIFY(scene.tree.makeDir("dir/y"));
    QCOMPARE(scene.processedLog(), nothing);
}

void TestEntryWatcher::removingPlainEntry()
{
    EntryScene& scene = *m_scene;
    const Entry dir = scene.plain("dir");
    scene.watcher.addEntry(dir);
    scene.watcher.removeEntry(dir);
    QVERIFY(!scene.isRegistered("dir"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), nothing);
    // No key stays behind: with one, this would find no entry to be about.
    QVERIFY(scene.report("slotPathCreated", scene.tree.path("dir"), "x"));
    QCOMPARE(scene.takeLog(), lines("created ~/dir/x"));

    // One that nobody watches, and one that can't be watched.
    scene.watcher.removeEntry(dir);
    scene.watcher.removeEntry(VFS::ptr()->entry(text("/proc/self")));
    QCOMPARE(scene.takeLog(), nothing);
}

void TestEntryWatcher::removingOneOfTwoPlaces()
{
    EntryScene& scene = *m_scene;
    const Entry first = scene.place("Fav", "dir");
    const Entry second = scene.place("Fav2", "dir");
    scene.watcher.addEntry(first);
    scene.watcher.addEntry(second);
    scene.watcher.removeEntry(first);
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created Fav2/x", "created ~/dir/x"));
    scene.watcher.removeEntry(second);
    QVERIFY(scene.tree.makeDir("dir/y"));
    QCOMPARE(scene.processedLog(), lines("created ~/dir/y"));
}

void TestEntryWatcher::plainEntriesAreNotCounted()
{
    EntryScene& scene = *m_scene;
    const Entry dir = scene.plain("dir");
    scene.watcher.addEntry(dir);
    scene.watcher.addEntry(dir);
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created ~/dir/x"));
    // The first to go ends it for both.
    scene.watcher.removeEntry(dir);
    QVERIFY(scene.tree.makeDir("dir/y"));
    QCOMPARE(scene.processedLog(), nothing);
}

void TestEntryWatcher::twinComesBack()
{
    EntryScene& scene = *m_scene;
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    scene.watcher.removeEntry(scene.plain("dir"));
    scene.watcher.addEntry(scene.plain("dir"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created Fav/x", "created ~/dir/x"));
}

void TestEntryWatcher::virtualPlacesShareTheEmptyKey()
{
    EntryScene& scene = *m_scene;
    const Entry computer = VFS::ptr()->computerEntry();
    const Entry places = VFS::ptr()->placesEntry();
    scene.watcher.addEntry(computer);
    scene.watcher.addEntry(places);
    QVERIFY(!scene.inotify->isPathRegistered(QString()));
    // What stands for the path "" is no entry at all, and is told like the others.
    QVERIFY(scene.report("slotPathChanged", QString()));
    QCOMPARE(scene.takeLog(), lines("changed Computer", "changed Places", "changed (null)"));
    QVERIFY(scene.report("slotPathDeleted", QString()));
    QCOMPARE(scene.takeLog(), lines("deleted Computer", "deleted Places", "deleted (null)"));

    scene.watcher.removeEntry(computer);
    scene.watcher.removeEntry(places);
    // A null entry counts as based on a place, so it is not taken for a plain twin.
    QVERIFY(scene.report("slotPathChanged", QString()));
    QCOMPARE(scene.takeLog(), lines("changed (null)"));
    scene.watcher.removeEntry(Entry());
    QVERIFY(scene.report("slotPathChanged", QString()));
    QCOMPARE(scene.takeLog(), lines("changed File System"));
}

void TestEntryWatcher::clear()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeDir("other"));
    scene.watcher.addEntry(scene.place("Fav", "dir"));
    scene.watcher.addEntry(scene.plain("other"));
    scene.watcher.clear();
    QVERIFY(!scene.isRegistered("dir"));
    QVERIFY(!scene.isRegistered("other"));
    QVERIFY(scene.tree.makeDir("dir/x"));
    QVERIFY(scene.tree.makeDir("other/x"));
    QCOMPARE(scene.processedLog(), nothing);
    QVERIFY(scene.report("slotPathCreated", scene.tree.path("dir"), "x"));
    QCOMPARE(scene.takeLog(), lines("created ~/dir/x"));
}

void TestEntryWatcher::slotsMayChangeTheSet()
{
    EntryScene& scene = *m_scene;
    const Entry first = scene.place("Fav", "dir");
    const Entry second = scene.place("Fav2", "dir");
    scene.watcher.addEntry(first);
    scene.watcher.addEntry(second);
    connect(&scene.watcher, &EntryWatcher::entryCreated, this, [&] {
        scene.watcher.removeEntry(first);
        scene.watcher.removeEntry(second);
        scene.watcher.removeEntry(scene.plain("dir"));
        scene.watcher.addEntry(scene.plain("dir"));
    });
    // All are told of what happened while they were there.
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created Fav/x", "created Fav2/x", "created ~/dir/x"));
    QVERIFY(scene.tree.makeDir("dir/y"));
    QCOMPARE(scene.processedLog(), lines("created ~/dir/y"));
}

// What is left of an older batch is told before a newer one that the event loop reads.
void TestEntryWatcher::slotsMayRunAnEventLoop()
{
    EntryScene& scene = *m_scene;
    QVERIFY(scene.tree.makeDir("dir/x"));
    scene.watcher.addEntry(scene.plain("dir"));
    QMetaObject::Connection once;
    once = connect(&scene.watcher, &EntryWatcher::entryCreated, this, [&] {
        disconnect(once);
        scene.tree.makeDir("dir/x");
        QTRY_COMPARE(scene.log.size(), 3);
    });
    QVERIFY(scene.tree.makeDir("dir/a"));
    QVERIFY(scene.tree.remove("dir/x"));
    QTRY_VERIFY(!scene.log.isEmpty());
    QCOMPARE(
        scene.log,
        (QStringList{text("created ~/dir/a"), text("deleted ~/dir/x"), text("created ~/dir/x")}));
}

// The end of the watch was among the events that the kernel had no room for.
void TestEntryWatcher::watchedAgainAfterOverflow()
{
    EntryScene& scene = *m_scene;
    QFile limit(text("/proc/sys/fs/inotify/max_queued_events"));
    QVERIFY(limit.open(QIODevice::ReadOnly));
    const int events = limit.readAll().trimmed().toInt() + 10;
    QVERIFY(scene.tree.makeDir("noise") && scene.tree.makeDir("noise/a"));
    QVERIFY(scene.tree.makeDir("noise/b"));
    const Entry place = scene.place("Fav", "dir");
    scene.watcher.addEntry(scene.plain("noise"));
    scene.watcher.addEntry(place);
    const QByteArray noisy[] = {scene.tree.bytes("noise/a"), scene.tree.bytes("noise/b")};
    for (int i = 0; i < events; ++i) { // equal events in a row would be merged
        QCOMPARE(::chmod(noisy[i % 2].constData(), 0700), 0);
    }
    QVERIFY(scene.tree.remove("dir"));
    scene.processedLog();
    QVERIFY(!scene.isRegistered("dir"));
    QVERIFY(scene.isRegistered("noise"));

    QVERIFY(scene.tree.makeDir("dir"));
    scene.watcher.removeEntry(place);
    scene.watcher.addEntry(place);
    QVERIFY(scene.tree.makeDir("dir/x"));
    QCOMPARE(scene.processedLog(), lines("created Fav/x", "created ~/dir/x"));
}

void TestEntryWatcher::signalOrder()
{
    QList<QByteArray> names;
    const QMetaObject& meta = EntryWatcher::staticMetaObject;
    for (int i = meta.methodOffset(); i < meta.methodCount(); ++i) {
        if (meta.method(i).methodType() == QMetaMethod::Signal) {
            names.append(meta.method(i).methodSignature());
        }
    }
    QCOMPARE(
        names, (QList<QByteArray>{
                   "entryCreated(Entry)", "entryDeleted(Entry)", "entryChanged(Entry)",
                   "entryAttributesChanged(Entry)", "entryReset(Entry)"}));
}

QTEST_GUILESS_MAIN(TestEntryWatcher)
#include "tst_entrywatcher.moc"
