// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/placescene.h"

#include <QtTest>

using namespace VeyFM;

// Which places there are, and how they hang together.
class TestVFSPlaceBase : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void createsAPlace();
    void createsAPlaceOnce();
    void createsAPlaceFromStoredFields();
    void knowsNoPlaceAtFirst();
    void looksAtThePathOfAnEntryAlone();
    void comparesPathsCaseSensitively();
    void handsOutCopies();
    void linksInOrder();
    void refusesAnUnknownParent();
    void linksAPlaceOnceUnderAParent();
    void linksWhatIsNoPlaceAgainAndAgain();
    void linksTheStoredEntryOfAPlace();
    void givesAChildThatIsNoPlaceNoKey();
    void keepsAChildApartFromALaterPlace();
    void linksAList();
    void removesALink();
    void removesTheFirstOfEqualChildren();
    void linksAgainAfterRemoval();
    void clearsAPlace();
    void refusesAClearedChildForEver();
    void doesNotTakeANewChildForAClearedOne();
    void destroysUnderEveryParent();
    void destroysWithoutAParent();
    void destroysUnderAParentThatIsGone();
    void destroysUnderAParentThatWasCleared();
    void leavesTheChildrenOfADestroyedPlace();
    void dropsOtherChildrenOfADestroyedPlace();
    void startsAfreshAfterDestruction();
    void replacesALocalPath();
    void tellsTheOrder();
    void takesAnyText_data();
    void takesAnyText();
    void holdsManyPlaces();
    void holdsADeepTree();
};

void TestVFSPlaceBase::createsAPlace()
{
    VFSPlaceBase base;
    const Entry made = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QCOMPARE(fields(made), u"Home|/home/u|2001"_s);
    QCOMPARE(fields(base.placeEntry(u"Home"_s)), u"Home|/home/u|2001"_s);
    QVERIFY(base.hasPlace(u"Home"_s));
    QVERIFY(base.hasPlace(made));
    QVERIFY(base.childEntries(made).isEmpty());
    QVERIFY(!base.hasChilds(made));
}

void TestVFSPlaceBase::createsAPlaceOnce()
{
    VFSPlaceBase base;
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    const Entry again = base.createPlace(u"Home"_s, TypeTrashDirPlace, u"/trash"_s);
    QCOMPARE(fields(again), u"Home|/home/u|2001"_s);
    QCOMPARE(fields(base.placeEntry(u"Home"_s)), u"Home|/home/u|2001"_s);
    QCOMPARE(fields(base.createPlace(makePlace(u"Home"_s))), u"Home|/home/u|2001"_s);
    QVERIFY(base.dirPlaceEntry(u"/trash"_s).isNull());
}

void TestVFSPlaceBase::createsAPlaceFromStoredFields()
{
    // Entry::localPath() of these three would ask VFS, and of the last one would not come back.
    VFSPlaceBase base;
    const Entry storage = makePlace(u"Disk"_s, TypeUsbDiskStoragePlace, u"/media/disk"_s);
    QCOMPARE(fields(base.createPlace(storage)), u"Disk|/media/disk|3500"_s);
    QCOMPARE(fields(base.createPlace(makePlace(u"Net"_s, TypeNetworkPlace))), u"Net||1002"_s);
    QCOMPARE(fields(base.createPlace(makePlace(u"F/x"_s, TypeFtpSharePlace))), u"F/x||4002"_s);
    QCOMPARE(fields(base.placeEntry(u"Disk"_s)), u"Disk|/media/disk|3500"_s);
}

void TestVFSPlaceBase::knowsNoPlaceAtFirst()
{
    VFSPlaceBase base;
    const Entry stranger = makePlace(u"Stranger"_s);
    QCOMPARE(fields(base.placeEntry(u"Stranger"_s)), fields(Entry()));
    QVERIFY(!base.hasPlace(u"Stranger"_s));
    QVERIFY(!base.hasPlace(stranger));
    QVERIFY(base.childEntries(stranger).isEmpty());
    QVERIFY(!base.hasChilds(stranger));
    QVERIFY(!base.placeHasChildEntry(stranger, stranger));
    QCOMPARE(base.placeOrderIndex(stranger, stranger), 0);
    QVERIFY(!base.destroyPlace(stranger));
    QVERIFY(!base.removeEntryFromPlace(stranger, stranger));
    base.clearPlace(stranger);
    base.setPlaceLocalPath(stranger, u"/x"_s);
    QVERIFY(!base.hasPlace(stranger));
    QVERIFY(base.dirPlaceEntry(u"/x"_s).isNull());
}

