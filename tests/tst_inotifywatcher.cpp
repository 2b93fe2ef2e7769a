// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/watchscene.h"

#include <QMetaMethod>
#include <QSignalSpy>
#include <QtTest>

#include <sys/stat.h>

using VeyFM::InotifyWatcher;

namespace {

constexpr QFile::Permissions ReadOnly = QFile::ReadOwner | QFile::ExeOwner;
constexpr QFile::Permissions Writable = ReadOnly | QFile::WriteOwner;

} // namespace

class TestInotifyWatcher : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void metaObject();
    void emptyAndMissingPaths();
    void pathWithNul();
    void addTwice();
    void removeUnknown();
    void removeWithoutKernel();
    void removeRefusedByKernel();
    void clear();
    void clearKeepsRefused();
    void clearSharedDescriptor();
    void firstOfTwoPaths();
    void replacedDirectory();
    void childEvents();
    void renameWithinDirectory();
    void renameBetweenDirectories();
    void writeIsReportedOnClose();
    void unlinkedChildIsSilent();
    void watchedFile();
    void deletedDirectory();
    void movedDirectory();
    void eventsOfDroppedWatch();
    void nothingWaiting();
    void undecodableName();
    void eventLoop();
    void destruction();
};

void TestInotifyWatcher::metaObject()
{
    const QMetaObject& meta = InotifyWatcher::staticMetaObject;
    QStringList methods;
    for (int i = meta.methodOffset(); i < meta.methodCount(); ++i) {
        methods.append(QString::fromLatin1(meta.method(i).methodSignature()));
    }
    QCOMPARE(
        methods, lines(
                     {"pathUnregistered(QString)", "pathCreated(QString,QString)",
                      "pathDeleted(QString,QString)", "pathChanged(QString,QString)",
                      "pathAttributesChanged(QString,QString)", "processInotifyMessages()",
                      "notifyDeletedSymlinks()"}));
}

void TestInotifyWatcher::emptyAndMissingPaths()
{
    WatchScene scene;
    QVERIFY(!scene.watcher->addPath(QString()));
    QVERIFY(!scene.watcher->addPath(QLatin1String("")));
    QVERIFY(!scene.watcher->isPathRegistered(QString()));
    QVERIFY(!scene.watcher->isSymlinkRegistered(QString()));
    QVERIFY(!scene.add("missing"));
    QVERIFY(!scene.isRegistered("missing"));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

// The kernel would see the path up to the NUL, and watch something else.
void TestInotifyWatcher::pathWithNul()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.makeLink("dir", "link"));
    for (const char* name : {"dir", "link"}) {
        const QString path = scene.path(name) + QChar(QChar::Null) + QLatin1String("rest");
        QVERIFY(!scene.watcher->addPath(path));
        QVERIFY(!scene.watcher->isPathRegistered(path));
        QVERIFY(!scene.watcher->isSymlinkRegistered(path));
    }
    QVERIFY(!scene.watcher->addPath(QString(QChar(QChar::Null))));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcher::addTwice()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(!scene.add("dir"));
    QVERIFY(scene.isRegistered("dir"));
    QVERIFY(!scene.isLinkRegistered("dir"));
    // The kernel shows the mask without IN_DONT_FOLLOW, which is not kept.
    QCOMPARE(WatchScene::kernelWatches(), lines({"4000fcc"}));

    // References are not counted.
    QVERIFY(scene.remove("dir"));
    QVERIFY(!scene.isRegistered("dir"));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcher::removeUnknown()
{
    WatchScene scene;
    QVERIFY(scene.remove("missing"));
    QVERIFY(scene.watcher->removePath(scene.path("missing"), false));
    QVERIFY(scene.watcher->removePath(QString()));
}

void TestInotifyWatcher::removeWithoutKernel()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.watcher->removePath(scene.path("dir"), false));
    QVERIFY(!scene.isRegistered("dir"));
    QCOMPARE(WatchScene::kernelWatchCount(), 1);
    QVERIFY(scene.write("dir/file"));
    QCOMPARE(scene.processedLog(), QStringList());
}

void TestInotifyWatcher::removeRefusedByKernel()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.removeDir("dir")); // the kernel drops the watch
    QVERIFY(!scene.remove("dir"));
    QVERIFY(scene.isRegistered("dir"));
    QVERIFY(scene.watcher->removePath(scene.path("dir"), false));
    QVERIFY(!scene.isRegistered("dir"));
}

void TestInotifyWatcher::clear()
{
    WatchScene scene;
    QVERIFY(scene.watcher->clear());
    QVERIFY(scene.makeDir("a") && scene.makeDir("b"));
    QVERIFY(scene.makeLink("a", "link"));
    QVERIFY(scene.add("link") && scene.add("b"));
    QCOMPARE(WatchScene::kernelWatchCount(), 3);
    QVERIFY(scene.watcher->clear());
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
    for (const char* path : {"a", "b", "link"}) {
        QVERIFY(!scene.isRegistered(path));
        QVERIFY(!scene.isLinkRegistered(path));
    }
    QVERIFY(scene.write("a/file"));
    QCOMPARE(scene.processedLog(), QStringList());
    QVERIFY(scene.add("a"));
}

