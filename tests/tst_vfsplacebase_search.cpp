// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/placescene.h"

#include <QtTest>

#include <random>

using namespace VeyFM;

// From paths to places, and from places to the places above them.
class TestVFSPlaceBaseSearch : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void findsTheParent();
    void findsTheParentInLevelOrder();
    void findsTheParentBelowTheRootAlone();
    void findsTheParentOfWhatIsNoPlace();
    void findsTheParentInManyDiamonds();
    void findsTheParentOfPlacesAndOthers();
    void findsTheParentInAnyTree();
    void findsAPlaceByItsDirectory();
    void findsTheFirstOfEqualDirectories();
    void findsTheFirstPlaceWithoutADirectory();
    void findsStoredDirectoriesOnly();
    void relatesToAPlace_data();
    void relatesToAPlace();
    void relatesToTheFirstOfEqualPlaces();
    void relatesToTheLongerAsStored();
    void relatesToAPlaceWithASlash();
    void relatesToNoPlaceOfAnEmptyPath();
    void relatesStoragePlacesAsStored();
    void tellsWhetherAPathBeginsWithAPlace();
    void explores_data();
    void explores();
    void exploresFromAnUnknownPlace();
    void exploresTheFirstMatchOnly();
    void exploresInDepthFirst();
    void exploresBelowPlacesThatDoNotMatch();
    void exploresChildrenThatAreNoPlaces();
    void exploresANamelessChild();
    void exploresManyDiamonds();
    void exploresALongPath();
    void endsInACircle();
};

void TestVFSPlaceBaseSearch::findsTheParent()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry computer = base.createPlace(u"Computer"_s, TypeComputerPlace, u"/c"_s);
    const Entry home = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    base.addEntryToPlace(computer, root);
    base.addEntryToPlace(home, computer);
    QCOMPARE(fields(base.checkAndGetParentPlace(home, root)), u"Computer|/c|1001"_s);
    QCOMPARE(base.checkAndGetParentPlace(computer, root), root);
    // Only by its path.
    QCOMPARE(base.checkAndGetParentPlace(makeDir(u"Home"_s), makeDir(u"_"_s)), computer);
    QVERIFY(base.checkAndGetParentPlace(root, root).isNull());
    QVERIFY(base.checkAndGetParentPlace(makePlace(u"none"_s), root).isNull());
    QVERIFY(base.checkAndGetParentPlace(home, makePlace(u"none"_s)).isNull());
    QVERIFY(base.checkAndGetParentPlace(home, home).isNull());
}

void TestVFSPlaceBaseSearch::findsTheParentInLevelOrder()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    const Entry b = base.createPlace(u"B"_s, TypePlace, QString());
    const Entry c = base.createPlace(u"C"_s, TypePlace, QString());
    const Entry deep = base.createPlace(u"Deep"_s, TypePlace, QString());
    const Entry x = base.createPlace(u"X"_s, TypePlace, QString());
    base.addEntriesToPlace(QList<Entry>{a, c, b}, root);
    base.addEntryToPlace(deep, a);
    base.addEntryToPlace(x, deep);
    QCOMPARE(base.checkAndGetParentPlace(x, root), deep);
    // A level above goes before an earlier branch, an earlier sibling before a later one.
    base.addEntryToPlace(x, b);
    QCOMPARE(base.checkAndGetParentPlace(x, root), b);
    base.addEntryToPlace(x, c);
    QCOMPARE(base.checkAndGetParentPlace(x, root), c);
    base.addEntryToPlace(x, root);
    QCOMPARE(base.checkAndGetParentPlace(x, root), root);
}

void TestVFSPlaceBaseSearch::findsTheParentBelowTheRootAlone()
{
    VFSPlaceBase base;
    const Entry computer = base.createPlace(u"Computer"_s, TypeComputerPlace, QString());
    const Entry places = base.createPlace(u"Places"_s, TypePlace, QString());
    const Entry home = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    base.addEntryToPlace(home, computer);
    base.addEntryToPlace(home, places);
    QCOMPARE(base.checkAndGetParentPlace(home, computer), computer);
    QCOMPARE(base.checkAndGetParentPlace(home, places), places);
}

void TestVFSPlaceBaseSearch::findsTheParentOfWhatIsNoPlace()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    base.addEntryToPlace(a, root);
    base.addEntryToPlace(makeDir(u"/x"_s), a);
    QCOMPARE(base.checkAndGetParentPlace(makeDir(u"/x"_s), root), a);
}

