// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolrunner.h"

#include <QDir>
#include <QJsonObject>
#include <QTemporaryDir>
#include <QTest>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

/// Names of a JSON listing.
QStringList names(const QJsonArray& array)
{
    QStringList result;
    for (const QJsonValue& value : array) {
        result.append(value[QLatin1String("name")].toString());
    }
    return result;
}

void setModified(const QString& path, qint64 seconds)
{
    const timespec times[] = {{seconds, 0}, {seconds, 0}};
    QCOMPARE(::utimensat(AT_FDCWD, path.toLocal8Bit().constData(), times, AT_SYMLINK_NOFOLLOW), 0);
}

} // namespace

class ToolListTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void workingDirectoryIsTheDefault();
    void oneEntryALine();
    void hiddenFiles();
    void pathsOnRequest();
    void linksCanBeLeftOut();
    void sorting();
    void longListing();
    void jsonListing();
    void emptyDirectory();
    void places();
    void urls();
    void severalOperands();
    void failures_data();
    void failures();
    void unreadableDirectory();
    void rawNamesInPipes();
    void nullEndsRecords();
    void invalidNames();
    void directoriesAreReadOnce_data();
    void directoriesAreReadOnce();
    void namesWithByteOrderMarks();
    void sizesForPeople_data();
    void sizesForPeople();
    void otherName();
    void plainLocale();
    void colourOnRequest();

private:
    QString path(const QString& name) const
    {
        return m_directory->filePath(name);
    }
    ToolResult list(const QStringList& arguments) const
    {
        return runTool(QStringList(QStringLiteral("list")) + arguments, m_directory->path());
    }

    QScopedPointer<QTemporaryDir> m_directory;
};

void ToolListTest::init()
{
    m_directory.reset(new QTemporaryDir);
    QVERIFY(m_directory->isValid());
}

void ToolListTest::cleanup()
{
    m_directory.reset();
}

void ToolListTest::workingDirectoryIsTheDefault()
{
    QVERIFY(createFile(m_directory->path(), "only"));
    QCOMPARE(list({}).out, QByteArray("only\n"));
}

void ToolListTest::oneEntryALine()
{
    QVERIFY(createFile(m_directory->path(), "b"));
    QVERIFY(createFile(m_directory->path(), "a b"));
    QVERIFY(createFile(m_directory->path(), "\303\244"));
    QVERIFY(QDir(m_directory->path()).mkdir(QStringLiteral("c")));
    const ToolResult result = list({QStringLiteral(".")});
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray("a b\nb\nc\n\303\244\n"));
    QVERIFY(result.err.isEmpty());
}

void ToolListTest::hiddenFiles()
{
    QVERIFY(createFile(m_directory->path(), ".hidden"));
    QVERIFY(createFile(m_directory->path(), "shown"));
    QCOMPARE(list({}).out, QByteArray("shown\n"));
    QCOMPARE(list({QStringLiteral("-a")}).out, QByteArray(".hidden\nshown\n"));
    QCOMPARE(list({QStringLiteral("--all")}).out, QByteArray(".hidden\nshown\n"));
}

void ToolListTest::pathsOnRequest()
{
    QVERIFY(createFile(m_directory->path(), "x"));
    QCOMPARE(list({QStringLiteral("--paths")}).out, path(QStringLiteral("x")).toLocal8Bit() + '\n');
    QCOMPARE(
        list({QStringLiteral("-p"), QStringLiteral("Computer")}).lines().constFirst(),
        QByteArray("Home"));
}

void ToolListTest::linksCanBeLeftOut()
{
    QVERIFY(createFile(m_directory->path(), "file"));
    QVERIFY(QFile::link(QStringLiteral("file"), path(QStringLiteral("link"))));
    QCOMPARE(list({}).out, QByteArray("file\nlink\n"));
    QCOMPARE(list({QStringLiteral("--no-links")}).out, QByteArray("file\n"));
}