void TestVFSPlaceBase::looksAtThePathOfAnEntryAlone()
{
    VFSPlaceBase base;
    const Entry home = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    const Entry other = makePlace(u"Home"_s, TypeFile, u"/elsewhere"_s);
    QVERIFY(base.hasPlace(other));
    QVERIFY(base.addEntryToPlace(makeDir(u"/a"_s), other));
    QVERIFY(base.hasChilds(home));
    QVERIFY(base.placeHasChildEntry(other, makePlace(u"/a"_s, TypeFile)));
    base.setPlaceLocalPath(other, u"/home/v"_s);
    QCOMPARE(fields(base.placeEntry(u"Home"_s)), u"Home|/home/v|2001"_s);
}

void TestVFSPlaceBase::comparesPathsCaseSensitively()
{
    VFSPlaceBase base;
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QVERIFY(!base.hasPlace(u"home"_s));
    QVERIFY(base.placeEntry(u"HOME"_s).isNull());
    QVERIFY(base.dirPlaceEntry(u"/Home/u"_s).isNull());
}

void TestVFSPlaceBase::handsOutCopies()
{
    VFSPlaceBase base;
    const Entry disk = base.createPlace(u"Disk"_s, TypeUsbDiskStoragePlace, QString());
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    base.addEntryToPlace(disk, top);
    const EntryList before = base.childEntries(top);
    base.setPlaceLocalPath(disk, u"/media/disk"_s);
    base.addEntryToPlace(makeDir(u"/a"_s), top);
    QCOMPARE(fields(disk), u"Disk||3500"_s);
    QCOMPARE(before.size(), 1);
    QCOMPARE(fields(before.at(0)), u"Disk||3500"_s);
    QCOMPARE(fields(base.childEntries(top).at(0)), u"Disk|/media/disk|3500"_s);
}

void TestVFSPlaceBase::linksInOrder()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry z = base.createPlace(u"Z"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    QVERIFY(base.addEntryToPlace(z, top));
    QVERIFY(base.addEntryToPlace(makeDir(u"/m"_s), top));
    QVERIFY(base.addEntryToPlace(a, top));
    QCOMPARE(base.childEntries(top).paths(), QStringList({u"Z"_s, u"/m"_s, u"A"_s}));
    QVERIFY(base.hasChilds(top));
    QVERIFY(base.placeHasChildEntry(top, a));
    QVERIFY(base.placeHasChildEntry(top, makeDir(u"/m"_s)));
    QVERIFY(!base.placeHasChildEntry(top, top));
    QVERIFY(!base.placeHasChildEntry(a, z));
}

void TestVFSPlaceBase::refusesAnUnknownParent()
{
    VFSPlaceBase base;
    const Entry child = base.createPlace(u"Child"_s, TypePlace, QString());
    const Entry top = makePlace(u"Top"_s);
    QVERIFY(!base.addEntryToPlace(child, top));
    QVERIFY(base.addEntriesToPlace(QList<Entry>{child, makeDir(u"/a"_s)}, top).isEmpty());
    QVERIFY(!base.hasPlace(top));
    // The child has no link that would be in the way of a real one.
    base.createPlace(top);
    QVERIFY(!base.hasChilds(top));
    QVERIFY(base.addEntryToPlace(child, top));
}

void TestVFSPlaceBase::linksAPlaceOnceUnderAParent()
{
    VFSPlaceBase base;
    const Entry computer = base.createPlace(u"Computer"_s, TypeComputerPlace, QString());
    const Entry places = base.createPlace(u"Places"_s, TypePlace, QString());
    const Entry home = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QVERIFY(base.addEntryToPlace(home, computer));
    QVERIFY(!base.addEntryToPlace(home, computer));
    QVERIFY(base.addEntryToPlace(home, places));
    QVERIFY(!base.addEntryToPlace(home, places));
    QCOMPARE(base.childEntries(computer).paths(), QStringList(u"Home"_s));
    QCOMPARE(base.childEntries(places).paths(), QStringList(u"Home"_s));
}

