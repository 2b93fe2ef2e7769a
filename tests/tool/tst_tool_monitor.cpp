// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolrunner.h"

#include <QDir>
#include <QJsonDocument>
#include <QJsonObject>
#include <QTemporaryDir>
#include <QTest>

#include <algorithm>

#include <signal.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

/// A running monitor, its output line by line.
class Monitor
{
public:
    explicit Monitor(const QStringList& arguments, const QString& directory = QString())
    {
        if (!directory.isEmpty()) {
            m_process.setWorkingDirectory(directory);
        }
        m_process.start(toolPath(), QStringList(QStringLiteral("monitor")) + arguments);
    }

    ~Monitor()
    {
        m_process.kill();
        m_process.waitForFinished();
    }

    /// Waits until the kernel has that many watches for the process.
    bool waitForWatches(int count)
    {
        return QTest::qWaitFor([this, count] { return watches() >= count; }, 20000);
    }

    QByteArray nextLine()
    {
        const bool come = QTest::qWaitFor([this] { return m_process.canReadLine(); }, 20000);
        return come ? m_process.readLine() : QByteArray("nothing came");
    }

    QByteArray read(int size)
    {
        const bool come =
            QTest::qWaitFor([&] { return m_process.bytesAvailable() >= size; }, 20000);
        return come ? m_process.readAllStandardOutput() : QByteArray("too little came");
    }

    /// Sends a signal; the one that it dies of, or -1.
    int end(int signalNumber)
    {
        ::kill(pid_t(m_process.processId()), signalNumber);
        if (!m_process.waitForFinished(20000) || m_process.exitStatus() != QProcess::CrashExit) {
            return -1;
        }
        return m_process.exitCode();
    }

    QByteArray errors()
    {
        return m_process.readAllStandardError();
    }

    bool isRunning() const
    {
        // "Starting" until this process has taken notice.
        return m_process.state() != QProcess::NotRunning;
    }

private:
    int watches() const
    {
        const QDir descriptors(QStringLiteral("/proc/%1/fdinfo").arg(m_process.processId()));
        int count = 0;
        const QStringList names = descriptors.entryList(QDir::Files);
        for (const QString& name : names) {
            QFile file(descriptors.filePath(name));
            if (file.open(QIODevice::ReadOnly)) {
                count += file.readAll().count("inotify wd:");
            }
        }
        return count;
    }

    QProcess m_process;
};

} // namespace

class ToolMonitorTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void printsEvents();
    void printsEventsOfPlacesOnce();
    void printsJson();
    void endsRecordsWithNull();
    void watchesOneFile();
    void watchesLinksToFiles();
    void watchesLinksToDirectories();
    void takesAnyNotation();
    void endsOnSignals_data();
    void endsOnSignals();
    void endsWithoutAReader();
    void endsWithItsSocket();
    void endsWhereItCannotWrite();
    void tellsWhatItCannotWatch();
    void failingOperandDoesNotStopOthers();
};

void ToolMonitorTest::printsEvents()
{
    QTemporaryDir directory;
    Monitor monitor({directory.path()});
    QVERIFY(monitor.waitForWatches(1));
    const QString path = directory.filePath(QStringLiteral("a b"));
    const QByteArray bytes = path.toLocal8Bit();
    QVERIFY(createFile(directory.path(), "a b", "text"));
    QCOMPARE(monitor.nextLine(), "created     " + bytes + '\n');
    QCOMPARE(monitor.nextLine(), "changed     " + bytes + '\n');
    QVERIFY(QFile::setPermissions(path, QFile::ReadOwner));
    QCOMPARE(monitor.nextLine(), "attributes  " + bytes + '\n');
    QVERIFY(QFile::remove(path));
    QCOMPARE(monitor.nextLine(), "deleted     " + bytes + '\n');
    QCOMPARE(monitor.end(SIGINT), SIGINT);
    QCOMPARE(monitor.errors(), QByteArray());
}

