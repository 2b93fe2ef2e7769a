// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// News that arrive in an event loop which a slot of the host runs while it is told of older news.

#include "service/smbbrowserproxy.h"
#include "support/makeentry.h"
#include "support/vfstest.h"

#include <QDir>
#include <QEventLoop>
#include <QTemporaryDir>
#include <QTimer>

#include <functional>

using namespace VeyFM;

class NestedNewsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void deviceRemovedAndAddedAgain();
    void deviceAddedAgainElsewhere();
    void deviceMountedAndUnmounted();
    void deviceUpdatedAndRemoved();
    void deviceRemovedAndRead();
    void favouriteRemovedAndAddedAgain();
    void favouriteAddedAndRemoved();
    void bookmarkAddedAndRemoved();
    void bookmarkUpdatedTwice();
    void bookmarkUpdatedAndRemoved();
    void mountsInTurn();
    void workgroupRemovedAndAddedAgain();
    void workgroupAddedAndRemoved();
    void hostRemovedAndAddedAgain();
    void sharesAddedAndUpdated();
    void shareOpenedByItsNews();
    void otherReceiversHearTheOrder();
    void fileDeletedAndMadeAgain();
    void watcherDeletedInItsSlot();
    void cleanupTestCase();

private:
    // Has the service emit inside the first emission of a signal, and a loop run until the news
    // are through: what a dialog does.
    template <typename Sender, typename Signal>
    void nest(Sender* sender, Signal signal, const std::function<void()>& emission)
    {
        m_once = std::make_unique<QObject>();
        connect(sender, signal, m_once.get(), [this, emission] {
            if (m_isNested) {
                return;
            }
            m_isNested = true;
            emission();
            QEventLoop loop;
            // The echo of a notification comes behind all that the service has sent before.
            connect(vfs->entryWatcher(), &EntryWatcher::entryReset, &loop, [&](const Entry& entry) {
                if (entry.path() == u"/end of nested"_s) {
                    loop.quit();
                }
            });
            vfs->notifyAllWatchers(makeEntry("/end of nested", "", 0));
            QTimer::singleShot(20000, &loop, &QEventLoop::quit);
            loop.exec();
        });
        m_isNested = false;
    }

    QStringList told(const QString& interface, const QString& signal, const QJsonArray& arguments)
    {
        QStringList lines = news(interface, signal, arguments);
        m_once.reset();
        lines.removeAll(u"reset /end of nested"_s);
        return lines;
    }

    void storage(const QString& signal, const QJsonArray& place)
    {
        service->emitSignal(
            u"StoragePlacesManager"_s, u"storagePlace"_s + signal, arguments(place));
    }

    QStringList storageTold(const QString& signal, const QJsonArray& place)
    {
        return told(u"StoragePlacesManager"_s, u"storagePlace"_s + signal, arguments(place));
    }

    void favourite(const QString& signal, const QString& name)
    {
        service->emitSignal(
            u"FavouritePlacesManager"_s, u"favouritePlace"_s + signal,
            arguments({name, u"/f/"_s + name}));
    }

    void bookmark(const QString& signal, const QString& name, const QString& localPath = {})
    {
        service->emitSignal(
            u"NetworkPlacesManager"_s, u"networkPlace"_s + signal,
            arguments({name, u"ftp://h"_s, localPath}));
    }

    QStringList
    bookmarkTold(const QString& signal, const QString& name, const QString& localPath = {})
    {
        return told(
            u"NetworkPlacesManager"_s, u"networkPlace"_s + signal,
            arguments({name, u"ftp://h"_s, localPath}));
    }

    // Has the Samba level be what a rescan finds.
    void rescanned(const QString& method, const QJsonValue& value)
    {
        service->setValue(u"SmbBrowser."_s + method, value);
    }

    std::unique_ptr<QObject> m_once;
    bool m_isNested = false;
};

void NestedNewsTest::initTestCase()
{
    QVERIFY(startVfs(R"({"values": {
        "StoragePlacesManager.availableStoragePlaces": [
            ["", false, true, false, "sda", "", "", "A", 3]],
        "SmbBrowser.workgroups": ["A", "B"],
        "SmbBrowser.hosts": ["h1", "h2"],
        "SmbBrowser.shares": {"s1": "", "s2": "/s2"}}})"));
    vfs->childs(vfs->storageDevicesEntry());
    log->takeAll(service);
}