void TestVFSPlaceBase::linksWhatIsNoPlaceAgainAndAgain()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry dir = makeDir(u"/a"_s);
    QVERIFY(base.addEntryToPlace(dir, top));
    QVERIFY(base.addEntryToPlace(dir, top));
    QCOMPARE(base.childEntries(top).paths(), QStringList({u"/a"_s, u"/a"_s}));
    // Nor is it what the entry says of itself that makes it a place.
    const Entry stranger = makePlace(u"Stranger"_s, TypeNetworkPlace);
    QVERIFY(base.addEntryToPlace(stranger, top));
    QVERIFY(base.addEntryToPlace(stranger, top));
    QCOMPARE(base.childEntries(top).size(), 4);
}

void TestVFSPlaceBase::linksTheStoredEntryOfAPlace()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QVERIFY(base.addEntryToPlace(makePlace(u"Home"_s, TypeFile, u"/other"_s), top));
    QCOMPARE(fields(base.childEntries(top).at(0)), u"Home|/home/u|2001"_s);
    QVERIFY(base.addEntryToPlace(makePlace(u"x"_s, TypeFile, u"/x"_s), top));
    QCOMPARE(fields(base.childEntries(top).at(1)), u"x|/x|10000"_s);
}

void TestVFSPlaceBase::givesAChildThatIsNoPlaceNoKey()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry dir = makeDir(u"/a"_s);
    base.addEntryToPlace(dir, top);
    QVERIFY(!base.hasPlace(dir));
    QVERIFY(base.placeEntry(u"/a"_s).isNull());
    QVERIFY(base.dirPlaceEntry(u"/a"_s).isNull());
    QVERIFY(!base.addEntryToPlace(makeDir(u"/b"_s), dir));
    QVERIFY(!base.destroyPlace(dir));
    QVERIFY(base.placeHasChildEntry(top, dir));
}

void TestVFSPlaceBase::keepsAChildApartFromALaterPlace()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    base.addEntryToPlace(makeDir(u"X"_s), top);
    const Entry place = base.createPlace(u"X"_s, TypePlace, QString());
    QVERIFY(base.addEntryToPlace(place, top));
    QCOMPARE(base.childEntries(top).size(), 2);
    QVERIFY(base.destroyPlace(place));
    QCOMPARE(base.childEntries(top).size(), 1);
    QCOMPARE(fields(base.childEntries(top).at(0)), u"X|X|10001"_s);
}

void TestVFSPlaceBase::linksAList()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry b = base.createPlace(u"B"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    base.addEntryToPlace(a, top);
    const Entry dir = makeDir(u"/d"_s);
    const Entry otherB = makePlace(u"B"_s, TypeFile, u"/b"_s);
    const EntryList linked = base.addEntriesToPlace(QList<Entry>{dir, otherB, a, dir, b}, top);
    // As they were given, without those that hung there.
    QCOMPARE(linked.paths(), QStringList({u"/d"_s, u"B"_s, u"/d"_s}));
    QCOMPARE(fields(linked.at(1)), u"B|/b|10000"_s);
    QCOMPARE(base.childEntries(top).paths(), QStringList({u"A"_s, u"/d"_s, u"B"_s, u"/d"_s}));
    QCOMPARE(fields(base.childEntries(top).at(2)), u"B||1000"_s);
    QVERIFY(base.addEntriesToPlace({}, top).isEmpty());
}

void TestVFSPlaceBase::removesALink()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry other = base.createPlace(u"Other"_s, TypePlace, QString());
    const Entry child = base.createPlace(u"Child"_s, TypePlace, QString());
    QVERIFY(!base.removeEntryFromPlace(child, top));
    base.addEntryToPlace(child, top);
    base.addEntryToPlace(child, other);
    QVERIFY(!base.removeEntryFromPlace(other, top));
    QVERIFY(base.removeEntryFromPlace(child, top));
    QVERIFY(!base.removeEntryFromPlace(child, top));
    QVERIFY(!base.hasChilds(top));
    QVERIFY(base.placeHasChildEntry(other, child));
    QVERIFY(base.hasPlace(child));
    // The link up is gone as well: no parent but the other one is left.
    QVERIFY(base.removeEntryFromPlace(child, other));
    QVERIFY(!base.destroyPlace(child));
}

void TestVFSPlaceBase::removesTheFirstOfEqualChildren()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    base.addEntryToPlace(makePlace(u"x"_s, TypeFile, u"/1"_s), top);
    base.addEntryToPlace(makeDir(u"/m"_s), top);
    base.addEntryToPlace(makePlace(u"x"_s, TypeFile, u"/2"_s), top);
    // Equal by path, whatever else it holds.
    QVERIFY(base.removeEntryFromPlace(makePlace(u"x"_s, TypeDir, u"/2"_s), top));
    QCOMPARE(base.childEntries(top).paths(), QStringList({u"/m"_s, u"x"_s}));
    QCOMPARE(fields(base.childEntries(top).at(1)), u"x|/2|10000"_s);
}

