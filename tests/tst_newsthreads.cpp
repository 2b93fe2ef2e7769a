// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Every operation that any thread may call, in eight of them, while the service's news change the
// devices, bookmarks, mounts and shares that it looks at.

#include "service/networkplacesmanagerproxy.h"
#include "support/makeentry.h"
#include "support/vfstest.h"

#include <atomic>
#include <thread>
#include <vector>

using namespace VeyFM;

namespace {

constexpr int workerCount = 8;

// What all threads ask for again and again. The paths lead to what comes and goes.
class Walk
{
public:
    explicit Walk(const QStringList& paths)
        : m_paths(paths)
    {
    }

    // Whether what was found made sense.
    bool lookAtRecords()
    {
        bool ok = true;
        const QList<StoragePlace> devices =
            m_vfs->storagePlacesByType(StoragePlace::StorageTypeUsbDisk);
        for (const StoragePlace& device : devices) {
            const StoragePlace fresh = m_vfs->freshStoragePlace(device);
            ok = ok && (!fresh.isValid() || fresh.name() == device.name());
        }
        const FavouritePlace favourite(u"F"_s, u"/f/0"_s);
        ok = ok && m_vfs->favouritePlacePath(favourite) == u"Favourites/F"_s;
        m_vfs->hasFavouritePlace(favourite);
        const FavouritePlace found = m_vfs->favouritePlace(m_favourite);
        ok = ok && (found.localPath.isEmpty() || found.name() == u"0"_s);
        return isGood(m_vfs->networkPlace(m_bookmark)) && ok;
    }

    bool lookAtAll()
    {
        bool ok = true;
        EntryList entries;
        for (const QString& path : m_paths) {
            const Entry entry = m_vfs->entry(path);
            ok = lookAt(entry) && ok;
            entries << entry;
            ok = m_vfs->normalizePath(path) == path && ok;
            m_vfs->localPath(path);
            m_vfs->exploreParentPlacesHistory(path);
        }
        ok = m_vfs->urlsFromEntries(entries).size() <= entries.size() && ok;
        m_vfs->hasStoragePlaceRelativeEntries(entries);
        m_vfs->hasNetworkRelativeEntries(entries);
        ok = m_vfs->entriesFromUrls({QUrl(u"vey-fm:Home"_s)}).value(0) == m_vfs->homeEntry() && ok;
        const Entry share = m_vfs->smbShareEntry(u"s0"_s, u"h0"_s, u"W0"_s);
        ok = ok && (share.isNull() || share.path() == u"Samba/W0/h0/s0"_s);
        ok = ok && m_vfs->createEntryForUrl(u"ftp://h"_s, u"/m"_s).path() == u"FTP/h"_s;
        return lookAtRecords() && ok;
    }

private:
    bool lookAt(const Entry& entry)
    {
        m_vfs->localPath(entry);
        m_vfs->childs(entry);
        m_vfs->hasChilds(entry);
        m_vfs->containsDirsOrPlaces(entry);
        m_vfs->isEntryExists(entry);
        m_vfs->child(entry, u"c"_s);
        m_vfs->pathEntryList(entry);
        m_vfs->hasParent(entry);
        m_vfs->symLinkTargetEntry(entry);
        m_vfs->placeRelatedEntry(entry);
        m_vfs->isPlaceRelativeEntry(entry);
        m_vfs->isStoragePlaceRelativeEntry(entry);
        m_vfs->getUrlForEntry(entry);
        m_vfs->smbHost(entry);
        m_vfs->smbWorkgroup(entry);
        m_vfs->favouritePlace(entry);
        const StoragePlace device = m_vfs->storagePlace(entry);
        return isGood(m_vfs->networkPlace(entry)) &&
               (!device.isValid() || device.udi() == u"U"_s + device.labelName());
    }

    static bool isGood(const NetworkPlace& bookmark)
    {
        return bookmark.isNull() || bookmark.url() == u"ftp://"_s + bookmark.name();
    }

    VFS* const m_vfs = VFS::ptr();
    const QStringList m_paths;
    // Found without a look at the tree.
    const Entry m_favourite = makeEntry("/f/0", "/f/0", TypeDir);
    const Entry m_bookmark = makeEntry("Network/0", "/n/0", TypeFavouriteNetworkPlace);
};

} // namespace

class NewsThreadsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void unreadListIsReadByItsThread();
    void eightThreadsWhileNewsCome_data();
    void eightThreadsWhileNewsCome();
    void cleanupTestCase();

private:
    void sendStorage(int i);
    void sendFavourite(int i);
    void sendBookmark(int i);
    void sendMount(int i);
    void sendSamba(int i);
    void send(const QString& interface, const QString& name, const QJsonArray& arguments)
    {
        service->emitSignal(interface, name, arguments);
    }
};

using Send = void (NewsThreadsTest::*)(int);
Q_DECLARE_METATYPE(QList<Send>)

void NewsThreadsTest::initTestCase()
{
    const QByteArray script = R"({"values": {
        "StoragePlacesManager.availableStoragePlaces": [
            ["/m/0", true, true, false, "0", "", "", "U0", 3]],
        "FavouritePlacesManager.favouritePlaces": [["0", "/f/0"]],
        "NetworkPlacesManager.networkPlaces": [["0", "ftp://0", ""]],
        "SmbBrowser.workgroups": ["W0", "W1"],
        "SmbBrowser.hosts": ["h0", "h1"],
        "SmbBrowser.shares": {"s0": "", "s1": "/s1"}}})";
    QVERIFY(startVfs(script));
}

void NewsThreadsTest::unreadListIsReadByItsThread()
{
    // Nobody has looked at devices yet. Another thread finds none, and does not wait for the bus.
    service->takeCalls();
    QList<StoragePlace> first{StoragePlace()};
    QString localPath = u"none"_s;
    std::thread([&] {
        first = vfs->storagePlacesByType(StoragePlace::StorageTypeUsbDisk);
        for (int i = 0; i < 100; ++i) {
            localPath = vfs->localPath(u"Storage devices/0"_s);
            vfs->freshStoragePlace(StoragePlace());
        }
    }).join();
    QVERIFY(first.isEmpty());
    QCOMPARE(localPath, QString());
    QCOMPARE(service->calls(), QStringList());
    // The thread of VFS reads it, once, when it comes to its events.
    QTRY_COMPARE(childPaths(u"Storage devices"_s).size(), 1);
    log->takeAll(service);
    QCOMPARE(service->takeCalls(), QStringList(u"StoragePlacesManager.availableStoragePlaces[]"_s));
    std::thread([&] {
        first = vfs->storagePlacesByType(StoragePlace::StorageTypeUsbDisk);
        localPath = vfs->localPath(u"Storage devices/0"_s);
    }).join();
    QCOMPARE(first.size(), 1);
    QCOMPARE(localPath, u"/m/0"_s);
    QCOMPARE(service->calls(), QStringList());
}

void NewsThreadsTest::sendStorage(int i)
{
    const QString name = QString::number(i % 4);
    const QString mountPoint = i % 3 ? u"/m/"_s + name : QString();
    const char* const news[] = {"storagePlaceAdded", "storagePlaceUpdated", "storagePlaceRemoved"};
    send(
        u"StoragePlacesManager"_s, QString::fromLatin1(news[i % 3]),
        arguments(device(name, u"U"_s + name, 3, mountPoint)));
}

void NewsThreadsTest::sendFavourite(int i)
{
    const QString name = QString::number(i / 2 % 4);
    send(
        u"FavouritePlacesManager"_s, i % 2 ? u"favouritePlaceRemoved"_s : u"favouritePlaceAdded"_s,
        arguments({name, u"/f/"_s + name}));
}

void NewsThreadsTest::sendBookmark(int i)
{
    const QString name = QString::number(i / 3 % 4);
    const char* const news[] = {"networkPlaceAdded", "networkPlaceUpdated", "networkPlaceRemoved"};
    send(
        u"NetworkPlacesManager"_s, QString::fromLatin1(news[i % 3]),
        arguments({name, u"ftp://"_s + name, i % 2 ? u"/n/"_s + name : QString()}));
}

void NewsThreadsTest::sendMount(int i)
{
    const QString host = QString::number(i % 16);
    send(
        u"NetworkMountsManager"_s, u"mountAdded"_s,
        {u"sftp://"_s + host, QJsonArray{u"SFTP/"_s + host, u"/s/"_s + host, 4003}});
}

