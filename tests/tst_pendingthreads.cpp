// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfstest.h"

#include <QThread>

#include <atomic>
#include <thread>
#include <vector>

using namespace VeyFM;

namespace {

/// Looks at a place until it has children, as a view in another thread does; false if it takes too
/// long. Whoever is first finds the place empty, and nothing tells it when that has changed.
bool waitForChildren(const QString& path, int count)
{
    for (int i = 0; i < 20000; ++i) {
        VFS* const vfs = VFS::ptr();
        const Entry entry = vfs->placeBase()->placeEntry(path);
        vfs->hasChilds(entry);
        if (!entry.isNull() && vfs->childs(entry).size() == count) {
            return true;
        }
        QThread::msleep(1);
    }
    return false;
}

} // namespace

/// Navigation from other threads, while the loop of the one that VFS belongs to runs.
class PendingThreadsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void pendingPlacesAreFilledLater();
    void manyThreadsWhileNewsCome();
    void cleanupTestCase();
};

void PendingThreadsTest::initTestCase()
{
    const QByteArray script = R"({"values": {
        "SmbBrowser.workgroups": ["A", "B"],
        "SmbBrowser.hosts": ["h1", "h2", "h3"],
        "SmbBrowser.shares": {"s1": "", "s2": "/s2"}}})";
    QVERIFY(startVfs(script));
    service->setValue(
        u"StoragePlacesManager.availableStoragePlaces"_s,
        QJsonArray{device(u"sda"_s, u"A"_s), device(u"sdb"_s, u"B"_s)});
}

void PendingThreadsTest::pendingPlacesAreFilledLater()
{
    EntryList first;
    bool pendingBefore = false;
    std::thread([&] {
        pendingBefore = vfs->hasChilds(vfs->sambaNetworkEntry());
        first = vfs->childs(vfs->sambaNetworkEntry());
    }).join();
    // The fill waits in the queue of this thread.
    QVERIFY(pendingBefore);
    QVERIFY(first.isEmpty());
    QVERIFY(!vfs->placeBase()->hasChilds(vfs->sambaNetworkEntry()));
    QTRY_COMPARE(childPaths(u"Samba"_s).size(), 2);
    // The children come without any news.
    QCOMPARE(log->takeAll(service), QStringList({u"started"_s, u"finished"_s}));
}

void PendingThreadsTest::manyThreadsWhileNewsCome()
{
    std::atomic<int> good{0};
    std::atomic<int> running{4};
    std::vector<std::thread> threads;
    const int total = running;
    for (int i = 0; i < total; ++i) {
        threads.emplace_back([&good, &running, i] {
            const QString workgroup = i % 2 ? u"Samba/A"_s : u"Samba/B"_s;
            bool ok = waitForChildren(workgroup, 3);
            for (const QString& host : {u"/h1"_s, u"/h2"_s, u"/h3"_s}) {
                ok = waitForChildren(workgroup + host, 2) && ok;
            }
            ok = waitForChildren(u"Storage devices"_s, 2) && ok;
            VFS* const vfs = VFS::ptr();
            const Entry share = vfs->entry(workgroup + u"/h2/s2"_s);
            ok = ok && share.localPath() == u"/s2"_s;
            ok = ok && vfs->pathEntryList(share).size() == 6;
            ok = ok && vfs->smbHost(share) == u"h2"_s;
            good += ok;
            --running;
        });
    }
    // Meanwhile the tree changes here.
    for (int i = 0; running > 0; ++i) {
        const QJsonArray favourite = {u"F%1"_s.arg(i % 10), u"/f"_s};
        service->emitSignal(
            u"FavouritePlacesManager"_s,
            i / 10 % 2 ? u"favouritePlaceRemoved"_s : u"favouritePlaceAdded"_s,
            arguments(favourite));
        QCoreApplication::processEvents(QEventLoop::AllEvents, 10);
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    QCOMPARE(int(good), total);
    log->takeAll(service);
    // Each level was read once.
    QCOMPARE(service->calls().filter(QRegularExpression(u"SmbBrowser.hosts"_s)).size(), 2);
    QCOMPARE(service->calls().filter(QRegularExpression(u"SmbBrowser.shares"_s)).size(), 6);
}

void PendingThreadsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(PendingThreadsTest)
#include "tst_pendingthreads.moc"
