// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/smbbrowserproxy.h"
#include "support/servicescene.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

/// The levels of the Samba network as they are read: each once, failures too.
class SmbBrowserProxyTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void levelsAreReadOnce();
    void listsAreSorted();
    void namesAreCaseSensitive();
    void nothingIsAskedBelowTheUnknown();
    void failedReadsStand();
    void localPathsAreAskedEachTime();
    void shareUpdatedChangesAKnownShare();
    void shareUpdatedOfAStrangerIsDropped();
    void expiredInterface();
    void unusedSignalsAreFollowedByNobody();
    void cleanupTestCase();

private:
    ServiceScene m_service;
    QSharedPointer<QDBusInterface> m_interface;
};

void SmbBrowserProxyTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
    m_interface = m_service.interface(u"SmbBrowser"_s);
}

void SmbBrowserProxyTest::init()
{
    m_service->load(object(R"({"values": {
        "SmbBrowser.workgroups": ["WG2", "WG1"],
        "SmbBrowser.hosts": [],
        "SmbBrowser.hosts WG1": ["H2", "H1"],
        "SmbBrowser.shares": {},
        "SmbBrowser.shares H1 WG1": {"pub": "", "home": "/mnt/home"}}})"));
    m_service->takeCalls();
}

void SmbBrowserProxyTest::levelsAreReadOnce()
{
    SmbBrowserProxy proxy(m_interface);
    QCOMPARE(m_service->takeCalls(), QStringList());
    for (int i = 0; i < 2; ++i) {
        QCOMPARE(proxy.workgroups(), QStringList({u"WG1"_s, u"WG2"_s}));
        QCOMPARE(proxy.hosts(u"WG1"_s), QStringList({u"H1"_s, u"H2"_s}));
        const StringMap shares = proxy.shares(u"H1"_s, u"WG1"_s);
        QCOMPARE(shares.keys(), QStringList({u"home"_s, u"pub"_s}));
        QCOMPARE(shares.value(u"home"_s), u"/mnt/home"_s);
    }
    QCOMPARE(
        m_service->takeCalls(), QStringList(
                                    {u"SmbBrowser.workgroups[]"_s, u"SmbBrowser.hosts[\"WG1\"]"_s,
                                     u"SmbBrowser.shares[\"H1\",\"WG1\"]"_s}));
}

void SmbBrowserProxyTest::listsAreSorted()
{
    m_service->setValue(u"SmbBrowser.workgroups"_s, array(R"(["b", "a", "C", "a"])"));
    SmbBrowserProxy proxy(m_interface);
    QCOMPARE(proxy.workgroups(), QStringList({u"C"_s, u"a"_s, u"b"_s}));
}

void SmbBrowserProxyTest::namesAreCaseSensitive()
{
    SmbBrowserProxy proxy(m_interface);
    proxy.workgroups();
    QVERIFY(proxy.hosts(u"wg1"_s).isEmpty());
    QCOMPARE(proxy.hosts(u"WG1"_s).size(), 2);
    QVERIFY(proxy.shares(u"h1"_s, u"WG1"_s).isEmpty());
    QCOMPARE(proxy.shares(u"H1"_s, u"WG1"_s).size(), 2);
}

void SmbBrowserProxyTest::nothingIsAskedBelowTheUnknown()
{
    SmbBrowserProxy proxy(m_interface);
    // Nothing reads the level above.
    QVERIFY(proxy.hosts(u"WG1"_s).isEmpty());
    QVERIFY(proxy.shares(u"H1"_s, u"WG1"_s).isEmpty());
    QCOMPARE(m_service->takeCalls(), QStringList());
    proxy.workgroups();
    QVERIFY(proxy.shares(u"H1"_s, u"WG1"_s).isEmpty());
    QVERIFY(proxy.hosts(u"nobody"_s).isEmpty());
    QCOMPARE(m_service->takeCalls(), QStringList(u"SmbBrowser.workgroups[]"_s));
    // And no record was made by asking.
    QCOMPARE(proxy.workgroups(), QStringList({u"WG1"_s, u"WG2"_s}));
}

void SmbBrowserProxyTest::failedReadsStand()
{
    for (const char* failure : {R"([{"error": "broken"}])", R"([{"wrong": true}])"}) {
        SmbBrowserProxy proxy(m_interface);
        m_service->setRules(u"SmbBrowser.shares"_s, array(failure));
        m_service->setRules(u"SmbBrowser.hosts"_s, array(failure));
        QCOMPARE(proxy.workgroups().size(), 2);
        QVERIFY(proxy.hosts(u"WG2"_s).isEmpty());
        QCOMPARE(proxy.hosts(u"WG1"_s).size(), 2);
        QVERIFY(proxy.shares(u"H1"_s, u"WG1"_s).isEmpty());
        m_service->takeCalls();
        QVERIFY(proxy.hosts(u"WG2"_s).isEmpty());
        QVERIFY(proxy.shares(u"H1"_s, u"WG1"_s).isEmpty());
        QCOMPARE(m_service->takeCalls(), QStringList());

        SmbBrowserProxy another(m_interface);
        m_service->setRules(u"SmbBrowser.workgroups"_s, array(failure));
        QVERIFY(another.workgroups().isEmpty());
        QVERIFY(another.workgroups().isEmpty());
        QCOMPARE(m_service->takeCalls().size(), 1);
    }
}

