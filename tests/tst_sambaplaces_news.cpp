// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/stringmap.h"
#include "service/smbbrowserproxy.h"
#include "support/vfstest.h"

using namespace VeyFM;

/// The Samba branch as it follows the reports of rescans.
class SambaPlacesNewsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void workgroupReportOpensSamba();
    void workgroupReportForAStranger();
    void hostReportForAStranger();
    void emptyReports();
    void hostsComeAndGo();
    void sharesAreAddedInOrder();
    void vanishedShareStays();
    void shareNamedAsItsLocalPathGoes();
    void shareUpdated();
    void shareUpdatedOfAStranger();
    void removedWorkgroupLeavesItsHosts();
    void workgroupThatComesBackFindsItsHosts();
    void cleanupTestCase();

private:
    QStringList report(const QString& signal, const QByteArray& arguments)
    {
        return news(u"SmbBrowser"_s, signal, array(arguments));
    }
};

void SambaPlacesNewsTest::initTestCase()
{
    const QByteArray script = R"({"values": {
        "SmbBrowser.workgroups": ["WG", "Other"],
        "SmbBrowser.hosts": [],
        "SmbBrowser.hosts WG": ["h1"],
        "SmbBrowser.shares": {},
        "SmbBrowser.shares h1 WG": {"b": "/mnt/b"}}})";
    QVERIFY(startVfs(script));
    service->takeCalls();
}

void SambaPlacesNewsTest::workgroupReportOpensSamba()
{
    // The client knows the workgroup by a rescan, nobody has looked at the tree.
    vfs->smbBrowser()->rescanWorkgroup(u"WG"_s);
    QCOMPARE(log->take(), QStringList({u"started"_s, u"finished"_s, u"created Samba/WG/h1"_s}));
    QCOMPARE(childPaths(u"Samba"_s), QStringList({u"Samba/Other"_s, u"Samba/WG"_s}));
}

void SambaPlacesNewsTest::workgroupReportForAStranger()
{
    vfs->smbBrowser()->rescanWorkgroup(u"Nobody"_s);
    service->setValue(u"SmbBrowser.hosts Nobody"_s, array(R"(["x"])"));
    QCOMPARE(report(u"rescanWorkgroupFinished"_s, R"(["Nobody", true])"), QStringList());
    QVERIFY(!vfs->placeBase()->hasPlace(u"Samba/Nobody"_s));
}

void SambaPlacesNewsTest::hostReportForAStranger()
{
    // Not even for what was added.
    service->setValue(u"SmbBrowser.shares x Nobody"_s, object(R"({"s": ""})"));
    vfs->smbBrowser()->rescanHost(u"x"_s, u"Nobody"_s);
    QCOMPARE(log->takeAll(service), QStringList());
    QVERIFY(!vfs->placeBase()->hasPlace(u"Samba/Nobody/x/s"_s));
}

void SambaPlacesNewsTest::emptyReports()
{
    QVERIFY(QMetaObject::invokeMethod(
        vfs, "_q_smbWorkgroupsChanged", Q_ARG(QStringList, QStringList()),
        Q_ARG(QStringList, QStringList(u"never"_s))));
    QVERIFY(QMetaObject::invokeMethod(
        vfs, "_q_smbWorkgroupUpdated", Q_ARG(QString, u"WG"_s), Q_ARG(QStringList, QStringList()),
        Q_ARG(QStringList, QStringList(u"never"_s))));
    QCOMPARE(log->take(), QStringList());
}

void SambaPlacesNewsTest::hostsComeAndGo()
{
    // Nobody has opened the workgroup: it has to be opened for its first read not to mix with this.
    vfs->childs(vfs->entry(u"Samba/WG"_s));
    log->take();
    service->setValue(u"SmbBrowser.hosts WG"_s, array(R"(["h3", "h2", "h1"])"));
    QCOMPARE(
        report(u"rescanWorkgroupFinished"_s, R"(["WG", true])"),
        QStringList({u"created Samba/WG/h3"_s, u"created Samba/WG/h2"_s}));
    service->setValue(u"SmbBrowser.hosts WG"_s, array(R"(["h1"])"));
    QCOMPARE(
        report(u"rescanWorkgroupFinished"_s, R"(["WG", true])"),
        QStringList({u"deleted Samba/WG/h2"_s, u"deleted Samba/WG/h3"_s}));
    QCOMPARE(childPaths(u"Samba/WG"_s), QStringList(u"Samba/WG/h1"_s));
}

