// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include <QDir>
#include <QElapsedTimer>
#include <QFile>
#include <QSet>
#include <QTemporaryDir>
#include <QTest>

#include <array>
#include <cerrno>
#include <csignal>
#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>
#include <veysu.h>

using VeySu::PtyProcess;

namespace {

QList<QByteArray> script(const QByteArray& text)
{
    return {"-c", text};
}

void type(const PtyProcess& process, const QByteArray& text)
{
    QCOMPARE(write(process.fd(), text.constData(), size_t(text.size())), ssize_t(text.size()));
}

/// Everything up to the end of the child's side.
QByteArray readToEnd(PtyProcess& process)
{
    QByteArray all;
    for (;;) {
        const QByteArray chunk = process.readAll(true);
        if (chunk.isEmpty()) {
            return all;
        }
        all += chunk;
    }
}

QStringList descriptors()
{
    return QDir(QStringLiteral("/proc/self/fd")).entryList(QDir::Files | QDir::System);
}

bool hasChildren()
{
    return waitid(P_ALL, 0, nullptr, WEXITED | WNOHANG | WNOWAIT) == 0 || errno != ECHILD;
}

void doNothing(int) {}

} // namespace

class TestPtyProcess : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void nothingStarted();
    void output();
    void noPostProcessing();
    void arguments();
    void namedByCommand();
    void noShellForScripts();
    void controllingTerminal();
    void terminalEchoes();
    void password();
    void questionInPieces();
    void answersAreSeparate();
    void endlessOutputDoesNotBlock();
    void largeOutput();
    void notBlocking();
    void endWithHelperOnTerminal();
    void helperSurvives();
    void terminalClosedByRunningChild();
    void waitSlaveLate();
    void waitSlaveBound();
    void waitSlaveChildEnds();
    void exitStatus_data();
    void exitStatus();
    void missing_data();
    void missing();
    void unreadOutputDoesNotBlockTheWait();
    void usedAgain();
    void usedAgainAfterMissing();
    void endedByDestructor();
    void forcedByDestructor();
    void leavesNothing();
    void closesDescriptors();
    void signalsAsFresh();
    void interruptedBySignals();
    void manyAtOnce();
    void hostIgnoresChildren();
};

void TestPtyProcess::nothingStarted()
{
    PtyProcess process;
    QCOMPARE(process.fd(), -1);
    QCOMPARE(process.readAll(true), QByteArray());
    QCOMPARE(process.readAll(false), QByteArray());
    QCOMPARE(process.WaitSlave(), -1);
    QCOMPARE(process.waitForChild(), 127);
}

void TestPtyProcess::output()
{
    PtyProcess process;
    QCOMPARE(process.exec("echo", {"hello"}), 0);
    QCOMPARE(process.readAll(true), QByteArray("hello\n"));
    QCOMPARE(process.readAll(true), QByteArray());
    QCOMPARE(process.readAll(true), QByteArray());
    QCOMPARE(process.waitForChild(), 0);
    QCOMPARE(process.waitForChild(), 0);
    QCOMPARE(process.readAll(true), QByteArray());
}

void TestPtyProcess::noPostProcessing()
{
    PtyProcess process;
    process.exec("printf", {"a\\nb\\r\\n\\tc"});
    QCOMPARE(readToEnd(process), QByteArray("a\nb\r\n\tc"));
}

void TestPtyProcess::arguments()
{
    PtyProcess process;
    process.exec("printf", {"<%s>", "", "a b", "$HOME;'\"`id`", "-o", "\xff\xfe"});
    QCOMPARE(readToEnd(process), QByteArray("<><a b><$HOME;'\"`id`><-o><\xff\xfe>"));
}

void TestPtyProcess::namedByCommand()
{
    PtyProcess process;
    process.exec("sh", script("echo \"$0\"; tr '\\0' '\\n' < /proc/$$/cmdline | head -n 1"));
    QCOMPARE(readToEnd(process), QByteArray("sh\nsh\n"));
}

void TestPtyProcess::noShellForScripts()
{
    const QTemporaryDir folder;
    QFile file(folder.filePath(QStringLiteral("tool")));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write("echo run by a shell\n");
    file.close();
    QVERIFY(file.setPermissions(QFile::ReadOwner | QFile::ExeOwner));

    PtyProcess process;
    QCOMPARE(process.exec(QFile::encodeName(file.fileName()), {}), 0);
    QCOMPARE(process.readAll(true), QByteArray());
    QCOMPARE(process.waitForChild(), 127);
}

