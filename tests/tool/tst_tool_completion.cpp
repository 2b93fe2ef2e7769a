// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/terminalsession.h"
#include "support/toolrunner.h"

#include <QDir>
#include <QFileInfo>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QTest>

#include <unistd.h>

namespace {

QByteArrayList complete(const QStringList& words, const QString& directory = QString())
{
    const ToolResult result =
        runTool(QStringList({QStringLiteral("complete"), QStringLiteral("--")}) + words, directory);
    QByteArrayList candidates = result.out.split('\0');
    candidates.removeLast();
    return result.exitCode == 0 ? candidates : QByteArrayList({"failed"});
}

QString shell(const QString& name)
{
    return QStandardPaths::findExecutable(name);
}

/// The environment with the tool's directory in front of PATH.
QProcessEnvironment environmentWithTool()
{
    const QString directory = QFileInfo(toolPath()).path();
    return toolEnvironment(
        {{QStringLiteral("PATH"), directory + QLatin1Char(':') + qEnvironmentVariable("PATH")}});
}

} // namespace

class ToolCompletionTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void verbs();
    void options();
    void optionValues();
    void places();
    void files();
    void namesLikeOptions();
    void invalidNames();
    void hiddenFiles();
    void tilde();
    void scriptsParse_data();
    void scriptsParse();
    void bashFunction_data();
    void bashFunction();
    void bashForReal();
    void zshForReal();
};

void ToolCompletionTest::verbs()
{
    QCOMPARE(complete({QStringLiteral("li")}), QByteArrayList({"list"}));
    QCOMPARE(
        complete({QString()}),
        QByteArrayList(
            {"list", "tree", "info", "monitor", "parent", "resolve", "storage", "bookmark",
             "network", "mount", "unmount", "mounts", "update", "notify", "status", "help"}));
    QCOMPARE(
        complete({QStringLiteral("bookmark"), QString()}),
        QByteArrayList({"list", "add", "remove"}));
    QCOMPARE(
        complete({QStringLiteral("help"), QStringLiteral("network"), QStringLiteral("w")}),
        QByteArrayList({"workgroups"}));
    QCOMPARE(complete({}), complete({QString()}));
    QCOMPARE(
        complete({QStringLiteral("help"), QStringLiteral("mo")}),
        QByteArrayList({"monitor", "mount", "mounts"}));
    QCOMPARE(complete({QStringLiteral("--")}), QByteArrayList({"--help", "--version"}));
    QCOMPARE(complete({QStringLiteral("frobnicate"), QString()}), QByteArrayList());
}

void ToolCompletionTest::options()
{
    const QString list = QStringLiteral("list");
    QCOMPARE(complete({list, QStringLiteral("--no")}), QByteArrayList({"--no-links"}));
    QCOMPARE(complete({list, QStringLiteral("--so")}), QByteArrayList({"--sort="}));
    QVERIFY(complete({list, QStringLiteral("-")}).contains("--json"));
    QVERIFY(!complete({QStringLiteral("help"), QStringLiteral("-")}).contains("--json"));
    QCOMPARE(
        complete({QStringLiteral("mount"), QStringLiteral("--p")}),
        QByteArrayList({"--password-fd="}));
    // Behind "--" everything is an operand.
    QCOMPARE(
        complete({list, QStringLiteral("--"), QStringLiteral("--no")}, QStringLiteral("/usr")),
        QByteArrayList());
}

void ToolCompletionTest::optionValues()
{
    const QString list = QStringLiteral("list");
    QCOMPARE(
        complete({list, QStringLiteral("--color=a")}),
        QByteArrayList({"--color=auto", "--color=always"}));
    QCOMPARE(
        complete({list, QStringLiteral("--sort"), QStringLiteral("n")}),
        QByteArrayList({"name", "none"}));
    QCOMPARE(
        complete({list, QStringLiteral("-s"), QString()}),
        QByteArrayList({"name", "size", "time", "none"}));
    QCOMPARE(complete({QStringLiteral("tree"), QStringLiteral("-d"), QString()}), QByteArrayList());
}

void ToolCompletionTest::places()
{
    QTemporaryDir directory;
    const QString list = QStringLiteral("list");
    QCOMPARE(complete({list, QStringLiteral("Ho")}, directory.path()), QByteArrayList({"Home/"}));
    QCOMPARE(
        complete({list, QStringLiteral("File")}, directory.path()),
        QByteArrayList({"File System/"}));
    QCOMPARE(
        complete({list, QStringLiteral("Computer/")}),
        QByteArrayList(
            {"Computer/Home/", "Computer/Desktop/", "Computer/Trash/", "Computer/Storage devices/",
             "Computer/File System/"}));
    QVERIFY(complete({list, QStringLiteral("File System/us")}).contains("File System/usr/"));
    // Never opened for a look.
    QCOMPARE(complete({list, QStringLiteral("Samba/")}), QByteArrayList());
}

