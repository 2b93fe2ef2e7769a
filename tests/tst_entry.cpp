// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entry.h"
#include "support/makeentry.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QSet>
#include <QTest>
#include <QVector>

#include <type_traits>

using namespace VeyFM;

namespace {

QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

Entry atPath(const char* path)
{
    return makeEntry(path, "/somewhere", TypeFile);
}

Entry atLocalPath(const QString& localPath)
{
    return makeEntry(text("Place"), localPath, TypeHomeDirPlace);
}

} // namespace

// Nothing but a default and a copy constructor is public, and the copy allocates nothing.
static_assert(!std::is_constructible<Entry, QString>::value, "");
static_assert(!std::is_constructible<Entry, QString, QString, int>::value, "");
static_assert(std::is_same<decltype(std::declval<const Entry&>().type()), int>::value, "");
static_assert(!std::is_polymorphic<Entry>::value, "");
static_assert(sizeof(Entry) <= 3 * sizeof(void*), "");

/// The value itself, without the disk: identity, names and kinds.
class TestEntry : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void defaultEntry();
    void nullness();
    void identity();
    void order();
    void hash();
    void similar();
    void names_data();
    void names();
    void storedRoot();
    void onDesktop();
    void onDesktopWithoutDesktop();
    void exactKinds_data();
    void exactKinds();
    void families();
    void placeBased();
    void storageAsksEachTime();
    void shareFollowsTheTree();
    void implicitPlacesWithoutPathEnd_data();
    void implicitPlacesWithoutPathEnd();
    void computedLocalPath();
    void debugOutput();
};

void TestEntry::initTestCase()
{
    VFS::initialize();
}

void TestEntry::defaultEntry()
{
    const Entry entry;
    QVERIFY(entry.isNull());
    QVERIFY(entry.path().isNull());
    QCOMPARE(entry.type(), 0);
    QVERIFY(!entry.isPlace());
    QVERIFY(!entry.isFile());
    QVERIFY(!entry.isDir());
    QVERIFY(entry == makeEntry("", "/tmp", TypeDir));
    QVERIFY(makeEntry("", "", TypeFile) == entry);
    QVERIFY(entry.localPath().isEmpty());
}

void TestEntry::nullness()
{
    QVERIFY(makeEntry("", "/tmp", TypeDir).isNull());
    QVERIFY(!makeEntry("x", "", TypeNone).isNull());
}

void TestEntry::identity()
{
    const Entry file = makeEntry("a", "/one", TypeFile);
    const Entry dir = makeEntry("a", "/two", TypeDir);
    QVERIFY(file == dir);
    QVERIFY(!(file != dir));
    QVERIFY(makeEntry("a", "/one", TypeFile) != makeEntry("b", "/one", TypeFile));
    QVERIFY(atPath("a") != atPath("A"));

    const Entry copy = dir;
    QCOMPARE(copy.path(), text("a"));
    QCOMPARE(copy.localPath(), text("/two"));
    QCOMPARE(copy.type(), int(TypeDir));
    QCOMPARE(copy.path().constData(), dir.path().constData());
}

void TestEntry::order()
{
    QVERIFY(atPath("B") < atPath("a"));
    QVERIFY(atPath("a") > atPath("B"));
    QVERIFY(!(atPath("a") < atPath("a")));
    QVERIFY(!(atPath("a") > atPath("a")));
    QVERIFY(atPath("file10") < atPath("file9"));
    QVERIFY(!(makeEntry("a", "/1", TypeDir) < makeEntry("a", "/2", TypeFile)));
    QVERIFY(!(makeEntry("a", "/2", TypeDir) < makeEntry("a", "/1", TypeFile)));
    // By code units: a surrogate pair comes before U+FFFD, though its code point is higher.
    QVERIFY(atPath("\xF0\x9F\x93\x81") < atPath("\xEF\xBF\xBD"));
}

void TestEntry::hash()
{
    const Entry file = makeEntry("a", "/one", TypeFile);
    const Entry dir = makeEntry("a", "/two", TypeDir);
    QCOMPARE(qHash(file), qHash(dir));
    QCOMPARE(qHash(file), ::qHash(text("a")));
    QCOMPARE(qHash(file, 77u), ::qHash(text("a"), 77u));

    QSet<Entry> set;
    set << file << dir << atPath("b");
    QCOMPARE(set.size(), 2);
    QVERIFY(set.contains(makeEntry("a", "", TypeNone)));
}

