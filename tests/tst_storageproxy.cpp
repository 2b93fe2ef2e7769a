// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/storageplacejob.h"
#include "service/storageplacesmanagerproxy.h"
#include "support/servicescene.h"

#include <QSignalSpy>
#include <QTest>

#include <algorithm>
#include <random>

using namespace VeyFM;

namespace {

// The reserved text has no accessor, and yet goes with copies. Naming a private member is allowed
// in an explicit instantiation, which spares the class a friend.
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

// The same for what else the service alone sets.
QString& udi(StoragePlace& place);
QString& placeName(StoragePlace& place);

template <auto Udi, auto PlaceName>
struct Names
{
    friend QString& udi(StoragePlace& place)
    {
        return place.*Udi;
    }
    friend QString& placeName(StoragePlace& place)
    {
        return place.*PlaceName;
    }
};
template struct Names<&StoragePlace::m_udi, &StoragePlace::m_placeName>;

QStringList udis(const QList<StoragePlace>& places)
{
    QStringList result;
    for (const StoragePlace& place : places) {
        result << place.udi();
    }
    return result;
}

const QString list = QStringLiteral("StoragePlacesManager.availableStoragePlaces");
const QString readCall = QStringLiteral("StoragePlacesManager.availableStoragePlaces[]");

} // namespace

/// The list of devices: read once, patched by signals.
class StorageProxyTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void readsOnce();
    void failedReadStays_data();
    void failedReadStays();
    void expiredInterface();
    void noInterface();
    void newsBeforeTheFirstRead();
    void duplicatesStayAndGoTogether();
    void updateCarriesOldState();
    void updateOfAnUnknownDevice();
    void updatePatchesTheFirstMatch();
    void reservedTextGoesAlong();
    void findsTheFirst();
    void deviceInfoIsAskedEachTime();
    void jobsAreNotStarted();
    void cleanupTestCase();

private:
    void emitNews(const QString& signal, const QJsonArray& place)
    {
        m_service->emitSignal(u"StoragePlacesManager"_s, signal, arguments(place));
    }

    ServiceScene m_service;
    QSharedPointer<QDBusInterface> m_interface;
};

void StorageProxyTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
    m_interface = m_service.interface(u"StoragePlacesManager"_s);
    QVERIFY(m_interface->isValid());
}

void StorageProxyTest::init()
{
    m_service->setValue(list, QJsonArray{device(u"sda"_s, u"A"_s), device(u"sdb"_s, u"B"_s)});
    m_service->takeCalls();
}

void StorageProxyTest::readsOnce()
{
    StoragePlacesManagerProxy proxy(m_interface);
    QCOMPARE(m_service->takeCalls(), QStringList());
    QCOMPARE(udis(proxy.availableStoragePlaces()), QStringList({u"A"_s, u"B"_s}));
    m_service->setValue(list, QJsonArray());
    QCOMPARE(udis(proxy.availableStoragePlaces()), QStringList({u"A"_s, u"B"_s}));
    QCOMPARE(m_service->takeCalls(), QStringList(readCall));
}

void StorageProxyTest::failedReadStays_data()
{
    QTest::addColumn<QByteArray>("rule");
    QTest::newRow("error") << QByteArray(R"([{"error": "broken"}])");
    QTest::newRow("wrong type") << QByteArray(R"([{"wrong": true}])");
    QTest::newRow("no argument") << QByteArray(R"([{"empty": true}])");
}

void StorageProxyTest::failedReadStays()
{
    QFETCH(QByteArray, rule);
    m_service->setRules(list, array(rule));
    StoragePlacesManagerProxy proxy(m_interface);
    QVERIFY(proxy.availableStoragePlaces().isEmpty());
    QVERIFY(proxy.availableStoragePlaces().isEmpty());
    QCOMPARE(m_service->takeCalls(), QStringList(readCall));

    // From then on only signals add.
    QSignalSpy added(&proxy, &StoragePlacesManagerProxy::storagePlaceAdded);
    emitNews(u"storagePlaceAdded"_s, device(u"sdc"_s, u"C"_s));
    QVERIFY(added.wait());
    QCOMPARE(udis(proxy.availableStoragePlaces()), QStringList(u"C"_s));
}

