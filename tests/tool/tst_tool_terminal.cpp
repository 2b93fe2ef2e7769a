// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/terminalsession.h"
#include "support/toolrunner.h"

#include <QDir>
#include <QTemporaryDir>
#include <QTest>

namespace {

QByteArray onTerminal(
    const QStringList& arguments, const QString& directory,
    const QMap<QString, QString>& variables = {}, int columns = 80)
{
    TerminalSession session(toolPath(), arguments, directory, toolEnvironment(variables), columns);
    return session.waitForEnd() == 0 ? session.output() : QByteArray("failed: ") + session.output();
}

const QMap<QString, QString> noColour = {{QStringLiteral("NO_COLOR"), QStringLiteral("1")}};

} // namespace

/// What a person sees.
class ToolTerminalTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void columns();
    void columnsOfWideNames();
    void columnsVariableWins();
    void narrowTerminal();
    void everyLineFits();
    void coloursByKind();
    void noColorVariable();
    void colourOptionWins();
    void dumbTerminal();
    void controlCharactersAreEscaped();
    void directionsAreEscaped();
    void nullIsRaw();
    void titlesOfSeveralDirectories();
    void treeAndInfoColours();
};

void ToolTerminalTest::columns()
{
    QTemporaryDir directory;
    for (const char* name : {"a", "bb", "ccc", "dddd", "eeeee"}) {
        QVERIFY(createFile(directory.path(), name));
    }
    const QStringList list = {QStringLiteral("list")};
    QCOMPARE(
        onTerminal(list, directory.path(), noColour, 80), QByteArray("a  bb  ccc  dddd  eeeee\n"));
    // Filled from top to bottom.
    QCOMPARE(
        onTerminal(list, directory.path(), noColour, 16),
        QByteArray("a   ccc   eeeee\nbb  dddd\n"));
}

void ToolTerminalTest::columnsOfWideNames()
{
    QTemporaryDir directory;
    for (const char* name : {"\346\227\245\346\234\254", "a\314\210", "x", "y"}) {
        QVERIFY(createFile(directory.path(), name));
    }
    // Two columns a sign, and none for the combining dots.
    QCOMPARE(
        onTerminal({QStringLiteral("list")}, directory.path(), noColour, 10),
        QByteArray("a\314\210  y\nx  \346\227\245\346\234\254\n"));
}

void ToolTerminalTest::columnsVariableWins()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "aaaa"));
    QVERIFY(createFile(directory.path(), "bbbb"));
    QMap<QString, QString> variables = noColour;
    variables.insert(QStringLiteral("COLUMNS"), QStringLiteral("9"));
    QCOMPARE(
        onTerminal({QStringLiteral("list")}, directory.path(), variables, 80),
        QByteArray("aaaa\nbbbb\n"));
}

void ToolTerminalTest::narrowTerminal()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "a name longer than the terminal"));
    QVERIFY(createFile(directory.path(), "b"));
    QCOMPARE(
        onTerminal({QStringLiteral("list")}, directory.path(), noColour, 3),
        QByteArray("a name longer than the terminal\nb\n"));
}

void ToolTerminalTest::everyLineFits()
{
    QTemporaryDir directory;
    QByteArrayList names;
    for (int i = 0; i < 300; ++i) {
        names.append("n" + QByteArray::number(i) + QByteArray(i * i % 17, 'x'));
        QVERIFY(createFile(directory.path(), names.constLast()));
    }
    std::sort(names.begin(), names.end());
    for (const int width : {1, 20, 21, 80, 203}) {
        const QByteArray output =
            onTerminal({QStringLiteral("list")}, directory.path(), noColour, width);
        QByteArrayList words;
        const QList<QByteArray> lines = output.split('\n');
        for (const QByteArray& line : lines) {
            QVERIFY(line.size() <= std::max(width, 21));
            QVERIFY(!line.endsWith(' '));
            const QList<QByteArray> parts = line.simplified().split(' ');
            for (const QByteArray& part : parts) {
                if (!part.isEmpty()) {
                    words.append(part);
                }
            }
        }
        QVERIFY(width < 80 || lines.size() < 150);
        std::sort(words.begin(), words.end());
        QCOMPARE(words, names);
    }
}

