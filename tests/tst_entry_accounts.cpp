// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entry.h"
#include "support/makeentry.h"
#include "support/temporarytree.h"

#include <QTest>
#include <QVector>

#include <cerrno>

#include <dlfcn.h>
#include <grp.h>
#include <pwd.h>
#include <unistd.h>

using namespace VeyFM;

namespace {

// What the account database below was asked for, and how it answers.
struct Database
{
    long passwordSize = -1; // What sysconf() recommends.
    long groupSize = -1;
    int error = 0;              // The result of a call whose buffer is large enough.
    int errorNumber = 0;        // What it leaves in errno.
    bool setsErrno = true;      // Whether a buffer that is too small shows in errno too.
    size_t needed = 0;          // Smallest buffer that will do.
    const char* name = nullptr; // Null: no such account.

    QVector<uint> ids;
    QVector<size_t> sizes;
};
Database database;

template <typename Record>
int lookUp(uint id, size_t size, Record* record, Record** result, char* Record::*name)
{
    database.ids.append(id);
    database.sizes.append(size);
    *result = nullptr;
    if (size < database.needed) {
        errno = database.setsErrno ? ERANGE : 0;
        return ERANGE;
    }
    if (database.name && database.error == 0) {
        record->*name = const_cast<char*>(database.name);
        *result = record;
    }
    errno = database.errorNumber;
    return database.error;
}

} // namespace

// These stand before the C library's in this process: no system has groups of every size.
extern "C" {

Q_DECL_EXPORT long sysconf(int name) noexcept
{
    if (name == _SC_GETPW_R_SIZE_MAX) {
        return database.passwordSize;
    }
    if (name == _SC_GETGR_R_SIZE_MAX) {
        return database.groupSize;
    }
    static const auto original = reinterpret_cast<long (*)(int)>(::dlsym(RTLD_NEXT, "sysconf"));
    return original(name);
}

Q_DECL_EXPORT int getpwuid_r(uid_t id, passwd* record, char*, size_t size, passwd** result)
{
    return lookUp(id, size, record, result, &passwd::pw_name);
}

Q_DECL_EXPORT int getgrgid_r(gid_t id, group* record, char*, size_t size, group** result)
{
    return lookUp(id, size, record, result, &group::gr_name);
}

} // extern "C"

/// Names of owners and groups. The two are not found in the same way.
class TestEntryAccounts : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void names();
    void unknownAccounts();
    void unknownFile();
    void ownerIsAskedForOnce();
    void ownerOfLargeRecord();
    void ownerHasNoLimit();
    void groupGrows();
    void groupGrowsToItsLimit();
    void groupOfOddSize();
    void groupLimit_data();
    void groupLimit();
    void groupGivesUpOnOtherErrors();
    void groupNeedsErrno();
    void groupIgnoresOldErrno();

private:
    TemporaryTree m_tree;
    Entry m_file;
    Entry m_missing;
};

void TestEntryAccounts::init()
{
    database = Database();
    QVERIFY(m_tree.write("file"));
    m_file = makeEntry(QStringLiteral("file"), m_tree.path("file"), TypeFile);
    m_missing = makeEntry(QStringLiteral("missing"), m_tree.path("missing"), TypeFile);
}

void TestEntryAccounts::names()
{
    database.name = "j\xC3\xBCrgen";
    QCOMPARE(m_file.owner(), QString::fromUtf8("j\xC3\xBCrgen"));
    QCOMPARE(database.ids, QVector<uint>{m_file.ownerId()});
    database.ids.clear();
    QCOMPARE(m_file.group(), QString::fromUtf8("j\xC3\xBCrgen"));
    QCOMPARE(database.ids, QVector<uint>{m_file.groupId()});
    // No recommendation means 1024 bytes.
    QCOMPARE(database.sizes, (QVector<size_t>{1024, 1024}));
}

void TestEntryAccounts::unknownAccounts()
{
    QCOMPARE(m_file.owner(), QString());
    QCOMPARE(m_file.group(), QString());
    QCOMPARE(database.ids.size(), 2);
}

