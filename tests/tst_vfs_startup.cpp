// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/startupprobe.h"
#include "support/temporarytree.h"

#include <QProcess>
#include <QProcessEnvironment>
#include <QRegularExpression>
#include <QTest>

#include <type_traits>

using namespace VeyFM;

namespace {

QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

// A process of its own, since there is one VFS in each.
struct Run
{
    bool isOk = false;
    QStringList output;

    /// What the process said about a topic.
    QString operator[](const char* topic) const
    {
        const QString start = text(topic) + QLatin1Char('=');
        const QStringList found =
            output.filter(QRegularExpression(QLatin1Char('^') + QRegularExpression::escape(start)));
        return found.size() == 1 ? found.first().mid(start.size()) : text("(not said)");
    }
};

} // namespace

static_assert(
    std::is_same<decltype(std::declval<const VFS&>().settings()), const VFSSettings*>::value, "");
static_assert(std::is_same<decltype(std::declval<VFS&>().settings()), VFSSettings*>::value, "");
static_assert(
    std::is_same<decltype(std::declval<const VFS&>().placeBase()), const VFSPlaceBase*>::value, "");
static_assert(std::is_same<decltype(std::declval<VFS&>().placeBase()), VFSPlaceBase*>::value, "");
static_assert(!std::is_default_constructible<VFS>::value, "");
static_assert(!std::is_copy_constructible<VFS>::value, "");

/// The one object of a process: how it comes to be, what its tree looks like, and how it goes.
class TestVfsStartup : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void placeTable_data();
    void placeTable();
    void children();
    void pendingPlaces();
    void placesHasNoParent();
    void objects();
    void networkSwitchedOff();
    void translated();
    void translatedTooLate();
    void rootUnderEveryLocale_data();
    void rootUnderEveryLocale();
    void secondInitialize();
    void documentsMissing();
    void documentsPresent();
    void otherThreads();
    void firstCallByManyThreads();
    void destroyedBehindMain();
    void oddHomes_data();
    void oddHomes();
    void oddUserDirectories_data();
    void oddUserDirectories();

private:
    Run run(const char* mode, const QMap<QString, QString>& changes = {}) const;

    QScopedPointer<TemporaryTree> m_home;
};

void TestVfsStartup::init()
{
    m_home.reset(new TemporaryTree);
    QVERIFY(m_home->makeDir(".config/veylabs"));
}

// A value that is null takes the variable away.
Run TestVfsStartup::run(const char* mode, const QMap<QString, QString>& changes) const
{
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(text("HOME"), m_home->path());
    environment.insert(text("XDG_CONFIG_HOME"), m_home->path(".config"));
    environment.insert(text("XDG_DATA_HOME"), m_home->path(".local/share"));
    for (auto change = changes.begin(); change != changes.end(); ++change) {
        if (change.value().isNull()) {
            environment.remove(change.key());
        } else {
            environment.insert(change.key(), change.value());
        }
    }

    QProcess process;
    process.setProcessEnvironment(environment);
    process.setWorkingDirectory(m_home->path());
    process.start(QCoreApplication::applicationFilePath(), {text("probe"), text(mode)});
    Run result;
    if (!process.waitForFinished(60000)) {
        process.kill();
        process.waitForFinished();
    }
    result.isOk = process.exitStatus() == QProcess::NormalExit && process.exitCode() == 0;
    result.output = QString::fromUtf8(process.readAllStandardOutput()).split(QLatin1Char('\n'));
    if (!result.isOk) {
        qWarning("%s: %s", mode, process.readAllStandardError().constData());
    }
    return result;
}

void TestVfsStartup::placeTable_data()
{
    QTest::addColumn<QString>("expected");
    QTest::newRow("root") << text("_|1000|");
    QTest::newRow("places") << text("Places|1000|");
    QTest::newRow("computer") << text("Computer|1001|");
    QTest::newRow("favourites") << text("Favourites|1004|");
    QTest::newRow("storageDevices") << text("Storage devices|1003|");
    QTest::newRow("desktop") << text("Desktop|2003|~/Desktop");
    QTest::newRow("trash") << text("Trash|2002|~/.local/share/Trash/files");
    QTest::newRow("home") << text("Home|2001|~");
    QTest::newRow("fileSystem") << text("File System|2000|/");
    QTest::newRow("network") << text("Network|1002|");
    QTest::newRow("sambaNetwork") << text("Samba|1005|");
    QTest::newRow("ftpNetwork") << text("FTP|1008|");
    QTest::newRow("sftpNetwork") << text("SFTP|1009|");
    QTest::newRow("documents") << text("~/Documents|0|~/Documents");
}

void TestVfsStartup::placeTable()
{
    QFETCH(QString, expected);
    const Run result = run("tree");
    QVERIFY(result.isOk);
    QCOMPARE(result[QTest::currentDataTag()].replace(m_home->path(), text("~")), expected);
}