void TestEntry::similar()
{
    const Entry place = makeEntry("Place", "/home/u", TypeHomeDirPlace);
    QVERIFY(place.isSimilar(makeEntry("/home/u", "/home/u", TypeDir)));
    QVERIFY(!place.isSimilar(makeEntry("Place", "/home/v", TypeHomeDirPlace)));
    QVERIFY(!place.isSimilar(makeEntry("Place", "/home/U", TypeHomeDirPlace)));

    const Entry virtualPlace = makeEntry("Place", "", TypePlace);
    QVERIFY(!virtualPlace.isSimilar(virtualPlace));
    QVERIFY(!virtualPlace.isSimilar(place));
    QVERIFY(!place.isSimilar(virtualPlace));
    QVERIFY(!Entry().isSimilar(Entry()));
}

void TestEntry::names_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("localPath");
    QTest::addColumn<QString>("fileName");
    QTest::addColumn<QString>("lastSection");
    QTest::addColumn<bool>("hidden");

    const auto row = [](const char* path, const char* localPath, const char* fileName,
                        const char* lastSection, bool hidden) {
        QTest::addRow("%s at %s", path, localPath)
            << text(path) << text(localPath) << text(fileName) << text(lastSection) << hidden;
    };
    row("Home/a", "/home/u/a", "a", "a", false);
    row("Home", "/home/u", "u", "Home", false);
    row("Place", "/", "", "Place", false);
    row("Place", "relative", "relative", "Place", false);
    row("Place", ".relative", ".relative", "Place", true);
    row("Place/", "/home/u/", "", "", false);
    row("Home/x", "/home/.x", ".x", "x", true);
    row("Home/.x", "/home/x", "x", ".x", false);
    row("Home/.d/x", "/home/.d/x", "x", "x", false);
    row("Samba/WG/HOST", "", "", "HOST", false);
    row("/a/b\xC3\xBC", "/a/b\xC3\xBC", "b\xC3\xBC", "b\xC3\xBC", false);
}

void TestEntry::names()
{
    QFETCH(QString, path);
    QFETCH(QString, localPath);
    // A kind that takes its stored local path as it is, and has none when that is empty.
    const Entry entry = makeEntry(path, localPath, TypeFavouritePlace);
    QTEST(entry.fileName(), "fileName");
    QTEST(entry.lastPathSection(), "lastSection");
    QTEST(entry.isHidden(), "hidden");
    QCOMPARE(
        entry.localPathWithScheme(), localPath.isEmpty() ? QString() : text("file://") + localPath);
}

void TestEntry::storedRoot()
{
    QVERIFY(makeEntry("anything", "/", TypeNone).isRoot());
    QVERIFY(makeEntry("anything", "/", TypeUsbDiskStoragePlace).isRoot());
    QVERIFY(!makeEntry("anything", "//", TypeDir).isRoot());
    QVERIFY(!Entry().isRoot());

    // This one has to ask for its local path, and so is not the root although that is "/".
    const Entry asking = makeEntry("/", "", TypeDir);
    QCOMPARE(asking.localPath(), text("/"));
    QVERIFY(!asking.isRoot());
}

void TestEntry::onDesktop()
{
    const QString desktop = VFS::ptr()->desktopEntry().localPath();
    QVERIFY(desktop.startsWith(QLatin1Char('/')) && !desktop.endsWith(QLatin1Char('/')));
    QVERIFY(atLocalPath(desktop + text("/x")).isOnDesktop());
    QVERIFY(atLocalPath(desktop + text("/x/y")).isOnDesktop());
    QVERIFY(atLocalPath(desktop + text("/")).isOnDesktop());
    QVERIFY(!atLocalPath(desktop).isOnDesktop());
    QVERIFY(!atLocalPath(desktop + text("2/x")).isOnDesktop());
    QVERIFY(!atLocalPath(desktop.toUpper() + text("/x")).isOnDesktop());
    QVERIFY(!atLocalPath(QString()).isOnDesktop());
    // By text: where a path leads is not looked at.
    QVERIFY(atLocalPath(desktop + text("/../x")).isOnDesktop());
}

void TestEntry::onDesktopWithoutDesktop()
{
    VFSPlaceBase* const tree = VFS::ptr()->placeBase();
    const Entry desktop = VFS::ptr()->desktopEntry();
    // The entry of the desktop is a copy with a directory of its own: the tree's does not count.
    tree->setPlaceLocalPath(desktop, text("/elsewhere"));
    QVERIFY(!atLocalPath(text("/elsewhere/x")).isOnDesktop());
    QVERIFY(atLocalPath(desktop.localPath() + text("/x")).isOnDesktop());
    tree->setPlaceLocalPath(desktop, desktop.localPath());
}

