// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entrylist.h"
#include "support/makeentry.h"
#include "vfs/vfs.h"

#include <QRandomGenerator>
#include <QTest>

#include <algorithm>
#include <functional>
#include <random>
#include <type_traits>

using namespace VeyFM;

namespace {

QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

// The type tells apart entries of one path.
Entry named(const QString& path, int type = TypeFile)
{
    return makeEntry(path, text("/local"), type);
}

EntryList listOf(const QStringList& paths)
{
    EntryList list;
    for (const QString& path : paths) {
        list.append(named(path));
    }
    return list;
}

EntryList sorted(EntryList list, bool ascending)
{
    list.sort(ascending);
    return list;
}

// The order that is promised, written down as slowly as it can be.
EntryList insertionSorted(const EntryList& list, bool ascending)
{
    EntryList result;
    for (const Entry& entry : list) {
        int i = 0;
        while (i < result.size() &&
               !(ascending ? entry.path() < result[i].path() : result[i].path() < entry.path())) {
            ++i;
        }
        result.insert(i, entry);
    }
    return result;
}

EntryList slowlyMerged(const EntryList& list, const EntryList& other)
{
    EntryList result = list;
    for (const Entry& entry : other) {
        if (!std::any_of(result.cbegin(), result.cend(), [&entry](const Entry& known) {
                return known == entry;
            })) {
            result.append(entry);
        }
    }
    return result;
}

QString describe(const EntryList& list)
{
    QStringList lines;
    for (const Entry& entry : list) {
        lines.append(
            QStringLiteral("%1 %2 %3").arg(entry.path(), entry.localPath()).arg(entry.type()));
    }
    return lines.join(QLatin1Char('\n'));
}

// Entry::operator== looks at the path alone. Here everything counts.
#define COMPARE_LISTS(actual, expected) QCOMPARE(describe(actual), describe(expected))

using Generator = std::function<QString(QRandomGenerator&)>;

EntryList randomList(int size, const Generator& generator, QRandomGenerator& random)
{
    EntryList list;
    list.reserve(size);
    for (int i = 0; i < size; ++i) {
        list.append(named(generator(random), i));
    }
    return list;
}

QString randomText(QRandomGenerator& random, int maxLength, const QVector<ushort>& alphabet)
{
    QString result;
    for (int length = random.bounded(maxLength + 1); length > 0; --length) {
        result.append(QChar(alphabet[random.bounded(alphabet.size())]));
    }
    return result;
}

// "prefix0000000", "prefix0000001" and so on, each with its number as its type.
EntryList numbered(int size, const QString& prefix)
{
    QByteArray bytes;
    QDataStream writer(&bytes, QIODevice::WriteOnly);
    writer << qint32(size);
    for (int i = 0; i < size; ++i) {
        writer << prefix + QStringLiteral("%1").arg(i, 7, 10, QLatin1Char('0')) << QString() << i;
    }
    QDataStream reader(bytes);
    QList<Entry> list;
    reader >> list;
    return list;
}

} // namespace

Q_DECLARE_METATYPE(Generator)

static_assert(std::is_base_of<QList<Entry>, EntryList>::value, "");
static_assert(std::has_virtual_destructor<EntryList>::value, "");
static_assert(std::is_convertible<QList<Entry>, EntryList>::value, "");
static_assert(std::is_convertible<Entry, EntryList>::value, "");

class TestEntryList : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void constructors();
    void queries();
    void queriesOfNothing();
    void bitMasks();
    void similar();
    void projections();
    void pathsOfNullEntries();
    void sortFewItems();
    void sortKeepsEqualPaths();
    void sortOddTexts();
    void sortRandom_data();
    void sortRandom();
    void sortLongTexts();
    void sortLeavesCopiesAlone();
    void sortLarge_data();
    void sortLarge();
    void mergeFewItems();
    void mergeWithItself();
    void mergeReturnsACopy();
    void mergeNullAndEmptyPaths();
    void mergeRandom();
    void mergeLarge();
};

void TestEntryList::initTestCase()
{
    VFS::initialize();
}

void TestEntryList::constructors()
{
    QVERIFY(EntryList().isEmpty());
    const EntryList one(named(text("a")));
    QCOMPARE(one.paths(), QStringList{text("a")});
    const QList<Entry> plain{named(text("a")), named(text("a")), named(text("b"))};
    const EntryList list(plain);
    QCOMPARE(list.paths(), (QStringList{text("a"), text("a"), text("b")}));
}