void ToolCompletionTest::files()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "file one"));
    QVERIFY(createFile(directory.path(), "line\nbreak"));
    QVERIFY(QDir(directory.path()).mkdir(QStringLiteral("folder")));
    QByteArrayList found =
        complete({QStringLiteral("info"), QStringLiteral("f")}, directory.path());
    std::sort(found.begin(), found.end());
    QCOMPARE(found, QByteArrayList({"file one", "folder/"}));
    QCOMPARE(
        complete({QStringLiteral("info"), QStringLiteral("./fi")}, directory.path()),
        QByteArrayList({"./file one"}));
    QCOMPARE(
        complete({QStringLiteral("info"), QStringLiteral("li")}, directory.path()),
        QByteArrayList({"line\nbreak"}));
}

void ToolCompletionTest::namesLikeOptions()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "-x"));
    const QString info = QStringLiteral("info");
    QVERIFY(complete({info, QString()}, directory.path()).contains("./-x"));
    QVERIFY(!complete({info, QString()}, directory.path()).contains("-x"));
    QVERIFY(!complete({info, QStringLiteral("-")}, directory.path()).contains("-x"));
    QCOMPARE(
        complete({info, QStringLiteral("--"), QStringLiteral("-")}, directory.path()),
        QByteArrayList({"-x"}));
}

void ToolCompletionTest::invalidNames()
{
    QTemporaryDir directory;
    const QByteArray link = QFile::encodeName(directory.path()) + "/in\377valid";
    QCOMPARE(::symlink("target", link.constData()), 0);
    const QString info = QStringLiteral("info");
    QCOMPARE(complete({info, QStringLiteral("in")}, directory.path()), QByteArrayList());
    QVERIFY(createFile(directory.path(), "in\357\277\275valid"));
    QCOMPARE(
        complete({info, QStringLiteral("in")}, directory.path()),
        QByteArrayList({"in\357\277\275valid"}));
}

void ToolCompletionTest::hiddenFiles()
{
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), ".hidden"));
    const QString info = QStringLiteral("info");
    QCOMPARE(complete({info, QStringLiteral("./")}, directory.path()), QByteArrayList());
    QCOMPARE(complete({info, QStringLiteral(".h")}, directory.path()), QByteArrayList({".hidden"}));
}

void ToolCompletionTest::tilde()
{
    QVERIFY(createFile(QDir::homePath(), "tildetest"));
    QCOMPARE(
        complete({QStringLiteral("info"), QStringLiteral("~/tildet")}),
        QByteArrayList({"~/tildetest"}));
    QVERIFY(QFile::remove(QDir::home().filePath(QStringLiteral("tildetest"))));
}

void ToolCompletionTest::scriptsParse_data()
{
    QTest::addColumn<QString>("program");
    QTest::addColumn<QString>("script");
    QTest::newRow("bash") << QStringLiteral("bash") << QStringLiteral("completion/veyfm-vfs.bash");
    QTest::newRow("zsh") << QStringLiteral("zsh") << QStringLiteral("completion/_veyfm-vfs");
}

void ToolCompletionTest::scriptsParse()
{
    QFETCH(const QString, program);
    QFETCH(const QString, script);
    if (shell(program).isEmpty()) {
        QSKIP("the shell is not installed");
    }
    const ToolResult result = runProgram(program, {QStringLiteral("-n"), toolSource(script)});
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.err, QByteArray());
}

void ToolCompletionTest::bashFunction_data()
{
    QTest::addColumn<QString>("line");
    QTest::addColumn<int>("type"); // The key of the completion, as bash has it.
    QTest::addColumn<QByteArray>("replies");
    const int tab = '\t';
    const int list = '?';
    const int menu = '%';
    const auto row = [](const char* name, const char* line, int type, const char* replies) {
        QTest::newRow(name) << QString::fromLatin1(line) << type << QByteArray(replies);
    };
    row("verb", "li", tab, "list\n");
    row("option", "list --no", tab, "--no-links\n");
    // From where bash replaces.
    row("value", "list --color=al", tab, "always\n");
    row("value apart", "list --sort ti", tab, "time\n");
    row("place", "list Hom", tab, "Home/\n");
    row("escaped", "list File\\ Sys", tab, "File\\ System/\n");
    // The second keeps bash from closing the quote.
    row("quoted", "list \"File Sys", tab, "File System/\nFile System/ \n");
    row("none", "list nothing/of/that", tab, "");
    // Of several nothing goes in but what they have in common.
    row("several", "list --color=", tab, "--color=auto\n--color=always\n--color=never\n \n");
    row("several in common", "list --color=a", list, "--color=auto\n--color=always\n");
    row("list", "list --color=", list, "--color=auto\n--color=always\n--color=never\n");
    row("menu", "list --color=a", menu, "auto\nalways\n");
    row("list of quoted", "list \"File Sys", list, "File System/\n");
}

