// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entrylist.h"
#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "core/storagedeviceinfo.h"
#include "core/storageplace.h"
#include "core/stringmap.h"
#include "vfs/vfs.h"

#include <QDBusMetaType>
#include <QtTest>

using namespace VeyFM;

namespace {

template <typename T>
QByteArray toBytes(const T& value)
{
    QByteArray bytes;
    QDataStream stream(&bytes, QIODevice::WriteOnly);
    stream.setVersion(QDataStream::Qt_5_15);
    stream << value;
    return bytes;
}

template <typename T>
QDataStream::Status fromBytes(const QByteArray& bytes, T& value)
{
    QDataStream stream(bytes);
    stream.setVersion(QDataStream::Qt_5_15);
    stream >> value;
    return stream.status();
}

// The most address space that this process ever had, in KiB, or -1.
qint64 peakMemory()
{
    QFile status(QStringLiteral("/proc/self/status"));
    if (status.open(QIODevice::ReadOnly)) {
        for (const QByteArray& line : status.readAll().split('\n')) {
            if (line.startsWith("VmPeak:")) {
                return line.mid(7).trimmed().split(' ').first().toLongLong();
            }
        }
    }
    return -1;
}

} // namespace

class RecordsTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();

    void defaultRecords();
    void favouriteIdentity();
    void networkIdentity();
    void networkNull();
    void networkSetter();
    void storageTypes();
    void stringMapOrder();

    void metaTypes_data();
    void metaTypes();
    void bareNames_data();
    void bareNames();

    void favouriteStreamBytes();
    void networkStreamBytes();
    void listStreamBytes();
    void truncatedStreams();
    void hostileListCounts_data();
    void hostileListCounts();
    void listFromFailedStream();
};

void RecordsTest::initTestCase()
{
    VFS::initialize();
}

void RecordsTest::defaultRecords()
{
    QVERIFY(FavouritePlace().name().isNull());
    QVERIFY(FavouritePlace().localPath.isNull());

    const NetworkPlace network;
    QVERIFY(network.isNull());
    QVERIFY(network.name().isNull() && network.url().isNull() && network.localPath().isNull());

    const StoragePlace storage;
    QVERIFY(!storage.isValid());
    QVERIFY(storage.isMountable()); // The one flag that is set.
    QVERIFY(!storage.isMounted());
    QVERIFY(!storage.isEjectable());
    QVERIFY(storage.mountPoint().isNull() && storage.iconName().isNull());
    QVERIFY(storage.udi().isNull() && storage.labelName().isNull());
    QCOMPARE(storage.type(), StoragePlace::StorageTypeNone);

    const StorageDeviceInfo info;
    for (const QString& text :
         {info.text1, info.text2, info.text3, info.text4, info.text5, info.text6, info.text7,
          info.text8, info.text9, info.text10}) {
        QVERIFY(text.isNull());
    }
    QVERIFY(!info.flag1 && !info.flag2 && !info.localFlag);
    QVERIFY(!info.number1 && !info.number2 && !info.number3 && !info.number4 && !info.number5);
}

void RecordsTest::favouriteIdentity()
{
    const FavouritePlace first(QStringLiteral("B"), QStringLiteral("/a"));
    const FavouritePlace renamed(QStringLiteral("A"), QStringLiteral("/a"));
    const FavouritePlace other(QStringLiteral("B"), QStringLiteral("/b"));
    QCOMPARE(first.name(), QStringLiteral("B"));
    QCOMPARE(first.localPath, QStringLiteral("/a"));

    QVERIFY(first == renamed);
    QVERIFY(!(first == other));
    QVERIFY(first < other);
    QVERIFY(!(other < first));
    QVERIFY(!(first < renamed) && !(renamed < first));
    QVERIFY(FavouritePlace(QString(), QStringLiteral("/Z")) < first); // Upper case first.

    FavouritePlaceList list{first, other, renamed};
    QCOMPARE(list.indexOf(renamed), 0);
    QCOMPARE(list.removeAll(renamed), 2);
    QCOMPARE(list.size(), 1);
    QCOMPARE(list.first().localPath, QStringLiteral("/b"));
}