void TestInotifyWatcher::clearKeepsRefused()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("a") && scene.makeDir("b"));
    QVERIFY(scene.makeLink("a", "link"));
    QVERIFY(scene.add("link") && scene.add("b"));
    QVERIFY(scene.removeDir("b"));
    QVERIFY(!scene.watcher->clear());
    QVERIFY(scene.isRegistered("b"));
    QVERIFY(!scene.isRegistered("a"));
    QVERIFY(!scene.isRegistered("link"));
    // The links go whatever happened.
    QVERIFY(!scene.isLinkRegistered("link"));
}

void TestInotifyWatcher::clearSharedDescriptor()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir/.") && scene.add("dir") && scene.add("dir/"));
    QCOMPARE(WatchScene::kernelWatchCount(), 1);
    QVERIFY(!scene.watcher->clear());
    QVERIFY(!scene.isRegistered("dir"));
    QVERIFY(scene.isRegistered("dir/"));
    QVERIFY(scene.isRegistered("dir/."));
}

void TestInotifyWatcher::firstOfTwoPaths()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir/.") && scene.add("dir") && scene.add("dir/"));
    QVERIFY(scene.write("dir/1"));
    QCOMPARE(scene.processedLog(), lines({"created dir|1", "changed dir|1"}));
    QVERIFY(scene.watcher->removePath(scene.path("dir"), false));
    QVERIFY(scene.write("dir/1"));
    QCOMPARE(scene.processedLog(), lines({"changed dir/|1"}));
    QVERIFY(scene.watcher->removePath(scene.path("dir/."), false));
    QVERIFY(scene.write("dir/1"));
    QCOMPARE(scene.processedLog(), lines({"changed dir/|1"}));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.write("dir/1"));
    QCOMPARE(scene.processedLog(), lines({"changed dir|1"}));

    // Removing one ends the kernel watch of both. The other learns it from the kernel.
    QVERIFY(scene.remove("dir"));
    QVERIFY(scene.isRegistered("dir/"));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
    QCOMPARE(scene.processedLog(), lines({"unregistered dir/"}));
    QVERIFY(!scene.isRegistered("dir/"));
}

void TestInotifyWatcher::replacedDirectory()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.makeLink("dir", "link"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.removeDir("dir"));
    QVERIFY(scene.makeDir("dir"));
    // The link's target is the new directory: its descriptor takes the place of the old one,
    // so the news of the old directory's end have no path any more.
    QVERIFY(scene.add("link"));
    QCOMPARE(scene.processedLog(), QStringList());
    QVERIFY(scene.write("dir/1"));
    QCOMPARE(
        scene.processedLog(),
        lines({"created dir|1", "created link|1", "changed dir|1", "changed link|1"}));
    QVERIFY(scene.remove("link") && scene.remove("dir"));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcher::childEvents()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.makeDir("dir/sub"));
    QCOMPARE(scene.processedLog(), lines({"created dir|sub"}));
    QVERIFY(scene.changeMode("dir/sub", ReadOnly));
    QCOMPARE(scene.processedLog(), lines({"attributes dir|sub"}));
    QVERIFY(scene.removeDir("dir/sub"));
    QCOMPARE(scene.processedLog(), lines({"deleted dir|sub"}));
    QVERIFY(scene.write("dir/file"));
    QCOMPARE(scene.processedLog(), lines({"created dir|file", "changed dir|file"}));
    QVERIFY(scene.write("dir/file"));
    QCOMPARE(scene.processedLog(), lines({"changed dir|file"}));
    QVERIFY(scene.unlink("dir/file"));
    QCOMPARE(scene.processedLog(), lines({"deleted dir|file"}));
    // A link that nobody watches is a child like any other.
    QVERIFY(scene.makeLink("dir", "dir/link"));
    QVERIFY(scene.unlink("dir/link"));
    QCOMPARE(scene.processedLog(), lines({"created dir|link", "deleted dir|link"}));
    QVERIFY(scene.changeMode("dir", Writable));
    QCOMPARE(scene.processedLog(), lines({"attributes dir|"}));
}

void TestInotifyWatcher::renameWithinDirectory()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.write("dir/old"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.rename("dir/old", "dir/new"));
    QCOMPARE(scene.processedLog(), lines({"deleted dir|old", "created dir|new"}));
}

void TestInotifyWatcher::renameBetweenDirectories()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("a") && scene.makeDir("b"));
    QVERIFY(scene.write("a/file"));
    QVERIFY(scene.add("a"));
    QVERIFY(scene.rename("a/file", "b/file"));
    QCOMPARE(scene.processedLog(), lines({"deleted a|file"}));
    QVERIFY(scene.rename("b/file", "a/file"));
    QCOMPARE(scene.processedLog(), lines({"created a|file"}));
}

