// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "support/vfstest.h"

#include <QTemporaryDir>

using namespace VeyFM;

/// From entries back to the records of the service.
class RecordLookupsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void storagePlaceOpensStorageDevices();
    void storagePlaceOfOtherEntries();
    void firstDeviceOfANameCounts();
    void localPathOfADeviceIsAskedEachTime();
    void freshStoragePlace();
    void storagePlacesByType();
    void networkPlace();
    void favouritePlaceGoesByDirectory();
    void hasFavouritePlace();
    void bookmarkUrls();
    void bookmarkWithoutAPlace();
    void cleanupTestCase();

private:
    QTemporaryDir m_directory;
};

void RecordLookupsTest::initTestCase()
{
    const QByteArray script = R"({"values": {
        "NetworkPlacesManager.networkPlaces":
            [["N", "ftp://n", ""], ["N", "ftp://second", ""], ["S", "smb://h/s", "/s"]]}})";
    QVERIFY(startVfs(script));
    service->setValue(
        u"StoragePlacesManager.availableStoragePlaces"_s,
        QJsonArray{
            device(u"sda"_s, u"A"_s, 4, u"/a"_s), device(u"sdb"_s, u"B"_s, 3),
            device(u"sda"_s, u"C"_s, 4, u"/c"_s), device(u"hidden"_s, u"H"_s, 0)});
}

void RecordLookupsTest::storagePlaceOpensStorageDevices()
{
    // By an entry from elsewhere: an EntryList on the bus may name a device nobody has seen.
    service->takeCalls();
    QByteArray bytes;
    QDataStream out(&bytes, QIODevice::WriteOnly);
    out << u"Storage devices/sdb"_s << QString() << qint32(TypeUsbDiskStoragePlace);
    Entry entry;
    QDataStream in(bytes);
    in >> entry;
    QCOMPARE(vfs->storagePlace(entry).udi(), u"B"_s);
    QCOMPARE(log->take(), QStringList({u"started"_s, u"finished"_s}));
    QCOMPARE(service->takeCalls().size(), 1);
}

void RecordLookupsTest::storagePlaceOfOtherEntries()
{
    QVERIFY(!vfs->storagePlace(Entry()).isValid());
    QVERIFY(!vfs->storagePlace(vfs->homeEntry()).isValid());
    QVERIFY(!vfs->storagePlace(vfs->storageDevicesEntry()).isValid());
    QVERIFY(!vfs->storagePlace(vfs->entry(u"/tmp"_s)).isValid());
    // A device that is not shown has a record and no place.
    QVERIFY(vfs->freshStoragePlace(vfs->storagePlacesByType(StoragePlace::StorageTypeNone).first())
                .isValid());
    QVERIFY(vfs->entry(u"Storage devices/hidden"_s).isNull());
}

void RecordLookupsTest::firstDeviceOfANameCounts()
{
    const Entry entry = vfs->entry(u"Storage devices/sda"_s);
    const StoragePlace place = vfs->storagePlace(entry);
    QCOMPARE(place.udi(), u"A"_s);
    QCOMPARE(place.name(), entry.path());
}

void RecordLookupsTest::localPathOfADeviceIsAskedEachTime()
{
    const Entry entry = vfs->entry(u"Storage devices/sdb"_s);
    QVERIFY(entry.isPurePlace());
    news(
        u"StoragePlacesManager"_s, u"storagePlaceUpdated"_s,
        arguments(device(u"sdb"_s, u"B"_s, 3, u"/b"_s)));
    QCOMPARE(entry.localPath(), u"/b"_s);
    QVERIFY(entry.isDirPlace() && !entry.isPurePlace());
}

