// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"
#include "support/vfstest.h"

using namespace VeyFM;

/// How the tree follows favourites.
class FavouriteUpdatesTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void readAtStart();
    void addedThenRemoved();
    void nameInUse();
    void removedStranger();
    void treeFollowsTheSignalAlone();
    void cleanupTestCase();

private:
    QStringList favouriteNews(const QString& signal, const QString& name, const QString& local)
    {
        return news(
            u"FavouritePlacesManager"_s, u"favouritePlace"_s + signal, arguments({name, local}));
    }
};

void FavouriteUpdatesTest::initTestCase()
{
    const QByteArray script = R"({"values": {"FavouritePlacesManager.favouritePlaces":
        [["Z", "/z"], ["A", "/a"], ["Z", "/second"]]}})";
    QVERIFY(startVfs(script));
}

void FavouriteUpdatesTest::readAtStart()
{
    QCOMPARE(childPaths(u"Favourites"_s), QStringList({u"Favourites/Z"_s, u"Favourites/A"_s}));
    QCOMPARE(treeLocalPath(u"Favourites/Z"_s), u"/z"_s);
    QCOMPARE(vfs->entry(u"Favourites/Z"_s).type(), int(TypeFavouritePlace));
}

void FavouriteUpdatesTest::addedThenRemoved()
{
    QCOMPARE(favouriteNews(u"Added"_s, u"N"_s, u"/n"_s), QStringList(u"created Favourites/N=/n"_s));
    QCOMPARE(childPaths(u"Favourites"_s).last(), u"Favourites/N"_s);
    // By the name alone, with what the tree has.
    QCOMPARE(
        favouriteNews(u"Removed"_s, u"N"_s, u"/other"_s),
        QStringList(u"deleted Favourites/N=/n"_s));
    QCOMPARE(childPaths(u"Favourites"_s).size(), 2);
}

void FavouriteUpdatesTest::nameInUse()
{
    QCOMPARE(favouriteNews(u"Added"_s, u"A"_s, u"/elsewhere"_s), QStringList());
    QCOMPARE(treeLocalPath(u"Favourites/A"_s), u"/a"_s);
}

void FavouriteUpdatesTest::removedStranger()
{
    QCOMPARE(favouriteNews(u"Removed"_s, u"nobody"_s, u"/a"_s), QStringList());
}

void FavouriteUpdatesTest::treeFollowsTheSignalAlone()
{
    service->takeCalls();
    const FavouritePlace place(u"Mine"_s, u"/mine"_s);
    vfs->addFavouritePlace(place);
    QVERIFY(!vfs->hasFavouritePlace(place));
    QCOMPARE(childPaths(u"Favourites"_s).size(), 2);
    QCOMPARE(log->takeAll(service), QStringList(u"created Favourites/Mine=/mine"_s));
    QVERIFY(vfs->hasFavouritePlace(place));
    vfs->removeFavouritePlace(place);
    QCOMPARE(childPaths(u"Favourites"_s).size(), 3);
    QCOMPARE(log->takeAll(service), QStringList(u"deleted Favourites/Mine=/mine"_s));
    QVERIFY(!vfs->hasFavouritePlace(place));
    QCOMPARE(
        service->takeCalls(),
        QStringList(
            {u"FavouritePlacesManager.addFavouritePlace[[\"Mine\",\"/mine\"]]"_s,
             u"FavouritePlacesManager.removeFavouritePlace[[\"Mine\",\"/mine\"]]"_s}));
}

void FavouriteUpdatesTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(FavouriteUpdatesTest)
#include "tst_placeupdates_favourites.moc"
