// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/smbbrowserproxy.h"
#include "support/servicescene.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

namespace {

QString text(const StringMap& map)
{
    QStringList parts;
    for (auto it = map.begin(); it != map.end(); ++it) {
        parts << it.key() + QLatin1Char('=') + it.value();
    }
    return parts.join(QLatin1Char(','));
}

/// What a proxy tells of its rescans, a line each, with added and removed behind "+" and "-".
class RescanLog : public QObject
{
public:
    explicit RescanLog(const SmbBrowserProxy& proxy)
    {
        const auto names = [](const QStringList& list) {
            return list.join(QLatin1Char(','));
        };
        connect(&proxy, &SmbBrowserProxy::workgroupsNotChanged, this, [this] {
            lines << u"workgroups same"_s;
        });
        connect(
            &proxy, &SmbBrowserProxy::workgroupsChanged, this,
            [=](const QStringList& added, const QStringList& removed) {
                lines << u"workgroups +%1 -%2"_s.arg(names(added), names(removed));
            });
        connect(&proxy, &SmbBrowserProxy::workgroupNotUpdated, this, [this](const QString& name) {
            lines << name + u" same"_s;
        });
        connect(
            &proxy, &SmbBrowserProxy::workgroupUpdated, this,
            [=](const QString& name, const QStringList& added, const QStringList& removed) {
                lines << u"%1 +%2 -%3"_s.arg(name, names(added), names(removed));
            });
        connect(
            &proxy, &SmbBrowserProxy::hostNotUpdated, this,
            [this](const QString& host, const QString& workgroup) {
                lines << u"%1/%2 same"_s.arg(workgroup, host);
            });
        connect(
            &proxy, &SmbBrowserProxy::hostUpdated, this,
            [this](
                const QString& host, const QString& workgroup, const StringMap& added,
                const StringMap& removed) {
                lines << u"%1/%2 +%3 -%4"_s.arg(workgroup, host, text(added), text(removed));
            });
        connect(
            &proxy, &SmbBrowserProxy::shareUpdated, this,
            [this](const QString& share, const QString&, const QString&, const QString& local) {
                lines << u"share %1=%2"_s.arg(share, local);
            });
    }

    QStringList take()
    {
        QStringList result;
        result.swap(lines);
        return result;
    }

    QStringList lines;
};

} // namespace

/// Rescans: what goes out at once, and what the finished signals become.
class SmbBrowserProxyRescanTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void rescanTellsWhatIsKnownFirst();
    void emptyFirstReadTellsNothing();
    void loadedLevelTellsNothing();
    void rescanWorkgroupMakesItKnown();
    void unknownWorkgroupIsReportedRemoved();
    void firstReadDropsWhatARescanMade();
    void rescanHostMakesItKnown();
    void unreadLevelTakesAllAsAdded();
    void identicalListIsToldToo();
    void deltaKeepsWhatStays();
    void comingBackStartsUnread();
    void hostsDelta();
    void sharesDelta();
    void changedPathKeepsTheOldOne();
    void failedReadRemovesAll();
    void finishedOfStrangersIsSwallowed();
    void cleanupTestCase();

private:
    // All signals sent so far, up to a last one of ours.
    QStringList settled(RescanLog& log)
    {
        m_service->emitSignal(u"SmbBrowser"_s, u"rescanFinished"_s, {false});
        const QString mark = u"workgroups same"_s;
        if (!QTest::qWaitFor([&] { return log.lines.contains(mark); }, 20000)) {
            return {u"no mark"_s};
        }
        log.lines.removeAll(mark);
        return log.take();
    }

    QStringList finished(RescanLog& log, const QString& signal, const QByteArray& arguments)
    {
        m_service->emitSignal(u"SmbBrowser"_s, signal, array(arguments));
        return settled(log);
    }

    void setWorkgroups(const QByteArray& names)
    {
        m_service->setValue(u"SmbBrowser.workgroups"_s, array(names));
    }

    ServiceScene m_service;
    QSharedPointer<QDBusInterface> m_interface;
};

void SmbBrowserProxyRescanTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
    m_interface = m_service.interface(u"SmbBrowser"_s);
}

void SmbBrowserProxyRescanTest::init()
{
    m_service->load(object(R"({"values": {
        "SmbBrowser.workgroups": ["B", "A"],
        "SmbBrowser.hosts": [],
        "SmbBrowser.hosts A": ["h2", "h1"],
        "SmbBrowser.hosts X": ["hx"],
        "SmbBrowser.shares": {},
        "SmbBrowser.shares h1 A": {"pub": "", "home": "/home"},
        "SmbBrowser.shares hy Y": {"s": "/s"}}})"));
    m_service->takeCalls();
}

