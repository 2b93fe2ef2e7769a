// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolrunner.h"

#include <QDateTime>
#include <QDir>
#include <QJsonObject>
#include <QTemporaryDir>
#include <QTest>

#include <unistd.h>

namespace {

QJsonObject first(const ToolResult& result)
{
    return result.json().first().toObject();
}

QStringList texts(const QJsonValue& array)
{
    QStringList result;
    const QJsonArray elements = array.toArray();
    for (const QJsonValue& element : elements) {
        result.append(
            element.isObject() ? element[QLatin1String("path")].toString() : element.toString());
    }
    return result;
}

} // namespace

/// The verbs that tell about single entries: info, parent and resolve.
class ToolInfoTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void infoOfFile();
    void infoOfLink();
    void infoOfDanglingLink();
    void infoOfPlace();
    void infoOfUrl();
    void infoJson();
    void infoFailures();
    void parentOfPlaceAndFile();
    void parentFromAnotherRoot();
    void parentNullAndJson();
    void parentFailures();
    void resolveForms_data();
    void resolveForms();
    void resolveNeedsNoExistence();
    void resolveEscapesNames();
    void resolveFailures();
};

void ToolInfoTest::infoOfFile()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "a file", "12345"));
    const ToolResult result =
        runTool({QStringLiteral("info"), QStringLiteral("./a file")}, directory.path());
    QCOMPARE(result.exitCode, 0);
    const QByteArray path = directory.path().toLocal8Bit() + "/a file";
    const QList<QByteArray> lines = result.lines();
    QVERIFY(lines.contains("path: " + path));
    QVERIFY(lines.contains("local path: " + path));
    QVERIFY(lines.contains("type: file (10000)"));
    QVERIFY(lines.contains("URL: file://" + directory.path().toLocal8Bit() + "/a%20file"));
    QVERIFY(lines.contains("size: 5"));
    QVERIFY(lines.contains("readable: yes"));
    QVERIFY(lines.contains("executable: no"));
    QVERIFY(result.out.contains("\nowner: "));
    QVERIFY(result.out.contains('(' + QByteArray::number(::getuid()) + ")\n"));
    QVERIFY(result.out.contains("\nparents: Computer > File System > "));
    QVERIFY(result.out.contains("\nflags: file"));
}

void ToolInfoTest::infoOfLink()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "file", "12345"));
    const QString link = directory.filePath(QStringLiteral("link"));
    QVERIFY(QFile::link(QStringLiteral("file"), link));
    const ToolResult result = runTool({QStringLiteral("info"), link});
    QVERIFY(result.lines().contains("type: file-link (10003)"));
    QVERIFY(result.lines().contains("size: 4"));
    QVERIFY(result.lines().contains(
        "link target: " + directory.filePath(QStringLiteral("file")).toLocal8Bit()));
}

void ToolInfoTest::infoOfDanglingLink()
{
    QTemporaryDir directory;
    const QString link = directory.filePath(QStringLiteral("link"));
    QVERIFY(QFile::link(QStringLiteral("gone"), link));
    const ToolResult result = runTool({QStringLiteral("info"), link});
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.out.contains("\nlink target: "));
    QVERIFY(result.out.contains("missing\n"));
}

void ToolInfoTest::infoOfPlace()
{
    const ToolResult result =
        runTool({QStringLiteral("info"), QStringLiteral("Home"), QStringLiteral("Computer")});
    QCOMPARE(result.exitCode, 0);
    const QList<QByteArray> lines = result.lines();
    QVERIFY(lines.contains("type: home (2001)"));
    QVERIFY(lines.contains("local path: " + QDir::homePath().toLocal8Bit()));
    QVERIFY(lines.contains("parents: Computer"));
    QVERIFY(lines.contains("type: computer (1001)"));
    QVERIFY(lines.contains("URL: vey-fm:Computer"));
    QVERIFY(lines.contains("")); // Between the two.
}

