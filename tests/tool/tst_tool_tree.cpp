// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolrunner.h"

#include <QDir>
#include <QJsonObject>
#include <QTemporaryDir>
#include <QTest>

namespace {

QJsonArray childNodes(const QJsonValue& node)
{
    return node[QLatin1String("children")].toArray();
}

QStringList names(const QJsonArray& nodes)
{
    QStringList result;
    for (const QJsonValue& node : nodes) {
        result.append(node[QLatin1String("name")].toString());
    }
    return result;
}

ToolResult tree(const QStringList& arguments, const QString& directory = QString())
{
    return runTool(QStringList(QStringLiteral("tree")) + arguments, directory);
}

} // namespace

class ToolTreeTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void placesByDefault();
    void alignsLocalPaths();
    void levels();
    void directoriesOnRequest();
    void hiddenFiles();
    void directoryLinksAreNotFollowed();
    void opensPendingPlacesOnRequest();
    void jsonTree();
    void namesAreEscaped();
    void failures();
};

void ToolTreeTest::placesByDefault()
{
    const ToolResult result = tree({});
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.err.isEmpty());
    QList<QByteArray> names;
    const QList<QByteArray> lines = result.lines();
    for (const QByteArray& line : lines) {
        names.append(line.split('/').constFirst().trimmed());
    }
    QCOMPARE(
        names, QList<QByteArray>(
                   {"Favourites", "Computer", "├── Home", "├── Desktop", "├── Trash",
                    "├── Storage devices …", "└── File System", "Network", "└── Samba …"}));
}

void ToolTreeTest::alignsLocalPaths()
{
    const ToolResult result = tree({});
    const QByteArray home = QDir::homePath().toLocal8Bit();
    QVERIFY2(result.out.contains("\n├── Home         " + home + "\n"), result.out.constData());
    QVERIFY(result.out.contains("\n└── File System  /\n"));
}

void ToolTreeTest::levels()
{
    QCOMPARE(
        tree({QStringLiteral("--depth=1")}).out, QByteArray("Favourites\nComputer\nNetwork\n"));
    QCOMPARE(
        tree({QStringLiteral("-d"), QStringLiteral("0"), QStringLiteral("Computer")}).out,
        QByteArray("Computer\n"));
}

void ToolTreeTest::directoriesOnRequest()
{
    QTemporaryDir directory;
    QDir(directory.path()).mkpath(QStringLiteral("b/c"));
    QVERIFY(createFile(directory.path(), "a"));
    QVERIFY(createFile(directory.filePath(QStringLiteral("b/c")), "d"));
    const QByteArray top = directory.path().toLocal8Bit() + '\n';
    QCOMPARE(tree({directory.path()}).out, top + "├── a\n└── b\n");
    QCOMPARE(tree({QStringLiteral("-d1"), directory.path()}).out, top + "├── a\n└── b\n");
    QCOMPARE(
        tree({QStringLiteral("-d2"), directory.path()}).out, top + "├── a\n└── b\n    └── c\n");
    QCOMPARE(
        tree({QStringLiteral("-d9"), directory.path()}).out,
        top + "├── a\n└── b\n    └── c\n        └── d\n");
    // The same below a place.
    const QString below = QStringLiteral("Home/treetest");
    QVERIFY(QDir::home().mkpath(QStringLiteral("treetest/x")));
    const QByteArray shown = tree({below}).out;
    const QByteArray places = tree({QStringLiteral("Home"), QStringLiteral("-d2")}).out;
    QVERIFY(QDir::home().rmdir(QStringLiteral("treetest/x")));
    QVERIFY(QDir::home().rmdir(QStringLiteral("treetest")));
    QCOMPARE(shown, QByteArray("Home/treetest\n└── x\n"));
    QVERIFY2(places.contains("── treetest\n"), places.constData());
    QVERIFY2(places.contains("── x\n"), places.constData());
}

void ToolTreeTest::hiddenFiles()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), ".hidden"));
    const QByteArray top = directory.path().toLocal8Bit() + '\n';
    QCOMPARE(tree({directory.path()}).out, top);
    QCOMPARE(tree({QStringLiteral("-a"), directory.path()}).out, top + "└── .hidden\n");
}

void ToolTreeTest::directoryLinksAreNotFollowed()
{
    QTemporaryDir directory;
    QVERIFY(QFile::link(directory.path(), directory.filePath(QStringLiteral("loop"))));
    const QByteArray top = directory.path().toLocal8Bit() + '\n';
    QCOMPARE(tree({QStringLiteral("-d5"), directory.path()}).out, top + "└── loop\n");
    // A link that was asked for is.
    const QString link = directory.filePath(QStringLiteral("loop"));
    QCOMPARE(tree({link}).out, link.toLocal8Bit() + "\n└── loop\n");
}

void ToolTreeTest::opensPendingPlacesOnRequest()
{
    QVERIFY(tree({}).out.contains("Storage devices …"));
    QVERIFY(tree({QStringLiteral("-d2")}).out.contains("Storage devices …"));
    const ToolResult expanded = tree({QStringLiteral("--expand")});
    QCOMPARE(expanded.exitCode, 0);
    QVERIFY(expanded.out.contains("Storage devices\n"));
    QVERIFY(!expanded.out.contains("…"));
    QCOMPARE(tree({QStringLiteral("Samba")}).out, QByteArray("Samba\n"));
}

void ToolTreeTest::jsonTree()
{
    const ToolResult result = tree({QStringLiteral("--json")});
    QCOMPARE(result.exitCode, 0);
    const QJsonArray array = result.json();
    QCOMPARE(names(array), QStringList(QStringLiteral("_")));
    const QJsonArray tops = childNodes(array.first());
    QCOMPARE(
        names(tops),
        QStringList(
            {QStringLiteral("Favourites"), QStringLiteral("Computer"), QStringLiteral("Network")}));
    const QJsonArray computer = childNodes(tops.at(1));
    QCOMPARE(computer.first()[QLatin1String("localPath")].toString(), QDir::homePath());
    QCOMPARE(computer.first()[QLatin1String("opened")].toBool(), true);
    QCOMPARE(
        computer.at(3)[QLatin1String("typeName")].toString(), QStringLiteral("storage-devices"));
    QCOMPARE(computer.at(3)[QLatin1String("opened")].toBool(), false);
}

void ToolTreeTest::namesAreEscaped()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "line\nbreak"));
    QCOMPARE(tree({directory.path()}).out, directory.path().toLocal8Bit() + "\n└── line\\nbreak\n");
}

void ToolTreeTest::failures()
{
    const ToolResult result =
        tree({QStringLiteral("nothing"), QStringLiteral("Samba")}, QDir::tempPath());
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: nothing: No such file or directory\n"));
    QCOMPARE(result.out, QByteArray("Samba\n"));

    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "file"));
    const ToolResult file = tree({directory.filePath(QStringLiteral("file"))});
    QCOMPARE(file.exitCode, 0);
    QCOMPARE(file.out, directory.filePath(QStringLiteral("file")).toLocal8Bit() + '\n');
}

QTEST_GUILESS_MAIN(ToolTreeTest)
#include "tst_tool_tree.moc"
