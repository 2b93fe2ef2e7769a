// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

#include <signal.h>

/// What "mount" asks at the terminal, and what becomes of the answers.
class ToolMountTerminalTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void password();
    void passwordOfNobodyKnown();
    void otherUser();
    void refusedOnce();
    void refusedWithoutUser();
    void threeTries();
    void neverAskedByServer_data();
    void neverAskedByServer();
    void otherUserNeverAsked();
    void anonymousRefused();
    void ftpRefusedOnce();
    void unfitUserName();
    void unfitPassword();
    void unknownHost();
    void unknownHostRefused();
    void unknownHostThenWrongPassword();
    void unknownHostOtherUserWrongPassword();
    void hostileQuestion();
    void endOfInput();
    void terminalBesidePipes();
    void echoComesBack_data();
    void echoComesBack();
    void showsThatItWaits();
};

void ToolMountTerminalTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountTerminalTest::password()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount sftp://me@host/etc");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
    const QByteArray output = session->output();
    QVERIFY2(output.endsWith(scene.line(QStringLiteral("sftp/me@host/etc"))), output.constData());
    QVERIFY(!output.contains("geheim"));
    QVERIFY2(!output.contains("denied"), output.constData());
}

void ToolMountTerminalTest::passwordOfNobodyKnown()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + Said::success());
    const auto session = scene.onTerminal("mount sftp://host/");
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("\n");
    QVERIFY(session->waitFor("Password for sftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    // ssh knows whom it takes; it is not told.
    QCOMPARE(scene.tool.arguments(1).value(0), QByteArray("host:/"));
    QVERIFY(session->output().endsWith(scene.line(QStringLiteral("sftp/host"))));
}

void ToolMountTerminalTest::otherUser()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + QByteArrayList{"exit 1"});
    scene.tool.expect(Said::sshPassword("you") + Said::success());
    const auto session = scene.onTerminal("mount --json sftp://host/");
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("you\n");
    QVERIFY(session->waitFor("Password for you on sftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("\n"));
    QCOMPARE(scene.tool.arguments(2).value(0), QByteArray("you@host:/"));
    QCOMPARE(scene.tool.input(2), QByteArray("geheim\n"));
    QVERIFY(session->output().contains("\"url\":\"sftp://you@host/\""));
    QVERIFY(!QFile::exists(scene.directory(QStringLiteral("sftp/host"))));
}

void ToolMountTerminalTest::refusedOnce()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    QVERIFY2(!session->output().contains("denied"), session->output().constData());
    session->type("wrong\n");
    QVERIFY(session->waitFor("Access denied\nPassword for me on sftp://host: "));
    session->type("right\n");
    QCOMPARE(session->waitForEnd(), 0);
    // Once each, though the job asks twice.
    QCOMPARE(session->output().count("Password for"), 2);
    QCOMPARE(scene.tool.input(1), QByteArray("wrong\n"));
    QCOMPARE(scene.tool.input(2), QByteArray("right\n"));
}

void ToolMountTerminalTest::refusedWithoutUser()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + Said::sshRefusal());
    scene.tool.expect(Said::sshPassword("root") + Said::success());
    const auto session = scene.onTerminal("mount sftp://host/");
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("\n");
    QVERIFY(session->waitFor("Password for sftp://host: "));
    session->type("wrong\n");
    QVERIFY(session->waitFor("Access denied\nUser name for sftp://host [root]: "));
    session->type("\n");
    QVERIFY(session->waitFor("Password for sftp://host: ", 2));
    session->type("right\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(session->output().count("Password for"), 2);
    QCOMPARE(scene.tool.input(2), QByteArray("right\n"));
}

void ToolMountTerminalTest::threeTries()
{
    MountScene scene("sshfs");
    for (int i = 0; i < 3; ++i) {
        scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    }
    const auto session = scene.onTerminal("mount sftp://me@host/");
    int asked = 0;
    for (const char* password : {"first\n", "second\n", "third\n"}) {
        QVERIFY(session->waitFor("Password for me on sftp://host: ", ++asked));
        session->type(password);
    }
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith("veyfm-vfs: sftp://me@host/: three passwords were refused\n"),
        session->output().constData());
    QCOMPARE(session->output().count("Password for"), 3);
    QCOMPARE(session->output().count("Access denied\n"), 2);
    QCOMPARE(scene.tool.runs(), 3);
    QVERIFY(scene.isClean());
}