void TestVfsStartup::children()
{
    const Run result = run("tree");
    QCOMPARE(result["children of root"], text("Favourites,Computer,Network"));
    QCOMPARE(
        result["children of computer"], text("Home,Desktop,Trash,Storage devices,File System"));
    QCOMPARE(
        result["children of places"],
        text("Favourites,Home,Desktop,Trash,File System,Storage devices,Network"));
    QCOMPARE(result["children of network"], text("Samba"));
    for (const char* place :
         {"favourites", "desktop", "trash", "home", "fileSystem", "ftpNetwork", "sftpNetwork"}) {
        QCOMPARE(result[QByteArray("children of ") + place], QString());
    }
}

void TestVfsStartup::pendingPlaces()
{
    const Run result = run("tree");
    // Nobody has looked yet, and so they count as having children.
    QCOMPARE(result["storageDevices has children"], text("yes"));
    QCOMPARE(result["sambaNetwork has children"], text("yes"));
    QCOMPARE(result["ftpNetwork has children"], text("no"));
    QCOMPARE(result["sftpNetwork has children"], text("no"));
    QCOMPARE(result["favourites has children"], text("no"));
}

void TestVfsStartup::placesHasNoParent()
{
    const Run result = run("tree");
    QCOMPARE(result["parent of places"], text("null"));
    QCOMPARE(result["parent of ftpNetwork"], text("null"));
    QCOMPARE(result["parent of sftpNetwork"], text("null"));
    QCOMPARE(result["parent of home"], text("Computer"));
    QCOMPARE(result["parent of network"], text("_"));
    QCOMPARE(result["parent of sambaNetwork"], text("Network"));
}

void TestVfsStartup::objects()
{
    const Run result = run("objects");
    QVERIFY(result.isOk);
    QCOMPARE(result["vfs has a parent"], text("no"));
    QCOMPARE(result["watcher belongs to vfs"], text("yes"));
    QCOMPARE(result["vfs lives in the main thread"], text("yes"));
    QCOMPARE(result["const and plain access meet"], text("yes"));
    // The fixed entries are copies.
    QCOMPARE(result["home entry follows the tree"], text("no"));
}

void TestVfsStartup::networkSwitchedOff()
{
    QFile settings(m_home->path(".config/veylabs/vey-fm-vfs.conf"));
    QVERIFY(settings.open(QIODevice::WriteOnly));
    QVERIFY(settings.write("[Network]\nEnabled=false\n") > 0);
    settings.close();

    const Run result = run("tree");
    QVERIFY(result.isOk);
    for (const char* place : {"network", "sambaNetwork", "ftpNetwork", "sftpNetwork"}) {
        QCOMPARE(result[place], text("null"));
    }
    QCOMPARE(result["children of root"], text("Favourites,Computer"));
    QCOMPARE(
        result["children of places"],
        text("Favourites,Home,Desktop,Trash,File System,Storage devices"));
    QCOMPARE(result["network places in the tree"], QString());
    QCOMPARE(run("tree")["documents"].section(QLatin1Char('|'), 1, 1), text("0"));
}

void TestVfsStartup::translated()
{
    const Run result = run("translated");
    QVERIFY(result.isOk);
    // The one that no user sees.
    QCOMPARE(result["root"], text("_|1000|"));
    QCOMPARE(result["home"], QStringLiteral("\u00fcHome|2001|") + m_home->path());
    QCOMPARE(result["children of root"], QString::fromUtf8("üFavourites,üComputer,üNetwork"));
    QCOMPARE(
        result["children of places"],
        QString::fromUtf8("üFavourites,üHome,üDesktop,üTrash,üFile System,"
                          "üStorage devices,üNetwork"));
    QCOMPARE(result["children of network"], QString::fromUtf8("üSamba"));
    QCOMPARE(result["ftpNetwork"], QString::fromUtf8("üFTP|1008|"));
    QCOMPARE(result["sftpNetwork"], QString::fromUtf8("üSFTP|1009|"));
    // Six words name places in every language, and the others do in their own.
    QCOMPARE(result["vey-fm:Home"], QString::fromUtf8("üHome"));
    QCOMPARE(result["vey-fm:Favourites"], text("null"));
    QCOMPARE(result["vey-fm:üFavourites"], QString::fromUtf8("üFavourites"));
}

void TestVfsStartup::translatedTooLate()
{
    const Run result = run("translated too late");
    QCOMPARE(result["home"], text("Home|2001|") + m_home->path());
    QCOMPARE(result["parent of home"], text("Computer"));
}

void TestVfsStartup::rootUnderEveryLocale_data()
{
    QTest::addColumn<QString>("locale");
    for (const char* locale : {"C", "de_DE.UTF-8", "tr_TR.UTF-8", "ru_RU.UTF-8", "zh_CN.UTF-8"}) {
        QTest::newRow(locale) << text(locale);
    }
}

void TestVfsStartup::rootUnderEveryLocale()
{
    QFETCH(QString, locale);
    const Run result = run("tree", {{text("LC_ALL"), locale}, {text("LANG"), locale}});
    QVERIFY(result.isOk);
    QCOMPARE(result["root"], text("_|1000|"));
}

