// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/terminalsession.h"
#include "support/toolrunner.h"

#include <QDir>
#include <QFile>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QTest>

#include <algorithm>
#include <map>
#include <memory>

#include <dirent.h>
#include <sys/stat.h>

namespace {

const char* const bashCompletion = "/usr/share/bash-completion/bash_completion";

/// A shell at a terminal, with the completion of the tool, where the tool itself is one that
/// completes but else only records what it is given.
class Shell
{
public:
    explicit Shell(const QByteArray& name)
    {
        const QString bin = m_directory.filePath(QStringLiteral("bin"));
        const QByteArray script = "#!/bin/sh\n"
                                  "if [ \"$1\" = complete ]; then exec '" +
                                  toolPath().toLocal8Bit() +
                                  "' \"$@\"; fi\n"
                                  "printf '%s\\0' \"$@\" >'" +
                                  record().toLocal8Bit() +
                                  "'\n"
                                  "echo RECORD''ED >/dev/tty\n";
        if (!QDir().mkdir(bin) || !createFile(bin, "veyfm-vfs", script) ||
            !QFile::setPermissions(
                bin + QLatin1String("/veyfm-vfs"), QFile::ReadOwner | QFile::ExeOwner)) {
            return;
        }

        const bool isZsh = name == "zsh";
        const QString program =
            QStandardPaths::findExecutable(isZsh ? QStringLiteral("zsh") : QStringLiteral("bash"));
        const QByteArray source = toolSource(QStringLiteral("completion")).toLocal8Bit();
        QByteArray start;
        QStringList arguments;
        if (isZsh) {
            arguments = QStringList({QStringLiteral("-f"), QStringLiteral("-i")});
            start = "PS1=; unsetopt prompt_sp; unset zle_bracketed_paste; fpath=('" + source +
                    "' $fpath); autoload -U compinit; compinit -u -D; bindkey -e; ";
        } else {
            arguments = QStringList(
                {QStringLiteral("--norc"), QStringLiteral("--noprofile"), QStringLiteral("-i")});
            start = "PS1=; bind 'set enable-bracketed-paste off'; ";
            if (name == "bash-completion") {
                start += QByteArray("source ") + bashCompletion + "; ";
            }
            start += "source '" + source + "/veyfm-vfs.bash'; ";
        }
        m_session = std::make_unique<TerminalSession>(
            program, arguments, m_directory.path(),
            toolEnvironment(
                {{QStringLiteral("PATH"), bin + QLatin1Char(':') + qEnvironmentVariable("PATH")},
                 {QStringLiteral("LC_ALL"), QStringLiteral("C.UTF-8")},
                 {QStringLiteral("HISTFILE"), QString()}}),
            250);
        m_session->type(start + "echo REA''DY\n");
        m_isReady = m_session->waitFor("READY\n");
    }

    bool isReady() const
    {
        return m_isReady;
    }

    /// Types the keys and Enter in a directory with these files. What the program was given.
    QByteArrayList type(const QByteArrayList& files, const QByteArray& keys)
    {
        ++m_count;
        const QByteArray directory =
            m_directory.path().toLocal8Bit() + "/d" + QByteArray::number(m_count);
        if (::mkdir(directory.constData(), 0700) != 0) {
            return {"no directory"};
        }
        QByteArrayList made;
        for (const QByteArray& file : files) {
            const int slash = file.indexOf('/');
            const QByteArray folder = directory + '/' + file.left(slash);
            if (slash >= 0) {
                ::mkdir(folder.constData(), 0700);
            }
            if (!createFile(QFile::decodeName(directory), file)) {
                return {"no file " + file};
            }
            made.append(slash >= 0 ? file.left(slash) : file);
        }
        m_session->type("cd '" + directory + "'\n" + keys + '\n');
        if (!m_session->waitFor("RECORDED\n", m_count)) {
            return {"no end", m_session->output().right(1000)};
        }
        QFile file(record());
        if (!file.open(QIODevice::ReadOnly)) {
            return {"no record"};
        }
        QByteArrayList arguments = file.readAll().split('\0');
        arguments.removeLast();
        // What stands in the names has not run.
        std::sort(made.begin(), made.end());
        made.erase(std::unique(made.begin(), made.end()), made.end());
        const QByteArrayList left = namesIn(directory);
        return left == made ? arguments : QByteArrayList({"other files"}) + left;
    }

private:
    QString record() const
    {
        return m_directory.filePath(QStringLiteral("record"));
    }

    static QByteArrayList namesIn(const QByteArray& directory)
    {
        QByteArrayList names;
        DIR* const stream = ::opendir(directory.constData());
        while (const dirent* entry = stream ? ::readdir(stream) : nullptr) {
            const QByteArray name = entry->d_name;
            if (name != "." && name != "..") {
                names.append(name);
            }
        }
        if (stream) {
            ::closedir(stream);
        }
        std::sort(names.begin(), names.end());
        return names;
    }

