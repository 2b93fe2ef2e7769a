// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/busmonitor.h"
#include "support/servicescene.h"
#include "support/vfsclient.h"

using namespace VeyFM;

/// Whole processes with the library: what they send from their first call to their exit, which
/// comes behind main(), with a service that is alive, gone or stopped.
class ServiceLifetimeTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void callsInTheirOrder();
    void twoProcesses();
    void killedService();
    void stoppedService();
    void serviceThatIsNotRunningIsStarted();
    void cleanupTestCase();

private:
    QStringList references()
    {
        return m_service->calls().filter(QRegularExpression(QStringLiteral("ProcessRef")));
    }

    ServiceScene m_service;
    const QString m_increment = u"Service.incrementProcessRef[]"_s;
    const QString m_decrement = u"Service.decrementProcessRef[]"_s;
};

void ServiceLifetimeTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
}

void ServiceLifetimeTest::init()
{
    if (!m_service->isRunning()) {
        QDBusConnection::sessionBus().interface()->startService(ServiceScene::name());
    }
    m_service->takeCalls();
}

void ServiceLifetimeTest::callsInTheirOrder()
{
    BusMonitor monitor;
    QVERIFY(monitor.start(m_service.bus().address()));
    VfsClient client;
    QVERIFY(client.start());
    QCOMPARE(client.quit(), 0);
    QVERIFY(monitor.waitFor(u"decrementProcessRef"_s));
    const QStringList calls = monitor.calls(
        {u"ListActivatableNames"_s, u"StartServiceByName"_s, u"Introspect"_s,
         u"incrementProcessRef"_s, u"favouritePlaces"_s, u"mounts"_s, u"networkPlaces"_s,
         u"decrementProcessRef"_s, u"workgroups"_s, u"availableStoragePlaces"_s});
    // One introspection an object, and two interfaces on the root.
    const QStringList expected = {
        u"/org/freedesktop/DBus ListActivatableNames"_s,
        u"/org/freedesktop/DBus StartServiceByName"_s,
        u"/ Introspect"_s,
        u"/ incrementProcessRef"_s,
        u"/StoragePlacesManager Introspect"_s,
        u"/FavouritePlacesManager Introspect"_s,
        u"/SmbBrowser Introspect"_s,
        u"/NetworkMountsManager Introspect"_s,
        u"/NetworkPlacesManager Introspect"_s,
        u"/FuseMountsManager Introspect"_s,
        u"/FavouritePlacesManager favouritePlaces"_s,
        u"/NetworkMountsManager mounts"_s,
        u"/NetworkPlacesManager networkPlaces"_s,
        u"/ decrementProcessRef"_s};
    QCOMPARE(calls, expected);
}

void ServiceLifetimeTest::twoProcesses()
{
    VfsClient first;
    VfsClient second;
    QVERIFY(first.start());
    QCOMPARE(references(), QStringList(m_increment));
    QVERIFY(second.start());
    QCOMPARE(references(), QStringList({m_increment, m_increment}));
    QCOMPARE(first.quit(), 0);
    QCOMPARE(references(), QStringList({m_increment, m_increment, m_decrement}));
    QCOMPARE(second.quit(), 0);
    QCOMPARE(references(), QStringList({m_increment, m_increment, m_decrement, m_decrement}));
    QVERIFY(first.errorOutput().isEmpty());
}

void ServiceLifetimeTest::killedService()
{
    VfsClient client;
    QVERIFY(client.start());
    m_service->kill();
    // Its tree stands, and it ends.
    client.send(u"childs Computer"_s);
    QVERIFY(client.waitFor(u"childs Home Desktop Trash Storage devices File System"_s));
    QCOMPARE(client.quit(), 0);
    QCOMPARE(client.errorOutput(), QString());
}

void ServiceLifetimeTest::stoppedService()
{
    VfsClient client;
    QVERIFY(client.start());
    m_service->stop();
    client.send(u"quit"_s);
    // It waits with its last call, and is let go by the answer.
    QVERIFY(!client.process.waitForFinished(300));
    m_service->resume();
    QCOMPARE(client.waitForEnd(), 0);
    QCOMPARE(references(), QStringList({m_increment, m_decrement}));
}

void ServiceLifetimeTest::serviceThatIsNotRunningIsStarted()
{
    m_service->exit();
    QVERIFY(!m_service->isRunning());
    VfsClient client;
    QVERIFY(client.start());
    QVERIFY(m_service->isRunning());
    QCOMPARE(client.quit(), 0);
    QCOMPARE(references(), QStringList({m_increment, m_decrement}));
}

void ServiceLifetimeTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(ServiceLifetimeTest)
#include "tst_servicelifetime.moc"
