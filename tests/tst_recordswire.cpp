// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "core/storagedeviceinfo.h"
#include "core/storageplace.h"
#include "core/stringmap.h"
#include "support/dbuswire.h"
#include "vfs/vfs.h"

#include <QDBusReply>
#include <QtTest>

#include <limits>

using namespace VeyFM;

namespace {

// The reserved text of a storage place has no accessor, and yet goes with copies. Naming a private
// member is allowed in an explicit instantiation, which spares the class a friend.
QString& reservedText(StoragePlace& place);

template <auto Member>
struct ReservedText
{
    friend QString& reservedText(StoragePlace& place)
    {
        return place.*Member;
    }
};
template struct ReservedText<&StoragePlace::m_reservedText>;

// The members of a storage place in wire order.
struct StorageFields
{
    QString mountPoint;
    bool mounted = false;
    bool mountable = false;
    bool ejectable = false;
    QString placeName;
    QString label;
    QString iconName;
    QString udi;
    int type = 0;
};

QDBusArgument storageArgument(const StorageFields& fields)
{
    QDBusArgument argument;
    argument.beginStructure();
    argument << fields.mountPoint << fields.mounted << fields.mountable << fields.ejectable
             << fields.placeName << fields.label << fields.iconName << fields.udi << fields.type;
    argument.endStructure();
    return argument;
}

StorageFields usbStick()
{
    StorageFields fields;
    fields.mountPoint = QStringLiteral("/media/stick");
    fields.mounted = true;
    fields.placeName = QStringLiteral("sdb1");
    fields.label = QStringLiteral("Holiday");
    fields.iconName = QStringLiteral("drive-removable");
    fields.udi = QStringLiteral("/dev/disk/1");
    fields.type = StoragePlace::StorageTypeUsbDisk;
    return fields;
}

} // namespace

/// The records as they cross D-Bus, and storage places, which get their values nowhere else.
class RecordsWireTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void storageIdentity();
    void storageNames();
    void favouriteOnTheWire();
    void networkOnTheWire();
    void storageOnTheWire();
    void storageTypeOutOfRange_data();
    void storageTypeOutOfRange();
    void storageReservedText();
    void deviceInfoOnTheWire();
    void listsOnTheWire();
    void mapsOnTheWire();
    void emptyContainersOnTheWire();
    void wrongSignatureReadsAsDefault();

private:
    StoragePlace storagePlace(const StorageFields& fields);

    QScopedPointer<DBusWire> m_wire;
};

void RecordsWireTest::initTestCase()
{
    VFS::initialize();
    m_wire.reset(new DBusWire);
    QVERIFY(m_wire->isConnected());
}

StoragePlace RecordsWireTest::storagePlace(const StorageFields& fields)
{
    StoragePlace place;
    place.fromDBusArgument(m_wire->exchange(QVariant::fromValue(storageArgument(fields))));
    return place;
}

void RecordsWireTest::storageIdentity()
{
    QVERIFY(StoragePlace() == StoragePlace()); // Although both are invalid.

    StorageFields fields = usbStick();
    const StoragePlace first = storagePlace(fields);
    fields.mountPoint.clear();
    fields.mounted = false;
    fields.type = StoragePlace::StorageTypeNone;
    const StoragePlace unmounted = storagePlace(fields);
    fields = usbStick();
    fields.udi = QStringLiteral("/dev/disk/2");
    const StoragePlace other = storagePlace(fields);

    QVERIFY(first.isValid());
    QVERIFY(first == unmounted);
    QVERIFY(!(first == other));
    QVERIFY(first < other && !(other < first));
    QVERIFY(!(first < unmounted) && !(unmounted < first));

    StoragePlaceList list{first, other, unmounted};
    QCOMPARE(list.indexOf(unmounted), 0);
    QCOMPARE(list.removeAll(unmounted), 2);
    QCOMPARE(list.size(), 1);
    QCOMPARE(list.first().udi(), QStringLiteral("/dev/disk/2"));
}

void RecordsWireTest::storageNames()
{
    const QString devices = VFS::ptr()->storageDevicesEntry().path();
    QVERIFY(!devices.isEmpty());

    StorageFields fields = usbStick();
    StoragePlace place = storagePlace(fields);
    QCOMPARE(place.labelName(), QStringLiteral("Holiday"));
    QCOMPARE(place.name(), devices + QStringLiteral("/sdb1"));

    fields.label.clear();
    place = storagePlace(fields);
    QCOMPARE(place.labelName(), QStringLiteral("sdb1")); // Never the path.
    QCOMPARE(place.name(), devices + QStringLiteral("/sdb1"));

    QCOMPARE(StoragePlace().name(), devices + QLatin1Char('/'));
}

