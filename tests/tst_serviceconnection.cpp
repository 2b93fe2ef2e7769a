// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/favouriteplacesmanagerproxy.h"
#include "service/smbbrowserproxy.h"
#include "support/privatebus.h"
#include "vfs/vfs.h"
#include "watch/entrywatcher.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

/// A process that finds the service: what is sent at start-up, and what comes back.
class TestServiceConnection : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void callsAtStart();
    void favouritesAreInTheTree();
    void notifyComesBack();
    void cleanupTestCase();

private:
    PrivateBus m_bus;
    std::unique_ptr<FakeServiceControl> m_service;
};

void TestServiceConnection::initTestCase()
{
    m_bus.installFakeService(
        {{QStringLiteral("values"),
          QJsonObject{
              {QStringLiteral("FavouritePlacesManager.favouritePlaces"),
               QJsonArray{QJsonArray{QStringLiteral("Temporary"), QStringLiteral("/tmp")}}}}}});
    QVERIFY2(m_bus.start(), qPrintable(m_bus.errorString()));
    VFS::initialize();
    m_service = std::make_unique<FakeServiceControl>(m_bus.address());
    QVERIFY(!m_service->isRunning());
    VFS::ptr();
    QVERIFY(m_service->isRunning());
}

void TestServiceConnection::callsAtStart()
{
    const QStringList expected = {
        QStringLiteral("Service.incrementProcessRef[]"),
        QStringLiteral("FavouritePlacesManager.favouritePlaces[]"),
        QStringLiteral("NetworkMountsManager.mounts[]"),
        QStringLiteral("NetworkPlacesManager.networkPlaces[]")};
    QCOMPARE(m_service->takeCalls(), expected);
    // One introspection an object: the two interfaces of the root come together.
    const QStringList introspected = {
        QStringLiteral("/"),
        QStringLiteral("/StoragePlacesManager"),
        QStringLiteral("/FavouritePlacesManager"),
        QStringLiteral("/SmbBrowser"),
        QStringLiteral("/NetworkMountsManager"),
        QStringLiteral("/NetworkPlacesManager"),
        QStringLiteral("/FuseMountsManager")};
    QCOMPARE(m_service->introspections(), introspected);
}

void TestServiceConnection::favouritesAreInTheTree()
{
    const EntryList favourites = VFS::ptr()->childs(VFS::ptr()->favouritesEntry());
    QCOMPARE(favourites.paths(), QStringList{QStringLiteral("Favourites/Temporary")});
    QCOMPARE(favourites.localPaths(), QStringList{QStringLiteral("/tmp")});
}

void TestServiceConnection::notifyComesBack()
{
    QSignalSpy resets(VFS::ptr()->entryWatcher(), &EntryWatcher::entryReset);
    VFS::ptr()->notifyAllWatchers(EntryList(VFS::ptr()->homeEntry()));
    QVERIFY(resets.isEmpty());
    QVERIFY(resets.wait());
    QCOMPARE(resets.takeFirst().first().value<Entry>(), VFS::ptr()->homeEntry());
}

void TestServiceConnection::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(TestServiceConnection)
#include "tst_serviceconnection.moc"