void NestedNewsTest::deviceRemovedAndAddedAgain()
{
    nest(vfs, &VFS::storagePlaceRemoved, [this] {
        storage(u"Added"_s, device(u"sda"_s, u"A"_s, 3, u"/m"_s));
    });
    QCOMPARE(
        storageTold(u"Removed"_s, device(u"sda"_s, u"A"_s)),
        QStringList(
            {u"removed A"_s, u"deleted Storage devices/sda"_s,
             u"created Storage devices/sda=/m"_s}));
    QCOMPARE(childPaths(u"Storage devices"_s), QStringList(u"Storage devices/sda"_s));
    QCOMPARE(treeLocalPath(u"Storage devices/sda"_s), u"/m"_s);
}

void NestedNewsTest::deviceAddedAgainElsewhere()
{
    nest(vfs, &VFS::storagePlaceRemoved, [this] {
        storage(u"Added"_s, device(u"sdb"_s, u"A"_s, 2));
        storage(u"Removed"_s, device(u"sdb"_s, u"A"_s, 2));
        storage(u"Added"_s, device(u"sda"_s, u"A"_s, 2));
    });
    storageTold(u"Removed"_s, device(u"sda"_s, u"A"_s));
    QCOMPARE(childPaths(u"Storage devices"_s), QStringList(u"Storage devices/sda"_s));
    // As another kind of device.
    QCOMPARE(vfs->entry(u"Storage devices/sda"_s).type(), int(TypeCdromDriveStoragePlace));
}

void NestedNewsTest::deviceMountedAndUnmounted()
{
    nest(vfs, &VFS::storagePlaceMountStateChanged, [this] {
        storage(u"Updated"_s, device(u"sda"_s, u"A"_s, 2));
    });
    QCOMPARE(
        storageTold(u"Updated"_s, device(u"sda"_s, u"A"_s, 2, u"/media/a"_s, false)),
        QStringList(
            {u"mountState A"_s, u"mountability A"_s, u"reset Storage devices/sda"_s,
             u"mountState A"_s, u"mountability A"_s, u"reset Storage devices/sda=/media/a"_s}));
    QCOMPARE(treeLocalPath(u"Storage devices/sda"_s), QString());
    QCOMPARE(vfs->localPath(u"Storage devices/sda"_s), QString());
}

void NestedNewsTest::deviceUpdatedAndRemoved()
{
    nest(vfs, &VFS::storagePlaceMountStateChanged, [this] {
        storage(u"Removed"_s, device(u"sda"_s, u"A"_s));
    });
    QCOMPARE(
        storageTold(u"Updated"_s, device(u"sda"_s, u"A"_s, 2, u"/media/a"_s)),
        QStringList(
            {u"mountState A"_s, u"reset Storage devices/sda"_s, u"removed A"_s,
             u"deleted Storage devices/sda=/media/a"_s}));
    QCOMPARE(childPaths(u"Storage devices"_s), QStringList());
}

void NestedNewsTest::deviceRemovedAndRead()
{
    news(u"StoragePlacesManager"_s, u"storagePlaceAdded"_s, arguments(device(u"sdc"_s, u"C"_s)));
    // Another process asks for all views to be read again. What they read then is not the past.
    nest(vfs, &VFS::storagePlaceRemoved, [this] {
        vfs->notifyAllWatchers(
            EntryList(QList<Entry>{vfs->storageDevicesEntry(), makeEntry("/x", "/x", TypeDir)}));
    });
    QCOMPARE(
        storageTold(u"Removed"_s, device(u"sdc"_s, u"C"_s)),
        QStringList(
            {u"removed C"_s, u"deleted Storage devices/sdc"_s, u"reset Storage devices"_s,
             u"reset /x=/x"_s}));
}

