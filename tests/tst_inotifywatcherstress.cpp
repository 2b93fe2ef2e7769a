// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/watchscene.h"

#include <QtTest>

#include <fcntl.h>
#include <sched.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>

using VeyFM::InotifyWatcher;

namespace {

// Runs in a child process: 0 if a watch beyond the limit is refused and everything else goes on,
// 77 if the limit can't be lowered here, else the number of the step that went wrong.
int runWithThreeWatches(const WatchScene& scene)
{
    if (unshare(CLONE_NEWUSER) != 0) {
        return 77;
    }
    const int limit = open("/proc/sys/user/max_inotify_watches", O_WRONLY);
    if (limit == -1 || write(limit, "3", 1) != 1) {
        return 77;
    }
    close(limit);

    InotifyWatcher watcher(nullptr);
    if (!watcher.addPath(scene.path("a")) || !watcher.addPath(scene.path("b"))) {
        return 1;
    }
    // The link takes the last watch, and there is none left for its target.
    if (watcher.addPath(scene.path("link")) || !watcher.isPathRegistered(scene.path("link"))) {
        return 2;
    }
    if (watcher.isSymlinkRegistered(scene.path("link"))) {
        return 3;
    }
    if (watcher.addPath(scene.path("c")) || watcher.isPathRegistered(scene.path("c"))) {
        return 4;
    }
    if (!watcher.removePath(scene.path("a")) || !watcher.addPath(scene.path("c"))) {
        return 5;
    }
    return watcher.clear() ? 0 : 6;
}

} // namespace

// Kernel limits, and slots that interfere with the batch that calls them.
class TestInotifyWatcherStress : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void withoutInotifyInstance();
    void largeBatch();
    void queueOverflow();
    void manyWatches();
    void slotRemovesPath();
    void slotAddsPath();
    void slotDeletesWatcher_data();
    void slotDeletesWatcher();
    void watchLimit();
};

void TestInotifyWatcherStress::withoutInotifyInstance()
{
    // The first check of a type by UBSan opens a pipe, so it has to come before there is none.
    const InotifyWatcher first(nullptr);

    rlimit limit;
    QCOMPARE(getrlimit(RLIMIT_NOFILE, &limit), 0);
    const rlimit none{0, limit.rlim_max};
    QCOMPARE(setrlimit(RLIMIT_NOFILE, &none), 0);
    InotifyWatcher watcher(nullptr);
    const int restored = setrlimit(RLIMIT_NOFILE, &limit);
    QCOMPARE(restored, 0);

    const QString dir = QDir::tempPath();
    QVERIFY(watcher.children().isEmpty());
    QVERIFY(!watcher.addPath(dir));
    QVERIFY(!watcher.isPathRegistered(dir));
    QVERIFY(!watcher.isSymlinkRegistered(dir));
    QVERIFY(!watcher.removePath(dir));
    QVERIFY(!watcher.removePath(dir, false));
    QVERIFY(watcher.clear());
    watcher.notifySymlinks("pathChanged", dir, QString());
    QVERIFY(QMetaObject::invokeMethod(&watcher, "processInotifyMessages"));
    QVERIFY(QMetaObject::invokeMethod(&watcher, "notifyDeletedSymlinks"));
}

void TestInotifyWatcherStress::largeBatch()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QStringList expected;
    for (int i = 0; i < 300; ++i) {
        const QByteArray name = "a-name-of-some-length-" + QByteArray::number(i);
        QVERIFY(scene.makeDir(("dir/" + name).constData()));
        expected.append(QLatin1String("created dir|") + QLatin1String(name));
    }
    QCOMPARE(scene.processedLog(), expected); // one run: 300 times 48 bytes
}

