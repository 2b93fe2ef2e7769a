// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfstest.h"

using namespace VeyFM;

/// How the tree follows storage devices.
class StorageUpdatesTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void nothingIsFollowedBeforeTheFirstLook();
    void firstLookTakesTheList();
    void typesAreMapped();
    void typesOutOfRangeMakeNoPlace();
    void addedTwice();
    void equalFlagsGiveTheResetAlone();
    void mountStateThenMountability();
    void unknownDeviceIsTold();
    void removedIsToldFirst();
    void removedStrangerIsTold();
    void treeOutlivesTheService();

private:
    QStringList storageNews(const QString& signal, const QJsonArray& place)
    {
        return news(u"StoragePlacesManager"_s, u"storagePlace"_s + signal, arguments(place));
    }
};

void StorageUpdatesTest::initTestCase()
{
    QJsonArray devices;
    for (int type = 0; type <= 9; ++type) {
        const QString name = QString::number(type);
        devices.append(device(u"t"_s + name, u"U"_s + name, type));
    }
    QVERIFY(startVfs("{}"));
    service->setValue(u"StoragePlacesManager.availableStoragePlaces"_s, devices);
    service->takeCalls();
}

void StorageUpdatesTest::nothingIsFollowedBeforeTheFirstLook()
{
    QCOMPARE(storageNews(u"Added"_s, device(u"early"_s, u"E"_s)), QStringList());
    QCOMPARE(storageNews(u"Updated"_s, device(u"t3"_s, u"U3"_s, 3, u"/m"_s)), QStringList());
    QCOMPARE(storageNews(u"Removed"_s, device(u"t3"_s, u"U3"_s)), QStringList());
    QVERIFY(vfs->placeBase()->hasChilds(vfs->storageDevicesEntry()));
    QCOMPARE(service->takeCalls(), QStringList());
}

void StorageUpdatesTest::firstLookTakesTheList()
{
    QStringList expected;
    for (int type = 1; type <= 8; ++type) {
        expected << u"Storage devices/t"_s + QString::number(type);
    }
    QCOMPARE(vfs->childs(vfs->storageDevicesEntry()).paths(), expected);
    // No entryCreated: the children are on their way to whoever asked.
    QCOMPARE(log->takeAll(service), QStringList({u"started"_s, u"finished"_s}));
    vfs->childs(vfs->storageDevicesEntry());
    QCOMPARE(log->takeAll(service), QStringList());
    QCOMPARE(service->takeCalls(), QStringList(u"StoragePlacesManager.availableStoragePlaces[]"_s));
}

void StorageUpdatesTest::typesAreMapped()
{
    QList<int> types;
    const EntryList devices = vfs->childs(vfs->storageDevicesEntry());
    for (const Entry& entry : devices) {
        types << entry.type();
    }
    // 1 and 3 swap against the order of the entry types.
    QCOMPARE(types, QList<int>({3502, 3501, 3500, 3503, 3504, 3505, 3506, 3507}));
}

void StorageUpdatesTest::typesOutOfRangeMakeNoPlace()
{
    for (const int type : {0, 9, -1, 3500, 0x7fffffff}) {
        QCOMPARE(storageNews(u"Added"_s, device(u"odd"_s, u"O"_s, type)), QStringList());
        QVERIFY(!vfs->placeBase()->hasPlace(u"Storage devices/odd"_s));
    }
}

void StorageUpdatesTest::addedTwice()
{
    QCOMPARE(
        storageNews(u"Added"_s, device(u"new"_s, u"N"_s, 3, u"/media/new"_s)),
        QStringList(u"created Storage devices/new=/media/new"_s));
    QCOMPARE(
        storageNews(u"Added"_s, device(u"new"_s, u"N2"_s, 4, u"/media/second"_s)), QStringList());
    QCOMPARE(treeLocalPath(u"Storage devices/new"_s), u"/media/new"_s);
    QCOMPARE(vfs->entry(u"Storage devices/new"_s).type(), int(TypeUsbDiskStoragePlace));
    storageNews(u"Removed"_s, device(u"none"_s, u"N2"_s));
}