void TestVFSPlaceBase::linksAgainAfterRemoval()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    const Entry b = base.createPlace(u"B"_s, TypePlace, QString());
    base.addEntriesToPlace(QList<Entry>{a, b}, top);
    QVERIFY(base.removeEntryFromPlace(a, top));
    QVERIFY(base.addEntryToPlace(a, top));
    QCOMPARE(base.childEntries(top).paths(), QStringList({u"B"_s, u"A"_s}));
}

void TestVFSPlaceBase::clearsAPlace()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry child = base.createPlace(u"Child"_s, TypePlace, QString());
    base.addEntriesToPlace(QList<Entry>{child, makeDir(u"/a"_s)}, top);
    base.clearPlace(top);
    QVERIFY(!base.hasChilds(top));
    QVERIFY(base.childEntries(top).isEmpty());
    QVERIFY(base.hasPlace(child));
    QVERIFY(!base.removeEntryFromPlace(child, top));
}

void TestVFSPlaceBase::refusesAClearedChildForEver()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry child = base.createPlace(u"Child"_s, TypePlace, QString());
    const Entry dir = makeDir(u"/a"_s);
    base.addEntriesToPlace(QList<Entry>{child, dir}, top);
    base.clearPlace(top);
    QVERIFY(!base.addEntryToPlace(child, top));
    QCOMPARE(base.addEntriesToPlace(QList<Entry>{child, dir}, top).paths(), QStringList(u"/a"_s));
    QCOMPARE(base.childEntries(top).paths(), QStringList(u"/a"_s));
}

void TestVFSPlaceBase::doesNotTakeANewChildForAClearedOne()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry old = base.createPlace(u"Old"_s, TypePlace, QString());
    const Entry young = base.createPlace(u"Young"_s, TypePlace, QString());
    base.addEntryToPlace(old, top);
    base.clearPlace(top);
    base.addEntryToPlace(young, top);
    QVERIFY(base.destroyPlace(old));
    QCOMPARE(base.childEntries(top).paths(), QStringList(u"Young"_s));
}

void TestVFSPlaceBase::destroysUnderEveryParent()
{
    VFSPlaceBase base;
    const Entry computer = base.createPlace(u"Computer"_s, TypeComputerPlace, QString());
    const Entry places = base.createPlace(u"Places"_s, TypePlace, QString());
    const Entry home = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    const Entry trash = base.createPlace(u"Trash"_s, TypeTrashDirPlace, u"/trash"_s);
    base.addEntriesToPlace(QList<Entry>{home, trash}, computer);
    base.addEntriesToPlace(QList<Entry>{trash, home}, places);
    QVERIFY(base.destroyPlace(home));
    QVERIFY(!base.hasPlace(home));
    QCOMPARE(base.childEntries(computer).paths(), QStringList(u"Trash"_s));
    QCOMPARE(base.childEntries(places).paths(), QStringList(u"Trash"_s));
    QVERIFY(base.dirPlaceEntry(u"/home/u"_s).isNull());
    QVERIFY(!base.destroyPlace(home));
}

void TestVFSPlaceBase::destroysWithoutAParent()
{
    VFSPlaceBase base;
    const Entry home = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QVERIFY(!base.destroyPlace(home));
    QVERIFY(!base.hasPlace(home));
    QVERIFY(!base.destroyPlace(makePlace(u"Unknown"_s)));
}

void TestVFSPlaceBase::destroysUnderAParentThatIsGone()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry child = base.createPlace(u"Child"_s, TypePlace, QString());
    base.addEntryToPlace(child, top);
    base.destroyPlace(top);
    QVERIFY(!base.destroyPlace(child));
    QVERIFY(!base.hasPlace(child));
}

void TestVFSPlaceBase::destroysUnderAParentThatWasCleared()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry child = base.createPlace(u"Child"_s, TypePlace, QString());
    base.addEntryToPlace(child, top);
    base.clearPlace(top);
    // It hangs nowhere any more, but has a parent that is alive.
    QVERIFY(base.destroyPlace(child));
}