using Predicate = bool (Entry::*)() const;
Q_DECLARE_METATYPE(Predicate)

void TestEntry::exactKinds_data()
{
    QTest::addColumn<Predicate>("predicate");
    QTest::addColumn<int>("type");

#define KIND(predicate, type) QTest::newRow(#predicate) << Predicate(&Entry::predicate) << type
    KIND(isComputerPlace, 1001);
    KIND(isNetworkPlace, 1002);
    KIND(isStorageDevicesPlace, 1003);
    KIND(isFavouritesPlace, 1004);
    KIND(isSambaNetworkPlace, 1005);
    KIND(isSambaWorkgroupPlace, 1006);
    KIND(isSambaServerPlace, 1007);
    KIND(isFtpNetworkPlace, 1008);
    KIND(isSFtpNetworkPlace, 1009);
    KIND(isFileSystemRootPlace, 2000);
    KIND(isHomeDirPlace, 2001);
    KIND(isTrashDirPlace, 2002);
    KIND(isDesktopDirPlace, 2003);
    KIND(isMyDocumentsDirPlace, 2004);
    KIND(isFavouritePlace, 2005);
    KIND(isUsbDiskStoragePlace, 3500);
    KIND(isCdromDriveStoragePlace, 3501);
    KIND(isFloppyDriveStoragePlace, 3502);
    KIND(isHardDiskDriveStoragePlace, 3503);
    KIND(isFavouriteNetworkPlace, 4000);
    KIND(isSambaSharePlace, 4001);
    KIND(isFtpSharePlace, 4002);
    KIND(isSFtpSharePlace, 4003);
    KIND(isFileLink, 10003);
    KIND(isDirLink, 10004);
    KIND(isArchiveFileMountPoint, 20000);
    KIND(isCustomUrl, 30000);
    KIND(isFuseUrl, 30100);
#undef KIND
}

void TestEntry::exactKinds()
{
    QFETCH(Predicate, predicate);
    QFETCH(int, type);
    static const QVector<Entry> entries = [] {
        QVector<Entry> result;
        for (int candidate = -1; candidate <= 30101; ++candidate) {
            result.append(entryOfType(candidate));
        }
        return result;
    }();
    for (const Entry& entry : entries) {
        if ((entry.*predicate)() != (entry.type() == type)) {
            QFAIL(qPrintable(text("wrong for %1").arg(entry.type())));
        }
    }
}

void TestEntry::families()
{
    for (int type = -1; type <= 40000; ++type) {
        const Entry entry = entryOfType(type);
        const bool isImplicit = type >= 3500 && type <= 4499;
        const bool isSamba = type == 1005 || type == 1006 || type == 1007 || type == 4001;
        const bool asExpected =
            entry.isPlace() == (type >= 1000 && type <= 9999) &&
            entry.isStoragePlace() == (type >= 3500 && type <= 3999) &&
            entry.isImplicitDirPlace() == isImplicit &&
            entry.isDirPlace() == (type >= 2000 && type <= 2999) &&
            entry.isPurePlace() == ((type >= 1000 && type <= 1999) || isImplicit) &&
            entry.isFile() == (type == 10000 || type == 10003) &&
            entry.isDir() == (type == 10001 || type == 10004) &&
            entry.isSymLink() == (type == 10003 || type == 10004) &&
            entry.isSambaPlace() == isSamba;
        if (!asExpected) {
            QFAIL(qPrintable(text("wrong for %1").arg(type)));
        }
    }
    // With a local path the implicit ones change sides, but for storage, which asks.
    QVERIFY(makeEntry("x", "/tmp", 4000).isDirPlace());
    QVERIFY(!makeEntry("x", "/tmp", 4000).isPurePlace());
    QVERIFY(makeEntry("x", "/tmp", 4499).isDirPlace());
    QVERIFY(!makeEntry("x", "/tmp", 4500).isDirPlace());
    QVERIFY(!makeEntry("x", "/tmp", 4500).isPurePlace());
    QVERIFY(!makeEntry("x", "/tmp", 3499).isDirPlace());
    QVERIFY(makeEntry("x", "/tmp", 1000).isPurePlace());
}

void TestEntry::placeBased()
{
    QVERIFY(atPath("Home/x").isPlaceBased());
    QVERIFY(atPath("http://example.org/").isPlaceBased());
    QVERIFY(Entry().isPlaceBased());
    QVERIFY(!atPath("/Home").isPlaceBased());
    QVERIFY(!atPath("/").isPlaceBased());
}