void RecordsWireTest::favouriteOnTheWire()
{
    const FavouritePlace place(QStringLiteral("Music \u00e4"), QStringLiteral("/home/me/Music"));
    const QDBusArgument fields = m_wire->exchange(QVariant::fromValue(place));
    QCOMPARE(m_wire->signature(), QStringLiteral("(ss)"));

    QString name;
    QString localPath;
    fields.beginStructure();
    fields >> name >> localPath;
    QVERIFY(fields.atEnd());
    fields.endStructure();
    QCOMPARE(name, place.name());
    QCOMPARE(localPath, place.localPath);

    FavouritePlace back;
    m_wire->exchange(QVariant::fromValue(place)) >> back;
    QCOMPARE(back.name(), place.name());
    QCOMPARE(back.localPath, place.localPath);
}

void RecordsWireTest::networkOnTheWire()
{
    const NetworkPlace place(
        QStringLiteral("name"), QStringLiteral("ftp://host"), QStringLiteral("/mnt"));
    const QDBusArgument fields = m_wire->exchange(QVariant::fromValue(place));
    QCOMPARE(m_wire->signature(), QStringLiteral("(sss)"));

    QString name;
    QString url;
    QString localPath;
    fields.beginStructure();
    fields >> name >> url >> localPath;
    QVERIFY(fields.atEnd());
    fields.endStructure();
    QCOMPARE(
        QStringList({name, url, localPath}),
        QStringList({place.name(), place.url(), place.localPath()}));

    NetworkPlace back;
    m_wire->exchange(QVariant::fromValue(place)) >> back;
    QCOMPARE(back.name(), place.name());
    QCOMPARE(back.url(), place.url());
    QCOMPARE(back.localPath(), place.localPath());
}

void RecordsWireTest::storageOnTheWire()
{
    // Each flag by itself, since their order on the wire is not that of the members.
    for (int set = 0; set < 3; ++set) {
        StorageFields fields = usbStick();
        fields.mounted = set == 0;
        fields.mountable = set == 1;
        fields.ejectable = set == 2;
        const StoragePlace place = storagePlace(fields);
        QCOMPARE(place.mountPoint(), fields.mountPoint);
        QCOMPARE(place.isMounted(), fields.mounted);
        QCOMPARE(place.isMountable(), fields.mountable);
        QCOMPARE(place.isEjectable(), fields.ejectable);
        QCOMPARE(place.labelName(), fields.label);
        QCOMPARE(place.iconName(), fields.iconName);
        QCOMPARE(place.udi(), fields.udi);
        QCOMPARE(place.type(), StoragePlace::StorageTypeUsbDisk);

        const QDBusArgument written = m_wire->exchange(QVariant::fromValue(place));
        QCOMPARE(m_wire->signature(), QStringLiteral("(sbbbssssi)"));
        StorageFields back;
        written.beginStructure();
        written >> back.mountPoint >> back.mounted >> back.mountable >> back.ejectable >>
            back.placeName >> back.label >> back.iconName >> back.udi >> back.type;
        QVERIFY(written.atEnd());
        written.endStructure();
        QCOMPARE(back.mountPoint, fields.mountPoint);
        QCOMPARE(back.mounted, fields.mounted);
        QCOMPARE(back.mountable, fields.mountable);
        QCOMPARE(back.ejectable, fields.ejectable);
        QCOMPARE(back.placeName, fields.placeName);
        QCOMPARE(back.label, fields.label);
        QCOMPARE(back.iconName, fields.iconName);
        QCOMPARE(back.udi, fields.udi);
        QCOMPARE(back.type, fields.type);
    }
}

void RecordsWireTest::storageTypeOutOfRange_data()
{
    QTest::addColumn<int>("type");

    QTest::newRow("9") << 9;
    QTest::newRow("-1") << -1;
    QTest::newRow("highest") << std::numeric_limits<int>::max();
    QTest::newRow("lowest") << std::numeric_limits<int>::min();
}