void StorageProxyTest::expiredInterface()
{
    auto interface = m_service.interface(u"StoragePlacesManager"_s);
    StoragePlacesManagerProxy proxy(interface);
    interface.clear();
    QVERIFY(proxy.availableStoragePlaces().isEmpty());
    QCOMPARE(proxy.storageDeviceInfo(StoragePlace()).number1, quint64(0));
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void StorageProxyTest::noInterface()
{
    StoragePlacesManagerProxy proxy(QWeakPointer<QDBusInterface>{});
    QVERIFY(proxy.availableStoragePlaces().isEmpty());
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void StorageProxyTest::newsBeforeTheFirstRead()
{
    StoragePlacesManagerProxy proxy(m_interface);
    QSignalSpy added(&proxy, &StoragePlacesManagerProxy::storagePlaceAdded);
    QSignalSpy updated(&proxy, &StoragePlacesManagerProxy::storagePlaceUpdated);
    QSignalSpy removed(&proxy, &StoragePlacesManagerProxy::storagePlaceRemoved);
    emitNews(u"storagePlaceAdded"_s, device(u"sdx"_s, u"X"_s));
    emitNews(u"storagePlaceUpdated"_s, device(u"sda"_s, u"A"_s, 3, u"/a"_s, false));
    emitNews(u"storagePlaceRemoved"_s, device(u"sdb"_s, u"B"_s));
    QVERIFY(!removed.isEmpty() || removed.wait());
    QCOMPARE(added.count(), 1);
    QCOMPARE(updated.count(), 1);
    const auto old = updated.first().at(1).value<StoragePlace>();
    QVERIFY(!old.isMounted());
    QVERIFY(old.isMountable());
    QVERIFY(!old.isValid());
    // The news changed nothing here: the first read gets the service's whole list.
    QCOMPARE(m_service->takeCalls(), QStringList());
    QCOMPARE(udis(proxy.availableStoragePlaces()), QStringList({u"A"_s, u"B"_s}));
    QVERIFY(!proxy.availableStoragePlaces().first().isMounted());
}

void StorageProxyTest::duplicatesStayAndGoTogether()
{
    StoragePlacesManagerProxy proxy(m_interface);
    proxy.availableStoragePlaces();
    // The list is patched before the news goes on.
    QList<int> sizes;
    const auto count = [&] {
        sizes << proxy.availableStoragePlaces().size();
    };
    connect(&proxy, &StoragePlacesManagerProxy::storagePlaceAdded, this, count);
    connect(&proxy, &StoragePlacesManagerProxy::storagePlaceRemoved, this, count);
    QSignalSpy removed(&proxy, &StoragePlacesManagerProxy::storagePlaceRemoved);
    emitNews(u"storagePlaceAdded"_s, device(u"one"_s, u"D"_s));
    emitNews(u"storagePlaceAdded"_s, device(u"two"_s, u"D"_s));
    emitNews(
        u"storagePlaceRemoved"_s, device(u"three"_s, u"D"_s, 3, QString(), true, u"as sent"_s));
    QVERIFY(!removed.isEmpty() || removed.wait());
    QCOMPARE(sizes, QList<int>({3, 4, 2}));
    QCOMPARE(removed.first().first().value<StoragePlace>().labelName(), u"as sent"_s);
}

void StorageProxyTest::updateCarriesOldState()
{
    StoragePlacesManagerProxy proxy(m_interface);
    proxy.availableStoragePlaces();
    QString whenTold;
    connect(&proxy, &StoragePlacesManagerProxy::storagePlaceUpdated, this, [&] {
        whenTold = proxy.availableStoragePlaces().at(1).mountPoint();
    });
    QSignalSpy updated(&proxy, &StoragePlacesManagerProxy::storagePlaceUpdated);
    emitNews(u"storagePlaceUpdated"_s, device(u"sdb"_s, u"B"_s, 4, u"/b"_s, false));
    QVERIFY(!updated.isEmpty() || updated.wait());
    QCOMPARE(whenTold, u"/b"_s);
    const auto now = updated.first().at(0).value<StoragePlace>();
    const auto old = updated.first().at(1).value<StoragePlace>();
    QVERIFY(now.isMounted() && !now.isMountable());
    QVERIFY(!old.isMounted() && old.isMountable() && old.isValid());
    QCOMPARE(old.type(), StoragePlace::StorageTypeUsbDisk);
    QCOMPARE(now.type(), StoragePlace::StorageTypeHardDiskDrive);
    QCOMPARE(udis(proxy.availableStoragePlaces()), QStringList({u"A"_s, u"B"_s}));
}

void StorageProxyTest::updateOfAnUnknownDevice()
{
    StoragePlacesManagerProxy proxy(m_interface);
    proxy.availableStoragePlaces();
    QSignalSpy updated(&proxy, &StoragePlacesManagerProxy::storagePlaceUpdated);
    emitNews(u"storagePlaceUpdated"_s, device(u"sdx"_s, u"X"_s, 3, u"/x"_s));
    QVERIFY(!updated.isEmpty() || updated.wait());
    QVERIFY(!updated.first().at(1).value<StoragePlace>().isValid());
    QCOMPARE(udis(proxy.availableStoragePlaces()), QStringList({u"A"_s, u"B"_s}));
}

void StorageProxyTest::updatePatchesTheFirstMatch()
{
    m_service->setValue(
        list, QJsonArray{device(u"one"_s, u"D"_s), device(u"two"_s, u"D"_s, 3, u"/two"_s)});
    StoragePlacesManagerProxy proxy(m_interface);
    proxy.availableStoragePlaces();
    QSignalSpy updated(&proxy, &StoragePlacesManagerProxy::storagePlaceUpdated);
    emitNews(u"storagePlaceUpdated"_s, device(u"three"_s, u"D"_s, 3, u"/three"_s));
    QVERIFY(!updated.isEmpty() || updated.wait());
    QCOMPARE(proxy.availableStoragePlaces().at(0).mountPoint(), u"/three"_s);
    QCOMPARE(proxy.availableStoragePlaces().at(1).mountPoint(), u"/two"_s);
}

void StorageProxyTest::reservedTextGoesAlong()
{
    StoragePlacesManagerProxy proxy(m_interface);
    const auto update = [&proxy](const QString& text) {
        StoragePlace place = proxy.availableStoragePlaces().first();
        reservedText(place) = text;
        QSignalSpy updated(&proxy, &StoragePlacesManagerProxy::storagePlaceUpdated);
        QMetaObject::invokeMethod(
            &proxy, "slotStoragePlaceUpdated", Q_ARG(VeyFM::StoragePlace, place));
        return updated.value(0).value(1).value<StoragePlace>();
    };
    update(u"first"_s);
    StoragePlace cached = proxy.availableStoragePlaces().first();
    QCOMPARE(reservedText(cached), u"first"_s);
    StoragePlace old = update(u"second"_s);
    QCOMPARE(reservedText(old), u"first"_s);
    cached = proxy.availableStoragePlaces().first();
    QCOMPARE(reservedText(cached), u"second"_s);
}

// Whatever comes, goes and changes: the look-ups find the first record of the list.
void StorageProxyTest::findsTheFirst()
{
    std::mt19937 random(1);
    const auto below = [&random](int count) {
        return int(random() % uint(count));
    };
    const auto first = [](const QList<StoragePlace>& places, auto fits) {
        const auto found = std::find_if(places.begin(), places.end(), fits);
        return found == places.end() ? StoragePlace() : *found;
    };
    const auto text = [](StoragePlace place) {
        return udi(place) + u' ' + placeName(place) + u' ' + reservedText(place);
    };
    m_service->setValue(list, QJsonArray());
    StoragePlacesManagerProxy proxy(m_interface);
    QList<StoragePlace> expected = proxy.availableStoragePlaces();
    QVERIFY(expected.isEmpty());
    int most = 0;
    for (int i = 0; i < 2000; ++i) {
        StoragePlace place;
        udi(place) = QString::number(below(8));
        placeName(place) = u"n%1"_s.arg(below(8));
        reservedText(place) = QString::number(i);
        const int found = expected.indexOf(place);
        const char* slot = "slotStoragePlaceAdded";
        switch (below(5)) {
        case 0:
            slot = "slotStoragePlaceRemoved";
            expected.removeAll(place);
            break;
        case 1:
        case 2:
            slot = "slotStoragePlaceUpdated";
            if (found >= 0) {
                expected[found] = place;
            }
            break;
        default:
            expected.append(place);
        }
        QVERIFY(QMetaObject::invokeMethod(&proxy, slot, Q_ARG(VeyFM::StoragePlace, place)));
        most = std::max(most, int(expected.size()));

        const QString sought = placeName(place);
        QCOMPARE(
            text(proxy.storagePlaceByPlaceName(sought)),
            text(first(
                expected, [&sought](StoragePlace other) { return placeName(other) == sought; })));
        QCOMPARE(
            text(proxy.storagePlaceByUdi(place.udi())),
            text(first(expected, [&place](const StoragePlace& other) { return other == place; })));
        if (i % 20 == 0) {
            const QList<StoragePlace> listed = proxy.availableStoragePlaces();
            QCOMPARE(listed.size(), expected.size());
            for (int j = 0; j < listed.size(); ++j) {
                QCOMPARE(text(listed.at(j)), text(expected.at(j)));
            }
        }
    }
    QVERIFY(most > 10);
    QVERIFY(!proxy.storagePlaceByUdi(u"none"_s).isValid());
}

void StorageProxyTest::deviceInfoIsAskedEachTime()
{
    const QString method = u"StoragePlacesManager.storageDeviceInfo"_s;
    m_service->setValue(
        method, array(R"(["1","2","3","4",true,"5","6","7","8","9","10",11,12,true,13,14,15])"));
    StoragePlacesManagerProxy proxy(m_interface);
    const StorageDeviceInfo info = proxy.storageDeviceInfo(StoragePlace());
    QCOMPARE(info.text1, u"1"_s);
    QCOMPARE(info.text10, u"10"_s);
    QVERIFY(info.flag1 && info.flag2);
    QVERIFY(!info.localFlag);
    QCOMPARE(info.number4, quint64(14));
    QCOMPARE(info.number5, quint64(15));

    // An invalid place is the service's to refuse.
    m_service->setRules(method, array(R"([{"error": "no such device"}, {"wrong": true}])"));
    QVERIFY(proxy.storageDeviceInfo(StoragePlace()).text1.isNull());
    QVERIFY(proxy.storageDeviceInfo(StoragePlace()).text1.isNull());
    const QString call = method + u"[[\"\",false,true,false,\"\",\"\",\"\",\"\",0]]"_s;
    QCOMPARE(m_service->takeCalls(), QStringList({call, call, call}));
}

void StorageProxyTest::jobsAreNotStarted()
{
    StoragePlacesManagerProxy proxy(m_interface);
    const std::unique_ptr<Job> mount(proxy.mountStoragePlace(StoragePlace()));
    const std::unique_ptr<Job> unmount(proxy.unmountStoragePlace(StoragePlace()));
    const std::unique_ptr<Job> eject(proxy.ejectStoragePlaceDevice(StoragePlace()));
    QVERIFY(qobject_cast<StoragePlaceMountJob*>(mount.get()));
    QVERIFY(qobject_cast<StoragePlaceUnmountJob*>(unmount.get()));
    QVERIFY(qobject_cast<StoragePlaceEjectJob*>(eject.get()));
    QVERIFY(!mount->parent() && !unmount->parent() && !eject->parent());
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void StorageProxyTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(StorageProxyTest)
#include "tst_storageproxy.moc"