void RecordsTest::networkIdentity()
{
    const NetworkPlace first(
        QStringLiteral("n"), QStringLiteral("ftp://a"), QStringLiteral("/mnt/a"));
    const NetworkPlace moved(QStringLiteral("n"), QStringLiteral("smb://b"), QString());
    const NetworkPlace other(
        QStringLiteral("N"), QStringLiteral("ftp://a"), QStringLiteral("/mnt/a"));
    QVERIFY(first == moved);
    QVERIFY(!(first == other));

    NetworkPlaceList list{other, first, moved};
    QCOMPARE(list.indexOf(moved), 1);
    QCOMPARE(list.removeAll(moved), 2);
    QCOMPARE(list.size(), 1);
    QCOMPARE(list.first().name(), QStringLiteral("N"));
}

void RecordsTest::networkNull()
{
    QVERIFY(!NetworkPlace(QStringLiteral("n"), QString(), QString()).isNull());
    QVERIFY(NetworkPlace(QString(), QStringLiteral("ftp://a"), QStringLiteral("/a")).isNull());
    QVERIFY(NetworkPlace(QStringLiteral(""), QStringLiteral("ftp://a"), QString()).isNull());
}

void RecordsTest::networkSetter()
{
    NetworkPlace place(QStringLiteral("n"), QStringLiteral("ftp://a"), QString());
    const NetworkPlace copy(place);
    place.setLocalPath(QStringLiteral("/mnt/a"));
    QCOMPARE(place.localPath(), QStringLiteral("/mnt/a"));
    QCOMPARE(place.name(), QStringLiteral("n"));
    QCOMPARE(place.url(), QStringLiteral("ftp://a"));
    QVERIFY(copy.localPath().isNull());
}

void RecordsTest::storageTypes()
{
    QCOMPARE(int(StoragePlace::StorageTypeNone), 0);
    QCOMPARE(int(StoragePlace::StorageTypeFloppyDrive), 1);
    QCOMPARE(int(StoragePlace::StorageTypeCdromDrive), 2);
    QCOMPARE(int(StoragePlace::StorageTypeUsbDisk), 3);
    QCOMPARE(int(StoragePlace::StorageTypeHardDiskDrive), 4);
    QCOMPARE(int(StoragePlace::StorageType5), 5);
    QCOMPARE(int(StoragePlace::StorageType6), 6);
    QCOMPARE(int(StoragePlace::StorageType7), 7);
    QCOMPARE(int(StoragePlace::StorageType8), 8);
}

void RecordsTest::stringMapOrder()
{
    const StringMap map{
        {QStringLiteral("b"), QStringLiteral("1")},
        {QStringLiteral("a"), QStringLiteral("2")},
        {QStringLiteral("B"), QStringLiteral("3")}};
    QCOMPARE(
        map.keys(), QStringList({QStringLiteral("B"), QStringLiteral("a"), QStringLiteral("b")}));
}

void RecordsTest::metaTypes_data()
{
    QTest::addColumn<QByteArray>("name");
    QTest::addColumn<int>("type");
    QTest::addColumn<QByteArray>("signature");
    QTest::addColumn<bool>("streams");

    const auto row = [](const char* name, int type, const char* signature, bool streams) {
        QTest::newRow(name) << QByteArray(name) << type << QByteArray(signature) << streams;
    };
    row("VeyFM::Entry", qMetaTypeId<Entry>(), "(ssi)", true);
    row("VeyFM::EntryList", qMetaTypeId<EntryList>(), "a(ssi)", false);
    row("VeyFM::StringMap", qMetaTypeId<StringMap>(), "a{ss}", false);
    row("VeyFM::StringEntryMap", qMetaTypeId<QMap<QString, Entry>>(), "a{s(ssi)}", false);
    row("VeyFM::FavouritePlace", qMetaTypeId<FavouritePlace>(), "(ss)", true);
    row("VeyFM::FavouritePlaceList", qMetaTypeId<QList<FavouritePlace>>(), "a(ss)", true);
    row("VeyFM::NetworkPlace", qMetaTypeId<NetworkPlace>(), "(sss)", true);
    row("VeyFM::NetworkPlaceList", qMetaTypeId<QList<NetworkPlace>>(), "a(sss)", true);
    row("VeyFM::StoragePlace", qMetaTypeId<StoragePlace>(), "(sbbbssssi)", false);
    row("VeyFM::StoragePlaceList", qMetaTypeId<QList<StoragePlace>>(), "a(sbbbssssi)", false);
    row("VeyFM::StorageDeviceInfo", qMetaTypeId<StorageDeviceInfo>(), "(ssssbssssssttbttt)", false);
}