void TestVfsStartup::secondInitialize()
{
    const Run result = run("initialize");
    QVERIFY(result.isOk);
    QCOMPARE(result["translators after the first call"], text("1"));
    QCOMPARE(result["translators after the third call"], text("1"));
    QCOMPARE(result["language changes of the later calls"], text("0"));
    QCOMPARE(result["Entry is known by its short name"], text("yes"));
}

void TestVfsStartup::documentsMissing()
{
    const Run result = run("tree");
    QCOMPARE(
        result["documents"].replace(m_home->path(), text("~")), text("~/Documents|0|~/Documents"));
    QCOMPARE(result["documents is a place"], text("no"));
}

void TestVfsStartup::documentsPresent()
{
    QVERIFY(m_home->makeDir("Documents"));
    const QString path = m_home->path("Documents");
    QCOMPARE(run("tree")["documents"], path + text("|10001|") + path);

    QVERIFY(m_home->rename("Documents", "Papers"));
    QVERIFY(m_home->makeLink("Papers", "Documents"));
    QCOMPARE(run("tree")["documents"], path + text("|10004|") + path);
    QCOMPARE(run("tree")["documents is a place"], text("no"));
}

void TestVfsStartup::otherThreads()
{
    const Run result = run("threads");
    QVERIFY(result.isOk);
    QCOMPARE(result["objects"], text("1"));
    QCOMPARE(result["vfs lives in the main thread"], text("yes"));
}

void TestVfsStartup::firstCallByManyThreads()
{
    const Run result = run("first call by many threads");
    QVERIFY(result.isOk);
    QCOMPARE(result["objects"], text("1"));
    QCOMPARE(result["root"], text("_|1000|"));
}

void TestVfsStartup::destroyedBehindMain()
{
    const Run result = run("exit");
    QVERIFY(result.isOk);
    QCOMPARE(
        result.output.filter(QRegularExpression(text("ended|destroyed"))),
        (QStringList{text("application ended"), text("vfs destroyed")}));
}

void TestVfsStartup::oddHomes_data()
{
    QTest::addColumn<QString>("home");
    QTest::newRow("unset") << QString();
    for (const char* home :
         {"",
          "/",
          "//",
          ".",
          "..",
          "./x",
          "relative",
          "/nonexistent",
          "Home",
          "Computer",
          "Favourites/x",
          "Storage devices",
          "Samba",
          "Network/x",
          "_",
          "~",
          "a:b",
          "vey-fm:Home",
          "vey-fm:Documents",
          "file:///tmp",
          "file://host/x",
          "http://example.org",
          "%2e%2e",
          "\xFF\xFE"}) {
        QTest::newRow(*home ? home : "empty") << text(home);
    }
}

// The tree is built inside VFS::ptr(). Whatever text the environment holds, nothing that is done
// with it may come back there: the process would hang or end.
void TestVfsStartup::oddHomes()
{
    QFETCH(QString, home);
    const Run result =
        run("tree", {{text("HOME"), home},
                     {text("XDG_CONFIG_HOME"), QString()},
                     {text("XDG_DATA_HOME"), QString()}});
    QVERIFY(result.isOk);
    QCOMPARE(result["root"], text("_|1000|"));
    QVERIFY(result["home"].startsWith(text("Home|2001|")));
    QVERIFY(result["desktop"].startsWith(text("Desktop|2003|")));
    QVERIFY(!result["children of places"].isEmpty());
    QVERIFY(!result["documents"].contains(text("(not said)")));
}

void TestVfsStartup::oddUserDirectories_data()
{
    QTest::addColumn<QString>("directory");
    for (const char* directory :
         {"", "/", "$HOME/", "$HOME", "relative", "Computer", "Storage devices/x", "Samba/x/y",
          "$HOME/../..", "vey-fm:Documents", "vey-fm:Samba/x", "file:///x", "/nonexistent/x",
          "Home/Documents"}) {
        QTest::newRow(*directory ? directory : "empty") << text(directory);
    }
}

void TestVfsStartup::oddUserDirectories()
{
    QFETCH(QString, directory);
    QFile file(m_home->path(".config/user-dirs.dirs"));
    QVERIFY(file.open(QIODevice::WriteOnly));
    for (const char* name : {"DESKTOP", "DOCUMENTS"}) {
        file.write("XDG_" + QByteArray(name) + "_DIR=\"" + directory.toUtf8() + "\"\n");
    }
    file.close();

    const Run result = run("tree");
    QVERIFY(result.isOk);
    QCOMPARE(result["root"], text("_|1000|"));
    // The directory is one of the disk, by its absolute path.
    QVERIFY(result["desktop"].startsWith(text("Desktop|2003|/")));
    QVERIFY(result["documents"] != text("(not said)"));
    QVERIFY(result["documents"] != text("null"));
}

int main(int argc, char** argv)
{
    if (argc == 3 && qstrcmp(argv[1], "probe") == 0) {
        return startupProbe(argc, argv, argv[2]);
    }
    QCoreApplication application(argc, argv);
    TestVfsStartup tests;
    return QTest::qExec(&tests, argc, argv);
}

#include "tst_vfs_startup.moc"
