// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfstest.h"

using namespace VeyFM;

/// How the tree follows network bookmarks.
class NetworkUpdatesTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void readAtStart();
    void added();
    void nameInUse();
    void updatedCarriesTheOldLocalPath();
    void updatedStrangerIsTold();
    void removed();
    void removedStranger();
    void cleanupTestCase();

private:
    QStringList
    bookmarkNews(const QString& signal, const QString& name, const QString& local = QString())
    {
        return news(
            u"NetworkPlacesManager"_s, u"networkPlace"_s + signal,
            arguments({name, u"ftp://host"_s, local}));
    }
};

void NetworkUpdatesTest::initTestCase()
{
    const QByteArray script = R"({"values": {"NetworkPlacesManager.networkPlaces":
        [["Z", "ftp://z", "/z"], ["A", "smb://a", ""], ["Z", "ftp://second", "/second"]]}})";
    QVERIFY(startVfs(script));
}

void NetworkUpdatesTest::readAtStart()
{
    QCOMPARE(childPaths(u"Network"_s), QStringList({u"Samba"_s, u"Network/Z"_s, u"Network/A"_s}));
    QCOMPARE(treeLocalPath(u"Network/Z"_s), u"/z"_s);
    QCOMPARE(vfs->entry(u"Network/A"_s).type(), int(TypeFavouriteNetworkPlace));
}

void NetworkUpdatesTest::added()
{
    QCOMPARE(
        bookmarkNews(u"Added"_s, u"N"_s, u"/n"_s),
        QStringList({u"created Network/N=/n"_s, u"bookmarkAdded N Network/N=/n"_s}));
}

void NetworkUpdatesTest::nameInUse()
{
    // A null entry tells that nothing new was linked.
    QCOMPARE(
        bookmarkNews(u"Added"_s, u"N"_s, u"/elsewhere"_s), QStringList(u"bookmarkAdded N -"_s));
    QCOMPARE(treeLocalPath(u"Network/N"_s), u"/n"_s);
}

void NetworkUpdatesTest::updatedCarriesTheOldLocalPath()
{
    QCOMPARE(
        bookmarkNews(u"Updated"_s, u"N"_s, u"/new"_s),
        QStringList({u"reset Network/N=/n"_s, u"bookmarkUpdated Network/N=/n"_s}));
    QCOMPARE(treeLocalPath(u"Network/N"_s), u"/new"_s);
}

void NetworkUpdatesTest::updatedStrangerIsTold()
{
    QCOMPARE(
        bookmarkNews(u"Updated"_s, u"nobody"_s, u"/x"_s),
        QStringList({u"reset -"_s, u"bookmarkUpdated -"_s}));
}

void NetworkUpdatesTest::removed()
{
    // The entry is made by hand, without a local path.
    QCOMPARE(bookmarkNews(u"Removed"_s, u"N"_s), QStringList(u"deleted Network/N"_s));
    QCOMPARE(childPaths(u"Network"_s).size(), 3);
}

void NetworkUpdatesTest::removedStranger()
{
    QCOMPARE(bookmarkNews(u"Removed"_s, u"nobody"_s), QStringList());
}

void NetworkUpdatesTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(NetworkUpdatesTest)
#include "tst_placeupdates_network.moc"