void ToolListTest::sorting()
{
    QVERIFY(createFile(m_directory->path(), "a", "12"));
    QVERIFY(createFile(m_directory->path(), "b", "123"));
    QVERIFY(createFile(m_directory->path(), "c", "1"));
    setModified(path(QStringLiteral("a")), 3000);
    setModified(path(QStringLiteral("b")), 1000);
    setModified(path(QStringLiteral("c")), 2000);
    QCOMPARE(list({QStringLiteral("--sort=name")}).out, QByteArray("a\nb\nc\n"));
    QCOMPARE(list({QStringLiteral("-r")}).out, QByteArray("c\nb\na\n"));
    QCOMPARE(list({QStringLiteral("--sort=size")}).out, QByteArray("b\na\nc\n"));
    QCOMPARE(list({QStringLiteral("-s"), QStringLiteral("time")}).out, QByteArray("a\nc\nb\n"));
    QCOMPARE(
        list({QStringLiteral("--sort=time"), QStringLiteral("--reverse")}).out,
        QByteArray("b\nc\na\n"));

    // The order of the disk is not known, but it is one and can be turned round.
    QList<QByteArray> disk = list({QStringLiteral("--unsorted")}).lines();
    QCOMPARE(list({QStringLiteral("--sort=none")}).lines(), disk);
    std::reverse(disk.begin(), disk.end());
    QCOMPARE(list({QStringLiteral("-Ur")}).lines(), disk);
    std::sort(disk.begin(), disk.end());
    QCOMPARE(disk, QList<QByteArray>({"a", "b", "c"}));
}

void ToolListTest::longListing()
{
    QVERIFY(createFile(m_directory->path(), "file", "12345"));
    QVERIFY(QFile::link(QStringLiteral("file"), path(QStringLiteral("link"))));
    setModified(path(QStringLiteral("file")), 86400);
    setModified(path(QStringLiteral("link")), 86460);
    const ToolResult result = runTool(
        {QStringLiteral("list"), QStringLiteral("--long")}, m_directory->path(),
        toolEnvironment({{QStringLiteral("TZ"), QStringLiteral("UTC")}}));
    const QByteArray target = path(QStringLiteral("file")).toLocal8Bit();
    // The length of a link is that of its text.
    QCOMPARE(
        result.out, "file       5  1970-01-02 00:00  file\n"
                    "file-link  4  1970-01-02 00:01  link -> " +
                        target + '\n');
    const QByteArray computer = list({QStringLiteral("-l"), QStringLiteral("Computer")}).out;
    QVERIFY2(
        computer.contains("storage-devices   -  -                 Storage devices\n") ||
            computer.contains("storage-devices "),
        computer.constData());
}

void ToolListTest::jsonListing()
{
    QVERIFY(createFile(m_directory->path(), "file", "12345"));
    QVERIFY(createFile(m_directory->path(), "line\nbreak \"quoted\" \033[31m"));
    const ToolResult result = list({QStringLiteral("--json")});
    QCOMPARE(result.exitCode, 0);
    const QJsonArray array = result.json();
    QCOMPARE(
        names(array),
        QStringList({QStringLiteral("file"), QStringLiteral("line\nbreak \"quoted\" \033[31m")}));
    const QJsonObject file = array.first().toObject();
    QCOMPARE(file[QLatin1String("path")].toString(), path(QStringLiteral("file")));
    QCOMPARE(file[QLatin1String("localPath")].toString(), path(QStringLiteral("file")));
    QCOMPARE(file[QLatin1String("type")].toInt(), 10000);
    QCOMPARE(file[QLatin1String("typeName")].toString(), QStringLiteral("file"));
    QVERIFY(!file.contains(QLatin1String("size")));

    const QJsonObject full =
        list({QStringLiteral("--json"), QStringLiteral("-l")}).json().first().toObject();
    QCOMPARE(full[QLatin1String("size")].toInt(), 5);
    QVERIFY(full[QLatin1String("modified")].isString());
    QVERIFY(full[QLatin1String("linkTarget")].isNull());
}