void TestVFSPlaceBaseSearch::findsTheParentInManyDiamonds()
{
    // 2^200 ways lead down.
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"0"_s, TypePlace, QString());
    Entry above = root;
    for (int i = 1; i <= 200; ++i) {
        const Entry left = base.createPlace(QStringLiteral("%1l").arg(i), TypePlace, QString());
        const Entry right = base.createPlace(QStringLiteral("%1r").arg(i), TypePlace, QString());
        const Entry below = base.createPlace(QString::number(i), TypePlace, QString());
        base.addEntriesToPlace(QList<Entry>{left, right}, above);
        base.addEntryToPlace(below, left);
        base.addEntryToPlace(below, right);
        above = below;
    }
    QCOMPARE(base.checkAndGetParentPlace(above, root).path(), u"200l"_s);
    QVERIFY(base.checkAndGetParentPlace(makePlace(u"none"_s), root).isNull());
}

// An entry that hung somewhere before it became a place goes on to hang there, as no place.
void TestVFSPlaceBaseSearch::findsTheParentOfPlacesAndOthers()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"a"_s, TypePlace, QString());
    const Entry b = base.createPlace(u"b"_s, TypePlace, QString());
    const Entry x = makeDir(u"x"_s);
    QVERIFY(base.addEntryToPlace(b, root) && base.addEntryToPlace(a, root));
    QVERIFY(base.addEntryToPlace(x, a));
    QCOMPARE(base.checkAndGetParentPlace(x, root), a);
    QVERIFY(base.addEntryToPlace(base.createPlace(x), b));
    QCOMPARE(base.checkAndGetParentPlace(x, root), b);
    QCOMPARE(base.checkAndGetParentPlace(x, a), a);
    QVERIFY(base.destroyPlace(x));
    QCOMPARE(base.checkAndGetParentPlace(x, root), a);
    base.clearPlace(a);
    QVERIFY(base.checkAndGetParentPlace(x, root).isNull());

    // Twice at one place, and gone with it.
    QVERIFY(base.addEntryToPlace(x, b) && base.addEntryToPlace(x, b));
    QVERIFY(base.removeEntryFromPlace(x, b));
    QCOMPARE(base.checkAndGetParentPlace(x, root), b);
    QVERIFY(base.destroyPlace(b));
    QVERIFY(base.checkAndGetParentPlace(x, root).isNull());
}

// However a tree has come about, the parent is the one that a walk from the root meets first.
void TestVFSPlaceBaseSearch::findsTheParentInAnyTree()
{
    std::mt19937 random(1);
    const auto below = [&random](int count) {
        return int(random() % uint(count));
    };
    VFSPlaceBase base;
    const auto placeName = [](int i) {
        return u"p%1"_s.arg(i, 2, 10, QLatin1Char('0'));
    };
    const auto anyEntry = [&] {
        return below(4) > 0 ? makePlace(placeName(below(12))) : makeDir(u"f%1"_s.arg(below(4)));
    };
    const auto walk = [&base](const Entry& entry, const Entry& root) {
        EntryList queue{root};
        for (int i = 0; i < queue.size(); ++i) {
            const EntryList children = base.childEntries(queue.at(i));
            if (children.contains(entry)) {
                return queue.at(i);
            }
            queue.mergeWith(children);
        }
        return Entry();
    };
    int found = 0;
    for (int i = 0; i < 3000; ++i) {
        const Entry place = makePlace(placeName(below(12)));
        const Entry entry = anyEntry();
        switch (below(12)) {
        case 0:
            base.destroyPlace(place);
            break;
        case 1:
            base.removeEntryFromPlace(entry, place);
            break;
        case 2:
            if (below(4) == 0) {
                base.clearPlace(place);
            }
            break;
        default:
            base.createPlace(place);
            // Upwards only, so that there is no circle.
            if (entry.path() > place.path() || entry.isDir()) {
                if (entry.isPlace()) {
                    base.createPlace(entry);
                }
                base.addEntryToPlace(entry, place);
            }
        }
        const Entry sought = anyEntry();
        const Entry root = makePlace(placeName(below(3)));
        const Entry parent = base.checkAndGetParentPlace(sought, root);
        QCOMPARE(parent, walk(sought, root));
        found += parent.isNull() ? 0 : 1;
    }
    QVERIFY2(found > 300, qPrintable(QString::number(found)));
}