void TestEntryAccounts::unknownFile()
{
    // The number that stands for unknown is looked up like any other.
    database.name = "somebody";
    QCOMPARE(m_missing.owner(), QStringLiteral("somebody"));
    QCOMPARE(m_missing.group(), QStringLiteral("somebody"));
    QCOMPARE(database.ids, (QVector<uint>{0xFFFFFFFEu, 0xFFFFFFFEu}));
}

void TestEntryAccounts::ownerIsAskedForOnce()
{
    database.name = "somebody";
    database.needed = 1025;
    QCOMPARE(m_file.owner(), QString());
    QCOMPARE(database.sizes, QVector<size_t>{1024});
}

void TestEntryAccounts::ownerOfLargeRecord()
{
    database.name = "somebody";
    database.passwordSize = 5000;
    database.needed = 5000;
    QCOMPARE(m_file.owner(), QStringLiteral("somebody"));
    QCOMPARE(database.sizes, QVector<size_t>{5000});
}

void TestEntryAccounts::ownerHasNoLimit()
{
    database.name = "somebody";
    database.passwordSize = 256000;
    QCOMPARE(m_file.owner(), QStringLiteral("somebody"));
    QCOMPARE(database.sizes, QVector<size_t>{256000});
}

void TestEntryAccounts::groupGrows()
{
    database.name = "crowd";
    database.needed = 4096;
    QCOMPARE(m_file.group(), QStringLiteral("crowd"));
    QCOMPARE(database.sizes, (QVector<size_t>{1024, 2048, 4096}));
}

void TestEntryAccounts::groupGrowsToItsLimit()
{
    database.name = "crowd";
    database.needed = 131073;
    QCOMPARE(m_file.group(), QString());
    QCOMPARE(
        database.sizes, (QVector<size_t>{1024, 2048, 4096, 8192, 16384, 32768, 65536, 131072}));
}

void TestEntryAccounts::groupOfOddSize()
{
    // Double the size has to stay below the limit: this one would reach it.
    database.name = "crowd";
    database.groupSize = 128000;
    database.needed = 200000;
    QCOMPARE(m_file.group(), QString());
    QCOMPARE(database.sizes, QVector<size_t>{128000});

    database.sizes.clear();
    database.groupSize = 127999;
    QCOMPARE(m_file.group(), QStringLiteral("crowd"));
    QCOMPARE(database.sizes, (QVector<size_t>{127999, 255998}));
}

void TestEntryAccounts::groupLimit_data()
{
    QTest::addColumn<long>("size");
    QTest::addColumn<bool>("isAsked");
    QTest::newRow("below") << 255999L << true;
    QTest::newRow("at") << 256000L << false;
    QTest::newRow("above") << 1000000L << false;
}

void TestEntryAccounts::groupLimit()
{
    QFETCH(long, size);
    QFETCH(bool, isAsked);
    database.name = "crowd";
    database.groupSize = size;
    QCOMPARE(m_file.group(), isAsked ? QStringLiteral("crowd") : QString());
    QCOMPARE(!database.sizes.isEmpty(), isAsked);
}

void TestEntryAccounts::groupGivesUpOnOtherErrors()
{
    database.name = "crowd";
    database.error = EIO;
    database.errorNumber = EIO;
    QCOMPARE(m_file.group(), QString());
    QCOMPARE(database.sizes.size(), 1);
}

void TestEntryAccounts::groupNeedsErrno()
{
    // A result of ERANGE alone is no reason to try again.
    database.name = "crowd";
    database.needed = 4096;
    database.setsErrno = false;
    QCOMPARE(m_file.group(), QString());
    QCOMPARE(database.sizes, QVector<size_t>{1024});
}

void TestEntryAccounts::groupIgnoresOldErrno()
{
    // Nor is errno where the call itself went well.
    database.errorNumber = ERANGE;
    QCOMPARE(m_file.group(), QString());
    QCOMPARE(database.sizes.size(), 1);
}

QTEST_GUILESS_MAIN(TestEntryAccounts)
#include "tst_entry_accounts.moc"
