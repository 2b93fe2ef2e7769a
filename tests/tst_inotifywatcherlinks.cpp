// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/watchscene.h"

#include <QtTest>

using VeyFM::InotifyWatcher;

class TestInotifyWatcherLinks : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void linkAndTarget();
    void twoLinks();
    void orderOfLinks();
    void relativeLink();
    void linkOfLink();
    void linkToItself();
    void danglingLink();
    void targetRequestedAfterLink();
    void targetRequestedBeforeLink();
    void removeTargetInUse();
    void removeLastLink();
    void addLinkAgain();
    void allChildEventsAreRepeated();
    void targetItselfIsNotRepeated();
    void linkToFile();
    void deletedTarget();
    void movedTarget();
    void notifySymlinks();
    void slotDeletesWatcher_data();
    void slotDeletesWatcher();
};

void TestInotifyWatcherLinks::linkAndTarget()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.isRegistered("link") && scene.isRegistered("target"));
    QVERIFY(scene.isLinkRegistered("link"));
    QVERIFY(!scene.isLinkRegistered("target"));
    QCOMPARE(WatchScene::kernelWatchCount(), 2);
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"created target|sub", "created link|sub"}));
}

void TestInotifyWatcherLinks::twoLinks()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target"));
    QVERIFY(scene.makeLink("target", "link1") && scene.makeLink("target", "link2"));
    QVERIFY(scene.add("link1") && scene.add("link2"));
    QCOMPARE(WatchScene::kernelWatchCount(), 3);
    QVERIFY(scene.makeDir("target/sub"));
    QStringList log = scene.processedLog();
    QCOMPARE(log.value(0), QStringLiteral("created target|sub"));
    log.sort(); // the order among links is open
    QCOMPARE(log, lines({"created link1|sub", "created link2|sub", "created target|sub"}));

    QVERIFY(scene.remove("link1"));
    QVERIFY(!scene.isLinkRegistered("link1"));
    QVERIFY(scene.removeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"deleted target|sub", "deleted link2|sub"}));
}

void TestInotifyWatcherLinks::orderOfLinks()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target"));
    for (const char* link : {"link1", "link2", "link3"}) {
        QVERIFY(scene.makeLink("target", link) && scene.add(link));
    }
    QVERIFY(scene.makeDir("target/sub"));
    const QStringList byEvent = scene.processedLog().mid(1);
    QCOMPARE(byEvent.size(), 3);
    // Whatever the order is, it is one.
    scene.watcher->notifySymlinks("pathCreated", scene.path("target"), QStringLiteral("sub"));
    QCOMPARE(scene.takeLog(), byEvent);
}

void TestInotifyWatcherLinks::relativeLink()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeDir("dir"));
    const QByteArray link = QFile::encodeName(scene.path("dir/link"));
    QCOMPARE(symlink("../target", link.constData()), 0);
    QVERIFY(scene.add("dir/link"));
    QVERIFY(scene.isRegistered("target"));
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"created target|sub", "created dir/link|sub"}));

    // A path that isn't absolute is a path like any other.
    const QString before = QDir::currentPath();
    QVERIFY(QDir::setCurrent(scene.path("dir")));
    const bool added = scene.watcher->addPath(QStringLiteral("link"));
    QVERIFY(QDir::setCurrent(before));
    QVERIFY(added);
    QVERIFY(scene.watcher->isSymlinkRegistered(QStringLiteral("link")));
}

void TestInotifyWatcherLinks::linkOfLink()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target"));
    QVERIFY(scene.makeLink("target", "link1") && scene.makeLink("link1", "link2"));
    QVERIFY(scene.add("link2"));
    // Links are followed one step only.
    QVERIFY(scene.isRegistered("link1"));
    QVERIFY(!scene.isRegistered("target"));
    QVERIFY(!scene.isLinkRegistered("link1"));
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), QStringList());
}

