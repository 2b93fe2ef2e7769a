// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/watchscene.h"

#include <QtTest>

#include <sched.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>

using VeyFM::InotifyWatcher;

namespace {

// As many events as the kernel keeps.
int queueLimit()
{
    QFile limit(QStringLiteral("/proc/sys/fs/inotify/max_queued_events"));
    return limit.open(QIODevice::ReadOnly) ? limit.readAll().trimmed().toInt() : 0;
}

// Fills the queue of a watcher of "noise", so that what comes next is dropped.
bool overflow(const WatchScene& scene)
{
    const QByteArray a = QFile::encodeName(scene.path("noise/a"));
    const QByteArray b = QFile::encodeName(scene.path("noise/b"));
    const int limit = queueLimit();
    bool done = limit > 0;
    for (int i = 0; done && i < limit + 10; ++i) { // equal events in a row would be merged
        done = chmod(i % 2 == 0 ? a.constData() : b.constData(), 0600) == 0;
    }
    return done;
}

bool makeNoise(WatchScene& scene)
{
    return scene.makeDir("noise") && scene.write("noise/a") && scene.write("noise/b") &&
           scene.add("noise");
}

// What was told beside the noise.
QStringList withoutNoise(const QStringList& log)
{
    QStringList result;
    for (const QString& line : log) {
        if (!line.startsWith(QLatin1String("attributes noise|"))) {
            result.append(line);
        }
    }
    return result;
}

// Runs in a child process: 0 if a watcher that can't ask the kernel leaves its records as they
// are, 77 if /proc can't be hidden here, else the number of the step that went wrong.
int runWithoutProc()
{
    WatchScene scene;
    if (!makeNoise(scene) || !scene.makeDir("dir") || !scene.add("dir") || !overflow(scene) ||
        !scene.removeDir("dir")) {
        return 1;
    }
    if (unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0 ||
        mount("none", "/proc", "tmpfs", 0, nullptr) != 0) {
        return 77;
    }
    if (!withoutNoise(scene.processedLog()).isEmpty()) {
        return 2;
    }
    return scene.isRegistered("dir") && scene.isRegistered("noise") ? 0 : 3;
}

// What such a child came to.
int exitCodeOf(pid_t child)
{
    int status = 0;
    return waitpid(child, &status, 0) == child && WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

} // namespace

// More events than the kernel keeps: what it drops is lost, the ends of watches aside.
class TestInotifyWatcherOverflow : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void dropsNewest();
    void endedWatch();
    void onlyWatch();
    void links();
    void twoSpellings();
    void endOnItsWay();
    void newWatch();
    void twice();
    void withoutProc();
    void slotDeletesWatcher();
};

void TestInotifyWatcherOverflow::dropsNewest()
{
    const int limit = queueLimit();
    if (limit > 200000) {
        QSKIP("The kernel's event queue is too long to be filled here.");
    }

    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.write("dir/a") && scene.write("dir/b"));
    QVERIFY(scene.add("dir"));
    const QByteArray a = QFile::encodeName(scene.path("dir/a"));
    const QByteArray b = QFile::encodeName(scene.path("dir/b"));
    for (int i = 0; i < limit + 100; ++i) { // equal events in a row would be merged
        QCOMPARE(chmod(i % 2 == 0 ? a.constData() : b.constData(), 0600), 0);
    }
    const QStringList log = scene.processedLog();
    QCOMPARE(log.size(), limit);
    QCOMPARE(log.count(QStringLiteral("attributes dir|a")), (limit + 1) / 2);
    QCOMPARE(log.count(QStringLiteral("attributes dir|b")), limit / 2);
    QVERIFY(scene.unlink("dir/a"));
    QCOMPARE(scene.processedLog(), lines({"deleted dir|a"}));
}

// Together with the end of its watch, the deletion of a directory was dropped. Without the end it
// would never be watched again.
void TestInotifyWatcherOverflow::endedWatch()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(scene.makeDir("dir") && scene.makeDir("dir/sub") && scene.makeDir("kept"));
    QVERIFY(scene.add("dir") && scene.add("dir/sub") && scene.add("kept"));
    QVERIFY(overflow(scene));
    QVERIFY(scene.removeDir("dir/sub") && scene.removeDir("dir"));
    QCOMPARE(
        withoutNoise(scene.processedLog()), lines({"unregistered dir", "unregistered dir/sub"}));
    QVERIFY(!scene.isRegistered("dir"));
    QVERIFY(!scene.isRegistered("dir/sub"));

    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.makeDir("dir/x") && scene.makeDir("kept/y") && scene.makeDir("noise/z"));
    QCOMPARE(scene.processedLog(), lines({"created dir|x", "created kept|y", "created noise|z"}));
    QVERIFY(scene.watcher->clear());
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcherOverflow::onlyWatch()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(overflow(scene));
    QVERIFY(scene.unlink("noise/a") && scene.unlink("noise/b") && scene.removeDir("noise"));
    QCOMPARE(withoutNoise(scene.processedLog()), lines({"unregistered noise"}));
    QVERIFY(makeNoise(scene));
}