void NestedNewsTest::favouriteRemovedAndAddedAgain()
{
    told(u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, arguments({u"F"_s, u"/f/F"_s}));
    nest(vfs->entryWatcher(), &EntryWatcher::entryDeleted, [this] {
        favourite(u"Added"_s, u"F"_s);
    });
    QCOMPARE(
        told(
            u"FavouritePlacesManager"_s, u"favouritePlaceRemoved"_s,
            arguments({u"F"_s, u"/f/F"_s})),
        QStringList({u"deleted Favourites/F=/f/F"_s, u"created Favourites/F=/f/F"_s}));
    QCOMPARE(childPaths(u"Favourites"_s), QStringList(u"Favourites/F"_s));
}

void NestedNewsTest::favouriteAddedAndRemoved()
{
    nest(vfs->entryWatcher(), &EntryWatcher::entryCreated, [this] {
        favourite(u"Removed"_s, u"G"_s);
    });
    QCOMPARE(
        told(u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, arguments({u"G"_s, u"/f/G"_s})),
        QStringList({u"created Favourites/G=/f/G"_s, u"deleted Favourites/G=/f/G"_s}));
    QCOMPARE(childPaths(u"Favourites"_s), QStringList(u"Favourites/F"_s));
}

void NestedNewsTest::bookmarkAddedAndRemoved()
{
    nest(vfs->entryWatcher(), &EntryWatcher::entryCreated, [this] {
        bookmark(u"Removed"_s, u"B"_s);
    });
    // A list that follows networkPlaceAdded() does not keep what is gone.
    QCOMPARE(
        bookmarkTold(u"Added"_s, u"B"_s),
        QStringList(
            {u"created Network/B"_s, u"bookmarkAdded B Network/B"_s, u"deleted Network/B"_s}));
    QVERIFY(!childPaths(u"Network"_s).contains(u"Network/B"_s));
}

void NestedNewsTest::bookmarkUpdatedTwice()
{
    bookmarkTold(u"Added"_s, u"B"_s);
    nest(
        vfs->entryWatcher(), &EntryWatcher::entryReset, [this] { bookmark(u"Updated"_s, u"B"_s); });
    QCOMPARE(
        bookmarkTold(u"Updated"_s, u"B"_s, u"/m/b"_s),
        QStringList(
            {u"reset Network/B"_s, u"bookmarkUpdated Network/B"_s, u"reset Network/B=/m/b"_s,
             u"bookmarkUpdated Network/B=/m/b"_s}));
    QCOMPARE(treeLocalPath(u"Network/B"_s), QString());
}

void NestedNewsTest::bookmarkUpdatedAndRemoved()
{
    nest(
        vfs->entryWatcher(), &EntryWatcher::entryReset, [this] { bookmark(u"Removed"_s, u"B"_s); });
    QCOMPARE(
        bookmarkTold(u"Updated"_s, u"B"_s, u"/m/b"_s),
        QStringList(
            {u"reset Network/B"_s, u"bookmarkUpdated Network/B"_s, u"deleted Network/B"_s}));
    QVERIFY(!childPaths(u"Network"_s).contains(u"Network/B"_s));
}

void NestedNewsTest::mountsInTurn()
{
    const auto mounted = [](const QString& host) {
        return QJsonArray{u"ftp://"_s + host, QJsonArray{u"FTP/"_s + host, u"/m/"_s + host, 4002}};
    };
    nest(vfs->entryWatcher(), &EntryWatcher::entryCreated, [this, mounted] {
        service->emitSignal(u"NetworkMountsManager"_s, u"mountAdded"_s, mounted(u"k"_s));
        service->emitSignal(u"NetworkMountsManager"_s, u"mountAdded"_s, mounted(u"h"_s));
    });
    // Each mount comes once, and is told of behind its place.
    QCOMPARE(
        told(u"NetworkMountsManager"_s, u"mountAdded"_s, mounted(u"h"_s)),
        QStringList(
            {u"created FTP"_s, u"created FTP/h=/m/h"_s, u"mountAdded ftp://h FTP/h=/m/h"_s,
             u"created FTP/k=/m/k"_s, u"mountAdded ftp://k FTP/k=/m/k"_s,
             u"mountAdded ftp://h FTP/h=/m/h"_s}));
    QCOMPARE(childPaths(u"FTP"_s), QStringList({u"FTP/h"_s, u"FTP/k"_s}));
}