void TestPtyProcess::controllingTerminal()
{
    PtyProcess process;
    process.exec(
        "sh",
        script("tty >/dev/tty; read -r _ _ _ _ _ sid _ rest < /proc/$$/stat; echo $((sid == $$));"
               "readlink /proc/self/fd/0 /proc/self/fd/1 /proc/self/fd/2 >/dev/tty"));
    const QList<QByteArray> lines = readToEnd(process).split('\n');
    QCOMPARE(lines.size(), 6);
    QVERIFY(lines[0].startsWith("/dev/pts/"));
    QCOMPARE(lines[1], QByteArray("1"));
    QCOMPARE(lines[2], lines[0]);
    QCOMPARE(lines[4], lines[0]);
}

void TestPtyProcess::terminalEchoes()
{
    PtyProcess process;
    process.exec("sh", script("read -r line; echo \"got $line\""));
    type(process, "text\n");
    QCOMPARE(readToEnd(process), QByteArray("text\ngot text\n"));
}

void TestPtyProcess::password()
{
    PtyProcess process;
    // The question before the echo is off, as the worse sort of tool has it.
    process.exec(
        "sh",
        script("printf 'user@host password: '; stty -echo; read -r p; stty echo; echo \"[$p]\""));
    QCOMPARE(process.readAll(true), QByteArray("user@host password: "));
    QCOMPARE(process.WaitSlave(), 0);
    type(process, "s3cret");
    type(process, "\n");
    QCOMPARE(readToEnd(process), QByteArray("[s3cret]\n"));
    QCOMPARE(process.waitForChild(), 0);
}

// On a busy machine a pause may grow beyond what is gathered, so one whole question of many is
// enough. Without gathering there would be none.
void TestPtyProcess::questionInPieces()
{
    bool whole = false;
    for (int attempt = 0; attempt < 30 && !whole; ++attempt) {
        PtyProcess process;
        process.exec(
            "sh",
            script("printf 'The host is not known.\\n'; sleep 0.003; printf 'Go on '; sleep 0.003;"
                   "printf '(yes/no)? '; read -r a"));
        whole = process.readAll(true) == "The host is not known.\nGo on (yes/no)? ";
    }
    QVERIFY(whole);
}

void TestPtyProcess::answersAreSeparate()
{
    PtyProcess process;
    process.exec(
        "sh", script("stty -echo; printf one; read -r a; printf two; read -r a; printf three"));
    QCOMPARE(process.readAll(true), QByteArray("one"));
    type(process, "\n");
    QCOMPARE(process.readAll(true), QByteArray("two"));
    type(process, "\n");
    QCOMPARE(process.readAll(true), QByteArray("three"));
    QCOMPARE(process.readAll(true), QByteArray());
}

void TestPtyProcess::endlessOutputDoesNotBlock()
{
    PtyProcess process;
    process.exec("yes", {});
    for (int i = 0; i < 5; ++i) {
        const QByteArray chunk = process.readAll(true);
        QVERIFY(chunk.size() > 0);
        QVERIFY2(chunk.size() < 128 * 1024, "bounded");
    }
    QVERIFY(process.readAll(false).size() < 128 * 1024);
}

void TestPtyProcess::largeOutput()
{
    PtyProcess process;
    process.exec("seq", {"200000"});
    QByteArray expected;
    for (int i = 1; i <= 200000; ++i) {
        expected += QByteArray::number(i) + '\n';
    }
    QVERIFY(readToEnd(process) == expected);
    QCOMPARE(process.waitForChild(), 0);
}

void TestPtyProcess::notBlocking()
{
    PtyProcess process;
    process.exec("sh", script("stty -echo; read -r a; echo \"$a\"; read -r a"));
    QElapsedTimer timer;
    timer.start();
    QCOMPARE(process.readAll(false), QByteArray());
    QVERIFY(timer.elapsed() < 1000);
    QCOMPARE(process.WaitSlave(), 0);
    type(process, "text\n");
    QByteArray seen;
    QTRY_VERIFY((seen += process.readAll(false)) == "text\n");
    QCOMPARE(process.readAll(false), QByteArray());
}

