// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/networkplacesmanagerproxy.h"
#include "support/servicescene.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

namespace {

QStringList texts(const QList<NetworkPlace>& places)
{
    QStringList result;
    for (const NetworkPlace& place : places) {
        result << place.name() + QLatin1Char(' ') + place.url() + QLatin1Char(' ') +
                      place.localPath();
    }
    return result;
}

const QString list = QStringLiteral("NetworkPlacesManager.networkPlaces");

} // namespace

/// The network bookmarks: read once, patched by signals, never by what is asked for here.
class NetworkPlacesProxyTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void readsOnce();
    void failedReadStays();
    void addReturnsTheAnswer();
    void removeAndUpdateAreSent();
    void updateReplacesTheFirstOfItsName();
    void updateCannotRename();
    void removalGoesByName();
    void newsBeforeTheFirstRead();
    void expiredInterface();
    void cleanupTestCase();

private:
    void emitNews(const QString& signal, const QByteArray& place)
    {
        m_service->emitSignal(u"NetworkPlacesManager"_s, signal, arguments(array(place)));
    }

    ServiceScene m_service;
    QSharedPointer<QDBusInterface> m_interface;
};

void NetworkPlacesProxyTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
    m_interface = m_service.interface(u"NetworkPlacesManager"_s);
}

void NetworkPlacesProxyTest::init()
{
    m_service->load(object(R"({"echo": false, "rules": {}, "values":
        {"NetworkPlacesManager.networkPlaces": [["N", "ftp://n", "/n"], ["A", "smb://a", ""]]}})"));
    m_service->takeCalls();
}

void NetworkPlacesProxyTest::readsOnce()
{
    NetworkPlacesManagerProxy proxy(m_interface);
    const QStringList expected = {u"N ftp://n /n"_s, u"A smb://a "_s};
    QCOMPARE(texts(proxy.networkPlaces()), expected);
    QCOMPARE(texts(proxy.networkPlaces()), expected);
    QCOMPARE(m_service->takeCalls(), QStringList(list + u"[]"_s));
}

void NetworkPlacesProxyTest::failedReadStays()
{
    for (const char* rule : {R"([{"error": "broken"}])", R"([{"wrong": true}])"}) {
        m_service->setRules(list, array(rule));
        NetworkPlacesManagerProxy proxy(m_interface);
        QVERIFY(proxy.networkPlaces().isEmpty());
        QVERIFY(proxy.networkPlaces().isEmpty());
        QCOMPARE(m_service->takeCalls().size(), 1);
    }
}

void NetworkPlacesProxyTest::addReturnsTheAnswer()
{
    const QString method = u"NetworkPlacesManager.addNetworkPlace"_s;
    const NetworkPlace place(u"X"_s, u"sftp://x"_s, QString());
    NetworkPlacesManagerProxy proxy(m_interface);
    proxy.networkPlaces();
    m_service->setRules(
        method, array(R"([{"value": true}, {"value": false}, {"error": "no"}, {"wrong": true},
                          {"empty": true}])"));
    QVERIFY(proxy.addNetworkPlace(place));
    QVERIFY(!proxy.addNetworkPlace(place));
    QVERIFY(!proxy.addNetworkPlace(place));
    QVERIFY(!proxy.addNetworkPlace(place));
    QVERIFY(!proxy.addNetworkPlace(place));
    QCOMPARE(m_service->takeCalls().last(), method + u"[[\"X\",\"sftp://x\",\"\"]]"_s);
    // Nothing shows without the service's signal.
    QCOMPARE(proxy.networkPlaces().size(), 2);

    QSignalSpy added(&proxy, &NetworkPlacesManagerProxy::networkPlaceAdded);
    m_service->load(object(R"({"echo": true})"));
    m_service->setRules(method, array(R"([{"value": true}])"));
    QVERIFY(proxy.addNetworkPlace(place));
    QCOMPARE(proxy.networkPlaces().size(), 2);
    QVERIFY(added.wait());
    QCOMPARE(texts(proxy.networkPlaces()).last(), u"X sftp://x "_s);
}

