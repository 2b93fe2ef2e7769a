// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/rerun.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"

#include <QCoreApplication>
#include <QStandardPaths>
#include <QTest>

#include <cstdio>

using namespace VeyFM;

namespace {

// What the traced process says to its tracer, by looking for files that are not there.
const char beginMark[] = "/nonexistent/begin";
const char endMark[] = "/nonexistent/end";

/// The work that is counted, in a process of its own.
int runTraced(const QStringList& arguments)
{
    VFS::initialize();
    VFS* vfs = VFS::ptr();
    const QString what = arguments.value(2);
    const QString path = arguments.value(3);
    const Entry directory = vfs->entry(path);
    int count = 0;
    if (what == QLatin1String("childs")) {
        ::access(beginMark, F_OK);
        count = vfs->childs(directory).size();
        ::access(endMark, F_OK);
    } else if (what == QLatin1String("childs-below-place")) {
        const Entry place = vfs->child(vfs->homeEntry(), path);
        ::access(beginMark, F_OK);
        count = vfs->childs(place).size();
        ::access(endMark, F_OK);
    } else if (what == QLatin1String("entry")) {
        const EntryList children = vfs->childs(directory);
        const QStringList paths = children.paths();
        vfs->entry(path + text("/first"));
        ::access(beginMark, F_OK);
        for (const QString& child : paths) {
            count += vfs->entry(child).isNull() ? 0 : 1;
        }
        ::access(endMark, F_OK);
    }
    std::printf("%d\n", count);
    return 0;
}

} // namespace

/// How often the library asks the system, as strace(1) sees it.
class TestVfsSyscalls : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void listing_data();
    void listing();
    void resolution_data();
    void resolution();

private:
    /// The calls about files and descriptors while the work was done, one line each.
    QStringList trace(const QString& what, const QString& path, int expectedCount);
    /// Those that look at something by its path or name.
    static QStringList looks(const QStringList& calls);

    VfsScene m_scene;
    QString m_strace;
};

void TestVfsSyscalls::initTestCase()
{
    m_strace = QStandardPaths::findExecutable(text("strace"));
    if (m_strace.isEmpty()) {
        QSKIP("strace is not installed");
    }
    QProcess probe;
    probe.start(m_strace, {text("-o"), text("/dev/null"), text("true")});
    if (!probe.waitForFinished(30000) || probe.exitCode() != 0) {
        QSKIP("strace may not trace here");
    }
    QVERIFY(m_scene.makeDir("home/links"));
    QVERIFY(m_scene.makeDir("home/links/dir"));
    for (int i = 0; i < 50; ++i) {
        QVERIFY(m_scene.makeLink(i % 2 ? "dir" : "gone", "home/links/" + QByteArray::number(i)));
    }
    QVERIFY(m_scene.makeDir("home/plain"));
    QVERIFY(m_scene.makeDir("home/plain/dir"));
    for (int i = 0; i < 300; ++i) {
        QVERIFY(m_scene.makeFile("home/plain/" + QByteArray::number(i)));
        QVERIFY(m_scene.makeFile("home/plain/\xc3\xa9" + QByteArray::number(i)));
    }
    QVERIFY(m_scene.makeFifo("home/plain/fifo"));
    QVERIFY(m_scene.makeDir("home/targets"));
    for (int i = 0; i < 50; ++i) {
        QVERIFY(m_scene.makeLink("../plain/0", "home/targets/" + QByteArray::number(i)));
    }
}

