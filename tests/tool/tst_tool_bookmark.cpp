// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolscene.h"

#include <QTemporaryDir>
#include <QTest>

namespace {

const QString listMethod = QStringLiteral("FavouritePlacesManager.favouritePlaces");

QJsonObject favourites(const QList<QStringList>& records)
{
    QJsonArray array;
    for (const QStringList& record : records) {
        array.append(QJsonArray::fromStringList(record));
    }
    return scriptOf(listMethod, array);
}

QStringList changes(FakeServiceControl& service)
{
    QStringList found;
    const QStringList calls = service.calls();
    for (const QString& call : calls) {
        if (call.contains(QLatin1String("addFavourite")) ||
            call.contains(QLatin1String("removeFavourite"))) {
            found.append(call);
        }
    }
    return found;
}

} // namespace

class ToolBookmarkTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void lists();
    void tellsWhyNothingIsListed();
    void adds();
    void addsUnderDirectoryName();
    void refusesToAdd_data();
    void refusesToAdd();
    void addWithoutNewsFails();
    void addWaitsForNews();
    void removes_data();
    void removes();
    void removeWithoutNewsFails();
    void removesMissing();
    void completion();
};

void ToolBookmarkTest::lists()
{
    ToolScene scene(favourites(
        {{QStringLiteral("zeta"), QStringLiteral("/usr")},
         {QStringLiteral("a\033[0m\nb"), QStringLiteral("/tmp/x\ty")}}));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("bookmark list");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray("zeta         /usr\na\\033[0m\\nb  /tmp/x\\ty\n"));
    const QJsonArray json = scene.run("bookmark list --json").json();
    QCOMPARE(json.size(), 2);
    QCOMPARE(json.at(0)[QLatin1String("path")].toString(), QStringLiteral("Favourites/zeta"));
    QCOMPARE(json.at(1)[QLatin1String("name")].toString(), QStringLiteral("a\033[0m\nb"));
    QCOMPARE(json.at(1)[QLatin1String("localPath")].toString(), QStringLiteral("/tmp/x\ty"));
}

void ToolBookmarkTest::tellsWhyNothingIsListed()
{
    ToolScene scene(ruleOf(
        listMethod,
        {{QStringLiteral("error"), QStringLiteral("no file")}, {QStringLiteral("keep"), true}}));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("bookmark list");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: bookmark list: no file\n"));
    QCOMPARE(scene.run("bookmark remove x").err, QByteArray("veyfm-vfs: x: no file\n"));
}