void ToolMountTerminalTest::neverAskedByServer_data()
{
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArray>("command");
    const auto row = [](const char* url, const char* command) {
        QTest::newRow(url) << QByteArray(url) << QByteArray(command);
    };
    row("sftp://me@host/", "ssh me@host");
    row("sftp://host/", "ssh host");
    row("sftp://me%40example.org@host/", "ssh me@example.org@host");
    // A shell would take these for something else.
    row("sftp://WG%5Cme@host/", "ssh host");
    row("sftp://~me@host/", "ssh host");
    row("sftp://me%23@host/", "ssh host");
}

void ToolMountTerminalTest::neverAskedByServer()
{
    // An unknown host, a server that has gone and one that takes keys alone all read like this.
    QFETCH(const QByteArray, url);
    QFETCH(const QByteArray, command);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshRefusal());
    const auto session = scene.onTerminal("mount " + url);
    QCOMPARE(session->waitForEnd(), 1);
    QCOMPARE(
        session->output(),
        failure(
            url, "the connection ended before a password was asked for: look with '" + command +
                     "' whether the host answers, and lets you in"));
    QCOMPARE(scene.tool.runs(), 1);
    QVERIFY(scene.isClean());
}

void ToolMountTerminalTest::otherUserNeverAsked()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + QByteArrayList{"exit 1"});
    scene.tool.expect(Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://host/");
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("you\n");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(session->output().contains("look with 'ssh you@host'"), session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountTerminalTest::anonymousRefused()
{
    MountScene scene("curlftpfs");
    scene.tool.expect({"err Error connecting to ftp: Access denied: 530\\n", "exit 1"});
    scene.tool.expect(Said::ftpPassword("you") + Said::success());
    const auto session = scene.onTerminal("mount ftp://host/pub");
    QVERIFY(session->waitFor("User name for ftp://host [root]: "));
    session->type("you\n");
    QVERIFY(session->waitFor("Password for you on ftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(2), QByteArray("geheim\n"));
    QVERIFY(session->output().endsWith(scene.line(QStringLiteral("ftp/you@host/pub"))));
    QVERIFY(!session->output().contains("geheim"));
}

void ToolMountTerminalTest::ftpRefusedOnce()
{
    MountScene scene("curlftpfs");
    scene.tool.expect(Said::ftpPassword() + Said::ftpRefusal());
    scene.tool.expect(Said::ftpPassword() + Said::success());
    const auto session = scene.onTerminal("mount ftp://me@host/");
    QVERIFY(session->waitFor("Password for me on ftp://host: "));
    session->type("wrong\n");
    QVERIFY(session->waitFor("Access denied\nPassword for me on ftp://host: "));
    session->type("right\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(session->output().count("Password for"), 2);
    QCOMPARE(scene.tool.input(1), QByteArray("wrong\n"));
    QCOMPARE(scene.tool.input(2), QByteArray("right\n"));
}

void ToolMountTerminalTest::unfitUserName()
{
    MountScene scene("curlftpfs");
    scene.tool.expect({"err Error connecting to ftp: Access denied: 530\\n", "exit 1"});
    scene.tool.expect(Said::ftpPassword("you") + Said::success());
    const auto session = scene.onTerminal("mount ftp://host/");
    QVERIFY(session->waitFor("User name for ftp://host [root]: "));
    session->type("you,allow_other\n");
    QVERIFY(session->waitFor("curlftpfs can't be told of a user with ',' in its name\n"
                             "User name for ftp://host [root]: "));
    session->type("you\n");
    QVERIFY(session->waitFor("Password for you on ftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.arguments(2).mid(0, 2), QByteArrayList({"-o", "user=you"}));
}

void ToolMountTerminalTest::unfitPassword()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("a\033b\n");
    QVERIFY(session->waitFor("a password can't hold a control character\nPassword for "));
    session->type("\xff\xfe\n");
    QVERIFY(
        session->waitFor("the encoding of the locale can't express this password\nPassword for "));
    session->type(QByteArray(2000, 'x') + '\n');
    QVERIFY(session->waitFor("a password can't be longer than 1024 bytes\nPassword for "));
    session->type("gut\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("gut\n"));
}

void ToolMountTerminalTest::unknownHost()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshHostKey() + Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("ED25519 key fingerprint is SHA256:c2VjcmV0.\n"));
    QVERIFY(session->waitFor("Type yes or no: "));
    session->type("y\n");
    QVERIFY(session->waitFor("Type yes or no: y\nType yes or no: "));
    session->type("yes\n");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("yes\ngeheim\n"));
}

void ToolMountTerminalTest::unknownHostRefused()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshHostKey() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Type yes or no: "));
    session->type("no\n");
    QCOMPARE(session->waitForEnd(), 1);
    QCOMPARE(scene.tool.input(1), QByteArray("no\n"));
    QVERIFY2(
        session->output().endsWith(
            "veyfm-vfs: sftp://me@host/: the key of the host was not accepted\n"),
        session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountTerminalTest::unknownHostThenWrongPassword()
{
    // The job ends without a word then.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshHostKey() + Said::sshPassword() + Said::sshRefusal());
    scene.tool.expect(Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Type yes or no: "));
    session->type("yes\n");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("wrong\n");
    QVERIFY(session->waitFor("Access denied\nPassword for me on sftp://host: "));
    session->type("right\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(2), QByteArray("right\n"));
}

void ToolMountTerminalTest::unknownHostOtherUserWrongPassword()
{
    // The next job goes on with the user of the last one.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + QByteArrayList{"exit 1"});
    scene.tool.expect(Said::sshHostKey() + Said::sshPassword("you") + Said::sshRefusal());
    scene.tool.expect(Said::sshPassword("you") + Said::success());
    const auto session = scene.onTerminal("mount sftp://host/");
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("you\n");
    QVERIFY(session->waitFor("Type yes or no: "));
    session->type("yes\n");
    QVERIFY(session->waitFor("Password for you on sftp://host: "));
    session->type("wrong\n");
    QVERIFY(session->waitFor("Access denied\nPassword for you on sftp://host: "));
    session->type("right\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.arguments(3).value(0), QByteArray("you@host:/"));
    QVERIFY(session->output().endsWith(scene.line(QStringLiteral("sftp/you@host"))));
}

void ToolMountTerminalTest::hostileQuestion()
{
    MountScene scene("sshfs");
    scene.tool.expect(
        QByteArrayList{"out \033]0;title\007\033[2Jkey (yes/no)? ", "read"} + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Type yes or no: "));
    session->type("no\n");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY(session->output().contains("\\033]0;title\\a\\033[2Jkey (yes/no)? \n"));
    QVERIFY(!session->output().contains("\033]0;"));
}

void ToolMountTerminalTest::endOfInput()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("\004");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith("\nveyfm-vfs: sftp://me@host/: cancelled\n"),
        session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountTerminalTest::terminalBesidePipes()
{
    // Standard input and output are for others.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    TerminalSession session(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"),
         QStringLiteral("echo no | \"$0\" mount sftp://me@host/ 2>/dev/null | sed 's/^/path: /'"),
         toolPath()},
        QDir::rootPath(), scene.environment());
    QVERIFY(session.waitFor("Password for me on sftp://host: "));
    session.type("geheim\n");
    QCOMPARE(session.waitForEnd(), 0);
    QVERIFY2(
        session.output().endsWith("path: " + scene.line(QStringLiteral("sftp/me@host"))),
        session.output().constData());
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
}

void ToolMountTerminalTest::echoComesBack_data()
{
    QTest::addColumn<QByteArray>("keys");
    QTest::newRow("answer") << QByteArray("geheim\n");
    QTest::newRow("Ctrl-C") << QByteArray("\003");
    QTest::newRow("Ctrl-D") << QByteArray("\004");
    QTest::newRow("Ctrl-Z") << QByteArray("\032");
    QTest::newRow("Ctrl-\\") << QByteArray("\034");
}

void ToolMountTerminalTest::echoComesBack()
{
    QFETCH(const QByteArray, keys);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    // With job control, without which Ctrl-Z does nothing. This shell leaves terminals as they
    // are. It would end with a program that died of Ctrl-C.
    TerminalSession session(
        QStringLiteral("/bin/dash"),
        {QStringLiteral("-mc"),
         QStringLiteral(
             "trap : INT; \"$0\" mount sftp://me@host/; stty -a; kill -KILL %1; echo end"),
         toolPath()},
        QDir::rootPath(), scene.environment(), 200);
    QVERIFY(session.waitFor("Password for me on sftp://host: "));
    session.type(keys);
    QVERIFY2(session.waitFor("end\n"), session.output().constData());
    QVERIFY2(session.output().contains(" echo "), session.output().constData());
}

void ToolMountTerminalTest::showsThatItWaits()
{
    MountScene scene("sshfs");
    scene.tool.expect({"hang"});
    QProcessEnvironment environment = scene.environment();
    environment.insert(QStringLiteral("TERM"), QStringLiteral("xterm"));
    TerminalSession session(
        toolPath(), MountScene::words("mount sftp://me@host/"), QDir::rootPath(), environment);
    QVERIFY(session.waitFor(" Mounting sftp://me@host/ (1 s)"));
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session.output().endsWith("\r\033[Kveyfm-vfs: sftp://me@host/: interrupted\n"),
        session.output().constData());
}

QTEST_GUILESS_MAIN(ToolMountTerminalTest)
#include "tst_tool_mount_terminal.moc"