void TestEntry::storageAsksEachTime()
{
    // Whatever its stored path says: there is no such device, so it is not mounted.
    for (int type : {3500, 3503, 3507, 3999}) {
        const Entry storage = makeEntry("Storage devices/sdb1", "/media/stick", type);
        QVERIFY(storage.localPath().isEmpty());
        QVERIFY(storage.localPathWithScheme().isEmpty());
        QVERIFY(storage.isPurePlace());
        QVERIFY(!storage.isDirPlace());
        QVERIFY(storage.isExecutable());
    }
}

void TestEntry::shareFollowsTheTree()
{
    VFSPlaceBase* const tree = VFS::ptr()->placeBase();
    for (int type : {TypeSambaSharePlace, TypeFavouriteNetworkPlace}) {
        const QString path = text("Share%1").arg(type);
        const Entry share = tree->createPlace(path, type, QString());
        QVERIFY(share.localPath().isEmpty());
        QVERIFY(share.isPurePlace());
        QVERIFY(share.isExecutable());

        // Mounted, with no change to the entry itself.
        tree->setPlaceLocalPath(share, text("/nonexistent/mount"));
        QCOMPARE(share.localPath(), text("/nonexistent/mount"));
        QVERIFY(share.isDirPlace());
        QVERIFY(!share.isPurePlace());
        QVERIFY(!share.isExecutable());

        tree->setPlaceLocalPath(share, QString());
        QVERIFY(!share.isDirPlace());

        // One that has a path of its own does not ask.
        QCOMPARE(makeEntry(path, text("/own"), type).localPath(), text("/own"));
        tree->destroyPlace(share);
    }
}

void TestEntry::implicitPlacesWithoutPathEnd_data()
{
    QTest::addColumn<int>("type");
    for (int type : {3500, 3508, 3999, 4000, 4001, 4002, 4003, 4004, 4499}) {
        QTest::addRow("%d", type) << type;
    }
}

// To ask whether such a place is a directory means to ask for its local path, and the other way
// round. It has none, and that is the end of it.
void TestEntry::implicitPlacesWithoutPathEnd()
{
    QFETCH(int, type);
    const Entry stranger = entryOfType(type);
    QVERIFY(stranger.localPath().isEmpty());
    QVERIFY(VFS::ptr()->localPath(stranger).isEmpty());
    QVERIFY(!stranger.isDirPlace());
    QVERIFY(stranger.isPurePlace());
    QVERIFY(stranger.isExecutable());

    VFSPlaceBase* const tree = VFS::ptr()->placeBase();
    const Entry place = tree->createPlace(text("Implicit"), type, QString());
    QVERIFY(place.localPath().isEmpty());
    QVERIFY(VFS::ptr()->localPath(text("Implicit/below")).isEmpty());
    tree->destroyPlace(place);
}

void TestEntry::computedLocalPath()
{
    const QString home = VFS::ptr()->homeEntry().localPath();
    QVERIFY(!home.isEmpty());
    QCOMPARE(makeEntry("Home/x", "", TypeFile).localPath(), home + text("/x"));
    QCOMPARE(makeEntry("/usr/x", "", TypeFile).localPath(), text("/usr/x"));
    QCOMPARE(makeEntry("file:///a%20b", "", TypeFile).localPath(), text("/a b"));
    QVERIFY(makeEntry("http://example.org/a", "", TypeCustomUrl).localPath().isEmpty());
    QVERIFY(makeEntry("Computer/x", "", TypeFile).localPath().isEmpty());
    // The stored path wins where there is one, whatever the path would resolve to.
    QCOMPARE(makeEntry("Home/x", "/elsewhere", TypeFile).localPath(), text("/elsewhere"));
}

void TestEntry::debugOutput()
{
    QString output;
    QDebug(&output).nospace() << makeEntry("Home/a \"b\"", "/home/u/x", TypeFile) << 1 << 2;
    QCOMPARE(output, text("VeyFM::Entry(\"Home/a \\\"b\\\"\", \"/home/u/x\") 1 2 "));

    output.clear();
    QDebug(&output) << makeEntry("/usr", "", TypeDir);
    QCOMPARE(output, text("VeyFM::Entry(\"/usr\", \"/usr\") "));

    output.clear();
    QDebug(&output) << Entry();
    QCOMPARE(output, text("VeyFM::Entry(\"\", \"\") "));
}

QTEST_GUILESS_MAIN(TestEntry)
#include "tst_entry.moc"