// The terminal itself does not end while the helper has it open.
void TestPtyProcess::endWithHelperOnTerminal()
{
    const QTemporaryDir folder;
    const QByteArray fifo = QFile::encodeName(folder.filePath(QStringLiteral("fifo")));
    QCOMPARE(mkfifo(fifo.constData(), 0600), 0);
    PtyProcess process;
    process.exec("sh", {"-c", "{ read -r a < \"$1\"; } & echo ready; exit 5", "sh", fifo});
    QCOMPARE(readToEnd(process), QByteArray("ready\n"));
    QCOMPARE(process.waitForChild(), 5);
    QFile release(QFile::decodeName(fifo));
    QVERIFY(release.open(QIODevice::WriteOnly));
}

void TestPtyProcess::helperSurvives()
{
    const QTemporaryDir folder;
    const QString alive = folder.filePath(QStringLiteral("alive"));
    const QByteArray fifo = QFile::encodeName(folder.filePath(QStringLiteral("fifo")));
    QCOMPARE(mkfifo(fifo.constData(), 0600), 0);
    {
        PtyProcess process;
        // In the foreground group of the terminal, to which the kernel sends SIGHUP.
        process.exec(
            "sh", {"-c", "{ read -r a < \"$1\"; echo \"$a\" > \"$2\"; } & exit 0", "sh", fifo,
                   QFile::encodeName(alive)});
        QCOMPARE(process.readAll(true), QByteArray());
        QCOMPARE(process.waitForChild(), 0);
    }
    // Session leader and terminal are gone. A helper that died would keep this from opening.
    int fd = -1;
    QTRY_VERIFY((fd = open(fifo.constData(), O_WRONLY | O_NONBLOCK)) >= 0);
    QCOMPARE(write(fd, "here\n", 5), ssize_t(5));
    close(fd);
    QTRY_COMPARE(QFileInfo(alive).size(), qint64(5));
}

void TestPtyProcess::terminalClosedByRunningChild()
{
    const QTemporaryDir folder;
    const QByteArray fifo = QFile::encodeName(folder.filePath(QStringLiteral("fifo")));
    QCOMPARE(mkfifo(fifo.constData(), 0600), 0);
    PtyProcess process;
    process.exec("sh", {"-c", "echo bye; exec <\"$1\" >&- 2>&-; read -r a; exit $a", "sh", fifo});
    int fd = -1;
    QTRY_VERIFY((fd = open(fifo.constData(), O_WRONLY | O_NONBLOCK)) >= 0);
    QCOMPARE(readToEnd(process), QByteArray("bye\n"));
    QCOMPARE(write(fd, "9\n", 2), ssize_t(2));
    close(fd);
    QCOMPARE(process.waitForChild(), 9);
}

void TestPtyProcess::waitSlaveLate()
{
    PtyProcess process;
    QElapsedTimer timer;
    timer.start();
    process.exec("sh", script("sleep 0.3; stty -echo; read -r a"));
    QCOMPARE(process.WaitSlave(), 0);
    QVERIFY(timer.elapsed() >= 300);
    QCOMPARE(process.WaitSlave(), 0);
}

void TestPtyProcess::waitSlaveBound()
{
    PtyProcess process;
    process.exec("sh", script("read -r a"));
    QElapsedTimer timer;
    timer.start();
    QCOMPARE(process.WaitSlave(), -1);
    QVERIFY(timer.elapsed() >= 1900);
    QVERIFY(timer.elapsed() < 10000);
}

void TestPtyProcess::waitSlaveChildEnds()
{
    PtyProcess process;
    process.exec("true", {});
    QElapsedTimer timer;
    timer.start();
    QCOMPARE(process.WaitSlave(), -1);
    QVERIFY2(timer.elapsed() < 1900, "does not wait for what can't come");
    QCOMPARE(process.waitForChild(), 0);
    QCOMPARE(process.WaitSlave(), -1);
}

