// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolrunner.h"

#include <QFile>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QTest>

namespace {

/// The commands that a help text shows.
QStringList commandsIn(const ToolResult& help)
{
    QStringList commands;
    const QList<QByteArray> lines = help.lines();
    const int start = lines.indexOf("Commands:");
    for (int i = start + 1; start >= 0 && i < lines.size() && lines.at(i).startsWith("  "); ++i) {
        commands.append(QString::fromLatin1(lines.at(i).mid(2).split(' ').constFirst()));
    }
    return commands;
}

QStringList words(const QString& verb)
{
    return verb.split(QLatin1Char(' '));
}

/// The verbs that the help shows.
QStringList shownVerbs()
{
    return commandsIn(runTool({QStringLiteral("--help")}));
}

/// The same with the verbs of verbs, such as "storage list".
QStringList allShownVerbs()
{
    QStringList all;
    const QStringList verbs = shownVerbs();
    for (const QString& verb : verbs) {
        all.append(verb);
        const QStringList inner = commandsIn(runTool({verb, QStringLiteral("--help")}));
        for (const QString& word : inner) {
            all.append(verb + QLatin1Char(' ') + word);
        }
    }
    return all;
}

} // namespace

class ToolUsageTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void helpShowsAllVerbs();
    void verbHelp_data();
    void verbHelp();
    void version();
    void wrongUsage_data();
    void wrongUsage();
    void helpOfUnknownVerbFails();
    void dashesEndOptions();
    void outputErrorsAreTold();
    void closedDescriptorsAreOpened_data();
    void closedDescriptorsAreOpened();
    void libraryMessagesAreShownOnRequest();
    void manualPageIsClean();
    void manualPageNamesEveryOption();
};

void ToolUsageTest::helpShowsAllVerbs()
{
    const ToolResult result = runTool({QStringLiteral("--help")});
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.err.isEmpty());
    QCOMPARE(
        shownVerbs(),
        QStringList(
            {QStringLiteral("list"), QStringLiteral("tree"), QStringLiteral("info"),
             QStringLiteral("monitor"), QStringLiteral("parent"), QStringLiteral("resolve"),
             QStringLiteral("storage"), QStringLiteral("bookmark"), QStringLiteral("network"),
             QStringLiteral("mount"), QStringLiteral("unmount"), QStringLiteral("mounts"),
             QStringLiteral("update"), QStringLiteral("notify"), QStringLiteral("status"),
             QStringLiteral("help")}));
    QVERIFY(allShownVerbs().contains(QStringLiteral("storage eject")));
    QCOMPARE(runTool({QStringLiteral("-h")}).out, result.out);
    QCOMPARE(runTool({QStringLiteral("help")}).out, result.out);
}

void ToolUsageTest::verbHelp_data()
{
    QTest::addColumn<QString>("verb");
    QStringList verbs = allShownVerbs();
    QVERIFY(!verbs.isEmpty());
    verbs.append(QStringLiteral("complete"));
    for (const QString& verb : qAsConst(verbs)) {
        QTest::newRow(qPrintable(verb)) << verb;
    }
}

void ToolUsageTest::verbHelp()
{
    QFETCH(const QString, verb);
    const ToolResult result = runTool(words(verb) << QStringLiteral("--help"));
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.err.isEmpty());
    const QByteArray usage = "Usage:\n  veyfm-vfs " + verb.toLatin1();
    QVERIFY(
        result.out.startsWith(usage + " [OPTION...]") ||
        result.out.startsWith(usage + " COMMAND [OPTION...]"));
    QVERIFY(result.out.contains("--version"));
    // The sizes of a listing are for people by this option.
    if (verb != QLatin1String("list")) {
        QCOMPARE(runTool(words(verb) << QStringLiteral("-h")).out, result.out);
    }
    QCOMPARE(runTool(QStringList(QStringLiteral("help")) + words(verb)).out, result.out);
    const QList<QByteArray> lines = result.lines();
    for (const QByteArray& line : lines) {
        QVERIFY2(line.size() <= 100, line.constData());
    }
}

void ToolUsageTest::version()
{
    const ToolResult result = runTool({QStringLiteral("--version")});
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.out.startsWith("veyfm-vfs "));
    QCOMPARE(result.lines().size(), 1);
    QStringList verbs = allShownVerbs();
    for (const QString& verb : qAsConst(verbs)) {
        const ToolResult same = runTool(words(verb) << QStringLiteral("--version"));
        QCOMPARE(same.exitCode, 0);
        QCOMPARE(same.out, result.out);
    }
}

