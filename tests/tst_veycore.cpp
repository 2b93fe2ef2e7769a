// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <QTest>

#include <atomic>
#include <climits>
#include <thread>
#include <vector>
#include <veycore.h>

class TestVeyCore : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void organization();
    void withoutSettings();
    void withoutHome();
    void xdgDirectories();
    void userDirs_data();
    void userDirs();
    void followsChanges();
    void localEncoding();
    void unknown_data();
    void unknown();
    void pointersStay();
    void threads();

private:
    QByteArray path(const char* relative) const
    {
        return QFile::encodeName(m_home->path()) + relative;
    }
    void write(const QString& file, const QByteArray& content)
    {
        QVERIFY(QDir().mkpath(QFileInfo(file).path()));
        QFile out(file);
        QVERIFY(out.open(QIODevice::WriteOnly));
        QCOMPARE(out.write(content), qint64(content.size()));
    }

    std::unique_ptr<QTemporaryDir> m_home;
};

void TestVeyCore::init()
{
    m_home = std::make_unique<QTemporaryDir>();
    QVERIFY(m_home->isValid());
    qputenv("HOME", QFile::encodeName(m_home->path()));
    qunsetenv("XDG_CONFIG_HOME");
    qunsetenv("XDG_DATA_HOME");
}

void TestVeyCore::organization()
{
    QCOMPARE(GetOrganization(), "veylabs");
}

void TestVeyCore::withoutSettings()
{
    QCOMPARE(QByteArray(GetVeyDir(VeyDirDesktop)), path("/Desktop"));
    QCOMPARE(QByteArray(GetVeyDir(VeyDirDocuments)), path("/Documents"));
    QCOMPARE(QByteArray(GetVeyDir(VeyDirTrash)), path("/.local/share/Trash/files"));
    QVERIFY2(QDir(m_home->path()).isEmpty(), "looking up creates nothing");
}

void TestVeyCore::withoutHome()
{
    qunsetenv("HOME");
    QCOMPARE(GetVeyDir(VeyDirDesktop), "/Desktop");
    QCOMPARE(GetVeyDir(VeyDirTrash), "/.local/share/Trash/files");
}

void TestVeyCore::xdgDirectories()
{
    qputenv("XDG_CONFIG_HOME", path("/etc"));
    qputenv("XDG_DATA_HOME", path("/data"));
    write(
        m_home->filePath(QStringLiteral("etc/user-dirs.dirs")), "XDG_DESKTOP_DIR=\"/srv/desk\"\n");

    QCOMPARE(GetVeyDir(VeyDirDesktop), "/srv/desk");
    QCOMPARE(QByteArray(GetVeyDir(VeyDirDocuments)), path("/Documents"));
    QCOMPARE(QByteArray(GetVeyDir(VeyDirTrash)), path("/data/Trash/files"));

    qputenv("XDG_DATA_HOME", "relative");
    QCOMPARE(QByteArray(GetVeyDir(VeyDirTrash)), path("/.local/share/Trash/files"));
}

void TestVeyCore::userDirs_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QByteArray>("desktop"); // Below the home directory, or absolute with "=".

    QTest::newRow("below home") << QByteArray("XDG_DESKTOP_DIR=\"$HOME/Pult\"")
                                << QByteArray("/Pult");
    QTest::newRow("absolute") << QByteArray("XDG_DESKTOP_DIR=\"/srv/a b\"")
                              << QByteArray("=/srv/a b");
    QTest::newRow("untidy") << QByteArray("XDG_DESKTOP_DIR=\"/srv//a/../b/\"")
                            << QByteArray("=/srv/b");
    QTest::newRow("none of its own") << QByteArray("XDG_DESKTOP_DIR=\"$HOME/\"") << QByteArray();
    QTest::newRow("relative") << QByteArray("XDG_DESKTOP_DIR=\"Pult\"") << QByteArray("/Desktop");
    QTest::newRow("empty") << QByteArray("XDG_DESKTOP_DIR=\"\"") << QByteArray("/Desktop");
    QTest::newRow("comment") << QByteArray("# XDG_DESKTOP_DIR=\"/srv\"") << QByteArray("/Desktop");
    QTest::newRow("other") << QByteArray("XDG_MUSIC_DIR=\"/srv\"") << QByteArray("/Desktop");
}

void TestVeyCore::userDirs()
{
    QFETCH(QByteArray, line);
    QFETCH(QByteArray, desktop);
    write(m_home->filePath(QStringLiteral(".config/user-dirs.dirs")), line + '\n');
    const QByteArray expected =
        desktop.startsWith('=') ? desktop.mid(1) : path(desktop.constData());
    QCOMPARE(QByteArray(GetVeyDir(VeyDirDesktop)), expected);
}

void TestVeyCore::followsChanges()
{
    const QString file = m_home->filePath(QStringLiteral(".config/user-dirs.dirs"));
    write(file, "XDG_DOCUMENTS_DIR=\"/srv/one\"\n");
    QCOMPARE(GetVeyDir(VeyDirDocuments), "/srv/one");
    write(file, "XDG_DOCUMENTS_DIR=\"/srv/two\"\n");
    QCOMPARE(GetVeyDir(VeyDirDocuments), "/srv/two");
    qputenv("HOME", "/srv/elsewhere");
    QCOMPARE(GetVeyDir(VeyDirDocuments), "/srv/elsewhere/Documents");
    QCOMPARE(GetVeyDir(VeyDirTrash), "/srv/elsewhere/.local/share/Trash/files");
}

void TestVeyCore::localEncoding()
{
    write(
        m_home->filePath(QStringLiteral(".config/user-dirs.dirs")),
        "XDG_DESKTOP_DIR=\"$HOME/B\xc3\xbcro\"\n");
    QCOMPARE(QByteArray(GetVeyDir(VeyDirDesktop)), path("/B\xc3\xbcro"));
}

void TestVeyCore::unknown_data()
{
    QTest::addColumn<int>("value");
    for (int value : {0, 1, 5, 9, -1, INT_MAX, INT_MIN}) {
        QTest::addRow("%d", value) << value;
    }
}

void TestVeyCore::unknown()
{
    QFETCH(int, value);
    QVERIFY(!GetVeyDir(static_cast<_VeyDir>(value)));
}

void TestVeyCore::pointersStay()
{
    const char* desktop = GetVeyDir(VeyDirDesktop);
    const QByteArray before(desktop);
    const char* documents = GetVeyDir(VeyDirDocuments);
    qputenv("HOME", "/srv/another");
    QCOMPARE(GetVeyDir(VeyDirDesktop), "/srv/another/Desktop");

    QCOMPARE(QByteArray(desktop), before);
    QCOMPARE(QByteArray(documents), path("/Documents"));
    qputenv("HOME", QFile::encodeName(m_home->path()));
    QCOMPARE(static_cast<const void*>(GetVeyDir(VeyDirDesktop)), static_cast<const void*>(desktop));
}

void TestVeyCore::threads()
{
    const QByteArray desktop = path("/Desktop");
    const QByteArray trash = path("/.local/share/Trash/files");
    std::atomic<int> wrong(0);
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&] {
            for (int round = 0; round < 200; ++round) {
                const char* first = GetVeyDir(VeyDirDesktop);
                const char* second = GetVeyDir(VeyDirTrash);
                wrong += desktop != first || trash != second;
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    QCOMPARE(wrong.load(), 0);
}

QTEST_GUILESS_MAIN(TestVeyCore)
#include "tst_veycore.moc"