void ToolListTest::emptyDirectory()
{
    const ToolResult plain = list({});
    QCOMPARE(plain.exitCode, 0);
    QVERIFY(plain.out.isEmpty());
    const ToolResult json = list({QStringLiteral("--json")});
    QCOMPARE(json.exitCode, 0);
    QCOMPARE(json.out, QByteArray("[]\n"));
}

void ToolListTest::places()
{
    const QByteArray children = "Home\nDesktop\nTrash\nStorage devices\nFile System\n";
    QCOMPARE(list({QStringLiteral("Computer")}).out, children);
    QCOMPARE(list({QStringLiteral("Computer"), QStringLiteral("--reverse")}).out, children);
    QCOMPARE(list({QStringLiteral("_")}).out, QByteArray("Favourites\nComputer\nNetwork\n"));
    // An operand is opened, however long that takes.
    const ToolResult devices = list({QStringLiteral("Storage devices")});
    QCOMPARE(devices.exitCode, 0);
    QVERIFY(devices.out.isEmpty());
}

void ToolListTest::urls()
{
    QVERIFY(createFile(m_directory->path(), "x"));
    const QString url = QStringLiteral("file://") + m_directory->path();
    QCOMPARE(list({url}).out, QByteArray("x\n"));
    QCOMPARE(list({QStringLiteral("vey-fm:Computer")}).lines().constFirst(), QByteArray("Home"));
}

void ToolListTest::severalOperands()
{
    QDir directory(m_directory->path());
    QVERIFY(directory.mkdir(QStringLiteral("one")));
    QVERIFY(directory.mkdir(QStringLiteral("two")));
    QVERIFY(createFile(path(QStringLiteral("one")), "a"));
    QVERIFY(createFile(path(QStringLiteral("two")), "b"));
    const QStringList operands = {
        QStringLiteral("one"), QStringLiteral("nothing"), QStringLiteral("two")};
    const ToolResult result = list(operands);
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray("a\nb\n"));
    QCOMPARE(result.err, QByteArray("veyfm-vfs: nothing: No such file or directory\n"));

    const ToolResult json = list(operands + QStringList(QStringLiteral("--json")));
    QCOMPARE(json.exitCode, 1);
    QCOMPARE(names(json.json()), QStringList({QStringLiteral("a"), QStringLiteral("b")}));
}

void ToolListTest::failures_data()
{
    QTest::addColumn<QString>("operand");
    QTest::addColumn<QByteArray>("why");
    const auto row = [](const char* operand, const char* why) {
        QTest::newRow(operand) << QString::fromLatin1(operand) << QByteArray(why);
    };
    row("nothing", "No such file or directory");
    row("./Home", "No such file or directory");
    row("file", "Not a directory");
    row("dangling", "No such file or directory");
    row("cycle", "Too many levels of symbolic links");
    row("fifo", "Not a directory");
    row("file/below", "Not a directory");
    row("Computer/nothing", "no such place, path or URL");
    row("", "an empty name");
    row("vey-fm:nothing", "no place has this URL");
    row("file://elsewhere/etc", "not a file on this computer");
    row("smb://host/share",
        "no URLs with the scheme 'smb' here; a file of this name is ./smb://host/share");
    row("http://example.org", "Not a directory");
    row("sftp://example.org", "not mounted");
    row("file:///tmp/a%00b", "No such file or directory");
}