void ToolUsageTest::wrongUsage_data()
{
    QTest::addColumn<QStringList>("arguments");
    QTest::addColumn<QByteArray>("message");

    const auto row = [](const char* line, const char* message) {
        QTest::newRow(line) << QString::fromLatin1(line).split(QLatin1Char(' '), Qt::SkipEmptyParts)
                            << QByteArray(message);
    };
    row("", "veyfm-vfs: usage: a command is missing\n");
    row("frobnicate", "veyfm-vfs: usage: frobnicate: no such command\n");
    row("--json", "veyfm-vfs: usage: --json: an option needs a command before it\n");
    row("lsit", "veyfm-vfs: usage: lsit: no such command: did you mean 'list'?\n");
    row("Info", "veyfm-vfs: usage: Info: no such command: did you mean 'info'?\n");
    row("monitr", "veyfm-vfs: usage: monitr: no such command: did you mean 'monitor'?\n");
    row("bookmarks", "veyfm-vfs: usage: bookmarks: no such command: did you mean 'bookmark'?\n");
    row("complet", "veyfm-vfs: usage: complet: no such command\n");
    row("x", "veyfm-vfs: usage: x: no such command\n");
    row("storage lst", "veyfm-vfs: storage: lst: no such command: did you mean 'list'?\n");
    row("network frobnicate", "veyfm-vfs: network: frobnicate: no such command\n");
    row("list --frobnicate", "veyfm-vfs: list: unknown option 'frobnicate'\n");
    row("list -z", "veyfm-vfs: list: unknown option 'z'\n");
    row("list --sort", "veyfm-vfs: list: missing value after '--sort'\n");
    row("list --sort=colour",
        "veyfm-vfs: list: 'colour' is no value of --sort, which takes name, size, time, none\n");
    row("list --color=pink",
        "veyfm-vfs: list: 'pink' is no value of --color, which takes auto, always, never\n");
    row("list --json=yes", "veyfm-vfs: list: unexpected value after '--json'\n");
    row("list --json -0", "veyfm-vfs: list: --json and --null exclude each other\n");
    row("tree --depth", "veyfm-vfs: tree: missing value after '--depth'\n");
    row("tree --depth=deep", "veyfm-vfs: tree: 'deep' is no value of --depth: not a number\n");
    row("tree --depth=-1", "veyfm-vfs: tree: '-1' is no value of --depth: not a number\n");
    row("tree -0", "veyfm-vfs: tree: unknown option '0'\n");
    row("info", "veyfm-vfs: info: an operand is missing\n");
    row("info -l /", "veyfm-vfs: info: unknown option 'l'\n");
    row("monitor", "veyfm-vfs: monitor: an operand is missing\n");
    row("monitor -x /", "veyfm-vfs: monitor: unknown option 'x'\n");
    row("parent", "veyfm-vfs: parent: an operand is missing\n");
    row("parent --root", "veyfm-vfs: parent: missing value after '--root'\n");
    row("resolve", "veyfm-vfs: resolve: an operand is missing\n");
    row("resolve -0 /", "veyfm-vfs: resolve: unknown option '0'\n");
    row("help --json", "veyfm-vfs: help: unknown option 'json'\n");
}

void ToolUsageTest::wrongUsage()
{
    QFETCH(const QStringList, arguments);
    QFETCH(const QByteArray, message);
    const ToolResult result = runTool(arguments);
    QCOMPARE(result.exitCode, 2);
    QVERIFY(result.out.isEmpty());
    const QList<QByteArray> lines = result.err.split('\n');
    QCOMPARE(lines.constFirst() + '\n', message);
    QVERIFY(lines.value(1).startsWith("Try 'veyfm-vfs "));
}

void ToolUsageTest::helpOfUnknownVerbFails()
{
    const ToolResult result =
        runTool({QStringLiteral("help"), QStringLiteral("frobnicate"), QStringLiteral("list")});
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: frobnicate: no such command\n"));
    QVERIFY(result.out.contains("veyfm-vfs list"));
    QCOMPARE(
        runTool({QStringLiteral("help"), QStringLiteral("statsu")}).err,
        QByteArray("veyfm-vfs: statsu: no such command: did you mean 'status'?\n"));
}