void ToolBookmarkTest::adds()
{
    QTemporaryDir directory;
    ToolScene scene;
    QVERIFY(scene.isReady());
    const ToolResult result =
        scene.run("bookmark add", {directory.path(), QStringLiteral("My place")});
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(
        changes(scene.service()),
        QStringList(
            QStringLiteral("FavouritePlacesManager.addFavouritePlace[[\"My place\",\"%1\"]]")
                .arg(directory.path())));
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolBookmarkTest::addsUnderDirectoryName()
{
    QTemporaryDir directory;
    QVERIFY(QDir(directory.path()).mkdir(QStringLiteral("folder")));
    ToolScene scene;
    QVERIFY(scene.isReady());
    const ToolResult result =
        runTool(ToolScene::words("bookmark add folder"), directory.path(), scene.environment());
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(
        changes(scene.service()),
        QStringList(
            QStringLiteral("FavouritePlacesManager.addFavouritePlace[[\"folder\",\"%1/folder\"]]")
                .arg(directory.path())));
}

void ToolBookmarkTest::refusesToAdd_data()
{
    QTest::addColumn<QStringList>("operands");
    QTest::addColumn<QByteArray>("message");
    const auto row = [](const char* name, const QStringList& operands, const char* message) {
        QTest::newRow(name) << operands << QByteArray(message);
    };
    const QString usr = QStringLiteral("/usr");
    const QString etc = QStringLiteral("/etc");
    row("same directory", {usr, QStringLiteral("other")},
        "/usr: is a favourite already, as 'known'");
    row("same name", {etc, QStringLiteral("known")}, "known: is the favourite of /usr already");
    row("missing", {QStringLiteral("/nothing/here")}, "/nothing/here: No such file or directory");
    row("file", {QStringLiteral("/etc/passwd")}, "/etc/passwd: Not a directory");
    row("place", {QStringLiteral("Computer")}, "Computer: no directory on the disk");
    row("slash", {etc, QStringLiteral("a/b")},
        "a/b: no name for a place: give another behind the directory");
    row("dots", {etc, QStringLiteral("..")},
        "..: no name for a place: give another behind the directory");
    row("empty", {etc, QString()}, ": no name for a place: give another behind the directory");
}

void ToolBookmarkTest::refusesToAdd()
{
    QFETCH(const QStringList, operands);
    QFETCH(const QByteArray, message);
    ToolScene scene(favourites({{QStringLiteral("known"), QStringLiteral("/usr")}}));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("bookmark add", operands);
    QCOMPARE(result.err, "veyfm-vfs: " + message + '\n');
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(changes(scene.service()), QStringList());
}

void ToolBookmarkTest::addWithoutNewsFails()
{
    ToolScene scene({{QStringLiteral("echo"), false}});
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("bookmark add --timeout=1 /etc");
    QCOMPARE(
        result.err,
        QByteArray("veyfm-vfs: etc: asked for, but the service told of no change within 1 s\n"));
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(changes(scene.service()).size(), 1);
    // The news of something else are not those.
    scene.service().setRules(
        QStringLiteral("FavouritePlacesManager.addFavouritePlace"),
        {QJsonObject{
            {QStringLiteral("signals"),
             QJsonArray{QJsonArray{
                 QStringLiteral("FavouritePlacesManager"), QStringLiteral("favouritePlaceAdded"),
                 QJsonArray{QJsonArray{QStringLiteral("etc"), QStringLiteral("/usr/share")}}}}}}});
    QCOMPARE(scene.run("bookmark add --timeout=1 /etc").exitCode, 1);
    const ToolResult usage = scene.run("bookmark add --timeout=soon /etc");
    QCOMPARE(usage.exitCode, 2);
}

void ToolBookmarkTest::addWaitsForNews()
{
    // The answer comes at once, and the news when the test gives them.
    ToolScene scene({{QStringLiteral("echo"), false}});
    QVERIFY(scene.isReady());
    QProcess tool;
    tool.setProcessEnvironment(scene.environment());
    tool.start(toolPath(), ToolScene::words("bookmark add --timeout=60 /etc"));
    QTRY_COMPARE_WITH_TIMEOUT(changes(scene.service()).size(), 1, 20000);
    QCOMPARE(tool.state(), QProcess::Running);
    scene.service().emitSignal(
        QStringLiteral("FavouritePlacesManager"), QStringLiteral("favouritePlaceAdded"),
        oneArgument(QJsonArray{QStringLiteral("etc"), QStringLiteral("/etc")}));
    QTRY_COMPARE_WITH_TIMEOUT(tool.state(), QProcess::NotRunning, 20000);
    QCOMPARE(tool.exitCode(), 0);
    QCOMPARE(tool.readAllStandardError(), QByteArray());
}

void ToolBookmarkTest::removes_data()
{
    QTest::addColumn<QString>("operand");
    QTest::addColumn<QString>("name");
    const QString known = QStringLiteral("known");
    QTest::newRow("name") << known << known;
    QTest::newRow("path") << QStringLiteral("Favourites/known") << known;
    QTest::newRow("directory") << QStringLiteral("/usr") << known;
    QTest::newRow("untidy directory") << QStringLiteral("/usr/../usr/") << known;
    QTest::newRow("hostile") << QStringLiteral("../\nx") << QStringLiteral("../\nx");
}

void ToolBookmarkTest::removes()
{
    QFETCH(const QString, operand);
    QFETCH(const QString, name);
    ToolScene scene(favourites({{name, QStringLiteral("/usr")}}));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("bookmark remove", {operand});
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(changes(scene.service()).size(), 1);
    QVERIFY(changes(scene.service()).constFirst().contains(QLatin1String("\"/usr\"")));
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolBookmarkTest::removeWithoutNewsFails()
{
    QJsonObject script = favourites({{QStringLiteral("known"), QStringLiteral("/usr")}});
    script.insert(QStringLiteral("echo"), false);
    ToolScene scene(script);
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("bookmark remove --timeout=1 known");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err,
        QByteArray("veyfm-vfs: known: asked for, but the service told of no change within 1 s\n"));
}

void ToolBookmarkTest::removesMissing()
{
    ToolScene scene(favourites({{QStringLiteral("known"), QStringLiteral("/usr")}}));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("bookmark remove nothing known known");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: nothing: no such favourite\n"
                               "veyfm-vfs: known: no such favourite\n"));
    QCOMPARE(changes(scene.service()).size(), 1);
}

void ToolBookmarkTest::completion()
{
    ToolScene scene(favourites({{QStringLiteral("known"), QStringLiteral("/usr")}}));
    QVERIFY(scene.isReady());
    QCOMPARE(scene.run("complete -- bookmark remove k").out, QByteArray("known\0", 6));
    QCOMPARE(scene.run("complete -- bookmark add --ti").out, QByteArray("--timeout=\0", 11));
}

QTEST_GUILESS_MAIN(ToolBookmarkTest)
#include "tst_tool_bookmark.moc"