void TestVFSPlaceBaseSearch::findsAPlaceByItsDirectory()
{
    VFSPlaceBase base;
    QVERIFY(base.dirPlaceEntry(u"/home/u"_s).isNull());
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    base.createPlace(u"Slash"_s, TypePlace, u"/slash/"_s);
    base.createPlace(u"FS"_s, TypeFileSystemRootPlace, u"/"_s);
    QCOMPARE(fields(base.dirPlaceEntry(u"/home/u"_s)), u"Home|/home/u|2001"_s);
    QCOMPARE(fields(base.checkAndGetDirPlace(u"/home/u"_s)), u"Home|/home/u|2001"_s);
    // To the letter: a slash at the end makes another text.
    QVERIFY(base.dirPlaceEntry(u"/home/u/"_s).isNull());
    QVERIFY(base.checkAndGetDirPlace(u"/home/u/"_s).isNull());
    QVERIFY(base.dirPlaceEntry(u"/slash"_s).isNull());
    QCOMPARE(base.dirPlaceEntry(u"/slash/"_s).path(), u"Slash"_s);
    QCOMPARE(base.dirPlaceEntry(u"/"_s).path(), u"FS"_s);
    QVERIFY(base.dirPlaceEntry(u"/home/u/x"_s).isNull());
    QVERIFY(base.dirPlaceEntry(u"Home"_s).isNull());
}

void TestVFSPlaceBaseSearch::findsTheFirstOfEqualDirectories()
{
    VFSPlaceBase base;
    base.createPlace(u"b"_s, TypePlace, u"/d"_s);
    base.createPlace(u"a"_s, TypePlace, u"/d"_s);
    base.createPlace(u"Z"_s, TypePlace, u"/d"_s);
    QCOMPARE(base.dirPlaceEntry(u"/d"_s).path(), u"Z"_s);
    QCOMPARE(base.checkAndGetDirPlace(u"/d"_s).path(), u"Z"_s);
}

void TestVFSPlaceBaseSearch::findsTheFirstPlaceWithoutADirectory()
{
    VFSPlaceBase base;
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QVERIFY(base.dirPlaceEntry(QString()).isNull());
    base.createPlace(u"Network"_s, TypeNetworkPlace, QString());
    base.createPlace(u"Computer"_s, TypeComputerPlace, QString());
    QCOMPARE(base.dirPlaceEntry(QString()).path(), u"Computer"_s);
}

void TestVFSPlaceBaseSearch::findsStoredDirectoriesOnly()
{
    // A storage place computes its directory, but not here; and a child that is no place has
    // one, but no key.
    VFSPlaceBase base;
    const Entry disk = base.createPlace(u"Disk"_s, TypeUsbDiskStoragePlace, u"/media/disk"_s);
    base.addEntryToPlace(makeDir(u"/media/x"_s), disk);
    QCOMPARE(base.dirPlaceEntry(u"/media/disk"_s), disk);
    QVERIFY(base.dirPlaceEntry(u"/media/x"_s).isNull());
}

void TestVFSPlaceBaseSearch::relatesToAPlace_data()
{
    QTest::addColumn<QString>("localPath");
    QTest::addColumn<QString>("expected");
    const auto row = [](const char* localPath, const char* expected) {
        QTest::newRow(localPath) << QString::fromLatin1(localPath) << QString::fromLatin1(expected);
    };
    row("/home/u", "Home/");
    row("/home/u/", "Home/");
    row("/home/u///", "Home/");
    row("/home/u/x", "Home/x");
    row("/home/u/x/y/", "Home/x/y");
    row("/home/u//x", "Home//x");
    row("/home/u/Desktop", "Desktop/");
    row("/home/u/Desktop/x", "Desktop/x");
    row("/home/u/Desktopx", "Home/Desktopx");
    row("/home/uu", "/home/uu");
    row("/home/uu/", "/home/uu/");
    row("/home", "/home");
    row("/home//", "/home//");
    row("/", "/");
    row("///", "///");
    row("", "");
    row("/etc/passwd", "/etc/passwd");
    row("/HOME/u", "/HOME/u");
    row("relative/x", "relative/x");
    row("home/u", "home/u");
}

void TestVFSPlaceBaseSearch::relatesToAPlace()
{
    QFETCH(QString, localPath);
    QFETCH(QString, expected);
    VFSPlaceBase base;
    base.createPlace(u"Computer"_s, TypeComputerPlace, QString());
    base.createPlace(u"Desktop"_s, TypeDesktopDirPlace, u"/home/u/Desktop"_s);
    // With a directory of nothing but slashes, it contains nothing.
    base.createPlace(u"File System"_s, TypeFileSystemRootPlace, u"/"_s);
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QCOMPARE(base.placeRelatedPath(localPath), expected);
}