void RecordsWireTest::storageTypeOutOfRange()
{
    QFETCH(int, type);

    StorageFields fields = usbStick();
    fields.type = type;
    StoragePlace place = storagePlace(fields);
    QCOMPARE(int(place.type()), type);

    StoragePlace back;
    m_wire->exchange(QVariant::fromValue(place)) >> back;
    QCOMPARE(int(back.type()), type);
}

void RecordsWireTest::storageReservedText()
{
    StoragePlace place;
    reservedText(place) = QStringLiteral("kept");
    StoragePlace copy(place);
    QCOMPARE(reservedText(copy), QStringLiteral("kept"));
    StoragePlace assigned;
    assigned = place;
    QCOMPARE(reservedText(assigned), QStringLiteral("kept"));

    // It does not cross the wire, and what comes from there leaves it alone.
    const QDBusArgument argument = m_wire->exchange(QVariant::fromValue(place));
    StoragePlace fresh;
    argument >> fresh;
    QVERIFY(reservedText(fresh).isNull());

    place.fromDBusArgument(m_wire->exchange(QVariant::fromValue(storageArgument(usbStick()))));
    QCOMPARE(place.udi(), usbStick().udi);
    QCOMPARE(reservedText(place), QStringLiteral("kept"));
}

void RecordsWireTest::deviceInfoOnTheWire()
{
    StorageDeviceInfo info;
    info.text1 = QStringLiteral("1");
    info.text2 = QStringLiteral("2");
    info.text3 = QStringLiteral("3");
    info.text4 = QStringLiteral("4");
    info.flag1 = true;
    info.text5 = QStringLiteral("5");
    info.text6 = QStringLiteral("6");
    info.text7 = QStringLiteral("7");
    info.text8 = QStringLiteral("8");
    info.text9 = QStringLiteral("9");
    info.text10 = QStringLiteral("10");
    info.number1 = std::numeric_limits<quint64>::max();
    info.number2 = 2;
    info.flag2 = false;
    info.number3 = 3;
    info.number4 = 4;
    info.localFlag = true;
    info.number5 = 5;

    const QDBusArgument fields = m_wire->exchange(QVariant::fromValue(info));
    QCOMPARE(m_wire->signature(), QStringLiteral("(ssssbssssssttbttt)"));
    QStringList texts;
    QList<quint64> numbers;
    QList<bool> flags;
    fields.beginStructure();
    while (!fields.atEnd()) {
        const QVariant value = fields.asVariant();
        if (value.userType() == QMetaType::QString) {
            texts.append(value.toString());
        } else if (value.userType() == QMetaType::Bool) {
            flags.append(value.toBool());
        } else {
            QCOMPARE(value.userType(), int(QMetaType::ULongLong));
            numbers.append(value.toULongLong());
        }
    }
    fields.endStructure();
    QStringList expected;
    for (int i = 1; i <= 10; ++i) {
        expected.append(QString::number(i));
    }
    QCOMPARE(texts, expected);
    QCOMPARE(flags, QList<bool>({true, false}));
    QCOMPARE(numbers, QList<quint64>({std::numeric_limits<quint64>::max(), 2, 3, 4, 5}));

    StorageDeviceInfo fresh;
    m_wire->exchange(QVariant::fromValue(info)) >> fresh;
    QVERIFY(!fresh.localFlag); // Its twin crosses the wire, and this one does not.
    QVERIFY(fresh.flag1 && !fresh.flag2);
    QCOMPARE(fresh.text4, info.text4);
    QCOMPARE(fresh.text5, info.text5);
    QCOMPARE(fresh.text10, info.text10);
    QCOMPARE(
        QList<quint64>({fresh.number1, fresh.number2, fresh.number3, fresh.number4, fresh.number5}),
        numbers);

    info.flag1 = false;
    info.flag2 = true;
    info.localFlag = false;
    StorageDeviceInfo marked;
    marked.localFlag = true;
    m_wire->exchange(QVariant::fromValue(info)) >> marked;
    QVERIFY(marked.localFlag); // Reading leaves it as it was.
    QVERIFY(!marked.flag1 && marked.flag2);
}