void TestEntryList::queries()
{
    const EntryList file(entryOfType(TypeFile));
    const EntryList link(entryOfType(TypeFileLink));
    const EntryList dir(entryOfType(TypeDir));
    const EntryList dirLink(entryOfType(TypeDirLink));
    const EntryList pure(entryOfType(TypeComputerPlace));
    const EntryList home(entryOfType(TypeHomeDirPlace));

    QVERIFY(file.hasFile() && link.hasFile() && !dir.hasFile() && !dirLink.hasFile());
    QVERIFY(dir.hasDir() && dirLink.hasDir() && !file.hasDir() && !link.hasDir());
    QVERIFY(!home.hasDir() && !pure.hasDir());
    QVERIFY(home.hasPlace() && pure.hasPlace() && !file.hasPlace() && !dir.hasPlace());
    QVERIFY(pure.hasPurePlace() && !home.hasPurePlace() && !dir.hasPurePlace());

    EntryList mixed = file;
    mixed << entryOfType(TypeDir) << entryOfType(TypeComputerPlace);
    QVERIFY(mixed.hasFile() && mixed.hasDir() && mixed.hasPlace() && mixed.hasPurePlace());
}

void TestEntryList::queriesOfNothing()
{
    EntryList none;
    QVERIFY(!none.hasPlace() && !none.hasPurePlace() && !none.hasDir() && !none.hasFile());
    QVERIFY(!none.hasChildOfType(-1));
    QVERIFY(!none.containsSimilar(named(text("a"))));
    QVERIFY(none.files().isEmpty() && none.dirs().isEmpty() && none.places().isEmpty());
    QVERIFY(none.sublistOfType(-1).isEmpty());
    QVERIFY(none.paths().isEmpty() && none.localPaths().isEmpty());
    QVERIFY(none.localPathsWithScheme().isEmpty());
    none.sort(true);
    none.sort(false);
    QVERIFY(none.isEmpty());
    QVERIFY(none.mergeWith(EntryList()).isEmpty());
}

void TestEntryList::bitMasks()
{
    EntryList list;
    for (int type : {1000, 1001, 2000, 10001, 0}) {
        list.append(entryOfType(type));
    }
    const auto types = [&list](int mask) {
        QList<int> result;
        for (const Entry& entry : list.sublistOfType(mask)) {
            result.append(entry.type());
        }
        return result;
    };
    // Numbers, not flags: no mask finds one kind alone.
    QCOMPARE(types(8), (QList<int>{1000, 1001}));
    QCOMPARE(types(1000), (QList<int>{1000, 1001, 2000, 10001}));
    QCOMPARE(types(1), (QList<int>{1001, 10001}));
    QCOMPARE(types(0), QList<int>());
    QVERIFY(list.hasChildOfType(8));
    QVERIFY(list.hasChildOfType(TypeFtpSharePlace));
    QVERIFY(!list.hasChildOfType(0));
    QVERIFY(!list.hasChildOfType(1 << 20));
}

void TestEntryList::similar()
{
    EntryList list(makeEntry("Virtual", "", TypePlace));
    list.append(makeEntry("Home", "/home/u", TypeHomeDirPlace));
    QVERIFY(list.containsSimilar(makeEntry("/home/u", "/home/u", TypeDir)));
    QVERIFY(!list.containsSimilar(makeEntry("Home", "/home/v", TypeDir)));
    // Two that have no local path are not in the same place.
    QVERIFY(!list.containsSimilar(list.first()));
    QVERIFY(list.contains(list.first()));
}

void TestEntryList::projections()
{
    EntryList list;
    for (int type : {10001, 10000, 2001, 10004, 10003, 1000, 10000, 0, 20000, 30000}) {
        list.append(named(QString::number(list.size()), type));
    }
    QCOMPARE(list.files().paths(), (QStringList{text("1"), text("4"), text("6")}));
    QCOMPARE(list.dirs().paths(), (QStringList{text("0"), text("3")}));
    QCOMPARE(list.places().paths(), (QStringList{text("2"), text("5")}));
    QCOMPARE(list.size(), 10);
}

void TestEntryList::pathsOfNullEntries()
{
    EntryList list(makeEntry("Home/a", "/home/u/a", TypeFile));
    list << Entry() << makeEntry("Computer", "", TypeComputerPlace)
         << makeEntry("", "/only/local", TypeFile);
    QCOMPARE(list.paths(), (QStringList{text("Home/a"), QString(), text("Computer"), QString()}));
    QCOMPARE(
        list.localPaths(),
        (QStringList{text("/home/u/a"), QString(), QString(), text("/only/local")}));
    // The one of the three that leaves out.
    QCOMPARE(
        list.localPathsWithScheme(),
        (QStringList{text("file:///home/u/a"), text("file:///only/local")}));
}