    QTemporaryDir m_directory;
    std::unique_ptr<TerminalSession> m_session;
    bool m_isReady = false;
    int m_count = 0;
};

bool isInstalled(const QByteArray& shell)
{
    if (shell == "bash-completion") {
        return QFile::exists(QLatin1String(bashCompletion));
    }
    return !QStandardPaths::findExecutable(QString::fromLatin1(shell)).isEmpty();
}

} // namespace

/// What Enter hands to the program behind keys that were typed, byte by byte.
class ToolCompletionKeysTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void arguments_data();
    void arguments();
    void names_data();
    void names();
    void cleanupTestCase();

private:
    void check(const QByteArrayList& files, const QByteArray& keys, const QByteArrayList& expected);

    std::map<QByteArray, std::unique_ptr<Shell>> m_shells;
};

void ToolCompletionKeysTest::check(
    const QByteArrayList& files, const QByteArray& keys, const QByteArrayList& expected)
{
    QFETCH(const QByteArray, shell);
    if (!isInstalled(shell)) {
        QSKIP("the shell is not installed");
    }
    std::unique_ptr<Shell>& used = m_shells[shell];
    if (!used) {
        used = std::make_unique<Shell>(shell);
    }
    QVERIFY(used->isReady());
    const QByteArray command = keys.contains("veyfm-vfs") ? QByteArray() : QByteArray("veyfm-vfs ");
    const QByteArrayList found = used->type(files, command + keys);
    if (found != expected) {
        used.reset(); // Nobody knows what it would make of further keys.
    }
    QCOMPARE(found, expected);
}

void ToolCompletionKeysTest::arguments_data()
{
    QTest::addColumn<QByteArray>("shell");
    QTest::addColumn<QByteArrayList>("files");
    QTest::addColumn<QByteArray>("keys");
    QTest::addColumn<QByteArrayList>("expected");

    const QByteArrayList bash = {"bash", "bash-completion"};
    const QByteArrayList all = bash + QByteArrayList({"zsh"});
    const auto rowsFor = [](const QByteArrayList& shells, const QByteArrayList& files,
                            const QByteArray& keys, const QByteArrayList& expected) {
        for (const QByteArray& shell : shells) {
            const QByteArray name = shell + ": " + keys + " of " + files.join(", ");
            QTest::newRow(name.toPercentEncoding(" \t$'\"(),:/\\*!#~=@{}").constData())
                << shell << files << keys << expected;
        }
    };
    const auto rows = [&](const QByteArrayList& files, const QByteArray& keys,
                          const QByteArrayList& expected) {
        rowsFor(all, files, keys, expected);
    };

    // Verbs, options and their values.
    rows({"list/file"}, "lis\t.", {"list", "."});
    rows({"file"}, "help li\t", {"help", "list"});
    rows({"file"}, "list --no\t--col\tal\tfi\t", {"list", "--no-links", "--color=always", "file"});
    rows({"file"}, "list --color=n\t", {"list", "--color=never"});
    rows({"file"}, "list --sort ti\t", {"list", "--sort", "time"});
    rows({"file"}, "info nothing\t", {"info", "nothing"});

    // Names that begin with a dash.
    rows({"-$(touch x)"}, "info -- -\t", {"info", "--", "-$(touch x)"});
    rows({"-$(touch x)"}, "info -- \"-\t", {"info", "--", "-$(touch x)"});
    rows({"-$(touch x)"}, "info -- '-\t", {"info", "--", "-$(touch x)"});
    rows({"-$(touch x)"}, "info ./-\t", {"info", "./-$(touch x)"});

    // Breaks of words.
    rows({"co:lon x"}, "info co:\t", {"info", "co:lon x"});
    rows({"co:lon x"}, "info ./co\\:\t", {"info", "./co:lon x"});
    rows({"at@sign x"}, "info at@\t", {"info", "at@sign x"});
    rows({"at@sign x"}, "info at@s\t", {"info", "at@sign x"});
    rows({"e=qual x"}, "info e=\t", {"info", "e=qual x"});
    rows({"e=q:u@a l"}, "info e=q:\t", {"info", "e=q:u@a l"});
    rows({"e=q:u@a l"}, "info \"e=q:\t", {"info", "e=q:u@a l"});
    rows({"e=q:u@a l"}, "info e'=q':\t", {"info", "e=q:u@a l"});

    // What is typed in quotes, or half so, or behind a backslash.
    rows({"two words!"}, "info two\\ \t", {"info", "two words!"});
    rows({"two words!"}, "info two\\\t", {"info", "two words!"});
    rows({"two words!"}, "info 'two 'w\t", {"info", "two words!"});
    rows({"two words!"}, "info two' wo'\t", {"info", "two words!"});
    rows({"two words!"}, "info two' \t", {"info", "two words!"});
    rows({"two words!"}, "info two\" \t", {"info", "two words!"});
    rows({"two words!"}, "info 'two'\002\t", {"info", "two words!"});
    rows({"back\\slash x"}, "info back\\\\\t", {"info", "back\\slash x"});
    rows({"back\\slash x"}, "info \"back\\\\\t", {"info", "back\\slash x"});
    rows({"back\\slash x"}, "info 'back\\\t", {"info", "back\\slash x"});
    rows({"a!b c"}, "info a\\!\t", {"info", "a!b c"});
    rowsFor(bash, {"a*b c", "axx"}, "info a*\t", {"info", "a*b c"}); // zsh expands it.
    rows({"a*b c", "axx"}, "info a\\*\t", {"info", "a*b c"});
    rows({"a#b c"}, "info a#\t", {"info", "a#b c"});
    rows({"#a b"}, "info \\#\t", {"info", "#a b"});

    // Directories, and names that begin alike.
    rows({"d d/f f"}, "info d\tf\t", {"info", "d d/f f"});
    rows({"d d/f f"}, "info \"d\tf\t", {"info", "d d/f f"});
    rows({"d d/f f"}, "info 'd\tf\t", {"info", "d d/f f"});
    rows({"aa b", "aa'c"}, "info a\t", {"info", "aa"});
    rows({"aa b", "aa'c"}, "info a\t\\ \t", {"info", "aa b"});
    rows({"aa b", "aa'c"}, "info \"a\t \t", {"info", "aa b"});
    rows({"a\nb", "a\nc"}, "info a\tc\t", {"info", "a\nc"});
    rows({"a\nb", "a\nc"}, "info \"a\tc\t", {"info", "a\nc"});
    rows({"a\nb", "a\nc"}, "info 'a\tc\t", {"info", "a\nc"});
    rows({"a\033b", "a\tc"}, "info a\t", {"info", "a"});
    rows({" lead", " leaf"}, "info ./\td\t", {"info", "./ lead"});
    rows({" a", "  b"}, "info ./\ta\t", {"info", "./ a"});
    rows(
        {"\346\227\245 x", "\346\227\246 y"}, "info ./\t\346\227\246\t",
        {"info", "./\346\227\246 y"});

    // What the shell makes of a line beside the words.
    rows({"~/f f"}, "info \"~/\t", {"info", "~/f f"});
    rows({"f f"}, "info f\t > /dev/null; true", {"info", "f f"});
    rows({"f f"}, "info 2>/dev/null f\t", {"info", "f f"});
    rows({"f f"}, "info $(echo a b) f\t", {"info", "a", "b", "f f"});
    rows({"f f"}, "info `echo a` f\t", {"info", "a", "f f"});
    rows({"f f"}, "info $TERM f\t", {"info", "xterm", "f f"});
    rows({"f f"}, "true; X='1 2' veyfm-vfs info f\t; true", {"info", "f f"});
    rowsFor(bash, {"xterm x"}, "info $TERM\t", {"info", "xterm x"});
    rowsFor(bash, {"xterm x"}, "info \"${TERM} \t", {"info", "xterm x"});

    // Names that nobody can type are not offered.
    rows({"bad\377name"}, "info bad\t", {"info", "bad"});

    // One after the other from a menu.
    rowsFor({"zsh"}, {"a$(touch 1)", "a`touch 2`"}, "info a\t\t", {"info", "a$(touch 1)"});
}