void TestInotifyWatcherLinks::linkToItself()
{
    WatchScene scene;
    QVERIFY(scene.makeLink("loop", "loop"));
    QVERIFY(scene.add("loop"));
    QVERIFY(scene.isLinkRegistered("loop"));
    QVERIFY(!scene.add("loop"));
    QVERIFY(scene.remove("loop"));
    QVERIFY(!scene.isRegistered("loop"));
    QVERIFY(!scene.isLinkRegistered("loop"));
    QVERIFY(!scene.watcher->isSymlinkRegistered(QString()));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcherLinks::danglingLink()
{
    WatchScene scene;
    QVERIFY(scene.makeLink("missing", "link"));
    // False, but the link itself is watched.
    QVERIFY(!scene.add("link"));
    QVERIFY(scene.isRegistered("link"));
    QVERIFY(!scene.isRegistered("missing"));
    QVERIFY(!scene.isLinkRegistered("link"));
    QCOMPARE(WatchScene::kernelWatchCount(), 1);
    // It is no registered link, so its deletion is not held back.
    QVERIFY(scene.unlink("link"));
    QCOMPARE(scene.processedLogWithoutAttributes(), lines({"deleted link|", "unregistered link"}));
}

void TestInotifyWatcherLinks::targetRequestedAfterLink()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(!scene.watcher->isSymlinkRegistered(QString()));
    QVERIFY(!scene.add("target"));
    // A request for a target shows as a link with the empty path.
    QVERIFY(scene.watcher->isSymlinkRegistered(QString()));
    // It is no link to be told of anything.
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"created target|sub", "created link|sub"}));

    QVERIFY(scene.remove("link"));
    QVERIFY(!scene.watcher->isSymlinkRegistered(QString()));
    QVERIFY(scene.isRegistered("target"));
    QVERIFY(scene.removeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"deleted target|sub"}));
    QVERIFY(scene.remove("target"));
    QVERIFY(!scene.isRegistered("target"));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcherLinks::targetRequestedBeforeLink()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("target"));
    QVERIFY(scene.add("link"));
    QCOMPARE(WatchScene::kernelWatchCount(), 2);
    // The earlier request is not carried over.
    QVERIFY(!scene.watcher->isSymlinkRegistered(QString()));
}

void TestInotifyWatcherLinks::removeTargetInUse()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(!scene.add("target"));
    QVERIFY(scene.remove("target"));
    QVERIFY(!scene.watcher->isSymlinkRegistered(QString())); // the request is withdrawn
    QVERIFY(scene.isRegistered("target"));
    QCOMPARE(WatchScene::kernelWatchCount(), 2);
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"created target|sub", "created link|sub"}));
    QVERIFY(scene.watcher->removePath(scene.path("target"), false));
    QVERIFY(scene.isRegistered("target"));
}

void TestInotifyWatcherLinks::removeLastLink()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.remove("link"));
    QVERIFY(!scene.isRegistered("link"));
    QVERIFY(!scene.isLinkRegistered("link"));
    // The target stays watched, for no one.
    QVERIFY(scene.isRegistered("target"));
    QCOMPARE(WatchScene::kernelWatchCount(), 1);
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"created target|sub"}));
    QVERIFY(scene.remove("target"));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcherLinks::addLinkAgain()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link") && scene.remove("link") && scene.add("link"));
    QVERIFY(!scene.add("link"));
    QCOMPARE(WatchScene::kernelWatchCount(), 2);
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), lines({"created target|sub", "created link|sub"}));
}

void TestInotifyWatcherLinks::allChildEventsAreRepeated()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.write("target/file"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.write("target/file"));
    QVERIFY(scene.changeMode("target/file", QFile::ReadOwner));
    QVERIFY(scene.rename("target/file", "target/other"));
    QVERIFY(scene.unlink("target/other"));
    QCOMPARE(
        scene.processedLog(),
        lines(
            {"changed target|file", "changed link|file", "attributes target|file",
             "attributes link|file", "deleted target|file", "deleted link|file",
             "created target|other", "created link|other", "deleted target|other",
             "deleted link|other"}));
}

void TestInotifyWatcherLinks::targetItselfIsNotRepeated()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.changeMode("target", QFile::ReadOwner | QFile::ExeOwner));
    QCOMPARE(scene.processedLog(), lines({"attributes target|"}));
}

void TestInotifyWatcherLinks::linkToFile()
{
    WatchScene scene;
    QVERIFY(scene.write("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    // News of the target itself are not repeated, so a link to a file hears of no writing.
    QVERIFY(scene.write("target"));
    QCOMPARE(scene.processedLog(), lines({"changed target|"}));
}

void TestInotifyWatcherLinks::deletedTarget()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.removeDir("target"));
    QCOMPARE(
        scene.processedLog(), lines({"deleted target|", "changed link|", "unregistered target"}));
    // The link still needs the target, so its record stays, with a watch that is dead.
    QVERIFY(scene.isRegistered("target"));
    QVERIFY(scene.isLinkRegistered("link"));
    QVERIFY(scene.makeDir("target"));
    QVERIFY(!scene.add("target"));
    QVERIFY(scene.makeDir("target/sub"));
    QCOMPARE(scene.processedLog(), QStringList());
}