void TestEntryList::sortFewItems()
{
    const EntryList list = listOf({text("b"), text("a"), text("C")});
    QCOMPARE(sorted(list, true).paths(), (QStringList{text("C"), text("a"), text("b")}));
    QCOMPARE(sorted(list, false).paths(), (QStringList{text("b"), text("a"), text("C")}));

    // No natural order, and directories among files.
    EntryList mixed = listOf({text("file9"), text("file10")});
    mixed.append(named(text("file1"), TypeDir));
    mixed.append(named(text("zoo"), TypeDir));
    QCOMPARE(
        sorted(mixed, true).paths(),
        (QStringList{text("file1"), text("file10"), text("file9"), text("zoo")}));
}

void TestEntryList::sortKeepsEqualPaths()
{
    EntryList list;
    list << named(text("b"), 1) << named(text("a"), 2) << named(text("b"), 3) << named(text("a"), 4)
         << named(text("b"), 5);
    const auto types = [](const EntryList& entries) {
        QList<int> result;
        for (const Entry& entry : entries) {
            result.append(entry.type());
        }
        return result;
    };
    // In both directions, so one is not the other in reverse.
    QCOMPARE(types(sorted(list, true)), (QList<int>{2, 4, 1, 3, 5}));
    QCOMPARE(types(sorted(list, false)), (QList<int>{1, 3, 5, 2, 4}));
}

void TestEntryList::sortOddTexts()
{
    const QChar nul(0);
    QStringList paths{QString(),       text(""),           QString(nul),    QString(2, nul),
                      QString(5, nul), text("a"),          text("a") + nul, text("a") + nul + nul,
                      text("aaaa"),    text("aaaa") + nul, text("aaaab"),   text("aaa"),
                      text("aaaaa")};
    // By code units: halves of pairs come behind most of the letters and before the last ones.
    for (ushort unit : {0xD83D, 0xDC00, 0xDFFF, 0xE000, 0xFFFD, 0xFFFF, 0x00FC, 0x7FFF, 0x8000}) {
        paths << QString(QChar(unit)) << text("abc") + QChar(unit) << text("abcd") + QChar(unit);
    }
    paths << text("\xF0\x9F\x93\x81") << paths;

    std::mt19937 random(1);
    for (int round = 0; round < 20; ++round) {
        std::shuffle(paths.begin(), paths.end(), random);
        EntryList list = listOf(paths);
        for (int i = 0; i < list.size(); ++i) {
            list[i] = named(list[i].path(), i);
        }
        COMPARE_LISTS(sorted(list, true), insertionSorted(list, true));
        COMPARE_LISTS(sorted(list, false), insertionSorted(list, false));
    }
}

void TestEntryList::sortRandom_data()
{
    QTest::addColumn<Generator>("generator");

    const QVector<ushort> binary{'a', 'b'};
    const QVector<ushort> odd{0, 1, 'a', 0xFF, 0xD800, 0xDBFF, 0xDC00, 0xE000, 0xFFFF};
    QTest::newRow("two letters") << Generator(
        [=](QRandomGenerator& random) { return randomText(random, 12, binary); });
    QTest::newRow("NULs, surrogates, ends of the range")
        << Generator([=](QRandomGenerator& random) { return randomText(random, 7, odd); });
    QTest::newRow("prefixes of each other") << Generator(
        [](QRandomGenerator& random) { return QString(random.bounded(60), QLatin1Char('x')); });
    QTest::newRow("NULs alone") << Generator(
        [](QRandomGenerator& random) { return QString(random.bounded(20), QChar(0)); });
    QTest::newRow("one long prefix") << Generator([=](QRandomGenerator& random) {
        return QString(301, QLatin1Char('p')) + randomText(random, 5, odd);
    });
    QTest::newRow("few paths") << Generator([](QRandomGenerator& random) {
        return text("/home/u/") + QString::number(random.bounded(5));
    });
    QTest::newRow("one path") << Generator([](QRandomGenerator&) { return text("/same/path"); });
    QTest::newRow("folders") << Generator([=](QRandomGenerator& random) {
        QString path;
        for (int depth = random.bounded(6); depth >= 0; --depth) {
            path += QLatin1Char('/') + randomText(random, 3, binary);
        }
        return path;
    });
}

void TestEntryList::sortRandom()
{
    QFETCH(Generator, generator);
    QRandomGenerator random(7);
    for (int size : {1, 2, 3, 10, 100, 500}) {
        for (int round = 0; round < 5; ++round) {
            const EntryList list = randomList(size, generator, random);
            COMPARE_LISTS(sorted(list, true), insertionSorted(list, true));
            COMPARE_LISTS(sorted(list, false), insertionSorted(list, false));
        }
    }
}