void NestedNewsTest::workgroupRemovedAndAddedAgain()
{
    vfs->childs(vfs->sambaNetworkEntry());
    log->takeAll(service);
    // A goes and N comes; while a view hears of N, A is back.
    nest(vfs->entryWatcher(), &EntryWatcher::entryCreated, [this] {
        rescanned(u"workgroups"_s, QJsonArray{u"A"_s, u"B"_s, u"N"_s});
        service->emitSignal(u"SmbBrowser"_s, u"rescanFinished"_s, {true});
    });
    rescanned(u"workgroups"_s, QJsonArray{u"B"_s, u"N"_s});
    QCOMPARE(
        told(u"SmbBrowser"_s, u"rescanFinished"_s, {true}),
        QStringList({u"created Samba/N"_s, u"deleted Samba/A"_s, u"created Samba/A"_s}));
    QCOMPARE(childPaths(u"Samba"_s), QStringList({u"Samba/B"_s, u"Samba/N"_s, u"Samba/A"_s}));
}

void NestedNewsTest::workgroupAddedAndRemoved()
{
    // X and Y come; while a view hears of X, both are gone again.
    nest(vfs->entryWatcher(), &EntryWatcher::entryCreated, [this] {
        rescanned(u"workgroups"_s, QJsonArray{u"A"_s, u"B"_s});
        service->emitSignal(u"SmbBrowser"_s, u"rescanFinished"_s, {true});
    });
    rescanned(u"workgroups"_s, QJsonArray{u"A"_s, u"B"_s, u"X"_s, u"Y"_s});
    QCOMPARE(
        told(u"SmbBrowser"_s, u"rescanFinished"_s, {true}),
        QStringList(
            {u"created Samba/X"_s, u"created Samba/Y"_s, u"deleted Samba/N"_s, u"deleted Samba/X"_s,
             u"deleted Samba/Y"_s}));
    QCOMPARE(childPaths(u"Samba"_s), QStringList({u"Samba/B"_s, u"Samba/A"_s}));
}

void NestedNewsTest::hostRemovedAndAddedAgain()
{
    vfs->childs(vfs->entry(u"Samba/B"_s));
    log->takeAll(service);
    // Both go; while a view hears of the first, both are back.
    nest(vfs->entryWatcher(), &EntryWatcher::entryDeleted, [this] {
        rescanned(u"hosts"_s, QJsonArray{u"h1"_s, u"h2"_s});
        service->emitSignal(u"SmbBrowser"_s, u"rescanWorkgroupFinished"_s, {u"B"_s, true});
    });
    rescanned(u"hosts"_s, QJsonArray());
    QCOMPARE(
        told(u"SmbBrowser"_s, u"rescanWorkgroupFinished"_s, {u"B"_s, true}),
        QStringList(
            {u"deleted Samba/B/h1"_s, u"deleted Samba/B/h2"_s, u"created Samba/B/h1"_s,
             u"created Samba/B/h2"_s}));
    QCOMPARE(childPaths(u"Samba/B"_s), QStringList({u"Samba/B/h1"_s, u"Samba/B/h2"_s}));
}

void NestedNewsTest::sharesAddedAndUpdated()
{
    vfs->childs(vfs->entry(u"Samba/B/h1"_s));
    log->takeAll(service);
    nest(vfs->entryWatcher(), &EntryWatcher::entryCreated, [this] {
        service->emitSignal(
            u"SmbBrowser"_s, u"shareUpdated"_s, {u"s4"_s, u"h1"_s, u"B"_s, u"/now"_s});
    });
    rescanned(u"shares"_s, object(R"({"s1": "", "s2": "/s2", "s3": "", "s4": "/old"})"));
    QCOMPARE(
        told(u"SmbBrowser"_s, u"rescanHostFinished"_s, {u"h1"_s, u"B"_s, true}),
        QStringList(
            {u"created Samba/B/h1/s3"_s, u"created Samba/B/h1/s4=/old"_s,
             u"reset Samba/B/h1/s4=/old"_s, u"shareUpdated Samba/B/h1/s4=/old"_s}));
    QCOMPARE(treeLocalPath(u"Samba/B/h1/s4"_s), u"/now"_s);
    // One update behind the other.
    nest(vfs->entryWatcher(), &EntryWatcher::entryReset, [this] {
        service->emitSignal(
            u"SmbBrowser"_s, u"shareUpdated"_s, {u"s4"_s, u"h1"_s, u"B"_s, QString()});
    });
    told(u"SmbBrowser"_s, u"shareUpdated"_s, {u"s4"_s, u"h1"_s, u"B"_s, u"/then"_s});
    QCOMPARE(treeLocalPath(u"Samba/B/h1/s4"_s), QString());
}