void ToolListTest::failures()
{
    QFETCH(const QString, operand);
    QFETCH(const QByteArray, why);
    QVERIFY(createFile(m_directory->path(), "file"));
    QVERIFY(QFile::link(QStringLiteral("gone"), path(QStringLiteral("dangling"))));
    QVERIFY(QFile::link(QStringLiteral("cycle"), path(QStringLiteral("cycle"))));
    QCOMPARE(::mkfifo(path(QStringLiteral("fifo")).toLocal8Bit().constData(), 0600), 0);
    const ToolResult result = list({operand});
    QCOMPARE(result.err, "veyfm-vfs: " + operand.toLocal8Bit() + ": " + why + '\n');
    QCOMPARE(result.exitCode, 1);
    QVERIFY(result.out.isEmpty());
}

void ToolListTest::unreadableDirectory()
{
    QVERIFY(QDir(m_directory->path()).mkdir(QStringLiteral("closed")));
    const QByteArray closed = path(QStringLiteral("closed")).toLocal8Bit();
    QCOMPARE(::chmod(closed.constData(), 0), 0);
    const QStringList words = {toolPath(), QStringLiteral("list"), QStringLiteral("closed")};
    ToolResult result;
    if (::geteuid() == 0) {
        // Root without the right to pass over permissions.
        const QString less = QStringLiteral("-dac_override,-dac_read_search");
        result = runProgram(
            QStringLiteral("setpriv"),
            QStringList(
                {QStringLiteral("--bounding-set"), less, QStringLiteral("--inh-caps"), less}) +
                words,
            m_directory->path());
    } else {
        result = list({QStringLiteral("closed")});
    }
    ::chmod(closed.constData(), 0700);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: closed: Permission denied\n"));
    QCOMPARE(result.exitCode, 1);
    QVERIFY(result.out.isEmpty());
}

void ToolListTest::rawNamesInPipes()
{
    const QByteArray name = "tab\t line\n escape\033[31m back\\slash";
    QVERIFY(createFile(m_directory->path(), name));
    QCOMPARE(list({}).out, name + '\n');
}

void ToolListTest::nullEndsRecords()
{
    const QByteArray name = "line\nbreak";
    QVERIFY(createFile(m_directory->path(), name));
    QVERIFY(createFile(m_directory->path(), "z"));
    QCOMPARE(list({QStringLiteral("-0")}).out, name + QByteArray("\0z\0", 3));
    QCOMPARE(list({QStringLiteral("--null")}).out, name + QByteArray("\0z\0", 3));
}

void ToolListTest::invalidNames()
{
    // A name that is no UTF-8 is listed only as a link; JSON stays valid.
    QVERIFY(createFile(m_directory->path(), "bad\377file"));
    const QByteArray link = path(QStringLiteral("bad")).toLocal8Bit() + "\377link";
    QCOMPARE(::symlink("target", link.constData()), 0);
    QVERIFY(createFile(m_directory->path(), ".bad\n\377"));
    const ToolResult json = list({QStringLiteral("--json")});
    QCOMPARE(json.exitCode, 1);
    QCOMPARE(names(json.json()), QStringList(QStringLiteral("bad\ufffdlink")));
    const QByteArray why = ": left out, not a valid name in the encoding of the locale\n";
    const QByteArray start = "veyfm-vfs: " + m_directory->path().toLocal8Bit();
    QCOMPARE(json.err, start + "/bad\\377file" + why);
    const ToolResult all = list({QStringLiteral("--all")});
    QCOMPARE(all.exitCode, 1);
    QVERIFY2(all.err.contains(start + "/.bad\\n\\377" + why), all.err.constData());
    QCOMPARE(all.err.count('\n'), 2);
    const ToolResult tree =
        runTool({QStringLiteral("tree"), QStringLiteral(".")}, m_directory->path());
    QCOMPARE(tree.exitCode, 1);
    QCOMPARE(tree.err, json.err);
    QCOMPARE(::unlink((m_directory->path().toLocal8Bit() + "/.bad\n\377").constData()), 0);

    // An operand of that kind has no entry. The shell passes the byte on.
    const ToolResult operand = runProgram(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"), QStringLiteral("exec \"$0\" list \"$(printf 'bad\\377file')\""),
         toolPath()},
        m_directory->path());
    QCOMPARE(operand.exitCode, 1);
    QVERIFY2(
        operand.err.endsWith(": not a valid name in the encoding of the locale\n"),
        operand.err.constData());
    QCOMPARE(::unlink((m_directory->path().toLocal8Bit() + "/bad\377file").constData()), 0);
    QCOMPARE(::unlink(link.constData()), 0);
}