void TestEntryList::sortLongTexts()
{
    // Longer than any stack would bear that took a frame for each few characters.
    const QString prefix(1000000, QLatin1Char('x'));
    const EntryList list = listOf({prefix + text("b"), prefix, prefix + text("a"), prefix});
    COMPARE_LISTS(sorted(list, true), insertionSorted(list, true));
    COMPARE_LISTS(sorted(list, false), insertionSorted(list, false));
}

void TestEntryList::sortLeavesCopiesAlone()
{
    EntryList list = listOf({text("b"), text("a")});
    const EntryList copy = list;
    list.sort(true);
    QCOMPARE(copy.paths(), (QStringList{text("b"), text("a")}));
    QCOMPARE(list.paths(), (QStringList{text("a"), text("b")}));
}

void TestEntryList::sortLarge_data()
{
    QTest::addColumn<int>("kind");
    QTest::newRow("shuffled") << 0;
    QTest::newRow("ascending") << 1;
    QTest::newRow("descending") << 2;
    QTest::newRow("one path") << 3;
}

// Of a size at which a quadratic way would not come to an end.
void TestEntryList::sortLarge()
{
    QFETCH(int, kind);
    constexpr int size = 200000;
    EntryList list = numbered(size, text("/home/user/folder/file"));
    if (kind == 3) {
        for (int i = 0; i < size; ++i) {
            list[i] = named(text("/same/path"), i);
        }
    } else if (kind == 0) {
        std::mt19937 random(3);
        std::shuffle(list.begin(), list.end(), random);
    } else if (kind == 2) {
        std::reverse(list.begin(), list.end());
    }
    for (bool ascending : {true, false}) {
        const EntryList result = sorted(list, ascending);
        QCOMPARE(result.size(), size);
        // The type is the number in the name, or the place that equal paths had.
        const bool isReversed = !ascending && kind != 3;
        for (int i = 0; i < size; ++i) {
            const int expected = isReversed ? size - 1 - i : i;
            if (result[i].type() != expected) {
                QFAIL(qPrintable(QStringLiteral("%1 stands at %2").arg(result[i].type()).arg(i)));
            }
        }
    }
}

void TestEntryList::mergeFewItems()
{
    EntryList list;
    list << named(text("a"), 1) << named(text("b"), 2) << named(text("a"), 3);
    EntryList other;
    other << named(text("c"), 4) << named(text("a"), 5) << named(text("c"), 6)
          << named(text("d"), 7);
    list.mergeWith(other);
    EntryList expected;
    // What was here first is kept, duplicates and all. Those that come in collapse.
    expected << named(text("a"), 1) << named(text("b"), 2) << named(text("a"), 3)
             << named(text("c"), 4) << named(text("d"), 7);
    COMPARE_LISTS(list, expected);
}

void TestEntryList::mergeWithItself()
{
    EntryList list = listOf({text("b"), text("a"), text("b")});
    const EntryList before = list;
    list.mergeWith(list);
    COMPARE_LISTS(list, before);
}

void TestEntryList::mergeReturnsACopy()
{
    EntryList list(named(text("a")));
    EntryList result = list.mergeWith(EntryList(named(text("b"))));
    COMPARE_LISTS(result, list);
    QCOMPARE(list.size(), 2);
    result.clear();
    QCOMPARE(list.size(), 2);
}

void TestEntryList::mergeNullAndEmptyPaths()
{
    EntryList list(Entry{});
    list.mergeWith(EntryList(makeEntry("", "/x", TypeFile)));
    QCOMPARE(list.size(), 1);
    list.mergeWith(EntryList(named(QString(QChar(0)))));
    QCOMPARE(list.size(), 2);
}

void TestEntryList::mergeRandom()
{
    QRandomGenerator random(11);
    const Generator generator = [](QRandomGenerator& source) {
        return randomText(source, 3, {'a', 'b', 0, 0xD800});
    };
    for (int round = 0; round < 200; ++round) {
        EntryList list = randomList(random.bounded(60), generator, random);
        const EntryList other = randomList(random.bounded(60), generator, random);
        const EntryList expected = slowlyMerged(list, other);
        COMPARE_LISTS(list.mergeWith(other), expected);
        COMPARE_LISTS(list, expected);
    }
}

// Of a size at which a quadratic way would not come to an end.
void TestEntryList::mergeLarge()
{
    constexpr int size = 200000;
    const EntryList all = numbered(size + size / 2, text("/home/user/folder/file"));
    EntryList list(all.mid(0, size));
    list.mergeWith(EntryList(all.mid(size / 2)));
    QCOMPARE(list.size(), all.size());
    for (int i = 0; i < list.size(); ++i) {
        if (list[i].type() != i) {
            QFAIL(qPrintable(QStringLiteral("%1 stands at %2").arg(list[i].type()).arg(i)));
        }
    }
}

QTEST_GUILESS_MAIN(TestEntryList)
#include "tst_entrylist.moc"