void ToolCompletionTest::bashFunction()
{
    QFETCH(const QString, line);
    QFETCH(const int, type);
    QFETCH(const QByteArray, replies);
    if (shell(QStringLiteral("bash")).isEmpty()) {
        QSKIP("bash is not installed");
    }
    QTemporaryDir directory;
    // compopt works during a completion only; the tests on a terminal have the real one.
    const QString script =
        QStringLiteral("source \"$0\"\ncompopt() { :; }\n"
                       "COMP_LINE=\"veyfm-vfs $1\"\n"
                       "COMP_POINT=${#COMP_LINE}\n"
                       "COMP_TYPE=$2\n"
                       "COMP_WORDBREAKS=$' \\t\\n\"\\'@><=;|&(:'\n"
                       "_veyfm_vfs veyfm-vfs\n"
                       "((${#COMPREPLY[@]})) && printf '%s\\n' \"${COMPREPLY[@]}\"\n"
                       "exit 0");
    const ToolResult result = runProgram(
        QStringLiteral("bash"),
        {QStringLiteral("-c"), script, toolSource(QStringLiteral("completion/veyfm-vfs.bash")),
         line, QString::number(type)},
        directory.path(), environmentWithTool());
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, replies);
}

void ToolCompletionTest::bashForReal()
{
    const QString bash = shell(QStringLiteral("bash"));
    if (bash.isEmpty()) {
        QSKIP("bash is not installed");
    }
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "a long name"));
    TerminalSession session(
        bash, {QStringLiteral("--norc"), QStringLiteral("--noprofile"), QStringLiteral("-i")},
        directory.path(), environmentWithTool(), 200);
    session.type(
        "PS1=; bind 'set enable-bracketed-paste off'; source '" +
        toolSource(QStringLiteral("completion/veyfm-vfs.bash")).toLocal8Bit() +
        "'; echo rea''dy\n");
    QVERIFY(session.waitFor("ready"));
    session.type("veyfm-vfs li\t--"
                 "no-l\tCom\tHome\n");
    QVERIFY2(session.waitFor("list --no-links Computer/Home"), session.output().constData());
    session.type("veyfm-vfs list --col\tne\t-p . a\\ lo\t; echo EN''D\n");
    QVERIFY2(
        session.waitFor("list --color=never -p . a\\ long\\ name"), session.output().constData());
    QVERIFY2(session.waitFor("END"), session.output().constData());
    session.type("veyfm-vfs info File\tusr; echo L''AST\n");
    QVERIFY2(session.waitFor("info File\\ System/usr"), session.output().constData());
    QVERIFY2(session.waitFor("path: "), session.output().constData());
    QVERIFY2(session.waitFor("LAST"), session.output().constData());
    session.type("exit\n");
    QCOMPARE(session.waitForEnd(), 0);
}

void ToolCompletionTest::zshForReal()
{
    const QString zsh = shell(QStringLiteral("zsh"));
    if (zsh.isEmpty()) {
        QSKIP("zsh is not installed");
    }
    QTemporaryDir directory;
    QVERIFY(createFile(directory.path(), "a long name"));
    TerminalSession session(
        zsh, {QStringLiteral("-f"), QStringLiteral("-i")}, directory.path(), environmentWithTool(),
        200);
    session.type(
        "PS1=; unsetopt zle_bracketed_paste 2>/dev/null; fpath=('" +
        toolSource(QStringLiteral("completion")).toLocal8Bit() +
        "' $fpath); autoload -U compinit; compinit -u -D; bindkey -e; echo rea''dy\n");
    QVERIFY2(session.waitFor("ready\n"), session.output().constData());
    // What zle draws is hard to read; what the program makes of the line is not.
    session.type("veyfm-vfs res\ta\\ lo\t\n");
    QVERIFY2(session.waitFor("text: a long name\n"), session.output().constData());
    session.type("veyfm-vfs res\tFile\tusr\n");
    QVERIFY2(session.waitFor("text: File System/usr\n"), session.output().constData());
    session.type("veyfm-vfs par\t--col\tne\tHo\t\n");
    QVERIFY2(session.waitFor("Computer\nHome\n"), session.output().constData());
}

QTEST_GUILESS_MAIN(ToolCompletionTest)
#include "tst_tool_completion.moc"