void TestVFSPlaceBaseSearch::relatesToTheFirstOfEqualPlaces()
{
    VFSPlaceBase base;
    base.createPlace(u"b"_s, TypePlace, u"/d"_s);
    base.createPlace(u"B"_s, TypePlace, u"/d//"_s);
    base.createPlace(u"a"_s, TypePlace, u"/d"_s);
    QCOMPARE(base.placeRelatedPath(u"/d/x"_s), u"B/x"_s);
}

void TestVFSPlaceBaseSearch::relatesToTheLongerAsStored()
{
    // The directory that leads counts with its slashes at the end, the one that challenges it
    // without. So a deeper place loses against enough slashes that came first.
    VFSPlaceBase base;
    base.createPlace(u"A"_s, TypePlace, u"/d///"_s);
    base.createPlace(u"B"_s, TypePlace, u"/d/xy"_s);
    QCOMPARE(base.placeRelatedPath(u"/d/xy/z"_s), u"A/xy/z"_s);
    base.createPlace(u"C"_s, TypePlace, u"/d/xy/z"_s);
    QCOMPARE(base.placeRelatedPath(u"/d/xy/z"_s), u"C/"_s);

    VFSPlaceBase other;
    other.createPlace(u"B"_s, TypePlace, u"/d///"_s);
    other.createPlace(u"A"_s, TypePlace, u"/d/xy"_s);
    QCOMPARE(other.placeRelatedPath(u"/d/xy/z"_s), u"A/z"_s);
}

void TestVFSPlaceBaseSearch::relatesToAPlaceWithASlash()
{
    VFSPlaceBase base;
    base.createPlace(u"Slash/"_s, TypePlace, u"/d"_s);
    QCOMPARE(base.placeRelatedPath(u"/d"_s), u"Slash/"_s);
    QCOMPARE(base.placeRelatedPath(u"/d/x"_s), u"Slash/x"_s);
}

void TestVFSPlaceBaseSearch::relatesToNoPlaceOfAnEmptyPath()
{
    VFSPlaceBase base;
    base.createPlace(QString(), TypePlace, u"/d/e"_s);
    base.createPlace(u"Short"_s, TypePlace, u"/d"_s);
    // It wins, and then counts as none.
    QCOMPARE(base.placeRelatedPath(u"/d/e/x/"_s), u"/d/e/x/"_s);
    QCOMPARE(base.placeRelatedPath(u"/d/x/"_s), u"Short/x"_s);
}

void TestVFSPlaceBaseSearch::relatesStoragePlacesAsStored()
{
    VFSPlaceBase base;
    base.createPlace(u"Disk"_s, TypeUsbDiskStoragePlace, u"/media/disk"_s);
    base.createPlace(u"Share"_s, TypeFtpSharePlace, QString());
    QCOMPARE(base.placeRelatedPath(u"/media/disk/x"_s), u"Disk/x"_s);
    QCOMPARE(base.placeRelatedPath(u"/media/x"_s), u"/media/x"_s);
}

void TestVFSPlaceBaseSearch::tellsWhetherAPathBeginsWithAPlace()
{
    VFSPlaceBase base;
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    base.createPlace(u"/x"_s, TypePlace, QString());
    base.createPlace(u"Samba/WG"_s, TypeSambaWorkgroupPlace, QString());
    QVERIFY(base.isPathContainsPlace(u"Home"_s));
    QVERIFY(base.isPathContainsPlace(u"Home/"_s));
    QVERIFY(base.isPathContainsPlace(u"Home/a/b"_s));
    QVERIFY(base.isPathContainsPlace(u"Home//a"_s));
    QVERIFY(!base.isPathContainsPlace(u"Homework/a"_s));
    QVERIFY(!base.isPathContainsPlace(u"home/a"_s));
    QVERIFY(!base.isPathContainsPlace(u"/Home/a"_s));
    QVERIFY(!base.isPathContainsPlace(u"/x"_s));
    QVERIFY(base.hasPlace(u"/x"_s));
    // One section is looked at, and no more.
    QVERIFY(!base.isPathContainsPlace(u"Samba/WG"_s));
    QVERIFY(!base.isPathContainsPlace(QString()));
    base.createPlace(QString(), TypePlace, QString());
    QVERIFY(base.isPathContainsPlace(QString()));
    QVERIFY(!base.isPathContainsPlace(u"/"_s));
}

