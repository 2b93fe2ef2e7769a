// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/slowdirectory.h"
#include "support/terminalsession.h"
#include "support/toolrunner.h"

#include <QDir>
#include <QTemporaryDir>
#include <QTest>

#include <fcntl.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr int patience = 30000;

/// Whether a child of the process watches something.
bool watches(pid_t parent)
{
    QFile children(QStringLiteral("/proc/%1/task/%1/children").arg(parent));
    if (!children.open(QIODevice::ReadOnly)) {
        return false;
    }
    const QString child = QString::fromLatin1(children.readAll()).trimmed();
    const QDir descriptors(QStringLiteral("/proc/%1/fdinfo").arg(child));
    const QStringList names = descriptors.entryList(QDir::Files);
    for (const QString& name : names) {
        QFile file(descriptors.filePath(name));
        if (file.open(QIODevice::ReadOnly) && file.readAll().contains("inotify wd:")) {
            return true;
        }
    }
    return false;
}

} // namespace

/// Ctrl-C, at moments that are sure to lie within the work.
class ToolInterruptTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void endlessDirectory_data();
    void endlessDirectory();
    void stalledDirectory();
    void stuckOutput();
    void controlC();
    void loopOfAShellEnds_data();
    void loopOfAShellEnds();
    void ignoredSignalStaysIgnored();
};

void ToolInterruptTest::endlessDirectory_data()
{
    QTest::addColumn<QStringList>("arguments");
    QTest::newRow("list") << QStringList(QStringLiteral("list"));
    QTest::newRow("long") << QStringList({QStringLiteral("list"), QStringLiteral("-l")});
    QTest::newRow("json") << QStringList({QStringLiteral("list"), QStringLiteral("--json")});
    QTest::newRow("tree") << QStringList(QStringLiteral("tree"));
}

void ToolInterruptTest::endlessDirectory()
{
    QFETCH(const QStringList, arguments);
    QTemporaryDir mountPoint;
    const SlowDirectory directory(SlowDirectory::Endless, mountPoint.path());
    if (!directory.problem().isEmpty()) {
        QSKIP(qPrintable(QStringLiteral("no slow directory here: ") + directory.problem()));
    }

    QTemporaryDir other;
    QVERIFY(createFile(other.path(), "finished"));
    QProcess process;
    // The third operand comes too late.
    process.start(
        toolPath(), arguments + QStringList({other.path(), mountPoint.path(), other.path()}));
    QTRY_VERIFY_WITH_TIMEOUT(directory.progress() > 20000, patience);
    ::kill(pid_t(process.processId()), SIGINT);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), SIGINT);
    QCOMPARE(
        process.readAllStandardError(),
        "veyfm-vfs: " + mountPoint.path().toLocal8Bit() + ": interrupted\n");
    const QByteArray output = process.readAllStandardOutput();
    QCOMPARE(output.count("finished"), output.contains('{') ? 3 : 1);
    QVERIFY(!output.contains("file-"));
}

void ToolInterruptTest::stalledDirectory()
{
    QTemporaryDir mountPoint;
    SlowDirectory directory(SlowDirectory::Stalled, mountPoint.path());
    if (!directory.problem().isEmpty()) {
        QSKIP(qPrintable(QStringLiteral("no slow directory here: ") + directory.problem()));
    }

    QProcess process;
    process.start(toolPath(), {QStringLiteral("list"), mountPoint.path()});
    QTRY_VERIFY_WITH_TIMEOUT(directory.progress() > 0, patience);
    ::kill(pid_t(process.processId()), SIGINT);
    // The kernel holds the process until the file system answers, but the word is out.
    QByteArray errors;
    QTRY_VERIFY_WITH_TIMEOUT((errors += process.readAllStandardError()).endsWith('\n'), patience);
    QCOMPARE(errors, "veyfm-vfs: " + mountPoint.path().toLocal8Bit() + ": interrupted\n");
    directory.release();
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), SIGINT);
}