void TestInotifyWatcherStress::queueOverflow()
{
    QFile limitFile(QStringLiteral("/proc/sys/fs/inotify/max_queued_events"));
    QVERIFY(limitFile.open(QIODevice::ReadOnly));
    const int limit = limitFile.readAll().trimmed().toInt();
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

void TestInotifyWatcherStress::manyWatches()
{
    WatchScene scene;
    constexpr int Count = 2000;
    const auto name = [](int i) {
        return "dir-" + QByteArray::number(i);
    };
    for (int i = 0; i < Count; ++i) {
        QVERIFY(scene.makeDir(name(i).constData()));
        QVERIFY(scene.add(name(i).constData()));
    }
    QCOMPARE(WatchScene::kernelWatchCount(), Count);
    for (int i = 0; i < Count; i += 2) {
        QVERIFY(scene.remove(name(i).constData()));
    }
    QStringList expected;
    for (int i = 0; i < Count; ++i) {
        QVERIFY(scene.makeDir((name(i) + "/sub").constData()));
        if (i % 2 == 1) {
            expected.append(QStringLiteral("created dir-%1|sub").arg(i));
        }
    }
    QCOMPARE(scene.processedLog(), expected);
    QVERIFY(scene.watcher->clear());
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcherStress::slotRemovesPath()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("other"));
    QVERIFY(scene.add("dir") && scene.add("other"));
    connect(scene.watcher.get(), &InotifyWatcher::pathCreated, scene.watcher.get(), [&scene] {
        scene.remove("dir");
    });
    QVERIFY(scene.makeDir("dir/1") && scene.makeDir("dir/2") && scene.makeDir("other/3"));
    QCOMPARE(scene.processedLog(), lines({"created dir|1", "created other|3"}));
    QVERIFY(!scene.isRegistered("dir"));
}

void TestInotifyWatcherStress::slotAddsPath()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    connect(
        scene.watcher.get(), &InotifyWatcher::pathCreated, scene.watcher.get(),
        [&scene](const QString& path, const QString& fileName) {
            scene.watcher->addPath(path + QLatin1Char('/') + fileName);
        });
    QVERIFY(scene.makeDir("dir/1") && scene.makeDir("dir/2"));
    QCOMPARE(scene.processedLog(), lines({"created dir|1", "created dir|2"}));
    QVERIFY(scene.makeDir("dir/2/3"));
    QCOMPARE(scene.processedLog(), lines({"created dir/2|3"}));
    QVERIFY(scene.isRegistered("dir/2/3"));
}

void TestInotifyWatcherStress::slotDeletesWatcher_data()
{
    QTest::addColumn<int>("signal");
    QTest::addColumn<QString>("name");
    QTest::newRow("unregistered") << 0 << QStringLiteral("unregistered");
    QTest::newRow("created") << 1 << QStringLiteral("created");
    QTest::newRow("deleted") << 2 << QStringLiteral("deleted");
    QTest::newRow("changed") << 3 << QStringLiteral("changed");
    QTest::newRow("attributes") << 4 << QStringLiteral("attributes");
}

void TestInotifyWatcherStress::slotDeletesWatcher()
{
    QFETCH(int, signal);
    QFETCH(QString, name);
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("gone"));
    QVERIFY(scene.add("dir") && scene.add("gone"));
    const auto die = [&scene] {
        scene.watcher.reset();
    };
    InotifyWatcher* w = scene.watcher.get();
    switch (signal) {
    case 0:
        connect(w, &InotifyWatcher::pathUnregistered, w, die);
        break;
    case 1:
        connect(w, &InotifyWatcher::pathCreated, w, die);
        break;
    case 2:
        connect(w, &InotifyWatcher::pathDeleted, w, die);
        break;
    case 3:
        connect(w, &InotifyWatcher::pathChanged, w, die);
        break;
    case 4:
        connect(w, &InotifyWatcher::pathAttributesChanged, w, die);
        break;
    }
    QVERIFY(scene.write("dir/file"));
    QVERIFY(scene.changeMode("dir/file", QFile::ReadOwner));
    QVERIFY(scene.removeDir("gone"));
    QVERIFY(scene.unlink("dir/file"));
    // By the notifier, which is deleted too while it delivers.
    QTRY_VERIFY(!scene.watcher);
    QVERIFY(scene.log.last().startsWith(name));
}

void TestInotifyWatcherStress::watchLimit()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("a") && scene.makeDir("b") && scene.makeDir("c") && scene.makeDir("d"));
    QVERIFY(scene.makeLink("d", "link"));
    // In a child with a user namespace of its own, since the limit is one of the namespace.
    const pid_t child = fork();
    QVERIFY(child != -1);
    if (child == 0) {
        _exit(runWithThreeWatches(scene));
    }
    int status = 0;
    QCOMPARE(waitpid(child, &status, 0), child);
    QVERIFY(WIFEXITED(status));
    if (WEXITSTATUS(status) == 77) {
        QSKIP("The watch limit can't be lowered here: no user namespace of one's own.");
    }
    QCOMPARE(WEXITSTATUS(status), 0);
}

QTEST_GUILESS_MAIN(TestInotifyWatcherStress)
#include "tst_inotifywatcherstress.moc"