void SambaPlacesNewsTest::sharesAreAddedInOrder()
{
    QCOMPARE(vfs->childs(vfs->entry(u"Samba/WG/h1"_s)).size(), 1);
    log->take();
    service->setValue(
        u"SmbBrowser.shares h1 WG"_s, object(R"({"z": "", "b": "/mnt/b", "a": "/mnt/a"})"));
    QCOMPARE(
        report(u"rescanHostFinished"_s, R"(["h1", "WG", true])"),
        QStringList({u"created Samba/WG/h1/a=/mnt/a"_s, u"created Samba/WG/h1/z"_s}));
    QCOMPARE(
        childPaths(u"Samba/WG/h1"_s),
        QStringList({u"Samba/WG/h1/b"_s, u"Samba/WG/h1/a"_s, u"Samba/WG/h1/z"_s}));
}

void SambaPlacesNewsTest::vanishedShareStays()
{
    // Removal goes by the local path, which names no share, be it empty or not.
    service->setValue(u"SmbBrowser.shares h1 WG"_s, object(R"({"b": "/mnt/b"})"));
    QCOMPARE(report(u"rescanHostFinished"_s, R"(["h1", "WG", true])"), QStringList());
    QCOMPARE(childPaths(u"Samba/WG/h1"_s).size(), 3);
    QVERIFY(!vfs->smbShareEntry(u"a"_s, u"h1"_s, u"WG"_s).isNull());
}

void SambaPlacesNewsTest::shareNamedAsItsLocalPathGoes()
{
    // By value: "a" goes for the share "s" whose local path is "a". The entry carries what stands
    // under the key "a", which is nothing, and then what stands under its own name.
    StringMap removed;
    removed.insert(u"s"_s, u"a"_s);
    const auto remove = [this](const StringMap& map) {
        return QMetaObject::invokeMethod(
            vfs, "_q_smbHostUpdated", Q_ARG(QString, u"h1"_s), Q_ARG(QString, u"WG"_s),
            Q_ARG(StringMap, StringMap()), Q_ARG(StringMap, map));
    };
    QVERIFY(remove(removed));
    QCOMPARE(log->take(), QStringList(u"deleted Samba/WG/h1/a"_s));
    removed.clear();
    removed.insert(u"z"_s, u"z"_s);
    QVERIFY(remove(removed));
    QCOMPARE(log->take(), QStringList(u"deleted Samba/WG/h1/z=z"_s));
    QCOMPARE(childPaths(u"Samba/WG/h1"_s), QStringList(u"Samba/WG/h1/b"_s));
}

void SambaPlacesNewsTest::shareUpdated()
{
    // The old local path travels with the news.
    QCOMPARE(
        report(u"shareUpdated"_s, R"(["b", "h1", "WG", "/new"])"),
        QStringList({u"reset Samba/WG/h1/b=/mnt/b"_s, u"shareUpdated Samba/WG/h1/b=/mnt/b"_s}));
    QCOMPARE(treeLocalPath(u"Samba/WG/h1/b"_s), u"/new"_s);
}

void SambaPlacesNewsTest::shareUpdatedOfAStranger()
{
    QVERIFY(QMetaObject::invokeMethod(
        vfs, "_q_smbShareUpdated", Q_ARG(QString, u"none"_s), Q_ARG(QString, u"h1"_s),
        Q_ARG(QString, u"WG"_s), Q_ARG(QString, u"/x"_s)));
    QCOMPARE(log->take(), QStringList());
}

void SambaPlacesNewsTest::removedWorkgroupLeavesItsHosts()
{
    service->setValue(u"SmbBrowser.workgroups"_s, array(R"(["Other"])"));
    const QStringList told = report(u"rescanFinished"_s, "[true]");
    QVERIFY(told.contains(u"deleted Samba/WG"_s));
    QCOMPARE(childPaths(u"Samba"_s), QStringList(u"Samba/Other"_s));
    // Without a parent, and still there.
    const Entry host = vfs->placeBase()->placeEntry(u"Samba/WG/h1"_s);
    QVERIFY(!host.isNull());
    QVERIFY(vfs->parent(host).isNull());
}

void SambaPlacesNewsTest::workgroupThatComesBackFindsItsHosts()
{
    service->setValue(u"SmbBrowser.workgroups"_s, array(R"(["Other", "WG"])"));
    QCOMPARE(report(u"rescanFinished"_s, "[true]"), QStringList(u"created Samba/WG"_s));
    QCOMPARE(vfs->childs(vfs->entry(u"Samba/WG"_s)).paths(), QStringList(u"Samba/WG/h1"_s));
    // The host is the same node, and its shares hang below it.
    QVERIFY(childPaths(u"Samba/WG/h1"_s).contains(u"Samba/WG/h1/b"_s));
}

void SambaPlacesNewsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(SambaPlacesNewsTest)
#include "tst_sambaplaces_news.moc"