void NewsThreadsTest::sendSamba(int i)
{
    const bool all = i / 4 % 2;
    switch (i % 4) {
    case 0:
        service->setValue(
            u"SmbBrowser.workgroups"_s, all ? QJsonArray{u"W0"_s, u"W1"_s} : QJsonArray{u"W0"_s});
        send(u"SmbBrowser"_s, u"rescanFinished"_s, {true});
        break;
    case 1:
        service->setValue(
            u"SmbBrowser.hosts"_s, all ? QJsonArray{u"h0"_s, u"h1"_s} : QJsonArray{u"h0"_s});
        send(u"SmbBrowser"_s, u"rescanWorkgroupFinished"_s, {u"W0"_s, true});
        break;
    case 2:
        service->setValue(
            u"SmbBrowser.shares"_s,
            all ? object(R"({"s0": "", "s1": "/s1"})") : object(R"({"s0": ""})"));
        send(u"SmbBrowser"_s, u"rescanHostFinished"_s, {u"h0"_s, u"W0"_s, true});
        break;
    default:
        send(
            u"SmbBrowser"_s, u"shareUpdated"_s,
            {u"s0"_s, u"h0"_s, u"W0"_s, all ? u"/s0"_s : QString()});
    }
}

void NewsThreadsTest::eightThreadsWhileNewsCome_data()
{
    const Send storage = &NewsThreadsTest::sendStorage;
    const Send favourites = &NewsThreadsTest::sendFavourite;
    const Send bookmarks = &NewsThreadsTest::sendBookmark;
    const Send mounts = &NewsThreadsTest::sendMount;
    const Send samba = &NewsThreadsTest::sendSamba;
    // Each kind apart, so that no lock that another kind takes hides that one is missing.
    QTest::addColumn<QStringList>("paths");
    QTest::addColumn<QList<Send>>("sends");
    const QStringList devices{u"Storage devices/0"_s, u"Storage devices/1/d"_s};
    const QStringList favouritePaths{u"Favourites/0"_s, u"Favourites/1/d"_s};
    const QStringList bookmarkPaths{u"Network/0"_s, u"Network/1/d"_s};
    const QStringList mountPaths{u"SFTP/0"_s, u"SFTP/1/d"_s};
    const QStringList shares{u"Samba/W0"_s, u"Samba/W0/h0"_s, u"Samba/W0/h0/s0/d"_s};
    QTest::newRow("devices") << devices << QList<Send>{storage};
    QTest::newRow("favourites") << favouritePaths << QList<Send>{favourites};
    QTest::newRow("bookmarks") << bookmarkPaths << QList<Send>{bookmarks};
    QTest::newRow("mounts") << mountPaths << QList<Send>{mounts};
    QTest::newRow("Samba") << shares << QList<Send>{samba};
    QTest::newRow("all") << devices + favouritePaths + bookmarkPaths + mountPaths + shares
                         << QList<Send>{storage, favourites, bookmarks, mounts, samba};
}

void NewsThreadsTest::eightThreadsWhileNewsCome()
{
    QFETCH(QStringList, paths);
    QFETCH(QList<Send>, sends);
    constexpr int newsPerKind = 20;
    std::atomic<bool> stop{false};
    std::atomic<int> bad{0};
    std::atomic<int> rounds{0};
    std::vector<std::thread> workers;
    for (int i = 0; i < workerCount; ++i) {
        // Half of them look at the records alone, and share nothing with the thread of VFS but the
        // lists: the lock of the tree, or a count, would order what they do, and hide from the
        // thread sanitizer that a list has no lock.
        workers.emplace_back([&, i] {
            Walk walk(paths);
            int badRounds = 0;
            vfs->storageDeviceInfo(StoragePlace());
            while (!stop.load(std::memory_order_relaxed)) {
                if (i % 2) {
                    badRounds += !walk.lookAtRecords();
                } else {
                    badRounds += !walk.lookAtAll();
                    ++rounds;
                }
            }
            bad += badRounds;
        });
    }
    // The rounds go on while the news come, and the news until each worker has had some rounds.
    for (int i = 0; i < newsPerKind || rounds < 2 * workerCount; ++i) {
        for (const Send sendOne : qAsConst(sends)) {
            (this->*sendOne)(i);
        }
        QCoreApplication::processEvents();
    }
    log->takeAll(service);
    stop = true;
    for (std::thread& worker : workers) {
        worker.join();
    }
    QCOMPARE(int(bad), 0);
    log->takeAll(service);
}

void NewsThreadsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(NewsThreadsTest)
#include "tst_newsthreads.moc"
