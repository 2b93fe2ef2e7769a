// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/watchscene.h"

#include <QElapsedTimer>
#include <QSignalSpy>
#include <QTimer>
#include <QtTest>

#include <algorithm>

using VeyFM::InotifyWatcher;

namespace {

// Watches "dir", and in it "link" to "target".
bool watchLinkInDirectory(WatchScene& scene)
{
    return scene.makeDir("dir") && scene.makeDir("target") &&
           scene.makeLink("target", "dir/link") && scene.add("dir") && scene.add("dir/link");
}

// Watches "link1" and "link2" to "target", whose directory nobody watches.
bool watchTwoLinks(WatchScene& scene)
{
    return scene.makeDir("target") && scene.makeLink("target", "link1") &&
           scene.makeLink("target", "link2") && scene.add("link1") && scene.add("link2");
}

} // namespace

// What becomes of a watched link that is deleted. Calling notifyDeletedSymlinks() by hand ends
// the wait at once.
class TestInotifyWatcherGrace : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void recreatedLink();
    void recreatedAsFile();
    void deletedLink();
    void deletedLinkWithoutDirectory();
    void allToldBeforeForgotten();
    void linkOfDeletedLink();
    void movedLink();
    void linkMovedInDuringGrace();
    void overwrittenLink();
    void otherSpellingOfDirectory();
    void removedDuringGrace();
    void clearDuringGrace();
    void firstTimerSettlesAll();
    void everyRunStartsTimer();
};

void TestInotifyWatcherGrace::recreatedLink()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("old") && scene.makeDir("new"));
    QVERIFY(scene.makeLink("old", "dir/link"));
    QVERIFY(scene.add("dir") && scene.add("dir/link"));
    QVERIFY(scene.unlink("dir/link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(scene.isRegistered("dir/link"));
    QVERIFY(scene.isLinkRegistered("dir/link"));
    QVERIFY(scene.makeLink("new", "dir/link"));
    QCOMPARE(scene.processedLog(), lines({"changed dir/link|"}));

    // The watch is set up anew, for the new target.
    QVERIFY(scene.makeDir("new/sub"));
    QVERIFY(scene.makeDir("old/sub"));
    QCOMPARE(
        scene.processedLog(),
        lines({"created new|sub", "created dir/link|sub", "created old|sub"}));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), QStringList());

    // Both in one batch come to the same.
    QVERIFY(scene.unlink("dir/link") && scene.makeLink("new", "dir/link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), lines({"changed dir/link|"}));
    QVERIFY(scene.removeDir("new/sub"));
    QCOMPARE(scene.processedLog(), lines({"deleted new|sub", "deleted dir/link|sub"}));
}

void TestInotifyWatcherGrace::recreatedAsFile()
{
    WatchScene scene;
    QVERIFY(watchLinkInDirectory(scene));
    QVERIFY(scene.unlink("dir/link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(scene.makeDir("dir/link"));
    QCOMPARE(scene.processedLog(), lines({"created dir|link"}));
    QVERIFY(!scene.isRegistered("dir/link"));
    QVERIFY(!scene.isLinkRegistered("dir/link"));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), QStringList());
}

void TestInotifyWatcherGrace::deletedLink()
{
    WatchScene scene;
    QVERIFY(watchLinkInDirectory(scene));
    QSignalSpy unregistered(scene.watcher.get(), &InotifyWatcher::pathUnregistered);
    QVERIFY(scene.unlink("dir/link"));
    QElapsedTimer elapsed;
    elapsed.start();
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(scene.isRegistered("dir/link"));
    QVERIFY(unregistered.wait());
    QVERIFY2(elapsed.elapsed() >= 490, qPrintable(QString::number(elapsed.elapsed())));
    QCOMPARE(scene.takeLog(), lines({"deleted dir/link|", "unregistered dir/link"}));
    QVERIFY(!scene.isRegistered("dir/link"));
    QVERIFY(!scene.isLinkRegistered("dir/link"));
    QVERIFY(scene.isRegistered("target"));
    // Created again too late, it is an ordinary child.
    QVERIFY(scene.makeLink("target", "dir/link"));
    QCOMPARE(scene.processedLog(), lines({"created dir|link"}));
}

void TestInotifyWatcherGrace::deletedLinkWithoutDirectory()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.unlink("link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    // Only the directory could tell that the link has come back.
    QVERIFY(scene.makeLink("target", "link"));
    QCOMPARE(scene.processedLog(), QStringList());
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), lines({"deleted link|", "unregistered link"}));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), QStringList());
}

