// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "support/servicescene.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

/// The two registers of mounts, of which nothing is kept.
class MountsProxiesTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void networkMountsAreAskedEachTime();
    void fuseMountsAreAskedEachTime();
    void failedReadsAreEmpty();
    void addMountIsSent();
    void rememberedMountsComeBack();
    void mountAddedComesFromTheServiceAlone();
    void fuseMountAddedNeverFires();
    void expiredInterfaces();
    void cleanupTestCase();

private:
    ServiceScene m_service;
    QSharedPointer<QDBusInterface> m_network;
    QSharedPointer<QDBusInterface> m_fuse;
};

void MountsProxiesTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
    m_network = m_service.interface(u"NetworkMountsManager"_s);
    m_fuse = m_service.interface(u"FuseMountsManager"_s);
}

void MountsProxiesTest::init()
{
    m_service->load(object(R"({"echo": false, "remember": false, "values": {
        "NetworkMountsManager.mounts": {"ftp://h": ["FTP/h", "/m/h", 4002]},
        "FuseMountsManager.mounts": {"ftp://h": "/m/h"}}})"));
    m_service->takeCalls();
}

void MountsProxiesTest::networkMountsAreAskedEachTime()
{
    NetworkMountsManagerProxy proxy(m_network);
    const QMap<QString, Entry> mounts = proxy.mounts();
    QCOMPARE(mounts.keys(), QStringList(u"ftp://h"_s));
    QCOMPARE(mounts.first().path(), u"FTP/h"_s);
    QCOMPARE(mounts.first().localPath(), u"/m/h"_s);
    QCOMPARE(mounts.first().type(), int(TypeFtpSharePlace));
    m_service->setValue(
        u"NetworkMountsManager.mounts"_s, object(R"({"sftp://a": ["SFTP/a", "/m/a", 4003]})"));
    QCOMPARE(proxy.mounts().keys(), QStringList(u"sftp://a"_s));
    const QString call = u"NetworkMountsManager.mounts[]"_s;
    QCOMPARE(m_service->takeCalls(), QStringList({call, call}));
}

void MountsProxiesTest::fuseMountsAreAskedEachTime()
{
    FuseMountsManagerProxy proxy(m_fuse);
    QCOMPARE(proxy.mounts().value(u"ftp://h"_s), u"/m/h"_s);
    m_service->setValue(u"FuseMountsManager.mounts"_s, object(R"({"ftp://b": "/m/b"})"));
    QCOMPARE(proxy.mounts().keys(), QStringList(u"ftp://b"_s));
    const QString call = u"FuseMountsManager.mounts[]"_s;
    QCOMPARE(m_service->takeCalls(), QStringList({call, call}));
}

void MountsProxiesTest::failedReadsAreEmpty()
{
    NetworkMountsManagerProxy network(m_network);
    FuseMountsManagerProxy fuse(m_fuse);
    for (const char* rule : {R"([{"error": "broken"}])", R"([{"wrong": true}])"}) {
        m_service->setRules(u"NetworkMountsManager.mounts"_s, array(rule));
        m_service->setRules(u"FuseMountsManager.mounts"_s, array(rule));
        QVERIFY(network.mounts().isEmpty());
        QVERIFY(fuse.mounts().isEmpty());
        // Nothing stays of the failure.
        QCOMPARE(network.mounts().size(), 1);
        QCOMPARE(fuse.mounts().size(), 1);
    }
}

void MountsProxiesTest::addMountIsSent()
{
    NetworkMountsManagerProxy network(m_network);
    FuseMountsManagerProxy fuse(m_fuse);
    const Entry entry = network.mounts().first();
    m_service->takeCalls();
    network.addMount(u"ftp://x"_s, entry);
    fuse.addMount(u"ftp://x"_s, u"/m/x"_s);
    QCOMPARE(
        m_service->takeCalls(),
        QStringList(
            {u"NetworkMountsManager.addMount[\"ftp://x\",[\"FTP/h\",\"/m/h\",4002]]"_s,
             u"FuseMountsManager.addMount[\"ftp://x\",\"/m/x\"]"_s}));
}

void MountsProxiesTest::rememberedMountsComeBack()
{
    NetworkMountsManagerProxy network(m_network);
    FuseMountsManagerProxy fuse(m_fuse);
    const Entry entry = network.mounts().first();
    network.addMount(u"sftp://x"_s, entry);
    fuse.addMount(u"sftp://x"_s, u"/m/x"_s);
    QCOMPARE(network.mounts().keys(), QStringList(u"ftp://h"_s));
    QCOMPARE(fuse.mounts().keys(), QStringList(u"ftp://h"_s));

    m_service->load(object(R"({"echo": true, "remember": true})"));
    m_service->setRules(u"FuseMountsManager.addMount"_s, array(R"([{"error": "full"}])"));
    fuse.addMount(u"sftp://lost"_s, u"/m/lost"_s);
    QSignalSpy added(&network, &NetworkMountsManagerProxy::mountAdded);
    network.addMount(u"sftp://x"_s, entry);
    fuse.addMount(u"sftp://x"_s, u"/m/x"_s);
    QCOMPARE(network.mounts().keys(), QStringList({u"ftp://h"_s, u"sftp://x"_s}));
    QCOMPARE(network.mounts().value(u"sftp://x"_s), entry);
    QCOMPARE(fuse.mounts().keys(), QStringList({u"ftp://h"_s, u"sftp://x"_s}));
    QCOMPARE(fuse.mounts().value(u"sftp://x"_s), u"/m/x"_s);
    QVERIFY(!added.isEmpty() || added.wait());
    QCOMPARE(added.first().at(0).toString(), u"sftp://x"_s);
}

void MountsProxiesTest::mountAddedComesFromTheServiceAlone()
{
    NetworkMountsManagerProxy proxy(m_network);
    QSignalSpy added(&proxy, &NetworkMountsManagerProxy::mountAdded);
    const Entry entry = proxy.mounts().first();
    proxy.addMount(u"quiet"_s, entry);
    m_service->load(object(R"({"echo": true})"));
    proxy.addMount(u"echoed"_s, entry);
    QVERIFY(added.isEmpty());
    QVERIFY(added.wait());
    QCOMPARE(added.count(), 1);
    QCOMPARE(added.first().at(0).toString(), u"echoed"_s);
    QCOMPARE(added.first().at(1).value<Entry>().localPath(), u"/m/h"_s);
}

void MountsProxiesTest::fuseMountAddedNeverFires()
{
    // Even where the service has such a signal. The second one tells that the first has passed.
    FuseMountsManagerProxy fuse(m_fuse);
    NetworkMountsManagerProxy network(m_network);
    QSignalSpy fuseAdded(&fuse, &FuseMountsManagerProxy::mountAdded);
    QSignalSpy networkAdded(&network, &NetworkMountsManagerProxy::mountAdded);
    m_service->emitRaw(
        u"/FuseMountsManager"_s, u"org.veylabs.FileManager.FuseMountsManager"_s, u"mountAdded"_s,
        {u"ftp://h"_s, u"/m/h"_s});
    m_service->emitSignal(
        u"NetworkMountsManager"_s, u"mountAdded"_s, array(R"(["ftp://h", ["FTP/h", "/m", 4002]])"));
    QVERIFY(!networkAdded.isEmpty() || networkAdded.wait());
    QVERIFY(fuseAdded.isEmpty());
}

void MountsProxiesTest::expiredInterfaces()
{
    auto networkInterface = m_service.interface(u"NetworkMountsManager"_s);
    auto fuseInterface = m_service.interface(u"FuseMountsManager"_s);
    NetworkMountsManagerProxy network(networkInterface);
    FuseMountsManagerProxy fuse(fuseInterface);
    networkInterface.clear();
    fuseInterface.clear();
    QVERIFY(network.mounts().isEmpty());
    QVERIFY(fuse.mounts().isEmpty());
    network.addMount(u"ftp://x"_s, Entry());
    fuse.addMount(u"ftp://x"_s, u"/m/x"_s);
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void MountsProxiesTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(MountsProxiesTest)
#include "tst_mountsproxies.moc"