void ToolListTest::directoriesAreReadOnce_data()
{
    QTest::addColumn<QString>("verb");
    QTest::newRow("list") << QStringLiteral("list");
    QTest::newRow("tree") << QStringLiteral("tree");
}

// Though the library leaves out some names, which are told. A slow directory would let wait twice.
void ToolListTest::directoriesAreReadOnce()
{
    QFETCH(const QString, verb);
    const QString log = path(QStringLiteral("log"));
    const QProcessEnvironment environment = toolEnvironment(
        // The leak checker can't trace what is traced already.
        {{QStringLiteral("ASAN_OPTIONS"),
          qEnvironmentVariable("ASAN_OPTIONS") + QStringLiteral(":detect_leaks=0")}});
    const auto trace = [&environment, &log](const QStringList& command) {
        const QStringList options = {QStringLiteral("-f"), QStringLiteral("-y"),
                                     QStringLiteral("-e"), QStringLiteral("trace=getdents64"),
                                     QStringLiteral("-o"), log};
        return runProgram(QStringLiteral("strace"), options + command, QString(), environment);
    };
    if (trace({QStringLiteral("true")}).exitCode != 0) {
        QSKIP("strace is not there, or may not trace here");
    }
    const QString directory = path(QStringLiteral("read"));
    QVERIFY(QDir().mkdir(directory));
    QVERIFY(createFile(directory, "bad\377file"));
    const ToolResult result = trace({toolPath(), verb, directory});
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.err.contains("/bad\\377file: left out"), result.err.constData());
    QFile file(log);
    QVERIFY(file.open(QIODevice::ReadOnly));
    int ends = 0;
    const QList<QByteArray> calls = file.readAll().split('\n');
    for (const QByteArray& call : calls) {
        ends += call.contains('<' + directory.toLocal8Bit() + '>') && call.endsWith(" = 0");
    }
    QCOMPARE(ends, 1);
    QCOMPARE(::unlink((directory.toLocal8Bit() + "/bad\377file").constData()), 0);
}

void ToolListTest::namesWithByteOrderMarks()
{
    QVERIFY(createFile(m_directory->path(), "\357\273\277file"));
    QVERIFY(createFile(m_directory->path(), "\357\273\277"));
    QVERIFY(QDir(m_directory->path()).mkdir(QStringLiteral("\ufeffdir")));
    const ToolResult result = list({});
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray("\357\273\277\n\357\273\277dir\n\357\273\277file\n"));
    // As an operand too.
    const QStringList operands = {QStringLiteral("\ufeffdir"), QStringLiteral("\ufefffile")};
    const ToolResult info =
        runTool(QStringList(QStringLiteral("info")) + operands, m_directory->path());
    QCOMPARE(info.err, QByteArray());
    QCOMPARE(info.exitCode, 0);
}

void ToolListTest::sizesForPeople_data()
{
    QTest::addColumn<qint64>("size");
    QTest::addColumn<QByteArray>("text");
    const auto row = [](qint64 size, const char* text) {
        QTest::newRow(text) << size << QByteArray(text);
    };
    row(0, "0");
    row(1023, "1023");
    row(1024, "1.0K");
    row(1025, "1.1K");
    row(10189, "10K");
    row(10240, "10K");
    row(10241, "11K");
    row(1023 * 1024, "1023K");
    row(1023 * 1024 + 1, "1.0M");
    row(1024 * 1024 * 3 / 2, "1.5M");
    row(qint64(1) << 40, "1.0T");
    row((qint64(1) << 43) - 1, "8.0T");
}