void ToolCompletionKeysTest::arguments()
{
    QFETCH(const QByteArrayList, files);
    QFETCH(const QByteArray, keys);
    QFETCH(const QByteArrayList, expected);
    check(files, keys, expected);
}

void ToolCompletionKeysTest::names_data()
{
    QTest::addColumn<QByteArray>("shell");
    for (const char* const shell : {"bash", "zsh"}) {
        QTest::newRow(shell) << QByteArray(shell);
    }
}

void ToolCompletionKeysTest::names()
{
    const QByteArrayList names = {
        "-$(touch x)",
        "two words",
        "sin'gle",
        "dou\"ble",
        "bang!bang",
        "tick`touch x`",
        "line\nbreak",
        "st*ar",
        "que?stion",
        "~tilde",
        "~/x",
        "co:lon",
        "at@sign",
        "e=qual",
        "=equal",
        "#hash",
        "\303\274ml\303\244ut",
        "\346\227\245\346\234\254",
        "back\\slash",
        "semi;colon",
        "t\tab",
        "br{a,b}ace",
        "br[ab]acket",
        "do$llar",
        "$HOME",
        "esc\033[31m",
        "del\177",
        "c1\302\233",
        "^caret",
        "per%cent",
        "(parens)",
        "am&p",
        "pi|pe",
        "<less>",
        "end'",
        "end\"",
        "end\\",
        "end!",
        "end\n",
        " lead",
        "trail ",
        "!!",
        "\\",
        "'",
        "\"",
        "$",
        "a'b\"c!d`e\\f g"};
    for (const QByteArray& name : names) {
        for (const char* const quote : {"", "\"", "'"}) {
            const QByteArray file = name.contains('/') ? name : "d/" + name;
            // The tab alone, where the name is the only one.
            check(
                {file},
                "info " + QByteArray(quote) + "./" + (name.contains('/') ? "~/" : "d/") + '\t',
                {"info", "./" + file});
            if (QTest::currentTestFailed()) {
                return;
            }
        }
    }
}

void ToolCompletionKeysTest::cleanupTestCase()
{
    m_shells.clear();
}

QTEST_GUILESS_MAIN(ToolCompletionKeysTest)
#include "tst_tool_completion_keys.moc"