void RecordsTest::metaTypes()
{
    QFETCH(QByteArray, name);
    QFETCH(int, type);
    QFETCH(QByteArray, signature);
    QFETCH(bool, streams);

    QCOMPARE(QMetaType::type(name), type);
    QCOMPARE(QByteArray(QMetaType::typeName(type)), name);
    QCOMPARE(QByteArray(QDBusMetaType::typeToSignature(type)), signature);

    const QVariant value(type, nullptr);
    QByteArray bytes;
    QDataStream out(&bytes, QIODevice::WriteOnly);
    QCOMPARE(QMetaType::save(out, type, value.constData()), streams);
    QVariant back(type, nullptr);
    QDataStream in(bytes);
    QCOMPARE(QMetaType::load(in, type, back.data()), streams);
    QCOMPARE(in.status(), QDataStream::Ok);
}

void RecordsTest::bareNames_data()
{
    QTest::addColumn<QByteArray>("name");
    QTest::addColumn<int>("type");

    QTest::newRow("Entry") << QByteArray("Entry") << qMetaTypeId<Entry>();
    QTest::newRow("EntryList") << QByteArray("EntryList") << qMetaTypeId<EntryList>();
    QTest::newRow("StringMap") << QByteArray("StringMap") << qMetaTypeId<StringMap>();
}

void RecordsTest::bareNames()
{
    QFETCH(QByteArray, name);
    QFETCH(int, type);

    QCOMPARE(QMetaType::type(name), type);
}

void RecordsTest::favouriteStreamBytes()
{
    const FavouritePlace place(QStringLiteral("ab"), QStringLiteral("/"));
    const QByteArray bytes = QByteArray::fromHex("00000004"
                                                 "00610062"
                                                 "00000002"
                                                 "002f");
    QCOMPARE(toBytes(place), bytes);

    FavouritePlace back;
    QCOMPARE(fromBytes(bytes, back), QDataStream::Ok);
    QCOMPARE(back.name(), QStringLiteral("ab"));
    QCOMPARE(back.localPath, QStringLiteral("/"));

    QCOMPARE(
        toBytes(FavouritePlace()), QByteArray::fromHex("ffffffff"
                                                       "ffffffff"));
}

void RecordsTest::networkStreamBytes()
{
    const NetworkPlace place(QStringLiteral("n"), QStringLiteral("u"), QStringLiteral("/"));
    const QByteArray bytes = QByteArray::fromHex("00000002"
                                                 "006e"
                                                 "00000002"
                                                 "0075"
                                                 "00000002"
                                                 "002f");
    QCOMPARE(toBytes(place), bytes);

    NetworkPlace back;
    QCOMPARE(fromBytes(bytes, back), QDataStream::Ok);
    QCOMPARE(back.name(), QStringLiteral("n"));
    QCOMPARE(back.url(), QStringLiteral("u"));
    QCOMPARE(back.localPath(), QStringLiteral("/"));
}

void RecordsTest::listStreamBytes()
{
    const FavouritePlaceList favourites{
        {QStringLiteral("a"), QStringLiteral("b")}, {QStringLiteral("c"), QStringLiteral("d")}};
    const QByteArray favouriteBytes = QByteArray::fromHex("00000002"
                                                          "00000002"
                                                          "0061"
                                                          "00000002"
                                                          "0062"
                                                          "00000002"
                                                          "0063"
                                                          "00000002"
                                                          "0064");
    QCOMPARE(toBytes(favourites), favouriteBytes);
    FavouritePlaceList favouritesBack{FavouritePlace()};
    QCOMPARE(fromBytes(favouriteBytes, favouritesBack), QDataStream::Ok);
    QCOMPARE(favouritesBack, favourites);
    QCOMPARE(favouritesBack.last().name(), QStringLiteral("c"));

    const NetworkPlaceList networks{
        {QStringLiteral("n"), QStringLiteral("u"), QStringLiteral("/")}};
    const QByteArray networkBytes = QByteArray::fromHex("00000001"
                                                        "00000002"
                                                        "006e"
                                                        "00000002"
                                                        "0075"
                                                        "00000002"
                                                        "002f");
    QCOMPARE(toBytes(networks), networkBytes);
    NetworkPlaceList networksBack{NetworkPlace(), NetworkPlace()};
    QCOMPARE(fromBytes(networkBytes, networksBack), QDataStream::Ok);
    QCOMPARE(networksBack, networks);
    QCOMPARE(networksBack.first().url(), QStringLiteral("u"));

    QCOMPARE(toBytes(NetworkPlaceList()), QByteArray::fromHex("00000000"));
}

