// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

namespace {

const QByteArray question = "Password for me on sftp://host: ";

// Mends a typing error, which works only where the terminal reads lines.
const QByteArray typed = "gehx\177eim\n";
const QByteArray password = "geheim\n";

/// An interactive shell, which has the terminal in modes of its own while it reads a line, and
/// tells at once when a job stops.
class Shell
{
public:
    explicit Shell(const MountScene& scene)
        : m_session(
              QStringLiteral("/bin/bash"),
              {QStringLiteral("--norc"), QStringLiteral("--noprofile"), QStringLiteral("-ib")},
              QDir::rootPath(), environment(scene), 200)
    {
    }

    TerminalSession* operator->()
    {
        return &m_session;
    }

    /// Has a line run, "$TOOL" in it being the program.
    void run(const QByteArray& line)
    {
        m_session.type(line + '\n');
    }

    /// Whether the next line leaves the terminal as a shell needs it, and without the password.
    bool isTerminalWell()
    {
        run("stty -a; printf '%s so' done");
        return m_session.waitFor("done so") && m_session.output().contains(" icanon ") &&
               m_session.output().contains(" echo ") && !m_session.output().contains("geheim");
    }

private:
    static QProcessEnvironment environment(const MountScene& scene)
    {
        QProcessEnvironment all = scene.environment();
        all.insert(QStringLiteral("TOOL"), toolPath());
        return all;
    }

    TerminalSession m_session;
};

} // namespace

/// The questions of "mount", where the program is stopped and goes on meanwhile.
class ToolMountJobControlTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void stopped();
    void stoppedInPlainShell();
    void continuedInBackground();
    void userNameInBackground();
    void startedInBackground();
    void stoppedUnseen();
    void stoppedUnseenInPlainShell();
    void endedWhileStopped();
    void endedInBackground();
    void outOfReach();
};

void ToolMountJobControlTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountJobControlTest::stopped()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    Shell shell(scene);
    shell.run("$TOOL mount sftp://me@host/");
    QVERIFY(shell->waitFor(question));
    shell->type("\032");
    QVERIFY2(shell->waitFor("Stopped"), shell->output().constData());
    shell.run("fg");
    QVERIFY(shell->waitFor(question, 2));
    shell->type(typed);
    QVERIFY(shell->waitFor(scene.line(QStringLiteral("sftp/me@host"))));
    QVERIFY2(shell.isTerminalWell(), shell->output().constData());
    QCOMPARE(scene.tool.input(1), password);
}

void ToolMountJobControlTest::stoppedInPlainShell()
{
    // One that leaves terminals as they are.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    TerminalSession session(
        QStringLiteral("/bin/dash"),
        {QStringLiteral("-mc"), QStringLiteral("\"$0\" mount sftp://me@host/; echo stopped; fg"),
         toolPath()},
        QDir::rootPath(), scene.environment(), 200);
    QVERIFY(session.waitFor(question));
    session.type("\032");
    QVERIFY2(session.waitFor("stopped\n"), session.output().constData());
    QVERIFY(session.waitFor(question, 2));
    session.type(typed);
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), password);
    QVERIFY(!session.output().contains("geheim"));
}

void ToolMountJobControlTest::continuedInBackground()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    Shell shell(scene);
    shell.run("$TOOL mount sftp://me@host/");
    QVERIFY(shell->waitFor(question));
    shell->type("\032");
    QVERIFY2(shell->waitFor("Stopped"), shell->output().constData());
    for (int i = 1; i <= 2; ++i) {
        shell.run("bg");
        QVERIFY2(shell->waitFor("Stopped", 1 + i), shell->output().constData());
    }
    shell.run("fg");
    QVERIFY(shell->waitFor(question, 2));
    shell->type(typed);
    QVERIFY(shell->waitFor(scene.line(QStringLiteral("sftp/me@host"))));
    QVERIFY2(shell.isTerminalWell(), shell->output().constData());
    QCOMPARE(scene.tool.input(1), password);
}

void ToolMountJobControlTest::userNameInBackground()
{
    // The question can be seen when it is its turn.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + Said::success());
    Shell shell(scene);
    shell.run("$TOOL mount sftp://host/ &");
    QVERIFY2(shell->waitFor("Stopped"), shell->output().constData());
    QVERIFY2(!shell->output().contains("User name"), shell->output().constData());
    shell.run("fg");
    QVERIFY(shell->waitFor("User name for sftp://host [root]: "));
    shell->type("\n");
    QVERIFY(shell->waitFor("Password for sftp://host: "));
    shell->type(typed);
    QVERIFY(shell->waitFor(scene.line(QStringLiteral("sftp/host"))));
    QCOMPARE(scene.tool.input(1), password);
    QVERIFY2(shell.isTerminalWell(), shell->output().constData());
}