void RecordsWireTest::listsOnTheWire()
{
    const FavouritePlaceList favourites{
        {QStringLiteral("b"), QStringLiteral("/b")},
        {QStringLiteral("a"), QStringLiteral("/a")},
        {QStringLiteral("b"), QStringLiteral("/b")}};
    const auto favouritesBack =
        qdbus_cast<FavouritePlaceList>(m_wire->exchange(QVariant::fromValue(favourites)));
    QCOMPARE(m_wire->signature(), QStringLiteral("a(ss)"));
    QCOMPARE(favouritesBack, favourites);
    QCOMPARE(favouritesBack.at(1).name(), QStringLiteral("a"));

    const NetworkPlaceList networks{
        {QStringLiteral("n"), QStringLiteral("ftp://a"), QStringLiteral("/a")}, {}};
    const auto networksBack =
        qdbus_cast<NetworkPlaceList>(m_wire->exchange(QVariant::fromValue(networks)));
    QCOMPARE(m_wire->signature(), QStringLiteral("a(sss)"));
    QCOMPARE(networksBack, networks);
    QCOMPARE(networksBack.first().url(), QStringLiteral("ftp://a"));

    const StoragePlaceList storages{storagePlace(usbStick()), StoragePlace()};
    const auto storagesBack =
        qdbus_cast<StoragePlaceList>(m_wire->exchange(QVariant::fromValue(storages)));
    QCOMPARE(m_wire->signature(), QStringLiteral("a(sbbbssssi)"));
    QCOMPARE(storagesBack, storages);
    QVERIFY(!storagesBack.first().isMountable());
    QVERIFY(storagesBack.last().isMountable());
}

void RecordsWireTest::mapsOnTheWire()
{
    const StringMap shares{
        {QStringLiteral("pub"), QStringLiteral("/mnt/pub")}, {QStringLiteral("home"), QString()}};
    const auto sharesBack = qdbus_cast<StringMap>(m_wire->exchange(QVariant::fromValue(shares)));
    QCOMPARE(m_wire->signature(), QStringLiteral("a{ss}"));
    QCOMPARE(sharesBack.keys(), shares.keys());
    QCOMPARE(sharesBack.value(QStringLiteral("pub")), QStringLiteral("/mnt/pub"));

    StringMap used{{QStringLiteral("old"), QStringLiteral("gone")}};
    m_wire->exchange(QVariant::fromValue(shares)) >> used;
    QCOMPARE(used.keys(), shares.keys()); // Cleared before it was read.

    QDBusArgument entry;
    entry.beginStructure();
    entry << QStringLiteral("Network/FTP/host") << QStringLiteral("/mnt/host") << 4002;
    entry.endStructure();
    StringEntryMap mounts;
    m_wire->exchange(QVariant::fromValue(entry)) >> mounts[QStringLiteral("ftp://host/")];
    const auto mountsBack =
        qdbus_cast<StringEntryMap>(m_wire->exchange(QVariant::fromValue(mounts)));
    QCOMPARE(m_wire->signature(), QStringLiteral("a{s(ssi)}"));
    QCOMPARE(mountsBack.size(), 1);
    const Entry mount = mountsBack.value(QStringLiteral("ftp://host/"));
    QCOMPARE(mount.path(), QStringLiteral("Network/FTP/host"));
    QCOMPARE(mount.localPath(), QStringLiteral("/mnt/host"));
    QCOMPARE(mount.type(), 4002);
}

void RecordsWireTest::emptyContainersOnTheWire()
{
    FavouritePlaceList favourites{FavouritePlace()};
    m_wire->exchange(QVariant::fromValue(FavouritePlaceList())) >> favourites;
    QCOMPARE(m_wire->signature(), QStringLiteral("a(ss)"));
    QVERIFY(favourites.isEmpty());

    StringEntryMap mounts{{QString(), Entry()}};
    m_wire->exchange(QVariant::fromValue(StringEntryMap())) >> mounts;
    QCOMPARE(m_wire->signature(), QStringLiteral("a{s(ssi)}"));
    QVERIFY(mounts.isEmpty());
}

void RecordsWireTest::wrongSignatureReadsAsDefault()
{
    const NetworkPlace network(QStringLiteral("n"), QStringLiteral("u"), QStringLiteral("/l"));
    const QDBusReply<FavouritePlace> reply =
        m_wire->exchange(QVariantList{QVariant::fromValue(network)});
    QVERIFY(!reply.isValid());
    QVERIFY(reply.value().name().isNull());

    const QDBusReply<StoragePlaceList> list = m_wire->exchange(QVariantList{42});
    QVERIFY(!list.isValid());
    QVERIFY(list.value().isEmpty());
}

QTEST_GUILESS_MAIN(RecordsWireTest)
#include "tst_recordswire.moc"