void TestVFSPlaceBaseSearch::explores_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QStringList>("expected");
    const auto row = [](const char* path, const QStringList& expected) {
        QTest::newRow(path) << QString::fromLatin1(path) << expected;
    };
    row("", {});
    row("None", {});
    row("/Home", {});
    row("_", {});
    // The place itself is not among its parents.
    row("Computer", {u"_"_s});
    row("Home", {u"_"_s, u"Computer"_s});
    row("Home/", {u"_"_s, u"Computer"_s});
    row("Home///", {u"_"_s, u"Computer"_s});
    // What is left behind a place leads no further, but the place is on the way.
    row("Home/x", {u"_"_s, u"Computer"_s, u"Home"_s});
    row("Home/x/y", {u"_"_s, u"Computer"_s, u"Home"_s});
    // Plain text, not sections.
    row("Homework/x", {u"_"_s, u"Computer"_s, u"Home"_s});
    row("Computer/Home", {u"_"_s, u"Computer"_s});
    row("Computer/Home/x", {u"_"_s, u"Computer"_s, u"Home"_s});
    row("ComputerHome", {u"_"_s, u"Computer"_s});
    row("Network", {u"_"_s});
    row("Samba", {u"_"_s, u"Network"_s});
    // Behind "Samba" there is "WG" left, and no place is named so.
    row("Samba/WG", {u"_"_s, u"Network"_s, u"Samba"_s});
}

void TestVFSPlaceBaseSearch::explores()
{
    QFETCH(QString, path);
    QFETCH(QStringList, expected);
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry computer = base.createPlace(u"Computer"_s, TypeComputerPlace, QString());
    const Entry network = base.createPlace(u"Network"_s, TypeNetworkPlace, QString());
    const Entry samba = base.createPlace(u"Samba"_s, TypeSambaNetworkPlace, QString());
    const Entry group = base.createPlace(u"Samba/WG"_s, TypeSambaWorkgroupPlace, QString());
    const Entry home = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    base.addEntriesToPlace(QList<Entry>{computer, network}, root);
    base.addEntryToPlace(home, computer);
    base.addEntryToPlace(samba, network);
    base.addEntryToPlace(group, samba);
    QCOMPARE(base.exploreParentPlacesHistory(path, u"_"_s), expected);
}

void TestVFSPlaceBaseSearch::exploresFromAnUnknownPlace()
{
    VFSPlaceBase base;
    base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QVERIFY(base.exploreParentPlacesHistory(u"Home"_s, u"_"_s).isEmpty());
    QVERIFY(base.exploreParentPlacesHistory(u"Home"_s, u"Home"_s).isEmpty());
}

void TestVFSPlaceBaseSearch::exploresTheFirstMatchOnly()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry ho = base.createPlace(u"Ho"_s, TypePlace, QString());
    const Entry home = base.createPlace(u"Home"_s, TypePlace, QString());
    const Entry x = base.createPlace(u"x"_s, TypePlace, QString());
    base.addEntriesToPlace(QList<Entry>{ho, home}, root);
    base.addEntryToPlace(x, home);
    // "Ho" comes first and swallows the path, though "Home" and "x" would use all of it.
    QCOMPARE(base.exploreParentPlacesHistory(u"Home/x"_s, u"_"_s), QStringList({u"_"_s, u"Ho"_s}));
    base.destroyPlace(ho);
    QCOMPARE(
        base.exploreParentPlacesHistory(u"Home/x"_s, u"_"_s), QStringList({u"_"_s, u"Home"_s}));
}

void TestVFSPlaceBaseSearch::exploresInDepthFirst()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    const Entry b = base.createPlace(u"B"_s, TypePlace, QString());
    const Entry x = base.createPlace(u"X"_s, TypePlace, QString());
    base.addEntriesToPlace(QList<Entry>{a, x}, root);
    base.addEntryToPlace(b, a);
    base.addEntryToPlace(x, b);
    // Down the first branch, before the next sibling is looked at.
    QCOMPARE(
        base.exploreParentPlacesHistory(u"X"_s, u"_"_s), QStringList({u"_"_s, u"A"_s, u"B"_s}));
}