void ToolInterruptTest::stuckOutput()
{
    QTemporaryDir directory;
    for (int i = 0; i < 1000; ++i) {
        QVERIFY(createFile(directory.path(), QByteArray(200, 'x') + QByteArray::number(i)));
    }
    QTemporaryDir pipes;
    const QString fifo = pipes.filePath(QStringLiteral("fifo"));
    QCOMPARE(::mkfifo(fifo.toLocal8Bit().constData(), 0600), 0);
    const int reader = ::open(fifo.toLocal8Bit().constData(), O_RDWR | O_CLOEXEC);
    QVERIFY(reader >= 0);
    const int size = ::fcntl(reader, F_SETPIPE_SZ, 4096);
    QVERIFY(size > 0);

    QProcess process;
    process.setStandardOutputFile(fifo);
    process.start(toolPath(), {QStringLiteral("list"), directory.path()});
    const auto waiting = [reader] {
        int bytes = 0;
        ::ioctl(reader, FIONREAD, &bytes);
        return bytes;
    };
    QTRY_COMPARE_WITH_TIMEOUT(waiting(), size, patience);
    ::kill(pid_t(process.processId()), SIGINT);
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(waiting(), size);
    ::close(reader);
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), SIGINT);
    QCOMPARE(
        process.readAllStandardError(),
        "veyfm-vfs: " + directory.path().toLocal8Bit() + ": interrupted\n");
}

void ToolInterruptTest::controlC()
{
    QTemporaryDir mountPoint;
    const SlowDirectory directory(SlowDirectory::Endless, mountPoint.path());
    if (!directory.problem().isEmpty()) {
        QSKIP(qPrintable(QStringLiteral("no slow directory here: ") + directory.problem()));
    }

    TerminalSession session(
        toolPath(), {QStringLiteral("list"), mountPoint.path()}, mountPoint.path(),
        toolEnvironment());
    QTRY_VERIFY_WITH_TIMEOUT(directory.progress() > 20000, patience);
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session.output().endsWith(
            "veyfm-vfs: " + mountPoint.path().toLocal8Bit() + ": interrupted\n"),
        session.output().constData());
}

void ToolInterruptTest::loopOfAShellEnds_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::newRow("list") << QByteArray("list .");
    QTest::newRow("tree") << QByteArray("tree .");
    QTest::newRow("monitor") << QByteArray("monitor .");
}

void ToolInterruptTest::loopOfAShellEnds()
{
    QFETCH(const QByteArray, line);
    QTemporaryDir mountPoint;
    const SlowDirectory directory(SlowDirectory::Endless, mountPoint.path());
    if (!directory.problem().isEmpty()) {
        QSKIP(qPrintable(QStringLiteral("no slow directory here: ") + directory.problem()));
    }

    const QString loop =
        QStringLiteral("for i in 1 2 3; do echo begin $i; \"$0\" %1; done; echo on")
            .arg(QString::fromLatin1(line));
    TerminalSession session(
        QStringLiteral("/bin/bash"), {QStringLiteral("-c"), loop, toolPath()}, mountPoint.path(),
        toolEnvironment());
    QVERIFY(session.waitFor("begin 1\n"));
    if (line.startsWith("monitor")) {
        // It has the signal in hand when it watches.
        QTRY_VERIFY_WITH_TIMEOUT(watches(session.processId()), patience);
    } else {
        QTRY_VERIFY_WITH_TIMEOUT(directory.progress() > 20000, patience);
    }
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY2(!session.output().contains("begin 2"), session.output().constData());
    QVERIFY2(!session.output().contains("on\n"), session.output().constData());
}

void ToolInterruptTest::ignoredSignalStaysIgnored()
{
    // What a shell does to what it starts in the background.
    QTemporaryDir mountPoint;
    SlowDirectory directory(SlowDirectory::Stalled, mountPoint.path());
    if (!directory.problem().isEmpty()) {
        QSKIP(qPrintable(QStringLiteral("no slow directory here: ") + directory.problem()));
    }

    QProcess process;
    process.start(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"), QStringLiteral("trap '' INT; exec \"$0\" list \"$1\""), toolPath(),
         mountPoint.path()});
    QTRY_VERIFY_WITH_TIMEOUT(directory.progress() > 0, patience);
    ::kill(pid_t(process.processId()), SIGINT);
    directory.release();
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitCode(), 0);
    QCOMPARE(process.readAllStandardError(), QByteArray());
}

QTEST_GUILESS_MAIN(ToolInterruptTest)
#include "tst_tool_interrupt.moc"