void NetworkPlacesProxyTest::removeAndUpdateAreSent()
{
    NetworkPlacesManagerProxy proxy(m_interface);
    const NetworkPlace place(u"N"_s, u"ftp://n"_s, u"/m"_s);
    proxy.removeNetworkPlace(place);
    proxy.updateNetworkPlace(place);
    QCOMPARE(
        m_service->takeCalls(),
        QStringList(
            {u"NetworkPlacesManager.removeNetworkPlace[[\"N\",\"ftp://n\",\"/m\"]]"_s,
             u"NetworkPlacesManager.updateNetworkPlace[[\"N\",\"ftp://n\",\"/m\"]]"_s}));
}

void NetworkPlacesProxyTest::updateReplacesTheFirstOfItsName()
{
    m_service->setValue(list, array(R"([["N", "ftp://1", ""], ["N", "ftp://2", ""]])"));
    NetworkPlacesManagerProxy proxy(m_interface);
    proxy.networkPlaces();
    QStringList whenTold;
    connect(&proxy, &NetworkPlacesManagerProxy::networkPlaceUpdated, this, [&] {
        whenTold = texts(proxy.networkPlaces());
    });
    QSignalSpy updated(&proxy, &NetworkPlacesManagerProxy::networkPlaceUpdated);
    emitNews(u"networkPlaceUpdated"_s, R"(["N", "ftp://new", "/new"])");
    QVERIFY(!updated.isEmpty() || updated.wait());
    QCOMPARE(whenTold, QStringList({u"N ftp://new /new"_s, u"N ftp://2 "_s}));
    QCOMPARE(updated.first().size(), 1);
}

void NetworkPlacesProxyTest::updateCannotRename()
{
    NetworkPlacesManagerProxy proxy(m_interface);
    proxy.networkPlaces();
    QSignalSpy updated(&proxy, &NetworkPlacesManagerProxy::networkPlaceUpdated);
    emitNews(u"networkPlaceUpdated"_s, R"(["Renamed", "ftp://n", "/n"])");
    QVERIFY(!updated.isEmpty() || updated.wait());
    QCOMPARE(updated.first().first().value<NetworkPlace>().name(), u"Renamed"_s);
    QCOMPARE(texts(proxy.networkPlaces()), QStringList({u"N ftp://n /n"_s, u"A smb://a "_s}));
}

void NetworkPlacesProxyTest::removalGoesByName()
{
    m_service->setValue(
        list, array(R"([["N", "ftp://1", ""], ["A", "ftp://a", ""], ["N", "ftp://2", ""]])"));
    NetworkPlacesManagerProxy proxy(m_interface);
    proxy.networkPlaces();
    QSignalSpy removed(&proxy, &NetworkPlacesManagerProxy::networkPlaceRemoved);
    emitNews(u"networkPlaceRemoved"_s, R"(["N", "ftp://other", ""])");
    QVERIFY(!removed.isEmpty() || removed.wait());
    QCOMPARE(texts(proxy.networkPlaces()), QStringList(u"A ftp://a "_s));
}

void NetworkPlacesProxyTest::newsBeforeTheFirstRead()
{
    NetworkPlacesManagerProxy proxy(m_interface);
    QSignalSpy added(&proxy, &NetworkPlacesManagerProxy::networkPlaceAdded);
    QSignalSpy removed(&proxy, &NetworkPlacesManagerProxy::networkPlaceRemoved);
    emitNews(u"networkPlaceAdded"_s, R"(["Early", "ftp://e", ""])");
    emitNews(u"networkPlaceRemoved"_s, R"(["N", "", ""])");
    QVERIFY(!removed.isEmpty() || removed.wait());
    QCOMPARE(added.count(), 1);
    QCOMPARE(proxy.networkPlaces().size(), 2);
}

void NetworkPlacesProxyTest::expiredInterface()
{
    auto interface = m_service.interface(u"NetworkPlacesManager"_s);
    NetworkPlacesManagerProxy proxy(interface);
    interface.clear();
    const NetworkPlace place(u"N"_s, u"ftp://n"_s, QString());
    QVERIFY(!proxy.addNetworkPlace(place));
    proxy.removeNetworkPlace(place);
    proxy.updateNetworkPlace(place);
    QVERIFY(proxy.networkPlaces().isEmpty());
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void NetworkPlacesProxyTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(NetworkPlacesProxyTest)
#include "tst_networkplacesproxy.moc"