void TestInotifyWatcherLinks::movedTarget()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeLink("target", "link"));
    QVERIFY(scene.add("link"));
    QVERIFY(scene.rename("target", "elsewhere"));
    QCOMPARE(scene.processedLog(), lines({"deleted target|", "changed link|"}));
    // Its watch stays too, and goes on under the old path.
    QVERIFY(scene.isRegistered("target"));
    QVERIFY(scene.makeDir("elsewhere/sub"));
    QCOMPARE(scene.processedLog(), lines({"created target|sub", "created link|sub"}));
}

void TestInotifyWatcherLinks::notifySymlinks()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("target") && scene.makeDir("plain"));
    QVERIFY(scene.makeLink("target", "link") && scene.makeLink("target", "gone"));
    QVERIFY(scene.add("link") && scene.add("gone") && scene.add("plain"));
    QVERIFY(!scene.add("target"));
    QVERIFY(scene.unlink("gone"));
    QCOMPARE(scene.processedLogWithoutAttributes(), QStringList());

    const QString name = QStringLiteral("name");
    for (const char* signal :
         {"pathCreated", "pathDeleted", "pathChanged", "pathAttributesChanged"}) {
        scene.watcher->notifySymlinks(signal, scene.path("target"), name);
    }
    // Neither the link that waits for its verdict nor the request of the target.
    QCOMPARE(
        scene.takeLog(), lines(
                             {"created link|name", "deleted link|name", "changed link|name",
                              "attributes link|name"}));
    scene.watcher->notifySymlinks("pathChanged", scene.path("target"), QString());
    scene.watcher->notifySymlinks("pathChanged", scene.path("plain"), name);
    scene.watcher->notifySymlinks("pathChanged", scene.path("link"), name);
    QCOMPARE(scene.takeLog(), lines({"changed link|"}));
}

void TestInotifyWatcherLinks::slotDeletesWatcher_data()
{
    QTest::addColumn<QString>("last");
    QTest::newRow("target") << QStringLiteral("created target|sub");
    QTest::newRow("repeated") << QStringLiteral("created link|sub");
    QTest::newRow("recreated") << QStringLiteral("changed dir/back|");
    QTest::newRow("target gone") << QStringLiteral("deleted gone|");
    QTest::newRow("target gone, repeated") << QStringLiteral("changed to-gone|");
    QTest::newRow("verdict") << QStringLiteral("deleted verdict|");
    QTest::newRow("verdict, repeated") << QStringLiteral("changed to-verdict|");
    QTest::newRow("forgotten") << QStringLiteral("unregistered verdict");
}

void TestInotifyWatcherLinks::slotDeletesWatcher()
{
    QFETCH(QString, last);
    WatchScene scene;
    QVERIFY(scene.makeDir("dir") && scene.makeDir("target") && scene.makeDir("gone"));
    QVERIFY(scene.makeLink("target", "link") && scene.makeLink("gone", "to-gone"));
    QVERIFY(scene.makeLink("target", "dir/back"));
    QVERIFY(scene.makeLink("dir", "verdict") && scene.makeLink("verdict", "to-verdict"));
    for (const char* path : {"dir", "dir/back", "link", "to-gone", "verdict", "to-verdict"}) {
        scene.add(path);
    }
    const auto check = [&scene, &last] {
        if (scene.watcher && scene.log.contains(last)) {
            scene.watcher.reset();
        }
    };
    InotifyWatcher* w = scene.watcher.get();
    connect(w, &InotifyWatcher::pathCreated, w, check);
    connect(w, &InotifyWatcher::pathDeleted, w, check);
    connect(w, &InotifyWatcher::pathChanged, w, check);
    connect(w, &InotifyWatcher::pathUnregistered, w, check);

    QVERIFY(scene.unlink("verdict"));
    QVERIFY(scene.unlink("dir/back") && scene.makeLink("target", "dir/back"));
    QVERIFY(scene.removeDir("gone"));
    QVERIFY(scene.makeDir("target/sub"));
    QTRY_VERIFY(!scene.watcher);
    QCOMPARE(scene.log.last(), last);
}

QTEST_GUILESS_MAIN(TestInotifyWatcherLinks)
#include "tst_inotifywatcherlinks.moc"