QStringList TestVfsSyscalls::trace(const QString& what, const QString& path, int expectedCount)
{
    const QString log = m_scene.path("strace");
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    // The leak checker can't trace what is traced already.
    environment.insert(
        text("ASAN_OPTIONS"), environment.value(text("ASAN_OPTIONS")) + text(":detect_leaks=0"));
    process.setProcessEnvironment(environment);
    process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
    process.start(
        m_strace,
        // Without "-f": only the thread that does the work, and not that of Qt's bus connection.
        {text("-qq"), text("-s"), text("1000"), text("-e"), text("trace=%file,%desc"), text("-o"),
         log, QCoreApplication::applicationFilePath(), text("traced"), what, path});
    if (!process.waitForFinished(60000) || process.exitCode() != 0 ||
        process.readAllStandardOutput().toInt() != expectedCount) {
        return {text("the traced process failed")};
    }
    QFile file(log);
    if (!file.open(QIODevice::ReadOnly)) {
        return {text("no log")};
    }
    const QStringList lines = QString::fromLatin1(file.readAll()).split(QLatin1Char('\n'));
    QStringList calls;
    bool isOn = false;
    for (const QString& line : lines) {
        if (line.contains(QLatin1String(endMark))) {
            return calls;
        }
        if (isOn) {
            calls.append(line);
        }
        isOn = isOn || line.contains(QLatin1String(beginMark));
    }
    return {text("no end mark")};
}

QStringList TestVfsSyscalls::looks(const QStringList& calls)
{
    QStringList result;
    for (const QString& call : calls) {
        const QString name = call.section(QLatin1Char('('), 0, 0);
        // Opening and reading the directory, and that opendir(3) looks at what it has opened.
        const bool isOfStream =
            name == QLatin1String("getdents64") || name == QLatin1String("close") ||
            call.contains(QLatin1String("\"\", ")) || name == QLatin1String("fstat");
        // Memory that is mapped without a file counts among the calls on descriptors.
        if (!isOfStream && name != QLatin1String("mmap") && name != QLatin1String("fcntl")) {
            result.append(call);
        }
    }
    return result;
}

void TestVfsSyscalls::listing_data()
{
    QTest::addColumn<QString>("what");
    QTest::addColumn<QString>("path");
    QTest::addColumn<int>("entries");
    QTest::addColumn<int>("links");
    const QString home = m_scene.home();
    QTest::newRow("plain") << text("childs") << home + text("/plain") << 602 << 0;
    QTest::newRow("links") << text("childs") << home + text("/links") << 51 << 50;
    QTest::newRow("plain below a place") << text("childs-below-place") << text("plain") << 602 << 0;
    QTest::newRow("links below a place") << text("childs-below-place") << text("links") << 51 << 50;
}

// The directory is opened. Then one call for each link, and none for anything else.
void TestVfsSyscalls::listing()
{
    QFETCH(const QString, what);
    QFETCH(const QString, path);
    QFETCH(const int, entries);
    QFETCH(const int, links);
    QStringList calls = looks(trace(what, path, entries));
    QVERIFY(!calls.isEmpty());
    QVERIFY2(calls.first().startsWith(text("openat(")), qPrintable(calls.first()));
    calls.removeFirst();
    QVERIFY2(calls.size() == links, qPrintable(calls.mid(0, 60).join(QLatin1Char('\n'))));
    for (const QString& call : qAsConst(calls)) {
        QVERIFY2(call.contains(text("stat")), qPrintable(call));
    }
}

void TestVfsSyscalls::resolution_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<int>("entries");
    QTest::addColumn<int>("callsEach");
    QTest::newRow("plain") << m_scene.home() + text("/plain") << 602 << 1;
    QTest::newRow("links") << m_scene.home() + text("/targets") << 50 << 2;
}

void TestVfsSyscalls::resolution()
{
    QFETCH(const QString, path);
    QFETCH(const int, entries);
    QFETCH(const int, callsEach);
    const QStringList calls = looks(trace(text("entry"), path, entries));
    QVERIFY2(
        calls.size() == entries * callsEach, qPrintable(calls.mid(0, 20).join(QLatin1Char('\n'))));
    for (const QString& call : calls) {
        QVERIFY2(call.contains(text("stat")), qPrintable(call));
    }
}

int main(int argc, char** argv)
{
    const QCoreApplication app(argc, argv);
    if (isRerun(argc, argv, "traced")) {
        return runTraced(QCoreApplication::arguments());
    }
    TestVfsSyscalls tests;
    return QTest::qExec(&tests, argc, argv);
}

#include "tst_vfs_syscalls.moc"