void StorageUpdatesTest::equalFlagsGiveTheResetAlone()
{
    // With the old local path, as the copy was taken before the change.
    QCOMPARE(
        storageNews(u"Updated"_s, device(u"new"_s, u"N"_s, 3, u"/media/other"_s)),
        QStringList(u"reset Storage devices/new=/media/new"_s));
    QCOMPARE(treeLocalPath(u"Storage devices/new"_s), u"/media/other"_s);
    QCOMPARE(vfs->entry(u"Storage devices/new"_s).localPath(), u"/media/other"_s);
}

void StorageUpdatesTest::mountStateThenMountability()
{
    QStringList whileTold;
    const auto look = [&] {
        whileTold << u"<"_s + treeLocalPath(u"Storage devices/t3"_s);
    };
    QObject receiver;
    connect(vfs, &VFS::storagePlaceMountStateChanged, &receiver, look);
    connect(vfs, &VFS::storagePlaceMountabilityChanged, &receiver, look);
    QCOMPARE(
        storageNews(u"Updated"_s, device(u"t3"_s, u"U3"_s, 3, u"/m"_s, false)),
        QStringList({u"mountState U3"_s, u"mountability U3"_s, u"reset Storage devices/t3"_s}));
    // Both run before the tree knows.
    QCOMPARE(whileTold, QStringList({u"<"_s, u"<"_s}));
    QCOMPARE(treeLocalPath(u"Storage devices/t3"_s), u"/m"_s);
    QCOMPARE(
        storageNews(u"Updated"_s, device(u"t3"_s, u"U3"_s, 3, QString(), false)),
        QStringList({u"mountState U3"_s, u"reset Storage devices/t3=/m"_s}));
    QCOMPARE(
        storageNews(u"Updated"_s, device(u"t3"_s, u"U3"_s, 3, QString(), true)),
        QStringList({u"mountability U3"_s, u"reset Storage devices/t3"_s}));
}

void StorageUpdatesTest::unknownDeviceIsTold()
{
    // The old state is a default record: mountable and not mounted.
    QCOMPARE(
        storageNews(u"Updated"_s, device(u"nowhere"_s, u"X"_s, 3, u"/x"_s, false)),
        QStringList({u"mountState X"_s, u"mountability X"_s, u"reset -"_s}));
    QCOMPARE(storageNews(u"Updated"_s, device(u"nowhere"_s, u"X"_s)), QStringList(u"reset -"_s));
}

void StorageUpdatesTest::removedIsToldFirst()
{
    bool stillThere = false;
    QObject receiver;
    connect(vfs, &VFS::storagePlaceRemoved, &receiver, [&](const StoragePlace& place) {
        stillThere = vfs->placeBase()->hasPlace(place.name());
    });
    QCOMPARE(
        storageNews(u"Removed"_s, device(u"new"_s, u"N"_s)),
        QStringList({u"removed N"_s, u"deleted Storage devices/new=/media/other"_s}));
    QVERIFY(stillThere);
    QVERIFY(!childPaths(u"Storage devices"_s).contains(u"Storage devices/new"_s));
}

void StorageUpdatesTest::removedStrangerIsTold()
{
    QCOMPARE(storageNews(u"Removed"_s, device(u"nowhere"_s, u"X"_s)), QStringList(u"removed X"_s));
}

void StorageUpdatesTest::treeOutlivesTheService()
{
    const QStringList before = childPaths(u"Storage devices"_s);
    QCOMPARE(service->violations(), QStringList());
    service->exit();
    QCOMPARE(childPaths(u"Storage devices"_s), before);
    QCOMPARE(vfs->storagePlacesByType(StoragePlace::StorageTypeUsbDisk).size(), 1);
}

QTEST_GUILESS_MAIN(StorageUpdatesTest)
#include "tst_placeupdates_storage.moc"