void SmbBrowserProxyTest::localPathsAreAskedEachTime()
{
    m_service->load(object(R"({"values": {
        "SmbBrowser.smbNetworkLocalPath": "/mnt",
        "SmbBrowser.shareLocalPath": "/mnt/H1/home"}})"));
    SmbBrowserProxy proxy(m_interface);
    QCOMPARE(proxy.smbNetworkLocalPath(), u"/mnt"_s);
    QCOMPARE(proxy.smbNetworkLocalPath(), u"/mnt"_s);
    proxy.workgroups();
    proxy.hosts(u"WG1"_s);
    proxy.shares(u"H1"_s, u"WG1"_s);
    m_service->takeCalls();
    QCOMPARE(proxy.shareLocalPath(u"pub"_s, u"H1"_s, u"WG1"_s, u"h1.example"_s), u"/mnt/H1/home"_s);
    QCOMPARE(
        m_service->takeCalls(),
        QStringList(u"SmbBrowser.shareLocalPath[\"pub\",\"H1\",\"WG1\",\"h1.example\"]"_s));
    // What is kept changes by the announcement alone.
    QCOMPARE(proxy.shares(u"H1"_s, u"WG1"_s).value(u"pub"_s), QString());

    m_service->setRules(u"SmbBrowser.shareLocalPath"_s, array(R"([{"error": "no"}])"));
    m_service->setRules(u"SmbBrowser.smbNetworkLocalPath"_s, array(R"([{"wrong": true}])"));
    QVERIFY(proxy.shareLocalPath(u"pub"_s, u"H1"_s, u"WG1"_s, QString()).isEmpty());
    QVERIFY(proxy.smbNetworkLocalPath().isEmpty());
}

void SmbBrowserProxyTest::shareUpdatedChangesAKnownShare()
{
    SmbBrowserProxy proxy(m_interface);
    proxy.workgroups();
    proxy.hosts(u"WG1"_s);
    proxy.shares(u"H1"_s, u"WG1"_s);
    QString whenTold;
    connect(&proxy, &SmbBrowserProxy::shareUpdated, this, [&] {
        whenTold = proxy.shares(u"H1"_s, u"WG1"_s).value(u"pub"_s);
    });
    QSignalSpy updated(&proxy, &SmbBrowserProxy::shareUpdated);
    m_service->emitSignal(
        u"SmbBrowser"_s, u"shareUpdated"_s, array(R"(["pub", "H1", "WG1", "/mnt/pub"])"));
    QVERIFY(!updated.isEmpty() || updated.wait());
    QCOMPARE(updated.first(), QVariantList({u"pub"_s, u"H1"_s, u"WG1"_s, u"/mnt/pub"_s}));
    QCOMPARE(whenTold, u"/mnt/pub"_s);
}

void SmbBrowserProxyTest::shareUpdatedOfAStrangerIsDropped()
{
    SmbBrowserProxy proxy(m_interface);
    proxy.workgroups();
    proxy.hosts(u"WG1"_s);
    proxy.shares(u"H1"_s, u"WG1"_s);
    QSignalSpy updated(&proxy, &SmbBrowserProxy::shareUpdated);
    for (const char* stranger :
         {R"(["x", "H1", "WG1", "/"])", R"(["pub", "H2", "WG1", "/"])",
          R"(["pub", "H1", "WG2", "/"])", R"(["pub", "H1", "X", "/"])",
          R"(["home", "H1", "WG1", "/last"])"}) {
        m_service->emitSignal(u"SmbBrowser"_s, u"shareUpdated"_s, array(stranger));
    }
    QVERIFY(!updated.isEmpty() || updated.wait());
    QCOMPARE(updated.count(), 1);
    QCOMPARE(updated.first().last().toString(), u"/last"_s);
    QCOMPARE(proxy.shares(u"H1"_s, u"WG1"_s).size(), 2);
}

void SmbBrowserProxyTest::expiredInterface()
{
    auto interface = m_service.interface(u"SmbBrowser"_s);
    SmbBrowserProxy proxy(interface);
    interface.clear();
    QVERIFY(proxy.workgroups().isEmpty());
    proxy.rescan();
    proxy.rescanWorkgroup(u"WG1"_s);
    proxy.rescanHost(u"H1"_s, u"WG1"_s);
    // The rescans made their records all the same.
    QCOMPARE(proxy.workgroups(), QStringList(u"WG1"_s));
    QVERIFY(proxy.shares(u"H1"_s, u"WG1"_s).isEmpty());
    QVERIFY(proxy.smbNetworkLocalPath().isEmpty());
    QVERIFY(proxy.shareLocalPath(u"a"_s, u"b"_s, u"c"_s, QString()).isEmpty());
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void SmbBrowserProxyTest::unusedSignalsAreFollowedByNobody()
{
    SmbBrowserProxy proxy(m_interface);
    QSignalSpy denied(&proxy, &SmbBrowserProxy::shareAccessDenied);
    QSignalSpy failed(&proxy, &SmbBrowserProxy::shareLogonFailure);
    QSignalSpy granted(&proxy, &SmbBrowserProxy::shareAccessGranted);
    QSignalSpy fence(&proxy, &SmbBrowserProxy::workgroupsNotChanged);
    for (const QString& name :
         {u"shareAccessDenied"_s, u"shareLogonFailure"_s, u"shareAccessGranted"_s}) {
        m_service->emitRaw(
            u"/SmbBrowser"_s, u"org.veylabs.FileManager.SmbBrowser"_s, name,
            {u"pub"_s, u"H1"_s, u"WG1"_s});
    }
    m_service->emitSignal(u"SmbBrowser"_s, u"rescanFinished"_s, {false});
    QVERIFY(!fence.isEmpty() || fence.wait());
    QVERIFY(denied.isEmpty() && failed.isEmpty() && granted.isEmpty());
}

void SmbBrowserProxyTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(SmbBrowserProxyTest)
#include "tst_smbbrowserproxy.moc"