void TestInotifyWatcherOverflow::links()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.makeDir("other") && scene.makeLink("other", "gone"));
    QVERIFY(scene.add("link") && scene.add("gone"));
    QVERIFY(overflow(scene));
    QVERIFY(scene.removeDir("target") && scene.unlink("gone"));
    QCOMPARE(
        withoutNoise(scene.processedLog()), lines({"unregistered gone", "unregistered target"}));
    QVERIFY(!scene.isLinkRegistered("gone"));
    // As ever, the target of a link that is gone stays watched.
    QVERIFY(scene.isRegistered("other"));
    QVERIFY(scene.isLinkRegistered("link"));

    QVERIFY(scene.makeDir("target"));
    QVERIFY(scene.add("target"));
    QVERIFY(scene.makeDir("target/x"));
    QCOMPARE(scene.processedLog(), lines({"created target|x", "created link|x"}));
}

void TestInotifyWatcherOverflow::twoSpellings()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(scene.makeDir("dir") && scene.add("dir") && scene.add("dir/"));
    QVERIFY(overflow(scene));
    QVERIFY(scene.removeDir("dir"));
    QCOMPARE(withoutNoise(scene.processedLog()), lines({"unregistered dir", "unregistered dir/"}));
    QVERIFY(scene.makeDir("dir") && scene.add("dir") && scene.add("dir/"));
}

// What the kernel has not dropped is told in full, and once.
void TestInotifyWatcherOverflow::endOnItsWay()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(scene.makeDir("dir") && scene.add("dir"));
    QVERIFY(overflow(scene));
    QMetaObject::Connection once;
    once = connect(
        scene.watcher.get(), &InotifyWatcher::pathAttributesChanged, scene.watcher.get(), [&] {
            disconnect(once);
            scene.removeDir("dir");
        });
    QCOMPARE(withoutNoise(scene.processedLog()), lines({"deleted dir|", "unregistered dir"}));
    QCOMPARE(scene.processedLog(), QStringList());
}

// A slot that begins a new watch before its turn comes keeps it.
void TestInotifyWatcherOverflow::newWatch()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(scene.makeDir("a") && scene.makeDir("b") && scene.add("a") && scene.add("b"));
    QVERIFY(overflow(scene));
    QVERIFY(scene.removeDir("a") && scene.removeDir("b"));
    connect(scene.watcher.get(), &InotifyWatcher::pathUnregistered, scene.watcher.get(), [&] {
        scene.makeDir("b");
        scene.watcher->removePath(scene.path("b"), false);
        scene.add("b");
    });
    QCOMPARE(withoutNoise(scene.processedLog()), lines({"unregistered a"}));
    QVERIFY(scene.makeDir("b/x"));
    QCOMPARE(scene.processedLog(), lines({"created b|x"}));
}

// More is dropped while the first overflow is told.
void TestInotifyWatcherOverflow::twice()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(scene.makeDir("a") && scene.makeDir("b") && scene.makeDir("c"));
    QVERIFY(scene.add("a") && scene.add("b") && scene.add("c"));
    QVERIFY(overflow(scene));
    QVERIFY(scene.removeDir("a"));
    int told = 0;
    const int limit = queueLimit();
    bool done = true;
    connect(scene.watcher.get(), &InotifyWatcher::pathAttributesChanged, scene.watcher.get(), [&] {
        ++told;
        if (told == 1) {
            done = overflow(scene) && scene.removeDir("b");
        } else if (told == limit + 1) {
            done = done && overflow(scene) && scene.removeDir("c");
        }
    });
    scene.process();
    QTRY_VERIFY(!scene.isRegistered("c"));
    QVERIFY(done);
    QCOMPARE(
        withoutNoise(scene.takeLog()),
        lines({"unregistered a", "unregistered b", "unregistered c"}));
    QVERIFY(scene.isRegistered("noise"));
}

void TestInotifyWatcherOverflow::withoutProc()
{
    const pid_t child = fork();
    QVERIFY(child != -1);
    if (child == 0) {
        _exit(runWithoutProc());
    }
    const int code = exitCodeOf(child);
    if (code == 77) {
        QSKIP("/proc can't be hidden here: no namespaces of one's own.");
    }
    QCOMPARE(code, 0);
}

void TestInotifyWatcherOverflow::slotDeletesWatcher()
{
    WatchScene scene;
    QVERIFY(makeNoise(scene));
    QVERIFY(scene.makeDir("a") && scene.makeDir("b") && scene.add("a") && scene.add("b"));
    QVERIFY(overflow(scene));
    QVERIFY(scene.removeDir("a") && scene.removeDir("b"));
    connect(scene.watcher.get(), &InotifyWatcher::pathUnregistered, scene.watcher.get(), [&] {
        scene.watcher.reset();
    });
    QTRY_VERIFY(!scene.watcher);
    QCOMPARE(withoutNoise(scene.takeLog()), lines({"unregistered a"}));
}

QTEST_GUILESS_MAIN(TestInotifyWatcherOverflow)
#include "tst_inotifywatcheroverflow.moc"