void SmbBrowserProxyRescanTest::rescanTellsWhatIsKnownFirst()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.rescan();
    // From inside the call, and the keys in order.
    QCOMPARE(log.take(), QStringList(u"workgroups +A,B -"_s));
    proxy.rescanWorkgroup(u"A"_s);
    QCOMPARE(log.take(), QStringList(u"A +h1,h2 -"_s));
    proxy.rescanHost(u"h1"_s, u"A"_s);
    QCOMPARE(log.take(), QStringList(u"A/h1 +home=/home,pub= -"_s));
    QTRY_COMPARE(m_service->calls().size(), 6);
    QCOMPARE(
        m_service->takeCalls(),
        QStringList(
            {u"SmbBrowser.workgroups[]"_s, u"SmbBrowser.rescan[]"_s, u"SmbBrowser.hosts[\"A\"]"_s,
             u"SmbBrowser.rescanWorkgroup[\"A\"]"_s, u"SmbBrowser.shares[\"h1\",\"A\"]"_s,
             u"SmbBrowser.rescanHost[\"h1\",\"A\"]"_s}));
}

void SmbBrowserProxyRescanTest::emptyFirstReadTellsNothing()
{
    setWorkgroups("[]");
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.rescan();
    QCOMPARE(log.take(), QStringList());
    setWorkgroups(R"(["N"])");
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups +N -"_s));
}

void SmbBrowserProxyRescanTest::loadedLevelTellsNothing()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    m_service->takeCalls();
    proxy.rescan();
    QCOMPARE(log.take(), QStringList());
    QTRY_COMPARE(m_service->calls(), QStringList(u"SmbBrowser.rescan[]"_s));
    m_service->emitSignal(u"SmbBrowser"_s, u"rescanFinished"_s, {false});
    QTRY_COMPARE(log.lines, QStringList(u"workgroups same"_s));
}

void SmbBrowserProxyRescanTest::rescanWorkgroupMakesItKnown()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.rescanWorkgroup(u"X"_s);
    QCOMPARE(log.take(), QStringList(u"X +hx -"_s));
    QCOMPARE(proxy.hosts(u"X"_s), QStringList(u"hx"_s));
    QCOMPARE(proxy.workgroups(), QStringList({u"A"_s, u"B"_s, u"X"_s}));
}

void SmbBrowserProxyRescanTest::unknownWorkgroupIsReportedRemoved()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.rescanWorkgroup(u"X"_s);
    log.take();
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups + -X"_s));
    QVERIFY(proxy.hosts(u"X"_s).isEmpty());
}

void SmbBrowserProxyRescanTest::firstReadDropsWhatARescanMade()
{
    SmbBrowserProxy proxy(m_interface);
    proxy.rescanWorkgroup(u"X"_s);
    QCOMPARE(proxy.hosts(u"X"_s), QStringList(u"hx"_s));
    QCOMPARE(proxy.workgroups(), QStringList({u"A"_s, u"B"_s}));
    QVERIFY(proxy.hosts(u"X"_s).isEmpty());
    // The same one level below.
    proxy.rescanHost(u"stranger"_s, u"A"_s);
    QCOMPARE(proxy.hosts(u"A"_s), QStringList({u"h1"_s, u"h2"_s}));
}

void SmbBrowserProxyRescanTest::rescanHostMakesItKnown()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.rescanHost(u"hy"_s, u"Y"_s);
    QCOMPARE(log.take(), QStringList(u"Y/hy +s=/s -"_s));
    QCOMPARE(proxy.workgroups(), QStringList({u"A"_s, u"B"_s, u"Y"_s}));
    QCOMPARE(proxy.shares(u"hy"_s, u"Y"_s).value(u"s"_s), u"/s"_s);
}

void SmbBrowserProxyRescanTest::unreadLevelTakesAllAsAdded()
{
    setWorkgroups(R"(["B", "A", "B"])");
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    // In the service's order, twice what came twice.
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups +B,A,B -"_s));
    m_service->takeCalls();
    QCOMPARE(proxy.workgroups(), QStringList({u"A"_s, u"B"_s}));
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void SmbBrowserProxyRescanTest::identicalListIsToldToo()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups + -"_s));
}