void ToolMountJobControlTest::startedInBackground()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    Shell shell(scene);
    // Beside it there is one that does not read.
    shell.run("$TOOL mount sftp://me@host/ | cat &");
    QVERIFY2(shell->waitFor("Stopped"), shell->output().constData());
    shell.run("fg");
    QVERIFY(shell->waitFor(question));
    shell->type(typed);
    QVERIFY(shell->waitFor(scene.line(QStringLiteral("sftp/me@host"))));
    QCOMPARE(scene.tool.input(1), password);
    QVERIFY2(shell.isTerminalWell(), shell->output().constData());
}

void ToolMountJobControlTest::stoppedUnseen()
{
    // The shell puts the terminal in modes of its own, and the echo would be on.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    Shell shell(scene);
    shell.run("$TOOL mount sftp://me@host/");
    QVERIFY(shell->waitFor(question));
    QTRY_COMPARE(scene.tool.runs(), 1);
    ::kill(scene.programOf(1), SIGSTOP);
    QVERIFY2(shell->waitFor("Stopped"), shell->output().constData());
    shell.run("fg");
    QVERIFY(shell->waitFor(question, 2));
    shell->type(typed);
    QVERIFY(shell->waitFor(scene.line(QStringLiteral("sftp/me@host"))));
    QCOMPARE(scene.tool.input(1), password);
    QVERIFY2(shell.isTerminalWell(), shell->output().constData());
}

void ToolMountJobControlTest::stoppedUnseenInPlainShell()
{
    // The terminal has no echo when the program finds itself in the background.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    TerminalSession session(
        QStringLiteral("/bin/dash"),
        {QStringLiteral("-mc"),
         QStringLiteral("\"$0\" mount sftp://me@host/; bg;"
                        "until jobs >\"$HOME/jobs\"; grep -q 'tty input' \"$HOME/jobs\"; do"
                        "    sleep 0.1; "
                        "done; fg; stty -a; echo end"),
         toolPath()},
        QDir::rootPath(), scene.environment(), 200);
    QVERIFY(session.waitFor(question));
    QTRY_COMPARE(scene.tool.runs(), 1);
    ::kill(scene.programOf(1), SIGSTOP);
    QVERIFY2(session.waitFor(question, 2), session.output().constData());
    session.type(typed);
    QVERIFY2(session.waitFor("end\n"), session.output().constData());
    QVERIFY2(session.output().contains(" echo "), session.output().constData());
    QCOMPARE(scene.tool.input(1), password);
    QVERIFY(!session.output().contains("geheim"));
}

void ToolMountJobControlTest::endedWhileStopped()
{
    // A shell and timeout(1) have what they signal go on as well.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor(question));
    QVERIFY(!session->hasEcho());
    for (const int number : {SIGSTOP, SIGQUIT, SIGCONT}) {
        ::kill(session->processId(), number);
    }
    QCOMPARE(session->waitForEnd(), 128 + SIGQUIT);
    QCOMPARE(session->processId(), -1);
    QCOMPARE(session->output().count(question), 1);
    QVERIFY(session->hasEcho());
}

void ToolMountJobControlTest::endedInBackground()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    Shell shell(scene);
    shell.run("$TOOL mount sftp://me@host/ &");
    QVERIFY2(shell->waitFor("Stopped"), shell->output().constData());
    // On a machine that is very busy it may stop once more before.
    shell.run("while kill %1; do sleep 1; done 2>/dev/null");
    QVERIFY2(
        shell->waitFor("veyfm-vfs: sftp://me@host/: interrupted\n"), shell->output().constData());
    QVERIFY2(shell.isTerminalWell(), shell->output().constData());
    QVERIFY(!shell->output().contains(question));
    QVERIFY(scene.isClean());
}

void ToolMountJobControlTest::outOfReach()
{
    // Its shell has gone.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    Shell shell(scene);
    shell.run("($TOOL mount sftp://me@host/ &)");
    QVERIFY2(
        shell->waitFor(failure(
            "sftp://me@host/", "asking needs the terminal, and no shell can bring the program "
                               "from the background to the foreground")),
        shell->output().constData());
    QVERIFY(!shell->output().contains(question));
    QVERIFY(scene.isClean());
}

QTEST_GUILESS_MAIN(ToolMountJobControlTest)
#include "tst_tool_mount_jobcontrol.moc"