void ToolMonitorTest::printsEventsOfPlacesOnce()
{
    Monitor monitor({QStringLiteral("Home")});
    QVERIFY(monitor.waitForWatches(1));
    QVERIFY(createFile(QDir::homePath(), "monitortest"));
    QVERIFY(QFile::remove(QDir::home().filePath(QStringLiteral("monitortest"))));
    QCOMPARE(monitor.nextLine(), QByteArray("created     Home/monitortest\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("changed     Home/monitortest\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("deleted     Home/monitortest\n"));
}

void ToolMonitorTest::printsJson()
{
    QTemporaryDir directory;
    Monitor monitor({QStringLiteral("--json"), directory.path()});
    QVERIFY(monitor.waitForWatches(1));
    QVERIFY(createFile(directory.path(), "line\nbreak"));
    const QJsonObject object = QJsonDocument::fromJson(monitor.nextLine()).object();
    QCOMPARE(object[QLatin1String("event")].toString(), QStringLiteral("created"));
    QCOMPARE(object[QLatin1String("name")].toString(), QStringLiteral("line\nbreak"));
    const QJsonObject next = QJsonDocument::fromJson(monitor.nextLine()).object();
    QCOMPARE(next[QLatin1String("event")].toString(), QStringLiteral("changed"));
}

void ToolMonitorTest::endsRecordsWithNull()
{
    QTemporaryDir directory;
    Monitor monitor({QStringLiteral("-0"), directory.path()});
    QVERIFY(monitor.waitForWatches(1));
    QVERIFY(createFile(directory.path(), "x"));
    const QByteArray path = directory.filePath(QStringLiteral("x")).toLocal8Bit();
    const QByteArray expected = "created     " + path + '\0' + "changed     " + path + '\0';
    QCOMPARE(monitor.read(expected.size()), expected);
}

void ToolMonitorTest::watchesOneFile()
{
    QTemporaryDir directory;
    const QString path = directory.filePath(QStringLiteral("watched"));
    QVERIFY(createFile(directory.path(), "watched"));
    Monitor monitor({path});
    QVERIFY(monitor.waitForWatches(1));
    QVERIFY(createFile(directory.path(), "other"));
    QVERIFY(createFile(directory.path(), "watched", "text"));
    QCOMPARE(monitor.nextLine(), "changed     " + path.toLocal8Bit() + '\n');
}

void ToolMonitorTest::watchesLinksToFiles()
{
    // The directory of a link is watched for its sake; what else happens there is no news, and
    // what happens to the target is told under the name of the target.
    QTemporaryDir directory;
    const QString link = directory.filePath(QStringLiteral("link"));
    QVERIFY(createFile(directory.path(), "target"));
    QVERIFY(QFile::link(QStringLiteral("target"), link));
    Monitor monitor({link});
    QVERIFY(monitor.waitForWatches(2));
    QVERIFY(createFile(directory.path(), "other"));
    QVERIFY(createFile(directory.path(), "target", "text"));
    QVERIFY(QFile::remove(link));
    QCOMPARE(monitor.nextLine(), "attributes  " + link.toLocal8Bit() + '\n');
    QCOMPARE(monitor.nextLine(), "deleted     " + link.toLocal8Bit() + '\n');
}

void ToolMonitorTest::watchesLinksToDirectories()
{
    QTemporaryDir directory;
    const QString link = directory.filePath(QStringLiteral("link"));
    QVERIFY(QDir(directory.path()).mkdir(QStringLiteral("target")));
    QVERIFY(QFile::link(QStringLiteral("target"), link));
    Monitor monitor({link});
    QVERIFY(monitor.waitForWatches(3));
    QVERIFY(createFile(link, "x"));
    QCOMPARE(monitor.nextLine(), "created     " + link.toLocal8Bit() + "/x\n");
}

void ToolMonitorTest::takesAnyNotation()
{
    // Stepping up from a top-level directory leads to the File System place.
    QTemporaryDir directory;
    const QString roundabout = QStringLiteral("/usr/..") + directory.path();
    Monitor monitor({roundabout});
    QVERIFY(monitor.waitForWatches(1));
    QVERIFY(createFile(directory.path(), "x"));
    QVERIFY(QFile::remove(directory.filePath(QStringLiteral("x"))));
    const QByteArray path = directory.filePath(QStringLiteral("x")).toLocal8Bit();
    QCOMPARE(monitor.nextLine(), "created     " + path + '\n');
    QCOMPARE(monitor.nextLine(), "changed     " + path + '\n');
    QCOMPARE(monitor.nextLine(), "deleted     " + path + '\n');
}

void ToolMonitorTest::endsOnSignals_data()
{
    QTest::addColumn<int>("number");
    QTest::newRow("SIGINT") << SIGINT;
    QTest::newRow("SIGTERM") << SIGTERM;
}

void ToolMonitorTest::endsOnSignals()
{
    QFETCH(const int, number);
    QTemporaryDir directory;
    Monitor monitor({directory.path()});
    QVERIFY(monitor.waitForWatches(1));
    QCOMPARE(monitor.end(number), number);
    QCOMPARE(monitor.errors(), QByteArray());
}

void ToolMonitorTest::endsWithoutAReader()
{
    // At once, not with the next event, which may never come.
    QTemporaryDir directory;
    const ToolResult result = runProgram(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"), QStringLiteral("{ \"$0\" monitor \"$1\"; echo $? >&2; } | :"),
         toolPath(), directory.path()});
    QCOMPARE(result.err, QByteArray("141\n")); // SIGPIPE, as a shell has it.
}