void ToolTerminalTest::coloursByKind()
{
    QTemporaryDir directory;
    QVERIFY(QDir(directory.path()).mkdir(QStringLiteral("dir")));
    QVERIFY(QFile::link(QStringLiteral("gone"), directory.filePath(QStringLiteral("dangling"))));
    QVERIFY(QFile::link(QStringLiteral("dir"), directory.filePath(QStringLiteral("link"))));
    QVERIFY(createFile(directory.path(), "file"));
    QCOMPARE(
        onTerminal({QStringLiteral("list")}, directory.path()),
        QByteArray("\033[1;31mdangling\033[0m  \033[1;34mdir\033[0m  file  "
                   "\033[1;36mlink\033[0m\n"));
    QVERIFY(onTerminal({QStringLiteral("list"), QStringLiteral("Computer")}, directory.path())
                .startsWith("\033[1;35mHome\033[0m  "));
}

void ToolTerminalTest::noColorVariable()
{
    QTemporaryDir directory;
    QVERIFY(QDir(directory.path()).mkdir(QStringLiteral("dir")));
    QCOMPARE(onTerminal({QStringLiteral("list")}, directory.path(), noColour), QByteArray("dir\n"));
    // Set to nothing it means nothing.
    QCOMPARE(
        onTerminal(
            {QStringLiteral("list")}, directory.path(),
            {{QStringLiteral("NO_COLOR"), QStringLiteral("")}}),
        QByteArray("\033[1;34mdir\033[0m\n"));
}

void ToolTerminalTest::colourOptionWins()
{
    QTemporaryDir directory;
    QVERIFY(QDir(directory.path()).mkdir(QStringLiteral("dir")));
    QCOMPARE(
        onTerminal(
            {QStringLiteral("list"), QStringLiteral("--color=always")}, directory.path(), noColour),
        QByteArray("\033[1;34mdir\033[0m\n"));
    QCOMPARE(
        onTerminal({QStringLiteral("list"), QStringLiteral("--color=never")}, directory.path()),
        QByteArray("dir\n"));
}

void ToolTerminalTest::dumbTerminal()
{
    QTemporaryDir directory;
    QVERIFY(QDir(directory.path()).mkdir(QStringLiteral("dir")));
    QCOMPARE(
        onTerminal(
            {QStringLiteral("list")}, directory.path(),
            {{QStringLiteral("TERM"), QStringLiteral("dumb")}}),
        QByteArray("dir\n"));
}

void ToolTerminalTest::controlCharactersAreEscaped()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "\001\a\b\t\n\v\f\r\033[31m\177\\ \302\233x"));
    const QByteArray shown = "\\001\\a\\b\\t\\n\\v\\f\\r\\033[31m\\177\\\\ \\302\\233x\n";
    QCOMPARE(onTerminal({QStringLiteral("list")}, directory.path(), noColour), shown);
    const QByteArray full =
        onTerminal({QStringLiteral("list"), QStringLiteral("-l")}, directory.path(), noColour);
    QVERIFY2(full.endsWith("  " + shown), full.constData());
    // In messages, too.
    TerminalSession session(
        toolPath(), {QStringLiteral("list"), QStringLiteral("no\033thing")}, directory.path(),
        toolEnvironment());
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(session.output(), QByteArray("veyfm-vfs: no\\033thing: No such file or directory\n"));
}

void ToolTerminalTest::directionsAreEscaped()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "\342\200\256gpj.exe"));
    QCOMPARE(
        onTerminal({QStringLiteral("list")}, directory.path(), noColour),
        QByteArray("\\342\\200\\256gpj.exe\n"));
}

void ToolTerminalTest::nullIsRaw()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "a\tb"));
    QVERIFY(createFile(directory.path(), "c"));
    QCOMPARE(
        onTerminal({QStringLiteral("list"), QStringLiteral("-0")}, directory.path(), noColour),
        QByteArray("a\tb\0c\0", 6));
}

void ToolTerminalTest::titlesOfSeveralDirectories()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "x"));
    const QByteArray title = directory.path().toLocal8Bit() + ":\n";
    QCOMPARE(
        onTerminal(
            {QStringLiteral("list"), QStringLiteral("."), QStringLiteral(".")}, directory.path(),
            noColour),
        title + "x\n\n" + title + "x\n");
}

void ToolTerminalTest::treeAndInfoColours()
{
    QVERIFY(onTerminal({QStringLiteral("tree")}, QDir::tempPath())
                .contains("├── \033[1;35mHome\033[0m"));
    QVERIFY(onTerminal({QStringLiteral("info"), QStringLiteral("/usr")}, QDir::tempPath())
                .startsWith("path: \033[1;34m/usr\033[0m\n"));
}

QTEST_GUILESS_MAIN(ToolTerminalTest)
#include "tst_tool_terminal.moc"