void ToolUsageTest::dashesEndOptions()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "--json"));
    const ToolResult result = runTool(
        {QStringLiteral("resolve"), QStringLiteral("--"), QStringLiteral("--json")},
        directory.path());
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.out.contains("\nexists: yes\n"));
}

void ToolUsageTest::outputErrorsAreTold()
{
    const ToolResult result = runProgram(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"), QStringLiteral("exec \"$0\" tree >/dev/full"), toolPath()});
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: standard output: No space left on device\n"));
}

void ToolUsageTest::closedDescriptorsAreOpened_data()
{
    QTest::addColumn<QString>("closed");
    QTest::addColumn<bool>("prints");
    QTest::newRow("input") << QStringLiteral("<&-") << true;
    QTest::newRow("output") << QStringLiteral(">&-") << false;
    QTest::newRow("errors") << QStringLiteral("2>&-") << true;
    QTest::newRow("all") << QStringLiteral("<&- >&- 2>&-") << false;
}

void ToolUsageTest::closedDescriptorsAreOpened()
{
    QFETCH(const QString, closed);
    QFETCH(const bool, prints);
    const QString resolve = QStringLiteral("exec \"$0\" resolve / ");
    const ToolResult result =
        runProgram(QStringLiteral("/bin/sh"), {QStringLiteral("-c"), resolve + closed, toolPath()});
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.out.contains("path: /"), prints);

    // Nothing else of the program has their numbers.
    QTemporaryDir directory;
    QProcess process;
    process.setProcessChannelMode(QProcess::ForwardedChannels);
    process.start(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"), QStringLiteral("exec \"$0\" monitor \"$1\" ") + closed, toolPath(),
         directory.path()});
    const auto target = [&process](const QString& number) {
        return QFile::symLinkTarget(
            QStringLiteral("/proc/%1/fd/%2").arg(process.processId()).arg(number));
    };
    const QStringList numbers = closed.split(QLatin1Char(' '));
    for (const QString& redirection : numbers) {
        const QString number = redirection == QLatin1String("<&-")   ? QStringLiteral("0")
                               : redirection == QLatin1String(">&-") ? QStringLiteral("1")
                                                                     : QStringLiteral("2");
        QTRY_COMPARE(target(number), QStringLiteral("/dev/null"));
    }
    process.kill();
    process.waitForFinished();
}

void ToolUsageTest::libraryMessagesAreShownOnRequest()
{
    // There is no session bus in the tests; that is no concern of who looks at the tree.
    const ToolResult result = runTool({QStringLiteral("tree")});
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.err, QByteArray());
    const ToolResult verbose = runTool({QStringLiteral("tree"), QStringLiteral("--verbose")});
    QCOMPARE(verbose.exitCode, 0);
    QCOMPARE(verbose.out, result.out);
    QVERIFY(verbose.err.startsWith("veyfm-vfs: libveyfmvfs: "));
}

void ToolUsageTest::manualPageIsClean()
{
    if (QStandardPaths::findExecutable(QStringLiteral("groff")).isEmpty()) {
        QSKIP("groff is not installed");
    }
    const ToolResult result = runProgram(
        QStringLiteral("groff"),
        {QStringLiteral("-man"), QStringLiteral("-Tutf8"), QStringLiteral("-ww"),
         QStringLiteral("-Kutf8"), toolSource(QStringLiteral("veyfm-vfs.1"))});
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.err, QByteArray());
    QVERIFY(result.out.contains("VEYFM-VFS(1)"));
}

void ToolUsageTest::manualPageNamesEveryOption()
{
    QFile file(toolSource(QStringLiteral("veyfm-vfs.1")));
    QVERIFY(file.open(QIODevice::ReadOnly));
    const QByteArray page = file.readAll().replace("\\-", "-");
    const QStringList verbs = allShownVerbs();
    for (const QString& verb : verbs) {
        QVERIFY2(page.contains("\n.SS \"" + verb.toLatin1() + ' '), qPrintable(verb));
        const ToolResult candidates = runTool(
            QStringList({QStringLiteral("complete"), QStringLiteral("--")}) + words(verb) +
            QStringList(QStringLiteral("--")));
        const QList<QByteArray> options = candidates.out.split('\0');
        QVERIFY(options.size() > 2);
        for (QByteArray option : options) {
            if (option.endsWith('=')) {
                option.chop(1);
            }
            QVERIFY2(page.contains(option), option.constData());
        }
    }
}

QTEST_GUILESS_MAIN(ToolUsageTest)
#include "tst_tool_usage.moc"