void ToolInfoTest::infoOfUrl()
{
    const ToolResult result =
        runTool({QStringLiteral("info"), QStringLiteral("mailto:somebody@example.org")});
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.lines().contains("type: custom-url (30000)"));
    QVERIFY(!result.out.contains("\nsize: "));
}

void ToolInfoTest::infoJson()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "f\n", "12345"));
    const QDateTime before = QDateTime::currentDateTime().addSecs(-60);
    const QString path = directory.filePath(QStringLiteral("f\n"));
    const QJsonObject object =
        first(runTool({QStringLiteral("info"), QStringLiteral("--json"), path}));
    QCOMPARE(object[QLatin1String("path")].toString(), path);
    QCOMPARE(object[QLatin1String("size")].toInt(), 5);
    QCOMPARE(object[QLatin1String("ownerId")].toInt(), int(::getuid()));
    const QDateTime modified =
        QDateTime::fromString(object[QLatin1String("modified")].toString(), Qt::ISODate);
    QVERIFY(modified.isValid());
    QVERIFY(modified > before && modified <= QDateTime::currentDateTime());
    QCOMPARE(texts(object[QLatin1String("parents")]).value(1), QStringLiteral("Computer"));
    QVERIFY(texts(object[QLatin1String("flags")]).contains(QStringLiteral("file")));
    QVERIFY(object[QLatin1String("linkTarget")].isNull());
}

void ToolInfoTest::infoFailures()
{
    const ToolResult result = runTool(
        {QStringLiteral("info"), QStringLiteral("nothing"), QStringLiteral("Home"),
         QStringLiteral("Home/nothing")},
        QDir::tempPath());
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: nothing: No such file or directory\n"
                               "veyfm-vfs: Home/nothing: No such file or directory\n"));
    QVERIFY(result.out.startsWith("path: Home\n"));
}

void ToolInfoTest::parentOfPlaceAndFile()
{
    QCOMPARE(
        runTool({QStringLiteral("parent"), QStringLiteral("Home")}).out,
        QByteArray("Computer\nHome\n"));
    QCOMPARE(
        runTool({QStringLiteral("parent"), QStringLiteral("/usr/bin")}).out,
        QByteArray("Computer\nFile System\n/usr\n/usr/bin\n"));
    QVERIFY(createFile(QDir::homePath(), "parenttest"));
    QCOMPARE(
        runTool({QStringLiteral("parent"), QStringLiteral("Home/parenttest")}).out,
        QByteArray("Computer\nHome\nHome/parenttest\n"));
    QVERIFY(QFile::remove(QDir::home().filePath(QStringLiteral("parenttest"))));
    // The name of the top is shown only to who asks for it.
    QCOMPARE(runTool({QStringLiteral("parent"), QStringLiteral("_")}).out, QByteArray("_\n"));
}

void ToolInfoTest::parentFromAnotherRoot()
{
    QCOMPARE(
        runTool({QStringLiteral("parent"), QStringLiteral("--root=Places"), QStringLiteral("Home")})
            .out,
        QByteArray("Places\nHome\n"));
    const ToolResult noPlace =
        runTool({QStringLiteral("parent"), QStringLiteral("--root=/usr"), QStringLiteral("Home")});
    QCOMPARE(noPlace.exitCode, 1);
    QCOMPARE(noPlace.err, QByteArray("veyfm-vfs: /usr: not a place\n"));
}

void ToolInfoTest::parentNullAndJson()
{
    QCOMPARE(
        runTool({QStringLiteral("parent"), QStringLiteral("-0"), QStringLiteral("Home")}).out,
        QByteArray("Computer\0Home\0", 14));
    const QJsonObject object = first(
        runTool({QStringLiteral("parent"), QStringLiteral("--json"), QStringLiteral("Home")}));
    QCOMPARE(object[QLatin1String("path")].toString(), QStringLiteral("Home"));
    QCOMPARE(
        texts(object[QLatin1String("chain")]),
        QStringList({QStringLiteral("_"), QStringLiteral("Computer"), QStringLiteral("Home")}));
}