void TestVFSPlaceBase::leavesTheChildrenOfADestroyedPlace()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry other = base.createPlace(u"Other"_s, TypePlace, QString());
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry child = base.createPlace(u"Top/Child"_s, TypePlace, QString());
    const Entry grandchild = base.createPlace(u"Top/Child/x"_s, TypePlace, QString());
    base.addEntryToPlace(top, root);
    base.addEntryToPlace(child, top);
    base.addEntryToPlace(child, other);
    base.addEntryToPlace(grandchild, child);
    QVERIFY(base.destroyPlace(top));
    QCOMPARE(base.placeEntry(u"Top/Child"_s), child);
    QCOMPARE(base.placeEntry(u"Top/Child/x"_s), grandchild);
    QVERIFY(base.placeHasChildEntry(other, child));
    QVERIFY(base.placeHasChildEntry(child, grandchild));
    QVERIFY(base.addEntryToPlace(child, root));
}

void TestVFSPlaceBase::dropsOtherChildrenOfADestroyedPlace()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    base.addEntryToPlace(makeDir(u"/a"_s), top);
    base.destroyPlace(top);
    base.createPlace(top);
    QVERIFY(!base.hasChilds(top));
}

void TestVFSPlaceBase::startsAfreshAfterDestruction()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry child = base.createPlace(u"Child"_s, TypePlace, QString());
    for (int i = 0; i < 100; ++i) {
        QVERIFY(base.addEntryToPlace(child, top));
        QVERIFY(!base.destroyPlace(top));
        const Entry made = base.createPlace(u"Top"_s, TypeNetworkPlace, QString::number(i));
        QCOMPARE(fields(made), QStringLiteral("Top|%1|1002").arg(i));
        QVERIFY(!base.hasChilds(top));
    }
    // A parent of the same path is another parent.
    QVERIFY(base.addEntryToPlace(child, top));
    QVERIFY(base.destroyPlace(child));
    QVERIFY(!base.hasChilds(top));
}

void TestVFSPlaceBase::replacesALocalPath()
{
    VFSPlaceBase base;
    const Entry disk = base.createPlace(u"Disk"_s, TypeUsbDiskStoragePlace, QString());
    base.setPlaceLocalPath(disk, u"/media/disk"_s);
    QCOMPARE(fields(base.placeEntry(u"Disk"_s)), u"Disk|/media/disk|3500"_s);
    QCOMPARE(base.dirPlaceEntry(u"/media/disk"_s), disk);
    QCOMPARE(base.placeRelatedPath(u"/media/disk/x"_s), u"Disk/x"_s);
    base.setPlaceLocalPath(disk, QString());
    QCOMPARE(fields(base.placeEntry(u"Disk"_s)), u"Disk||3500"_s);
    QCOMPARE(base.placeRelatedPath(u"/media/disk/x"_s), u"/media/disk/x"_s);
}

void TestVFSPlaceBase::tellsTheOrder()
{
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry empty = base.createPlace(u"Empty"_s, TypePlace, QString());
    const Entry first = base.createPlace(u"Z"_s, TypePlace, QString());
    const Entry second = base.createPlace(u"A"_s, TypePlace, QString());
    const Entry dir = makeDir(u"/a"_s);
    base.addEntriesToPlace(QList<Entry>{first, dir, second, dir}, top);
    QCOMPARE(base.placeOrderIndex(second, top), 2);
    // The first, a stranger, and what is no place, are all 0.
    QCOMPARE(base.placeOrderIndex(first, top), 0);
    QCOMPARE(base.placeOrderIndex(empty, top), 0);
    QCOMPARE(base.placeOrderIndex(dir, top), 0);
    QCOMPARE(base.placeOrderIndex(second, empty), 0);
    QCOMPARE(base.placeOrderIndex(second, makePlace(u"Unknown"_s)), 0);
    QCOMPARE(base.placeOrderIndex(second, Entry()), 0);
    QCOMPARE(base.placeOrderIndex(Entry(), top), 0);
    // By what the entries say of themselves, not by what the store says of them.
    QCOMPARE(base.placeOrderIndex(makePlace(u"A"_s, TypeDir), top), 0);
    QCOMPARE(base.placeOrderIndex(second, makePlace(u"Top"_s, TypeDir)), 0);
    QCOMPARE(base.placeOrderIndex(makePlace(u"/a"_s, TypePlace), top), 1);
    // A place of an empty path is no parent here.
    const Entry nameless = base.createPlace(QString(), TypePlace, QString());
    base.addEntriesToPlace(QList<Entry>{first, second}, nameless);
    QCOMPARE(base.childEntries(nameless).size(), 2);
    QCOMPARE(base.placeOrderIndex(second, nameless), 0);
}

