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
    void manyWatches();
    void nestedBatches();
    void nestedEventLoop();
    void nestedWithinOneEvent();
    void nestedWithinVerdict();
    void verdictWithinBatch();
    void nestedDeletion();
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

// An event loop in a slot reads a newer batch. It is told behind the rest of the older one.
void TestInotifyWatcherStress::nestedBatches()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("dir/x"));
    QVERIFY(scene.add("dir"));
    int depth = 0;
    connect(scene.watcher.get(), &InotifyWatcher::pathCreated, scene.watcher.get(), [&] {
        if (++depth == 1) {
            scene.makeDir("dir/x");
            scene.process();
        } else if (depth == 2) {
            scene.makeDir("dir/b");
            scene.process();
        }
    });
    QVERIFY(scene.makeDir("dir/a") && scene.removeDir("dir/x"));
    QCOMPARE(
        scene.processedLog(),
        lines({"created dir|a", "deleted dir|x", "created dir|x", "created dir|b"}));
    QCOMPARE(scene.processedLog(), QStringList());
}

void TestInotifyWatcherStress::nestedEventLoop()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("dir/x"));
    QVERIFY(scene.add("dir"));
    const auto runLoop = [&scene] {
        scene.makeDir("dir/x");
        QTRY_COMPARE(scene.log.size(), 3);
    };
    QMetaObject::Connection once;
    once = connect(scene.watcher.get(), &InotifyWatcher::pathCreated, scene.watcher.get(), [&] {
        disconnect(once);
        runLoop();
    });
    QVERIFY(scene.makeDir("dir/a") && scene.removeDir("dir/x"));
    QTRY_VERIFY(!scene.log.isEmpty());
    QCOMPARE(scene.takeLog(), lines({"created dir|a", "deleted dir|x", "created dir|x"}));
}

// The links to a directory are told what happened there before anything newer is told at all.
void TestInotifyWatcherStress::nestedWithinOneEvent()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeDir("target/x"));
    QVERIFY(scene.makeLink("target", "link") && scene.add("link"));
    QMetaObject::Connection once;
    once = connect(scene.watcher.get(), &InotifyWatcher::pathDeleted, scene.watcher.get(), [&] {
        disconnect(once);
        scene.makeDir("target/x");
        scene.process();
    });
    QVERIFY(scene.removeDir("target/x"));
    QCOMPARE(
        scene.processedLog(),
        lines({"deleted target|x", "deleted link|x", "created target|x", "created link|x"}));
}

void TestInotifyWatcherStress::nestedWithinVerdict()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("target"));
    QVERIFY(scene.makeLink("target", "dir/a") && scene.makeLink("target", "dir/b"));
    QVERIFY(scene.add("dir") && scene.add("dir/a") && scene.add("dir/b"));
    QVERIFY(scene.unlink("dir/a") && scene.unlink("dir/b"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());
    QMetaObject::Connection once;
    once = connect(scene.watcher.get(), &InotifyWatcher::pathDeleted, scene.watcher.get(), [&] {
        disconnect(once);
        scene.makeLink("target", "dir/a");
        scene.makeLink("target", "dir/b");
        scene.process();
    });
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QStringList log = scene.takeLog();
    QCOMPARE(log.mid(4), lines({"created dir|a", "created dir|b"}));
    log = log.mid(0, 4);
    std::sort(log.begin(), log.end());
    QCOMPARE(
        log,
        lines({"deleted dir/a|", "deleted dir/b|", "unregistered dir/a", "unregistered dir/b"}));
    QVERIFY(!scene.isRegistered("dir/a"));
    QVERIFY(scene.call("notifyDeletedSymlinks"));
    QCOMPARE(scene.takeLog(), QStringList());
}

// A link that has come back is not given up, however long a slot kept its return from being seen.
void TestInotifyWatcherStress::verdictWithinBatch()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("target"));
    QVERIFY(scene.makeLink("target", "dir/link"));
    QVERIFY(scene.add("dir") && scene.add("dir/link"));
    connect(scene.watcher.get(), &InotifyWatcher::pathCreated, scene.watcher.get(), [&] {
        scene.call("notifyDeletedSymlinks");
    });
    QVERIFY(scene.unlink("dir/link") && scene.makeDir("dir/a"));
    QVERIFY(scene.makeLink("target", "dir/link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), lines({"created dir|a", "changed dir/link|"}));
    QVERIFY(scene.isLinkRegistered("dir/link"));
}

void TestInotifyWatcherStress::nestedDeletion()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.add("dir"));
    int depth = 0;
    connect(scene.watcher.get(), &InotifyWatcher::pathCreated, scene.watcher.get(), [&] {
        if (++depth == 1) {
            scene.process();
        } else {
            scene.watcher.reset();
        }
    });
    QVERIFY(scene.makeDir("dir/1") && scene.makeDir("dir/2") && scene.makeDir("dir/3"));
    QTRY_VERIFY(!scene.watcher);
    QCOMPARE(scene.takeLog(), lines({"created dir|1", "created dir|2"}));
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
