// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/favouriteplacesmanagerproxy.h"
#include "support/servicescene.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

namespace {

QStringList names(const QList<FavouritePlace>& places)
{
    QStringList result;
    for (const FavouritePlace& place : places) {
        result << place.name();
    }
    return result;
}

const QString list = QStringLiteral("FavouritePlacesManager.favouritePlaces");

} // namespace

/// The favourites: read once, patched by signals, never by what is asked for here.
class FavouritesProxyTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void readsOnce();
    void failedReadStays_data();
    void failedReadStays();
    void addShowsWithItsSignal();
    void sameDirectoryTwice();
    void newsBeforeTheFirstRead();
    void failureIsNotTold();
    void expiredInterface();
    void cleanupTestCase();

private:
    ServiceScene m_service;
    QSharedPointer<QDBusInterface> m_interface;
};

void FavouritesProxyTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
    m_interface = m_service.interface(u"FavouritePlacesManager"_s);
}

void FavouritesProxyTest::init()
{
    m_service->setValue(list, array(R"([["Z", "/z"], ["A", "/a"]])"));
    m_service->takeCalls();
}

void FavouritesProxyTest::readsOnce()
{
    FavouritePlacesManagerProxy proxy(m_interface);
    // In the service's order.
    QCOMPARE(names(proxy.favouritePlaces()), QStringList({u"Z"_s, u"A"_s}));
    QCOMPARE(names(proxy.favouritePlaces()), QStringList({u"Z"_s, u"A"_s}));
    QCOMPARE(m_service->takeCalls(), QStringList(list + u"[]"_s));
}

void FavouritesProxyTest::failedReadStays_data()
{
    QTest::addColumn<QByteArray>("rule");
    QTest::newRow("error") << QByteArray(R"([{"error": "broken"}])");
    QTest::newRow("wrong type") << QByteArray(R"([{"wrong": true}])");
}

void FavouritesProxyTest::failedReadStays()
{
    QFETCH(QByteArray, rule);
    m_service->setRules(list, array(rule));
    FavouritePlacesManagerProxy proxy(m_interface);
    QVERIFY(proxy.favouritePlaces().isEmpty());
    QVERIFY(proxy.favouritePlaces().isEmpty());
    QCOMPARE(m_service->takeCalls().size(), 1);
}

void FavouritesProxyTest::addShowsWithItsSignal()
{
    FavouritePlacesManagerProxy proxy(m_interface);
    proxy.favouritePlaces();
    m_service->takeCalls();
    QStringList whenTold;
    connect(&proxy, &FavouritePlacesManagerProxy::favouritePlaceAdded, this, [&] {
        whenTold = names(proxy.favouritePlaces());
    });
    QSignalSpy added(&proxy, &FavouritePlacesManagerProxy::favouritePlaceAdded);
    QSignalSpy removed(&proxy, &FavouritePlacesManagerProxy::favouritePlaceRemoved);

    proxy.addFavouritePlace(FavouritePlace(u"N"_s, u"/n"_s));
    QCOMPARE(proxy.favouritePlaces().size(), 2);
    QVERIFY(added.wait());
    QCOMPARE(whenTold, QStringList({u"Z"_s, u"A"_s, u"N"_s}));

    proxy.removeFavouritePlace(FavouritePlace(u"another name"_s, u"/n"_s));
    QCOMPARE(proxy.favouritePlaces().size(), 3);
    QVERIFY(removed.wait());
    QCOMPARE(names(proxy.favouritePlaces()), QStringList({u"Z"_s, u"A"_s}));
    QCOMPARE(
        m_service->takeCalls(),
        QStringList(
            {u"FavouritePlacesManager.addFavouritePlace[[\"N\",\"/n\"]]"_s,
             u"FavouritePlacesManager.removeFavouritePlace[[\"another name\",\"/n\"]]"_s}));
}

void FavouritesProxyTest::sameDirectoryTwice()
{
    FavouritePlacesManagerProxy proxy(m_interface);
    proxy.favouritePlaces();
    QSignalSpy added(&proxy, &FavouritePlacesManagerProxy::favouritePlaceAdded);
    QSignalSpy removed(&proxy, &FavouritePlacesManagerProxy::favouritePlaceRemoved);
    m_service->emitSignal(
        u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, array(R"([["Second", "/a"]])"));
    QVERIFY(!added.isEmpty() || added.wait());
    QCOMPARE(names(proxy.favouritePlaces()), QStringList({u"Z"_s, u"A"_s, u"Second"_s}));
    m_service->emitSignal(
        u"FavouritePlacesManager"_s, u"favouritePlaceRemoved"_s, array(R"([["Third", "/a"]])"));
    QVERIFY(!removed.isEmpty() || removed.wait());
    QCOMPARE(names(proxy.favouritePlaces()), QStringList({u"Z"_s}));
}

void FavouritesProxyTest::newsBeforeTheFirstRead()
{
    FavouritePlacesManagerProxy proxy(m_interface);
    QSignalSpy added(&proxy, &FavouritePlacesManagerProxy::favouritePlaceAdded);
    m_service->emitSignal(
        u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, array(R"([["Early", "/e"]])"));
    QVERIFY(!added.isEmpty() || added.wait());
    QCOMPARE(names(proxy.favouritePlaces()), QStringList({u"Z"_s, u"A"_s}));
}

void FavouritesProxyTest::failureIsNotTold()
{
    FavouritePlacesManagerProxy proxy(m_interface);
    m_service->setRules(
        u"FavouritePlacesManager.addFavouritePlace"_s, array(R"([{"error": "full"}])"));
    proxy.addFavouritePlace(FavouritePlace(u"N"_s, u"/n"_s));
    QCOMPARE(m_service->takeCalls().size(), 1);
}

void FavouritesProxyTest::expiredInterface()
{
    auto interface = m_service.interface(u"FavouritePlacesManager"_s);
    FavouritePlacesManagerProxy proxy(interface);
    interface.clear();
    proxy.addFavouritePlace(FavouritePlace(u"N"_s, u"/n"_s));
    proxy.removeFavouritePlace(FavouritePlace(u"N"_s, u"/n"_s));
    QVERIFY(proxy.favouritePlaces().isEmpty());
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void FavouritesProxyTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(FavouritesProxyTest)
#include "tst_favouritesproxy.moc"