void TestPtyProcess::exitStatus_data()
{
    QTest::addColumn<QByteArray>("text");
    QTest::addColumn<int>("status");
    QTest::newRow("0") << QByteArray("exit 0") << 0;
    QTest::newRow("1") << QByteArray("exit 1") << 1;
    QTest::newRow("255") << QByteArray("exit 255") << 255;
    QTest::newRow("SIGTERM") << QByteArray("kill -TERM $$") << 128 + SIGTERM;
    QTest::newRow("SIGKILL") << QByteArray("kill -KILL $$") << 128 + SIGKILL;
    QTest::newRow("SIGHUP is ignored") << QByteArray("kill -HUP $$; exit 3") << 3;
}

void TestPtyProcess::exitStatus()
{
    QFETCH(QByteArray, text);
    PtyProcess process;
    process.exec("sh", script(text));
    QTEST(process.waitForChild(), "status");
}

void TestPtyProcess::missing_data()
{
    QTest::addColumn<QByteArray>("command");
    QTest::newRow("not on PATH") << QByteArray("veyfm-no-such-tool");
    QTest::newRow("no such file") << QByteArray("/nonexistent/tool");
    QTest::newRow("a directory") << QByteArray("/tmp");
    QTest::newRow("not executable") << QByteArray("/etc/passwd");
    QTest::newRow("empty") << QByteArray("");
    QTest::newRow("null") << QByteArray();
}

void TestPtyProcess::missing()
{
    QFETCH(QByteArray, command);
    PtyProcess process;
    process.exec(command, {"x"});
    QCOMPARE(process.readAll(true), QByteArray());
    QCOMPARE(process.WaitSlave(), -1);
    QCOMPARE(process.waitForChild(), 127);
}

void TestPtyProcess::unreadOutputDoesNotBlockTheWait()
{
    PtyProcess process;
    process.exec("seq", {"200000"});
    QCOMPARE(process.waitForChild(), 0);
    const QByteArray rest = readToEnd(process);
    QVERIFY(rest.size() < 256 * 1024);
    QVERIFY2(rest.endsWith("\n199999\n200000\n"), "the last of it is kept");
}

void TestPtyProcess::usedAgain()
{
    PtyProcess process;
    process.exec("sh", script("echo first; exit 1"));
    QCOMPARE(readToEnd(process), QByteArray("first\n"));
    QCOMPARE(process.waitForChild(), 1);

    // Kept by the wait, but not for the next child.
    process.exec("sh", script("seq 200000; exit 2"));
    QCOMPARE(process.waitForChild(), 2);

    // Neither read nor waited for: nothing of it shows up in the next.
    process.exec("echo", {"third"});
    QTRY_VERIFY(waitid(P_ALL, 0, nullptr, WEXITED | WNOHANG | WNOWAIT) == 0);
    process.exec("echo", {"fourth"});
    QCOMPARE(readToEnd(process), QByteArray("fourth\n"));

    // Still running.
    process.exec("cat", {});
    process.exec("sh", script("echo fifth; exit 5"));
    QCOMPARE(readToEnd(process), QByteArray("fifth\n"));
    QCOMPARE(process.waitForChild(), 5);
    QVERIFY(!hasChildren());
}

void TestPtyProcess::usedAgainAfterMissing()
{
    PtyProcess process;
    process.exec("true", {});
    QCOMPARE(process.waitForChild(), 0);
    QCOMPARE(process.exec("veyfm-no-such-tool", {}), -1);
    QCOMPARE(process.fd(), -1);
    QCOMPARE(process.waitForChild(), 127);
    QCOMPARE(process.exec("echo", {"there"}), 0);
    QCOMPARE(readToEnd(process), QByteArray("there\n"));
}

void TestPtyProcess::endedByDestructor()
{
    {
        PtyProcess process;
        process.exec("sh", script("echo up; exec cat"));
        QCOMPARE(process.readAll(true), QByteArray("up\n"));
    }
    QVERIFY(!hasChildren());
}

void TestPtyProcess::forcedByDestructor()
{
    {
        PtyProcess process;
        process.exec("sh", script("trap '' TERM; echo up; while :; do sleep 1; done"));
        QCOMPARE(process.readAll(true), QByteArray("up\n"));
    }
    QVERIFY(!hasChildren());
}