void TestVFSPlaceBase::takesAnyText_data()
{
    QTest::addColumn<QString>("text");
    QTest::newRow("null") << QString();
    QTest::newRow("empty") << u""_s;
    QTest::newRow("slash") << u"/"_s;
    QTest::newRow("slashes") << u"///"_s;
    QTest::newRow("absolute") << u"/x"_s;
    QTest::newRow("trailing slash") << u"x/"_s;
    QTest::newRow("NUL") << u"a\0b/\0"_s;
    QTest::newRow("lone surrogates") << QString(QChar(0xDC00)) + QChar(0xD800) + u"/x"_s;
    QTest::newRow("not normalised") << QString(QLatin1Char('e')) + QChar(0x301);
    QTest::newRow("100 KB") << QString(100000, QLatin1Char('x')) + u"/y"_s;
    QTest::newRow("100,000 sections") << u"x/"_s.repeated(100000);
}

void TestVFSPlaceBase::takesAnyText()
{
    QFETCH(QString, text);
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    QVERIFY(base.placeEntry(text).isNull());
    QVERIFY(!base.hasPlace(text));
    QCOMPARE(base.placeRelatedPath(text), text);
    QVERIFY(!base.isPathContainsPlace(text));
    QVERIFY(base.exploreParentPlacesHistory(text, u"Top"_s).isEmpty());

    const Entry made = base.createPlace(text, TypePlace, text);
    QCOMPARE(made.path(), text);
    QVERIFY(base.hasPlace(text));
    QCOMPARE(fields(base.placeEntry(text)), fields(made));
    QVERIFY(base.addEntryToPlace(made, top));
    QVERIFY(base.placeHasChildEntry(top, made));
    if (!text.isEmpty()) {
        QCOMPARE(base.dirPlaceEntry(text).path(), text);
        QCOMPARE(base.exploreParentPlacesHistory(text, u"Top"_s), QStringList(u"Top"_s));
    }
    QVERIFY(base.destroyPlace(made));
    QVERIFY(!base.hasPlace(text));
}

void TestVFSPlaceBase::holdsManyPlaces()
{
    constexpr int count = 50000;
    VFSPlaceBase base;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    EntryList places;
    for (int i = 0; i < count; ++i) {
        places.append(base.createPlace(
            QStringLiteral("Top/%1").arg(i), TypePlace, QStringLiteral("/m/%1").arg(i)));
    }
    QCOMPARE(base.addEntriesToPlace(places, top).size(), count);
    QVERIFY(base.addEntriesToPlace(places, top).isEmpty());
    QCOMPARE(base.childEntries(top).paths(), places.paths());
    QCOMPARE(base.dirPlaceEntry(u"/m/49999"_s), places.last());
    QCOMPARE(base.placeRelatedPath(u"/m/31415/x"_s), u"Top/31415/x"_s);
    QCOMPARE(base.placeOrderIndex(places.last(), top), count - 1);
    // From the middle down, where a search from either end would be longest.
    for (int i = count / 2; i-- > 0;) {
        QVERIFY(base.destroyPlace(places.at(i)));
    }
    QCOMPARE(base.childEntries(top).paths(), EntryList(places.mid(count / 2)).paths());
}

void TestVFSPlaceBase::holdsADeepTree()
{
    constexpr int depth = 100000;
    // Each place sorts before the one above it, so that the top is let go of last.
    const auto path = [](int level) {
        return QString::number(1000000 - level);
    };
    VFSPlaceBase base;
    Entry place = base.createPlace(path(0), TypePlace, QString());
    const Entry top = place;
    for (int level = 1; level < depth; ++level) {
        const Entry child = base.createPlace(path(level), TypePlace, QString());
        QVERIFY(base.addEntryToPlace(child, place));
        place = child;
    }
    QCOMPARE(base.checkAndGetParentPlace(place, top).path(), path(depth - 2));
    QVERIFY(base.checkAndGetParentPlace(top, top).isNull());
    QCOMPARE(base.exploreParentPlacesHistory(place.path(), top.path()).size(), depth - 1);
    QVERIFY(base.exploreParentPlacesHistory(u"x"_s, top.path()).isEmpty());
}

QTEST_GUILESS_MAIN(TestVFSPlaceBase)
#include "tst_vfsplacebase.moc"