void SmbBrowserProxyRescanTest::deltaKeepsWhatStays()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.hosts(u"A"_s);
    setWorkgroups(R"(["a", "Z", "C", "A", "Z"])");
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups +a,Z,C -B"_s));
    m_service->takeCalls();
    // A kept its hosts.
    QCOMPARE(proxy.hosts(u"A"_s), QStringList({u"h1"_s, u"h2"_s}));
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void SmbBrowserProxyRescanTest::comingBackStartsUnread()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.hosts(u"A"_s);
    setWorkgroups("[]");
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups + -A,B"_s));
    QVERIFY(proxy.hosts(u"A"_s).isEmpty());
    setWorkgroups(R"(["A"])");
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups +A -"_s));
    m_service->takeCalls();
    QCOMPARE(proxy.hosts(u"A"_s).size(), 2);
    QCOMPARE(m_service->takeCalls(), QStringList(u"SmbBrowser.hosts[\"A\"]"_s));
}

void SmbBrowserProxyRescanTest::hostsDelta()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    QCOMPARE(
        finished(log, u"rescanWorkgroupFinished"_s, R"(["A", false])"), QStringList(u"A same"_s));
    // Never read before.
    QCOMPARE(
        finished(log, u"rescanWorkgroupFinished"_s, R"(["A", true])"),
        QStringList(u"A +h2,h1 -"_s));
    m_service->setValue(u"SmbBrowser.hosts A"_s, array(R"(["h3", "h1"])"));
    QCOMPARE(
        finished(log, u"rescanWorkgroupFinished"_s, R"(["A", true])"), QStringList(u"A +h3 -h2"_s));
}

void SmbBrowserProxyRescanTest::sharesDelta()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.hosts(u"A"_s);
    QCOMPARE(
        finished(log, u"rescanHostFinished"_s, R"(["h1", "A", false])"),
        QStringList(u"A/h1 same"_s));
    QCOMPARE(
        finished(log, u"rescanHostFinished"_s, R"(["h1", "A", true])"),
        QStringList(u"A/h1 +home=/home,pub= -"_s));
    m_service->setValue(u"SmbBrowser.shares h1 A"_s, object(R"({"new": "/n", "pub": ""})"));
    QCOMPARE(
        finished(log, u"rescanHostFinished"_s, R"(["h1", "A", true])"),
        QStringList(u"A/h1 +new=/n -home=/home"_s));
}

void SmbBrowserProxyRescanTest::changedPathKeepsTheOldOne()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.hosts(u"A"_s);
    proxy.shares(u"h1"_s, u"A"_s);
    m_service->setValue(u"SmbBrowser.shares h1 A"_s, object(R"({"home": "/new", "pub": ""})"));
    QCOMPARE(
        finished(log, u"rescanHostFinished"_s, R"(["h1", "A", true])"), QStringList(u"A/h1 + -"_s));
    QCOMPARE(proxy.shares(u"h1"_s, u"A"_s).value(u"home"_s), u"/home"_s);
    QCOMPARE(
        finished(log, u"shareUpdated"_s, R"(["home", "h1", "A", "/new"])"),
        QStringList(u"share home=/new"_s));
    QCOMPARE(proxy.shares(u"h1"_s, u"A"_s).value(u"home"_s), u"/new"_s);
}

void SmbBrowserProxyRescanTest::failedReadRemovesAll()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    proxy.hosts(u"A"_s);
    m_service->setRules(u"SmbBrowser.hosts"_s, array(R"([{"error": "broken"}])"));
    QCOMPARE(
        finished(log, u"rescanWorkgroupFinished"_s, R"(["A", true])"),
        QStringList(u"A + -h1,h2"_s));
    m_service->setRules(u"SmbBrowser.workgroups"_s, array(R"([{"wrong": true}])"));
    QCOMPARE(finished(log, u"rescanFinished"_s, "[true]"), QStringList(u"workgroups + -A,B"_s));
}

void SmbBrowserProxyRescanTest::finishedOfStrangersIsSwallowed()
{
    SmbBrowserProxy proxy(m_interface);
    RescanLog log(proxy);
    proxy.workgroups();
    m_service->takeCalls();
    for (const char* arguments : {R"(["nobody", true])", R"(["nobody", false])"}) {
        QCOMPARE(finished(log, u"rescanWorkgroupFinished"_s, arguments), QStringList());
    }
    for (const char* arguments :
         {R"(["h1", "nobody", true])", R"(["h1", "A", true])", R"(["h1", "A", false])"}) {
        QCOMPARE(finished(log, u"rescanHostFinished"_s, arguments), QStringList());
    }
    QCOMPARE(m_service->takeCalls(), QStringList());
}

void SmbBrowserProxyRescanTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(SmbBrowserProxyRescanTest)
#include "tst_smbbrowserproxy_rescan.moc"