void ToolInfoTest::parentFailures()
{
    const ToolResult result =
        runTool({QStringLiteral("parent"), QStringLiteral("nothing")}, QDir::tempPath());
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: nothing: No such file or directory\n"));
}

void ToolInfoTest::resolveForms_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("typeName");
    const auto row = [](const char* text, const char* path, const char* type) {
        QTest::newRow(text) << QString::fromLatin1(text) << QString::fromLatin1(path)
                            << QString::fromLatin1(type);
    };
    row("/", "File System", "file-system-root");
    row("/usr/", "/usr", "directory");
    row("/usr/../etc", "File System/etc", "directory");
    row("Computer/Home", "Home", "home");
    row("vey-fm:Home", "Home", "home");
    row("file:///usr", "/usr", "directory");
    row("http://example.org", "http://example.org", "custom-url");
    row("sftp://example.org/x", "sftp://example.org/x", "fuse-url");
}

void ToolInfoTest::resolveForms()
{
    QFETCH(const QString, text);
    QFETCH(const QString, path);
    QFETCH(const QString, typeName);
    const ToolResult result = runTool({QStringLiteral("resolve"), text});
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.lines().contains("text: " + text.toLatin1()));
    QVERIFY(result.lines().contains("path: " + path.toLatin1()));
    const QJsonObject object =
        first(runTool({QStringLiteral("resolve"), QStringLiteral("--json"), text}));
    QCOMPARE(object[QLatin1String("text")].toString(), text);
    QCOMPARE(object[QLatin1String("path")].toString(), path);
    QCOMPARE(object[QLatin1String("typeName")].toString(), typeName);
}

void ToolInfoTest::resolveNeedsNoExistence()
{
    const ToolResult result =
        runTool({QStringLiteral("resolve"), QStringLiteral("nothing")}, QStringLiteral("/usr"));
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(
        result.out, QByteArray("text: nothing\npath: /usr/nothing\nlocal path: /usr/nothing\n"
                               "type: none (0)\nURL: file:///usr/nothing\nexists: no\n"));
    // Without its directory it has no URL.
    const QJsonObject lost = first(runTool(
        {QStringLiteral("resolve"), QStringLiteral("--json"), QStringLiteral("/nothing/x/y")}));
    QVERIFY(lost[QLatin1String("url")].isNull());
    const QJsonObject samba = first(
        runTool({QStringLiteral("resolve"), QStringLiteral("--json"), QStringLiteral("Samba")}));
    QCOMPARE(samba[QLatin1String("networkUrl")].toString(), QStringLiteral("smb:/"));
}

void ToolInfoTest::resolveEscapesNames()
{
    const ToolResult result =
        runTool({QStringLiteral("resolve"), QStringLiteral("/usr/a\nexists: \033yes\\")});
    QCOMPARE(result.lines().constFirst(), QByteArray("text: /usr/a\\nexists: \\033yes\\\\"));
    QVERIFY(result.lines().contains("exists: no"));
}

void ToolInfoTest::resolveFailures()
{
    const ToolResult result =
        runTool({QStringLiteral("resolve"), QStringLiteral("smb://host"), QStringLiteral("Home")});
    QCOMPARE(result.exitCode, 1);
    QVERIFY(result.err.startsWith("veyfm-vfs: smb://host: no URLs with the scheme 'smb' here"));
    QVERIFY(result.out.startsWith("text: Home\n"));
    const ToolResult json = runTool(
        {QStringLiteral("resolve"), QStringLiteral("--json"), QStringLiteral("Computer/nothing")});
    QCOMPARE(json.exitCode, 1);
    QCOMPARE(json.out, QByteArray("[]\n"));
}

QTEST_GUILESS_MAIN(ToolInfoTest)
#include "tst_tool_info.moc"
