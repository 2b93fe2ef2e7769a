// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

namespace {

QByteArrayList asks(const QByteArray& prompt)
{
    return {"echo off", "out \r" + prompt, "read", "out \\n", "echo on"};
}

const QByteArrayList asksJumpHost = asks("jumper@gw.test's password: ");
const QByteArrayList asksPassphrase = asks("Enter passphrase for key '/k': ");
const QByteArrayList asksCode = asks("(me@host) Code: ");

} // namespace

/// What "mount" makes of prompts of SSH that are not for the password of the URL's user.
class ToolMountPromptsTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void jumpHost();
    void jumpHostRefuses();
    void descriptorIsNotForJumpHosts();
    void descriptorIsForTheHostByItsOtherNames_data();
    void descriptorIsForTheHostByItsOtherNames();
    void passphrase();
    void passphraseThreeTimes();
    void doesWithoutAPassphrase_data();
    void doesWithoutAPassphrase();
    void doesWithoutAPassphraseInVain();
    void ownWords();
    void ownWordsFromDescriptor();
};

void ToolMountPromptsTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountPromptsTest::jumpHost()
{
    MountScene scene("sshfs");
    scene.tool.expect(asksJumpHost + Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for jumper on sftp://gw.test: "));
    session->type("first\n");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    session->type("second\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("first\nsecond\n"));
}

void ToolMountPromptsTest::jumpHostRefuses()
{
    // The tries of the one are none of the other.
    MountScene scene("sshfs");
    const QByteArrayList twice = asksJumpHost + Said::sshPassword() + Said::sshRefusal();
    for (int run = 0; run < 3; ++run) {
        scene.tool.expect(twice);
    }
    const auto session = scene.onTerminal("mount sftp://me@host/");
    for (int run = 1; run <= 3; ++run) {
        QVERIFY(session->waitFor("Password for jumper on sftp://gw.test: ", run));
        session->type("right\n");
        QVERIFY(session->waitFor("Password for me on sftp://host: ", run));
        session->type("wrong\n");
    }
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith(failure("sftp://me@host/", "three passwords were refused")),
        session->output().constData());
    QCOMPARE(session->output().count("Access denied\n"), 2);
    QVERIFY(scene.isClean());
}

void ToolMountPromptsTest::descriptorIsNotForJumpHosts()
{
    MountScene scene("sshfs");
    // As ssh does on the way: it asks again.
    scene.tool.expect(asksJumpHost + QByteArrayList({"out jumper@gw.test's password: ", "hang"}));
    const ToolResult result =
        scene.runShell("\"$0\" mount --password-fd 7 sftp://me@host/ 7<\"$1\"", "geheim\n");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, failure(
                        "sftp://me@host/",
                        "a password for jumper on sftp://gw.test is needed, and that of "
                        "--password-fd is for host: let that host take a key, or type both"));
    QCOMPARE(scene.tool.input(1), QByteArray("\n"));
    QVERIFY(scene.isClean());
}

void ToolMountPromptsTest::descriptorIsForTheHostByItsOtherNames_data()
{
    QTest::addColumn<QByteArray>("configuration"); // As "ssh -G" tells it.
    QTest::newRow("name") << QByteArray("host work\nhostname GW.test\n");
    QTest::newRow("alias of the key")
        << QByteArray("host work\nhostname elsewhere\nhostkeyalias gw.test\n");
}

void ToolMountPromptsTest::descriptorIsForTheHostByItsOtherNames()
{
    QFETCH(QByteArray, configuration);
    MountScene scene("sshfs");
    QTemporaryDir programs;
    QFile ssh(programs.filePath(QStringLiteral("ssh")));
    QVERIFY(ssh.open(QIODevice::WriteOnly));
    ssh.write(
        "#!/bin/sh\n[ \"$*\" = '-G work -l me' ] && cat <<'TEXT'\n" + configuration + "TEXT\n");
    ssh.setPermissions(QFile::ReadOwner | QFile::WriteOwner | QFile::ExeOwner);
    ssh.close();
    const QByteArray path = qgetenv("PATH");
    qputenv("PATH", QFile::encodeName(programs.path()) + ':' + path);
    scene.tool.expect(asks("me@gw.test's password: ") + Said::success());
    const ToolResult result =
        scene.runShell("\"$0\" mount --password-fd 7 sftp://me@work/ 7<\"$1\"", "geheim\n");
    qputenv("PATH", path);
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
}