void TestPtyProcess::leavesNothing()
{
    const QStringList before = descriptors();
    for (int i = 0; i < 10; ++i) {
        std::unique_ptr<PtyProcess> process = std::make_unique<PtyProcess>();
        process->exec("echo", {"x"});
        if (i % 2) {
            QCOMPARE(process->waitForChild(), 0);
        }
        process->exec("veyfm-no-such-tool", {});
        process->exec("true", {});
    }
    QCOMPARE(descriptors(), before);
    QVERIFY(!hasChildren());
}

void TestPtyProcess::closesDescriptors()
{
    const int plain = open("/dev/null", O_RDONLY); // Without O_CLOEXEC, as old code opens files.
    QVERIFY(plain >= 0);
    PtyProcess other;
    other.exec("cat", {});

    PtyProcess process;
    process.exec("sh", script("ls /proc/$$/fd"));
    const QList<QByteArray> open = readToEnd(process).simplified().split(' ');
    close(plain);
    // 10 and above are the shell's own.
    QCOMPARE(open.mid(0, 3), (QList<QByteArray>{"0", "1", "2"}));
    for (const QByteArray& fd : open.mid(3)) {
        QVERIFY2(fd.toInt() >= 10, fd.constData());
    }
}

void TestPtyProcess::signalsAsFresh()
{
    const auto pipeBefore = signal(SIGPIPE, SIG_IGN);
    const auto userBefore = signal(SIGUSR1, doNothing);
    sigset_t blocked;
    sigset_t before;
    sigemptyset(&blocked);
    sigaddset(&blocked, SIGUSR2);
    pthread_sigmask(SIG_BLOCK, &blocked, &before);

    PtyProcess process;
    process.exec("grep", {"^Sig[BI]", "/proc/self/status"});
    const QByteArray status = readToEnd(process);

    sigset_t now;
    pthread_sigmask(SIG_SETMASK, &before, &now);
    signal(SIGPIPE, pipeBefore);
    signal(SIGUSR1, userBefore);
    // SIGHUP is the lowest bit.
    QCOMPARE(status, QByteArray("SigBlk:\t0000000000000000\nSigIgn:\t0000000000000001\n"));
    QCOMPARE(sigismember(&now, SIGUSR2), 1);
    QCOMPARE(sigismember(&now, SIGUSR1), 0);
}

void TestPtyProcess::interruptedBySignals()
{
    struct sigaction action = {};
    action.sa_handler = doNothing; // Without SA_RESTART.
    struct sigaction before;
    sigaction(SIGUSR1, &action, &before);
    PtyProcess process;
    process.exec(
        "sh", {"-c",
               "for i in 1 2 3 4 5; do kill -USR1 $1; sleep 0.02; done; printf on; read -r a;"
               "for i in 1 2 3 4 5; do kill -USR1 $1; sleep 0.02; done; exit 7",
               "sh", QByteArray::number(getpid())});
    QCOMPARE(process.readAll(true), QByteArray("on"));
    type(process, "\n");
    QCOMPARE(process.waitForChild(), 7);
    sigaction(SIGUSR1, &before, nullptr);
}

void TestPtyProcess::manyAtOnce()
{
    std::vector<std::thread> threads;
    std::array<QByteArray, 4> seen;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&seen, i] {
            for (int round = 0; round < 10; ++round) {
                PtyProcess process;
                process.exec("echo", {QByteArray::number(i)});
                seen[size_t(i)] += readToEnd(process);
                seen[size_t(i)] += QByteArray::number(process.waitForChild());
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    for (int i = 0; i < 4; ++i) {
        QCOMPARE(seen[size_t(i)], (QByteArray::number(i) + "\n0").repeated(10));
    }
    QVERIFY(!hasChildren());
}

// The kernel then throws the status away, and nobody can say that the tool did well.
void TestPtyProcess::hostIgnoresChildren()
{
    const auto before = signal(SIGCHLD, SIG_IGN);
    // Some of these are over before anybody looks.
    QByteArray text;
    QSet<int> statuses;
    for (int i = 0; i < 50; ++i) {
        PtyProcess process;
        process.exec("echo", {"done"});
        text += readToEnd(process);
        statuses.insert(process.waitForChild());
    }
    signal(SIGCHLD, before);
    QCOMPARE(text, QByteArray("done\n").repeated(50));
    QCOMPARE(statuses, QSet<int>{127});
}

QTEST_GUILESS_MAIN(TestPtyProcess)
#include "tst_ptyprocess.moc"