void TestVFSPlaceBaseSearch::exploresBelowPlacesThatDoNotMatch()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    const Entry b = base.createPlace(u"B"_s, TypePlace, QString());
    const Entry c = base.createPlace(u"C"_s, TypePlace, QString());
    const Entry d = base.createPlace(u"D"_s, TypePlace, QString());
    base.addEntryToPlace(a, root);
    base.addEntryToPlace(b, a);
    base.addEntryToPlace(c, b);
    base.addEntryToPlace(d, c);
    QCOMPARE(
        base.exploreParentPlacesHistory(u"A/D/x"_s, u"_"_s),
        QStringList({u"_"_s, u"A"_s, u"B"_s, u"C"_s, u"D"_s}));
    QCOMPARE(
        base.exploreParentPlacesHistory(u"B/x"_s, u"_"_s), QStringList({u"_"_s, u"A"_s, u"B"_s}));
}

void TestVFSPlaceBaseSearch::exploresChildrenThatAreNoPlaces()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    base.addEntryToPlace(makeDir(u"/mnt"_s), root);
    QCOMPARE(base.exploreParentPlacesHistory(u"/mnt"_s, u"_"_s), QStringList(u"_"_s));
    QCOMPARE(
        base.exploreParentPlacesHistory(u"/mnt/x"_s, u"_"_s), QStringList({u"_"_s, u"/mnt"_s}));
}

void TestVFSPlaceBaseSearch::exploresANamelessChild()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    base.addEntryToPlace(Entry(), root);
    base.addEntryToPlace(base.createPlace(u"A"_s, TypePlace, QString()), root);
    // Every path begins with nothing.
    QCOMPARE(base.exploreParentPlacesHistory(u"A/x"_s, u"_"_s), QStringList({u"_"_s, QString()}));
    QCOMPARE(base.exploreParentPlacesHistory(u"//"_s, u"_"_s), QStringList(u"_"_s));
}

void TestVFSPlaceBaseSearch::exploresManyDiamonds()
{
    VFSPlaceBase base;
    Entry above = base.createPlace(u"_"_s, TypePlace, QString());
    for (int i = 1; i <= 200; ++i) {
        const Entry left = base.createPlace(QStringLiteral("l%1.").arg(i), TypePlace, QString());
        const Entry right = base.createPlace(QStringLiteral("r%1.").arg(i), TypePlace, QString());
        const Entry below = base.createPlace(QStringLiteral("m%1.").arg(i), TypePlace, QString());
        base.addEntriesToPlace(QList<Entry>{left, right}, above);
        base.addEntryToPlace(below, left);
        base.addEntryToPlace(below, right);
        above = below;
    }
    QVERIFY(base.exploreParentPlacesHistory(u"none"_s, u"_"_s).isEmpty());
    const QStringList history = base.exploreParentPlacesHistory(u"r200./x"_s, u"_"_s);
    QCOMPARE(history.size(), 2 * 199 + 2);
    QCOMPARE(QStringList(history.mid(397)), QStringList({u"l199."_s, u"m199."_s, u"r200."_s}));
}

void TestVFSPlaceBaseSearch::exploresALongPath()
{
    VFSPlaceBase base;
    const Entry root = base.createPlace(u"_"_s, TypePlace, QString());
    const Entry x = base.createPlace(u"x"_s, TypePlace, QString());
    base.addEntryToPlace(x, root);
    QCOMPARE(
        base.exploreParentPlacesHistory(u"x/"_s.repeated(100000), u"_"_s),
        QStringList({u"_"_s, u"x"_s}));
    QCOMPARE(
        base.exploreParentPlacesHistory(u"x"_s + QString(100000, QLatin1Char('/')), u"_"_s),
        QStringList(u"_"_s));
}

void TestVFSPlaceBaseSearch::endsInACircle()
{
    // Forbidden, but a name that a service hands in may close one.
    VFSPlaceBase base;
    const Entry a = base.createPlace(u"A"_s, TypePlace, QString());
    const Entry b = base.createPlace(u"B"_s, TypePlace, QString());
    const Entry nameless = base.createPlace(QString(), TypePlace, QString());
    base.addEntryToPlace(b, a);
    base.addEntryToPlace(a, b);
    QVERIFY(base.checkAndGetParentPlace(makePlace(u"none"_s), a).isNull());
    QVERIFY(base.exploreParentPlacesHistory(u"none"_s, u"A"_s).isEmpty());
    QCOMPARE(
        base.exploreParentPlacesHistory(u"B/A/B/x"_s, u"A"_s),
        QStringList({u"A"_s, u"B"_s, u"A"_s, u"B"_s}));
    base.addEntryToPlace(nameless, nameless);
    QVERIFY(!base.exploreParentPlacesHistory(u"x"_s, QString()).isEmpty());
}

QTEST_GUILESS_MAIN(TestVFSPlaceBaseSearch)
#include "tst_vfsplacebase_search.moc"