void TestInotifyWatcher::writeIsReportedOnClose()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.write("dir/file"));
    QVERIFY(scene.add("dir"));
    QFile file(scene.path("dir/file"));
    QVERIFY(file.open(QIODevice::Append | QIODevice::Unbuffered));
    for (int i = 0; i < 3; ++i) {
        QCOMPARE(file.write("more"), qint64(4));
    }
    QCOMPARE(scene.processedLog(), QStringList());
    file.close();
    QCOMPARE(scene.processedLog(), lines({"changed dir|file"}));
    QVERIFY(file.open(QIODevice::ReadOnly));
    file.close();
    QCOMPARE(scene.processedLog(), QStringList());
}

void TestInotifyWatcher::unlinkedChildIsSilent()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QFile file(scene.path("dir/file"));
    QVERIFY(file.open(QIODevice::WriteOnly));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.unlink("dir/file"));
    QCOMPARE(scene.processedLog(), lines({"deleted dir|file"}));
    file.close();
    QCOMPARE(scene.processedLog(), QStringList());
}

void TestInotifyWatcher::watchedFile()
{
    WatchScene scene;
    QVERIFY(scene.write("file"));
    QVERIFY(scene.add("file"));
    QVERIFY(scene.write("file"));
    QCOMPARE(scene.processedLog(), lines({"changed file|"}));
    QVERIFY(scene.changeMode("file", ReadOnly));
    QCOMPARE(scene.processedLog(), lines({"attributes file|"}));
    QVERIFY(scene.unlink("file"));
    QCOMPARE(
        scene.processedLog(), lines({"attributes file|", "deleted file|", "unregistered file"}));
    QVERIFY(!scene.isRegistered("file"));
}

void TestInotifyWatcher::deletedDirectory()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.makeDir("dir/sub"));
    QVERIFY(scene.add("dir") && scene.add("dir/sub"));
    QVERIFY(scene.removeDir("dir/sub"));
    QCOMPARE(
        scene.processedLog(),
        lines({"deleted dir/sub|", "unregistered dir/sub", "deleted dir|sub"}));
    QVERIFY(!scene.isRegistered("dir/sub"));
    QVERIFY(scene.makeDir("dir/sub"));
    QCOMPARE(scene.processedLog(), lines({"created dir|sub"}));
    QVERIFY(scene.add("dir/sub"));
}

void TestInotifyWatcher::movedDirectory()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.rename("dir", "elsewhere"));
    // The watch is ended here, not by the kernel: no pathUnregistered.
    QCOMPARE(scene.processedLog(), lines({"deleted dir|"}));
    QCOMPARE(scene.processedLog(), QStringList());
    QVERIFY(!scene.isRegistered("dir"));
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
}

void TestInotifyWatcher::eventsOfDroppedWatch()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.write("dir/file"));
    QVERIFY(scene.remove("dir"));
    QCOMPARE(scene.processedLog(), QStringList());

    // A watch set anew has a new descriptor, to which old events don't belong.
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.write("dir/old"));
    QVERIFY(scene.remove("dir") && scene.add("dir"));
    QVERIFY(scene.write("dir/new"));
    QCOMPARE(scene.processedLog(), lines({"created dir|new", "changed dir|new"}));
}

void TestInotifyWatcher::nothingWaiting()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QCOMPARE(scene.processedLog(), QStringList()); // a read would never return
}

void TestInotifyWatcher::undecodableName()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QSignalSpy created(scene.watcher.get(), &InotifyWatcher::pathCreated);
    const QByteArray bytes("caf\xe9 \xff\xfe");
    const QByteArray umlaut("\xc3\xa4");
    const QByteArray dir = QFile::encodeName(scene.path("dir/"));
    QCOMPARE(mkdir((dir + bytes).constData(), 0700), 0);
    QCOMPARE(mkdir((dir + umlaut).constData(), 0700), 0);
    QVERIFY(scene.process());
    QCOMPARE(created.size(), 2);
    QCOMPARE(created[0][1].toString(), QString::fromLocal8Bit(bytes));
    QCOMPARE(created[1][1].toString(), QString::fromLocal8Bit(umlaut));
    QCOMPARE(rmdir((dir + bytes).constData()), 0); // QTemporaryDir can't name it
}

void TestInotifyWatcher::eventLoop()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QSignalSpy created(scene.watcher.get(), &InotifyWatcher::pathCreated);
    QVERIFY(scene.makeDir("dir/sub"));
    QVERIFY(created.isEmpty());
    QVERIFY(created.wait());
    QCOMPARE(scene.takeLog(), lines({"created dir|sub"}));
}

void TestInotifyWatcher::destruction()
{
    WatchScene scene;
    QVERIFY(scene.makeDir("dir"));
    QVERIFY(scene.add("dir"));
    QVERIFY(scene.makeDir("dir/sub"));
    QCOMPARE(WatchScene::kernelWatchCount(), 1);
    scene.watcher.reset();
    QCOMPARE(WatchScene::kernelWatchCount(), 0);
    QCOMPARE(scene.takeLog(), QStringList());
}

QTEST_GUILESS_MAIN(TestInotifyWatcher)
#include "tst_inotifywatcher.moc"