void NestedNewsTest::shareOpenedByItsNews()
{
    // The level is known to the proxy but not to the tree, so the news of a share open its host,
    // and newer news come in while the host is told that this takes time.
    vfs->smbBrowser()->shares(u"h2"_s, u"B"_s);
    nest(vfs, &VFS::longTimeOperationStarted, [this] {
        service->emitSignal(
            u"SmbBrowser"_s, u"shareUpdated"_s, {u"s2"_s, u"h2"_s, u"B"_s, u"/newest"_s});
    });
    told(u"SmbBrowser"_s, u"shareUpdated"_s, {u"s2"_s, u"h2"_s, u"B"_s, u"/newer"_s});
    QVERIFY(m_isNested);
    QCOMPARE(treeLocalPath(u"Samba/B/h2/s2"_s), u"/newest"_s);
}

void NestedNewsTest::otherReceiversHearTheOrder()
{
    // What waits inside for more news gets them: nothing is held back until the slot returns.
    bool inside = false;
    nest(
        vfs, &VFS::storagePlaceRemoved, [this] { storage(u"Added"_s, device(u"late"_s, u"L"_s)); });
    QObject receiver;
    connect(vfs, &VFS::storagePlaceRemoved, &receiver, [&] {
        inside = vfs->placeBase()->hasPlace(u"Storage devices/late"_s);
    });
    storageTold(u"Removed"_s, device(u"none"_s, u"None"_s));
    QVERIFY(inside);
}

void NestedNewsTest::fileDeletedAndMadeAgain()
{
    const QTemporaryDir directory;
    told(
        u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s,
        arguments({u"D"_s, directory.path()}));
    const QString file = directory.filePath(u"f"_s);
    const auto make = [&file] {
        QFile(file).open(QIODevice::WriteOnly);
    };
    make();
    // By both its names: as the place and as the plain directory.
    EntryWatcher* const watcher = vfs->entryWatcher();
    watcher->addEntry(vfs->entry(u"Favourites/D"_s));
    QStringList deletedAndCreated;
    QObject receiver;
    connect(watcher, &EntryWatcher::entryCreated, &receiver, [&](const Entry& entry) {
        deletedAndCreated << u"+"_s + entry.path();
    });
    connect(watcher, &EntryWatcher::entryDeleted, &receiver, [&](const Entry& entry) {
        deletedAndCreated << u"-"_s + entry.path();
        if (deletedAndCreated.size() == 1) {
            make();
            QTRY_COMPARE(deletedAndCreated.size(), 4);
        }
    });
    QVERIFY(QFile::remove(file));
    QTRY_COMPARE(deletedAndCreated.size(), 4);
    // Both views hear of the new file last.
    QCOMPARE(QStringList(deletedAndCreated.mid(0, 2)).filter(u"-"_s).size(), 2);
    QCOMPARE(QStringList(deletedAndCreated.mid(2)).filter(u"+"_s).size(), 2);
    watcher->clear();
}

void NestedNewsTest::watcherDeletedInItsSlot()
{
    const QTemporaryDir directory;
    told(
        u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s,
        arguments({u"E"_s, directory.path()}));
    auto* const watcher = new EntryWatcher;
    watcher->addEntry(vfs->entry(u"Favourites/E"_s));
    int count = 0;
    connect(watcher, &EntryWatcher::entryCreated, vfs, [&count, watcher] {
        ++count;
        delete watcher;
    });
    QVERIFY(QDir(directory.path()).mkdir(u"d"_s));
    QTRY_COMPARE(count, 1);
}

void NestedNewsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(NestedNewsTest)
#include "tst_nestednews.moc"