void RecordLookupsTest::freshStoragePlace()
{
    StoragePlace held = vfs->storagePlace(vfs->entry(u"Storage devices/sdb"_s));
    news(
        u"StoragePlacesManager"_s, u"storagePlaceUpdated"_s,
        arguments(device(u"sdb"_s, u"B"_s, 3, u"/elsewhere"_s)));
    QCOMPARE(held.mountPoint(), u"/b"_s);
    QCOMPARE(vfs->freshStoragePlace(held).mountPoint(), u"/elsewhere"_s);
    QVERIFY(!vfs->freshStoragePlace(StoragePlace()).isValid());
}

void RecordLookupsTest::storagePlacesByType()
{
    const auto disks = vfs->storagePlacesByType(StoragePlace::StorageTypeHardDiskDrive);
    QCOMPARE(disks.size(), 2);
    QCOMPARE(disks.first().udi(), u"A"_s);
    QCOMPARE(disks.last().udi(), u"C"_s);
    QVERIFY(vfs->storagePlacesByType(StoragePlace::StorageType8).isEmpty());
}

void RecordLookupsTest::networkPlace()
{
    QCOMPARE(vfs->networkPlace(vfs->entry(u"Network/N"_s)).url(), u"ftp://n"_s);
    // By type first: only a bookmark's place has a bookmark.
    QVERIFY(vfs->networkPlace(vfs->sambaNetworkEntry()).isNull());
    QVERIFY(vfs->networkPlace(vfs->homeEntry()).isNull());
    QVERIFY(vfs->networkPlace(Entry()).isNull());
}

void RecordLookupsTest::favouritePlaceGoesByDirectory()
{
    const QString directory = m_directory.path();
    news(u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, arguments({u"Mine"_s, directory}));
    QCOMPARE(vfs->favouritePlace(vfs->entry(u"Favourites/Mine"_s)).name(), u"Mine"_s);
    // A plain directory finds its bookmark too.
    const Entry plain = vfs->entry(directory);
    QVERIFY(plain.isDir());
    QCOMPARE(vfs->favouritePlace(plain).name(), u"Mine"_s);
    QVERIFY(vfs->favouritePlace(vfs->entry(u"/"_s)).localPath.isEmpty());
    QCOMPARE(vfs->favouritePlacePath(FavouritePlace(u"a/b"_s, QString())), u"Favourites/a/b"_s);
}

void RecordLookupsTest::hasFavouritePlace()
{
    QVERIFY(vfs->hasFavouritePlace(FavouritePlace(u"another name"_s, m_directory.path())));
    QVERIFY(!vfs->hasFavouritePlace(FavouritePlace(u"Mine"_s, u"/elsewhere"_s)));
}

void RecordLookupsTest::bookmarkUrls()
{
    // The bookmark itself ends in two slashes, and keeps them.
    QCOMPARE(vfs->getUrlForEntry(vfs->entry(u"Network/N"_s)), u"ftp://n//"_s);
    QCOMPARE(vfs->getUrlForEntry(vfs->entry(u"Network/S"_s)), u"smb://h/s//"_s);
    const Entry below = vfs->child(vfs->entry(u"Network/S"_s), u"sub"_s);
    QCOMPARE(below.path(), u"Network/S/sub"_s);
    QCOMPARE(vfs->getUrlForEntry(below), u"smb://h/s/sub"_s);
    QCOMPARE(vfs->getUrlForEntry(vfs->entry(u"Network/S/sub/deep"_s)), u"smb://h/s/sub/deep"_s);
    QVERIFY(vfs->getUrlForEntry(vfs->networkEntry()).isEmpty());
}

void RecordLookupsTest::bookmarkWithoutAPlace()
{
    const Entry gone = vfs->entry(u"Network/S"_s);
    news(u"NetworkPlacesManager"_s, u"networkPlaceRemoved"_s, arguments({u"S"_s, u""_s, u""_s}));
    QVERIFY(vfs->getUrlForEntry(gone).isEmpty());
    // The client's list forgets the record as well.
    QVERIFY(vfs->networkPlace(gone).isNull());
}

void RecordLookupsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(RecordLookupsTest)
#include "tst_recordlookups.moc"