void ToolMountPromptsTest::passphrase()
{
    MountScene scene("sshfs");
    scene.tool.expect(asksPassphrase + Said::sshPassword() + Said::success());
    const auto session = scene.onTerminal("mount sftp://host/");
    QVERIFY(session->waitFor("Enter passphrase for key '/k': "));
    session->type("\n"); // An answer, too.
    QVERIFY(session->waitFor("User name for sftp://host [root]: "));
    session->type("\n");
    QVERIFY(session->waitFor("Password for sftp://host: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("\ngeheim\n"));
}

void ToolMountPromptsTest::passphraseThreeTimes()
{
    MountScene scene("sshfs");
    for (int run = 0; run < 3; ++run) {
        scene.tool.expect(asksPassphrase + Said::sshRefusal());
    }
    scene.tool.expect(asksPassphrase + QByteArrayList{"exit 1"});
    const auto session = scene.onTerminal("mount sftp://me@host/");
    for (int run = 1; run <= 3; ++run) {
        QVERIFY(session->waitFor("Enter passphrase for key '/k': ", run));
        session->type("wrong\n");
    }
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith(failure("sftp://me@host/", "three passwords were refused")),
        session->output().constData());
    QVERIFY(scene.isClean());
}

void ToolMountPromptsTest::doesWithoutAPassphrase_data()
{
    QTest::addColumn<QByteArray>("options");
    QTest::addColumn<QByteArray>("input");
    QTest::addColumn<QByteArray>("error");
    QTest::newRow("--password-fd")
        << QByteArray("--password-fd 7") << QByteArray("\ngeheim\n") << QByteArray();
    QTest::newRow("--no-input") << QByteArray("--no-input") << QByteArray("\n\n")
                                << failure(
                                       "sftp://me@host/",
                                       "a password for me on sftp://host is needed, and "
                                       "--no-input forbids asking: use --password-fd");
}

// ssh has other ways, such as the password.
void ToolMountPromptsTest::doesWithoutAPassphrase()
{
    QFETCH(QByteArray, options);
    QFETCH(QByteArray, input);
    QFETCH(QByteArray, error);
    MountScene scene("sshfs");
    scene.tool.expect(
        asksPassphrase + Said::sshPassword() +
        (error.isEmpty() ? Said::success() : QByteArrayList{"exit 1"}));
    const ToolResult result = scene.runShell(
        ("\"$0\" mount " + options + " sftp://me@host/ 7<\"$1\"").constData(), "geheim\n");
    QVERIFY2(result.err.contains(error), result.err.constData());
    QCOMPARE(result.exitCode, error.isEmpty() ? 0 : 1);
    QCOMPARE(scene.tool.input(1), input);
}

// Where the server takes keys alone.
void ToolMountPromptsTest::doesWithoutAPassphraseInVain()
{
    MountScene scene("sshfs");
    scene.tool.expect(asksPassphrase + Said::sshRefusal());
    scene.tool.expect(asksPassphrase + Said::sshRefusal());
    const ToolResult result = scene.run("mount --no-input sftp://me@host/");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, failure(
                        "sftp://me@host/",
                        "the connection ended before a password was asked for: look with 'ssh "
                        "me@host' whether the host answers, and lets you in"));
    QVERIFY(scene.isClean());
}

void ToolMountPromptsTest::ownWords()
{
    MountScene scene("sshfs");
    scene.tool.expect(asks("\033[1m(me@host) Code:\007 ") + Said::success());
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("[1m(me@host) Code: "));
    session->type("123456\n");
    QCOMPARE(session->waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("123456\n"));
    QVERIFY(!session->output().contains('\033') && !session->output().contains("123456"));
}

void ToolMountPromptsTest::ownWordsFromDescriptor()
{
    MountScene scene("sshfs");
    scene.tool.expect(asksCode + Said::success());
    const ToolResult result =
        scene.runShell("\"$0\" mount --password-fd 7 sftp://me@host/ 7<\"$1\"", "geheim\n");
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
}

QTEST_GUILESS_MAIN(ToolMountPromptsTest)
#include "tst_tool_mount_prompts.moc"