// What sshd makes standard output of.
void ToolMonitorTest::endsWithItsSocket()
{
    QTemporaryDir directory;
    int ends[2];
    QCOMPARE(::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends), 0);
    const QByteArray tool = toolPath().toLocal8Bit();
    const QByteArray operand = directory.path().toLocal8Bit();
    const pid_t process = ::fork();
    if (process == 0) {
        ::dup2(ends[1], STDOUT_FILENO);
        ::execl(tool.constData(), "veyfm-vfs", "monitor", operand.constData(), nullptr);
        ::_exit(127);
    }
    QVERIFY(process > 0);
    ::close(ends[1]);
    // What comes from the other side is no end.
    QCOMPARE(::send(ends[0], "x", 1, MSG_NOSIGNAL), ssize_t(1));
    QByteArray out;
    const auto read = [&out, &ends] {
        char bytes[4096];
        const ssize_t size = ::recv(ends[0], bytes, sizeof bytes, MSG_DONTWAIT);
        out.append(bytes, int(std::max<ssize_t>(size, 0)));
        return out;
    };
    QTRY_VERIFY(createFile(directory.path(), "x") && read().contains("x\n"));
    // All that is written is read, lest writing should end it.
    QVERIFY(createFile(directory.path(), "last"));
    QTRY_VERIFY(read().contains("changed     " + operand + "/last\n"));
    ::close(ends[0]);
    int status = 0;
    pid_t ended = 0;
    if (!QTest::qWaitFor([&] { return (ended = ::waitpid(process, &status, WNOHANG)) != 0; })) {
        ::kill(process, SIGKILL);
        ::waitpid(process, &status, 0);
    }
    QCOMPARE(ended, process);
    QVERIFY(WIFSIGNALED(status));
    QCOMPARE(WTERMSIG(status), SIGPIPE);
}

void ToolMonitorTest::endsWhereItCannotWrite()
{
    QTemporaryDir directory;
    const QByteArray start = "veyfm-vfs: standard output: ";
    const struct
    {
        const char* command;
        QByteArray errors;
    } cases[] = {
        {"\"$0\" monitor \"$1\" >/dev/full; echo $? >&2", start + "No space left on device\n1\n"},
        // Whoever ignores the signal is told.
        {"trap '' PIPE; { \"$0\" monitor \"$1\"; echo $? >&2; } | :", start + "Broken pipe\n1\n"},
    };
    for (const auto& each : cases) {
        QProcess process;
        process.setStandardInputFile(QProcess::nullDevice());
        process.start(
            QStringLiteral("/bin/sh"), {QStringLiteral("-c"), QString::fromLatin1(each.command),
                                        toolPath(), directory.path()});
        QTRY_VERIFY_WITH_TIMEOUT(
            createFile(directory.path(), "x") && process.state() == QProcess::NotRunning, 20000);
        QCOMPARE(process.readAllStandardError(), each.errors);
    }
}

void ToolMonitorTest::tellsWhatItCannotWatch()
{
    const ToolResult result = runTool(
        {QStringLiteral("monitor"), QStringLiteral("/proc"), QStringLiteral("/nothing"),
         QStringLiteral("http://example.org")});
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err,
        QByteArray("veyfm-vfs: /proc: what lies below /proc, /dev, /sys and /var is never "
                   "watched\n"
                   "veyfm-vfs: /nothing: No such file or directory\n"
                   "veyfm-vfs: http://example.org: nothing on the disk to watch\n"));
}

void ToolMonitorTest::failingOperandDoesNotStopOthers()
{
    QTemporaryDir directory;
    Monitor monitor({QStringLiteral("/proc"), directory.path()});
    QVERIFY(monitor.waitForWatches(1));
    QVERIFY(monitor.isRunning());
    QVERIFY(createFile(directory.path(), "x"));
    QVERIFY(monitor.nextLine().startsWith("created     "));
    QCOMPARE(monitor.end(SIGTERM), SIGTERM);
    QVERIFY(monitor.errors().startsWith("veyfm-vfs: /proc: "));
}

QTEST_GUILESS_MAIN(ToolMonitorTest)
#include "tst_tool_monitor.moc"