void TestInotifyWatcherGrace::allToldBeforeForgotten()
{
    WatchScene scene;
    QVERIFY(watchTwoLinks(scene));
    QVERIFY(scene.unlink("link1") && scene.unlink("link2"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QStringList log = scene.takeLog();
    QCOMPARE(log.size(), 4);
    std::sort(log.begin(), log.begin() + 2);
    std::sort(log.begin() + 2, log.end());
    QCOMPARE(
        log,
        lines({"deleted link1|", "deleted link2|", "unregistered link1", "unregistered link2"}));
}

void TestInotifyWatcherGrace::linkOfDeletedLink()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target"));
    QVERIFY(scene.makeLink("target", "link1") && scene.makeLink("link1", "link2"));
    QVERIFY(scene.add("link1") && scene.add("link2"));
    QVERIFY(scene.unlink("link1"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), lines({"deleted link1|", "changed link2|", "unregistered link1"}));
    QVERIFY(scene.isRegistered("link1")); // link2 needs it
    QVERIFY(!scene.isLinkRegistered("link1"));
}

void TestInotifyWatcherGrace::movedLink()
{
    WatchScene scene;
    QVERIFY(watchLinkInDirectory(scene));
    QVERIFY(scene.rename("dir/link", "elsewhere"));
    QCOMPARE(scene.processedLog(), lines({"deleted dir|link", "deleted dir/link|"}));
    QVERIFY(!scene.isRegistered("dir/link"));
    QVERIFY(!scene.isLinkRegistered("dir/link"));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), QStringList());
}

void TestInotifyWatcherGrace::linkMovedInDuringGrace()
{
    WatchScene scene;
    QVERIFY(watchLinkInDirectory(scene) && scene.makeLink("target", "spare"));
    QVERIFY(scene.unlink("dir/link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    // Only a link that is created ends the wait, so it is declared dead all the same.
    QVERIFY(scene.rename("spare", "dir/link"));
    QCOMPARE(scene.processedLog(), lines({"created dir|link"}));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), lines({"deleted dir/link|", "unregistered dir/link"}));
}

void TestInotifyWatcherGrace::overwrittenLink()
{
    WatchScene scene;
    QVERIFY(watchLinkInDirectory(scene) && scene.makeLink("target", "spare"));
    // The directory tells of an arrival, the overwritten link of its own end.
    QVERIFY(scene.rename("spare", "dir/link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), lines({"created dir|link"}));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), lines({"deleted dir/link|", "unregistered dir/link"}));
}

void TestInotifyWatcherGrace::otherSpellingOfDirectory()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("target"));
    QVERIFY(scene.makeLink("target", "dir/link"));
    QVERIFY(scene.add("dir/") && scene.add("dir/link"));
    QVERIFY(scene.unlink("dir/link"));
    // For the directory the child is "dir//link", which is no registered link.
    QCOMPARE(scene.processedLogWithoutAttributes(), lines({"deleted dir/|link"}));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), lines({"deleted dir/link|", "unregistered dir/link"}));
}

void TestInotifyWatcherGrace::removedDuringGrace()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.unlink("link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(!scene.remove("link")); // the kernel has dropped the watch
    QVERIFY(!scene.isLinkRegistered("link"));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), lines({"deleted link|", "unregistered link"}));
    QVERIFY(!scene.isRegistered("link"));
}

void TestInotifyWatcherGrace::clearDuringGrace()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.unlink("link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(!scene.watcher->clear());
    QVERIFY(scene.isRegistered("link"));
    QTRY_COMPARE(scene.log, lines({"deleted link|", "unregistered link"}));
    QVERIFY(!scene.isRegistered("link"));
}

void TestInotifyWatcherGrace::firstTimerSettlesAll()
{
    WatchScene scene;
    QVERIFY(watchTwoLinks(scene));
    QVERIFY(scene.unlink("link1"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QVERIFY(scene.unlink("link2"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QSignalSpy unregistered(scene.watcher.get(), &InotifyWatcher::pathUnregistered);
    QVERIFY(unregistered.wait());
    QCOMPARE(unregistered.size(), 2); // one timer for both
    QCOMPARE(scene.log.size(), 4);
}

void TestInotifyWatcherGrace::everyRunStartsTimer()
{
    WatchScene scene;
    QVERIFY(watchTwoLinks(scene));
    QVERIFY(scene.unlink("link1"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());

    // Runs with nothing to read start timers too, as long as a link waits.
    QTimer runs;
    connect(&runs, &QTimer::timeout, scene.watcher.get(), [&scene] { scene.process(); });
    runs.start(20);
    QSignalSpy unregistered(scene.watcher.get(), &InotifyWatcher::pathUnregistered);
    QVERIFY(unregistered.wait());
    runs.stop();

    // So a link that is deleted now waits for the next of those only.
    QVERIFY(scene.unlink("link2"));
    QElapsedTimer elapsed;
    elapsed.start();
    QVERIFY(unregistered.wait());
    QVERIFY2(elapsed.elapsed() < 400, qPrintable(QString::number(elapsed.elapsed())));
    QVERIFY(scene.log.contains(QStringLiteral("deleted link2|")));
}

QTEST_GUILESS_MAIN(TestInotifyWatcherGrace)
#include "tst_inotifywatchergrace.moc"
