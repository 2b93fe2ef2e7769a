// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/smbbrowserproxy.h"
#include "support/vfstest.h"

using namespace VeyFM;

/// The Samba branch as it is made level by level, when somebody first looks.
class SambaPlacesTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void emptyNetwork();
    void reportMakesAWorkgroup();
    void hasChildsAsksNobody();
    void workgroupWithHosts();
    void workgroupWithoutHosts();
    void hostWithShares();
    void hostWithoutShares();
    void vanishedPathHasNoEnd();
    void reportArmsAgain();
    void cleanupTestCase();
};

void SambaPlacesTest::initTestCase()
{
    const QByteArray script = R"({"values": {
        "SmbBrowser.workgroups": [],
        "SmbBrowser.hosts": [],
        "SmbBrowser.hosts WG": ["h2", "h1"],
        "SmbBrowser.shares": {},
        "SmbBrowser.shares h1 WG": {"pub": "", "home": "/mnt/home"}}})";
    QVERIFY(startVfs(script));
    service->takeCalls();
}

void SambaPlacesTest::emptyNetwork()
{
    QVERIFY(vfs->hasChilds(vfs->sambaNetworkEntry()));
    QVERIFY(vfs->childs(vfs->sambaNetworkEntry()).isEmpty());
    // The reset tells a view that waits that the answer is nothing.
    QCOMPARE(log->takeAll(service), QStringList({u"started"_s, u"reset Samba"_s, u"finished"_s}));
    QVERIFY(!vfs->hasChilds(vfs->sambaNetworkEntry()));
    // It is not read again by itself.
    vfs->childs(vfs->sambaNetworkEntry());
    QCOMPARE(log->takeAll(service), QStringList());
    QCOMPARE(service->takeCalls(), QStringList(u"SmbBrowser.workgroups[]"_s));
}

void SambaPlacesTest::reportMakesAWorkgroup()
{
    service->setValue(u"SmbBrowser.workgroups"_s, array(R"(["WG", "Empty"])"));
    QCOMPARE(
        news(u"SmbBrowser"_s, u"rescanFinished"_s, {true}),
        QStringList({u"created Samba/WG"_s, u"created Samba/Empty"_s}));
    QCOMPARE(childPaths(u"Samba"_s), QStringList({u"Samba/WG"_s, u"Samba/Empty"_s}));
    // No host list was read.
    QCOMPARE(service->takeCalls(), QStringList(u"SmbBrowser.workgroups[]"_s));
}

void SambaPlacesTest::hasChildsAsksNobody()
{
    for (const Entry& workgroup : vfs->childs(vfs->sambaNetworkEntry())) {
        QCOMPARE(workgroup.type(), int(TypeSambaWorkgroupPlace));
        QVERIFY(vfs->hasChilds(workgroup));
    }
    QCOMPARE(service->takeCalls(), QStringList());
}

void SambaPlacesTest::workgroupWithHosts()
{
    const EntryList hosts = vfs->childs(vfs->entry(u"Samba/WG"_s));
    // As the client sorts them.
    QCOMPARE(hosts.paths(), QStringList({u"Samba/WG/h1"_s, u"Samba/WG/h2"_s}));
    QCOMPARE(hosts.first().type(), int(TypeSambaServerPlace));
    QCOMPARE(log->takeAll(service), QStringList({u"started"_s, u"finished"_s}));
    QCOMPARE(service->takeCalls(), QStringList(u"SmbBrowser.hosts[\"WG\"]"_s));
}

void SambaPlacesTest::workgroupWithoutHosts()
{
    const Entry workgroup = vfs->entry(u"Samba/Empty"_s);
    QVERIFY(vfs->childs(workgroup).isEmpty());
    QCOMPARE(
        log->takeAll(service), QStringList({u"started"_s, u"reset Samba/Empty"_s, u"finished"_s}));
    QVERIFY(!vfs->hasChilds(workgroup));
}

void SambaPlacesTest::hostWithShares()
{
    const EntryList shares = vfs->childs(vfs->entry(u"Samba/WG/h1"_s));
    QCOMPARE(shares.paths(), QStringList({u"Samba/WG/h1/home"_s, u"Samba/WG/h1/pub"_s}));
    QCOMPARE(shares.first().type(), int(TypeSambaSharePlace));
    QCOMPARE(storedLocalPath(shares.first()), u"/mnt/home"_s);
    QCOMPARE(log->takeAll(service), QStringList({u"started"_s, u"finished"_s}));
    // A share is a plain place, which asks nobody.
    service->takeCalls();
    vfs->childs(shares.last());
    QCOMPARE(service->takeCalls(), QStringList());
}

void SambaPlacesTest::hostWithoutShares()
{
    QVERIFY(vfs->childs(vfs->entry(u"Samba/WG/h2"_s)).isEmpty());
    QCOMPARE(
        log->takeAll(service), QStringList({u"started"_s, u"reset Samba/WG/h2"_s, u"finished"_s}));
}

void SambaPlacesTest::vanishedPathHasNoEnd()
{
    // The unbalance is meant.
    for (const char* slot : {"_q_createSambaHosts", "_q_createSambaShares"}) {
        QVERIFY(QMetaObject::invokeMethod(vfs, slot, Q_ARG(QString, u"Samba/gone"_s)));
        QCOMPARE(log->take(), QStringList(u"started"_s));
    }
}

void SambaPlacesTest::reportArmsAgain()
{
    // A place that is reported as added, and was opened, is read once more. Here by the slot
    // itself, since the client reports what is new to it alone.
    QVERIFY(QMetaObject::invokeMethod(
        vfs, "_q_smbWorkgroupsChanged", Q_ARG(QStringList, QStringList(u"Empty"_s)),
        Q_ARG(QStringList, QStringList())));
    QCOMPARE(log->take(), QStringList());
    QCOMPARE(childPaths(u"Samba"_s).size(), 2);
    QVERIFY(vfs->hasChilds(vfs->entry(u"Samba/Empty"_s)));
    vfs->childs(vfs->entry(u"Samba/Empty"_s));
    QCOMPARE(log->take(), QStringList({u"started"_s, u"reset Samba/Empty"_s, u"finished"_s}));
}

void SambaPlacesTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(SambaPlacesTest)
#include "tst_sambaplaces.moc"
