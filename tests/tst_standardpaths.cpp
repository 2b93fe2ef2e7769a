// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/standardpaths.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <QTest>

#include <netdb.h>

using namespace VeyFM;

namespace {

// What the resolver below was asked, and what it answers.
struct Resolver
{
    QByteArray node;
    bool service = false;
    addrinfo hints = {};
    int calls = 0;
    int freed = 0;

    int error = 0;
    addrinfo* answer = nullptr;
};
Resolver resolver;

} // namespace

// Stands before the C library's in this process (hence exported), so that no name server decides
// about the tests.
extern "C" Q_DECL_EXPORT int
getaddrinfo(const char* node, const char* service, const addrinfo* hints, addrinfo** result)
{
    resolver.node = node;
    resolver.service = service;
    resolver.hints = *hints;
    ++resolver.calls;
    *result = resolver.answer;
    return resolver.error;
}

extern "C" Q_DECL_EXPORT void freeaddrinfo(addrinfo* result) noexcept
{
    resolver.freed += result == resolver.answer;
}

class TestStandardPaths : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void root();
    void directories();
    void localEncoding();
    void hostAsked();
    void hostAnswers_data();
    void hostAnswers();
    void hostFails();
    void hostWithoutResult();
    void hostFirstResultOnly();
    void notAHost_data();
    void notAHost();
};

void TestStandardPaths::init()
{
    resolver = Resolver();
}

void TestStandardPaths::root()
{
    QCOMPARE(StandardPaths::fileSystemRootPath(), QStringLiteral("/"));
}

void TestStandardPaths::directories()
{
    const QTemporaryDir home;
    qputenv("XDG_CONFIG_HOME", QFile::encodeName(home.path()));
    qputenv("XDG_DATA_HOME", "/srv/data");
    QFile dirs(home.filePath(QStringLiteral("user-dirs.dirs")));
    QVERIFY(dirs.open(QIODevice::WriteOnly));
    dirs.write("XDG_DESKTOP_DIR=\"/srv/desk\"\nXDG_DOCUMENTS_DIR=\"/srv/docs\"\n");
    dirs.close();

    QCOMPARE(StandardPaths::desktopDirPath(), QStringLiteral("/srv/desk"));
    QCOMPARE(StandardPaths::documentsDirPath(), QStringLiteral("/srv/docs"));
    QCOMPARE(StandardPaths::trashDirPath(), QStringLiteral("/srv/data/Trash/files"));

    QVERIFY(dirs.remove());
    QCOMPARE(StandardPaths::desktopDirPath(), QDir::homePath() + QStringLiteral("/Desktop"));
    QCOMPARE(StandardPaths::documentsDirPath(), QDir::homePath() + QStringLiteral("/Documents"));
}

void TestStandardPaths::localEncoding()
{
    qputenv("XDG_DATA_HOME", "/srv/B\xc3\xbcro");
    QCOMPARE(StandardPaths::trashDirPath(), QString::fromUtf8("/srv/B\xc3\xbcro/Trash/files"));
}

void TestStandardPaths::hostAsked()
{
    resolver.error = EAI_NONAME;
    StandardPaths::toCanonicalHostName(QString::fromUtf8("b\xc3\xbc"
                                                         "cher.example"));

    QCOMPARE(resolver.calls, 1);
    QCOMPARE(resolver.node, QByteArray("xn--bcher-kva.example"));
    QVERIFY(!resolver.service);
    addrinfo expected = {};
    expected.ai_flags = AI_CANONNAME;
    QVERIFY(memcmp(&resolver.hints, &expected, sizeof expected) == 0);
}

void TestStandardPaths::hostAnswers_data()
{
    QTest::addColumn<QByteArray>("canonical"); // Null: the result carries no name.
    QTest::addColumn<QString>("name");
    QTest::newRow("another") << QByteArray("files.example") << QStringLiteral("files.example");
    QTest::newRow("no name") << QByteArray() << QStringLiteral("nas");
    QTest::newRow("empty name") << QByteArray("") << QStringLiteral("nas");
    QTest::newRow("beyond ASCII") << QByteArray("b\xc3\xbc") << QString::fromUtf8("b\xc3\xbc");
}

void TestStandardPaths::hostAnswers()
{
    QFETCH(QByteArray, canonical);
    addrinfo answer = {};
    answer.ai_canonname = canonical.isNull() ? nullptr : canonical.data();
    resolver.answer = &answer;

    QTEST(StandardPaths::toCanonicalHostName(QStringLiteral("nas")), "name");
    QCOMPARE(resolver.node, QByteArray("nas"));
    QCOMPARE(resolver.freed, 1);
}

void TestStandardPaths::hostFails()
{
    resolver.error = EAI_NONAME;
    const QString host = QString::fromUtf8("B\xc3\xbc"
                                           "cher.Example");
    QCOMPARE(StandardPaths::toCanonicalHostName(host), host);
    QCOMPARE(resolver.calls, 1);
    QCOMPARE(resolver.freed, 0);
}

void TestStandardPaths::hostWithoutResult()
{
    QCOMPARE(StandardPaths::toCanonicalHostName(QStringLiteral("nas")), QStringLiteral("nas"));
    QCOMPARE(resolver.calls, 1);
    QCOMPARE(resolver.freed, 0);
}

void TestStandardPaths::hostFirstResultOnly()
{
    QByteArray name("second.example");
    addrinfo second = {};
    second.ai_canonname = name.data();
    addrinfo first = {};
    first.ai_next = &second;
    resolver.answer = &first;
    QCOMPARE(StandardPaths::toCanonicalHostName(QStringLiteral("nas")), QStringLiteral("nas"));
    QCOMPARE(resolver.freed, 1);
}

void TestStandardPaths::notAHost_data()
{
    QTest::addColumn<QString>("host");
    QTest::newRow("null") << QString();
    QTest::newRow("blank") << QStringLiteral("a b");
    QTest::newRow("address in brackets") << QStringLiteral("[::1]");
}

void TestStandardPaths::notAHost()
{
    QFETCH(QString, host);
    QCOMPARE(StandardPaths::toCanonicalHostName(host), host);
    QCOMPARE(resolver.calls, 0);
}

QTEST_GUILESS_MAIN(TestStandardPaths)
#include "tst_standardpaths.moc"