void ToolListTest::sizesForPeople()
{
    QFETCH(const qint64, size);
    QFETCH(const QByteArray, text);
    QVERIFY(createFile(m_directory->path(), "file"));
    QCOMPARE(::truncate(path(QStringLiteral("file")).toLocal8Bit().constData(), size), 0);
    const QStringList options[] = {
        {QStringLiteral("-h")},
        {QStringLiteral("-lh")},
        {QStringLiteral("--human-readable"), QStringLiteral("--long")}};
    for (const QStringList& option : options) {
        const ToolResult result = list(option);
        QCOMPARE(result.exitCode, 0);
        QVERIFY2(result.out.startsWith("file  " + text + "  "), result.out.constData());
    }
    // ls is the model.
    const ToolResult model =
        runProgram(QStringLiteral("ls"), {QStringLiteral("-lh"), path(QStringLiteral("file"))});
    QVERIFY2(model.out.contains(' ' + text + ' '), model.out.constData());
    const ToolResult json = list({QStringLiteral("-h"), QStringLiteral("--json")});
    QCOMPARE(json.json().at(0)[QLatin1String("size")].toDouble(), double(size));
}

void ToolListTest::otherName()
{
    QVERIFY(createFile(m_directory->path(), "file"));
    const QString ls = QStringLiteral("ls");
    const ToolResult result = runTool({ls, QStringLiteral("-a")}, m_directory->path());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray("file\n"));
    QCOMPARE(
        runTool({QStringLiteral("help"), ls}).out,
        runTool({QStringLiteral("list"), QStringLiteral("--help")}).out);
    QCOMPARE(
        runTool(
            {QStringLiteral("complete"), QStringLiteral("--"), ls, QStringLiteral("fi")},
            m_directory->path())
            .out,
        QByteArray("file\0", 5));
}

void ToolListTest::plainLocale()
{
    QVERIFY(createFile(m_directory->path(), "\303\244"));
    QVERIFY(createFile(m_directory->path(), "plain"));
    const QProcessEnvironment environment =
        toolEnvironment({{QStringLiteral("LC_ALL"), QStringLiteral("C")}});
    const ToolResult result = runTool({QStringLiteral("list")}, m_directory->path(), environment);
    QCOMPARE(result.exitCode, 0);
    // Bytes that the encoding has no letters for pass through.
    QCOMPARE(result.out, QByteArray("plain\n\303\244\n"));
    const ToolResult tree = runTool({QStringLiteral("tree")}, m_directory->path(), environment);
    QCOMPARE(tree.exitCode, 0);
    QVERIFY(tree.out.contains("\n|-- Home  "));
    QVERIFY(tree.out.contains("\n`-- Samba ...\n"));
}

void ToolListTest::colourOnRequest()
{
    QVERIFY(QDir(m_directory->path()).mkdir(QStringLiteral("dir")));
    QVERIFY(createFile(m_directory->path(), "file"));
    QVERIFY(QFile::link(QStringLiteral("gone"), path(QStringLiteral("dangling"))));
    QVERIFY(QFile::link(QStringLiteral("file"), path(QStringLiteral("link"))));
    QCOMPARE(
        list({QStringLiteral("--color=always")}).out,
        QByteArray(
            "\033[1;31mdangling\033[0m\n\033[1;34mdir\033[0m\nfile\n\033[1;36mlink\033[0m\n"));
    QCOMPARE(list({QStringLiteral("--color=auto")}).out, QByteArray("dangling\ndir\nfile\nlink\n"));
    QVERIFY(list({QStringLiteral("--color=always"), QStringLiteral("Computer")})
                .out.startsWith("\033[1;35mHome\033[0m\n"));
}

QTEST_GUILESS_MAIN(ToolListTest)
#include "tst_tool_list.moc"