void RecordsTest::truncatedStreams()
{
    const FavouritePlace favourite(QStringLiteral("ab"), QStringLiteral("/"));
    const NetworkPlace network(QStringLiteral("n"), QStringLiteral("u"), QStringLiteral("/"));
    const QByteArray favouriteBytes = toBytes(favourite);
    const QByteArray networkBytes = toBytes(network);
    const QByteArray listBytes = toBytes(FavouritePlaceList{favourite, favourite});

    for (int size = 0; size < favouriteBytes.size(); ++size) {
        FavouritePlace back(QStringLiteral("old"), QStringLiteral("old"));
        QVERIFY(fromBytes(favouriteBytes.left(size), back) != QDataStream::Ok);
        QVERIFY(back.name().isEmpty() || back.name() == QStringLiteral("ab"));
        QVERIFY(back.localPath.isEmpty());
    }
    for (int size = 0; size < networkBytes.size(); ++size) {
        NetworkPlace back;
        QVERIFY(fromBytes(networkBytes.left(size), back) != QDataStream::Ok);
        QVERIFY(back.localPath().isEmpty());
    }
    for (int size = 0; size < listBytes.size(); ++size) {
        FavouritePlaceList back{favourite};
        QVERIFY(fromBytes(listBytes.left(size), back) != QDataStream::Ok);
        QVERIFY(back.isEmpty());
    }
}

void RecordsTest::hostileListCounts_data()
{
    QTest::addColumn<QByteArray>("bytes");

    const QByteArray element = QByteArray::fromHex("00000002"
                                                   "0061"
                                                   "00000002"
                                                   "0062");
    QTest::newRow("highest") << QByteArray::fromHex("ffffffff") + element;
    QTest::newRow("highest of an int") << QByteArray::fromHex("7fffffff") + element;
    QTest::newRow("a gigabyte of pointers") << QByteArray::fromHex("08000000") + element;
    QTest::newRow("huge text") << QByteArray::fromHex("00000001"
                                                      "fffffffe"
                                                      "0061");
    QTest::newRow("odd text") << QByteArray::fromHex("00000001"
                                                     "00000003"
                                                     "006100");
}

void RecordsTest::hostileListCounts()
{
    QFETCH(QByteArray, bytes);

    const qint64 before = peakMemory();
    QVERIFY(before > 0);
    FavouritePlaceList favourites{FavouritePlace()};
    QVERIFY(fromBytes(bytes, favourites) != QDataStream::Ok);
    QVERIFY(favourites.isEmpty());
    NetworkPlaceList networks{NetworkPlace()};
    QVERIFY(fromBytes(bytes, networks) != QDataStream::Ok);
    QVERIFY(networks.isEmpty());
    const qint64 growth = peakMemory() - before;
    QVERIFY2(growth < 65536, "room was made for what is only announced");
}

void RecordsTest::listFromFailedStream()
{
    // As Qt reads its containers: all the same, with the old status left behind.
    const QByteArray bytes =
        toBytes(FavouritePlaceList{FavouritePlace(QStringLiteral("a"), QStringLiteral("b"))});
    QDataStream stream(bytes);
    stream.setStatus(QDataStream::ReadCorruptData);
    FavouritePlaceList favourites;
    stream >> favourites;
    QCOMPARE(stream.status(), QDataStream::ReadCorruptData);
    QCOMPARE(favourites.size(), 1);
    QCOMPARE(favourites.first().name(), QStringLiteral("a"));
}

QTEST_GUILESS_MAIN(RecordsTest)
#include "tst_records.moc"
