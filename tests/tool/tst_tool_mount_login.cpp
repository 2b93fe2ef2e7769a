// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

namespace {

const QByteArray noKey =
    "the key of the host is not known, and nobody could be asked about it: connect once with 'ssh "
    "me@host', which asks";

} // namespace

/// Logins of "mount" that scripts give, and those that nobody gives; and those of Samba.
class ToolMountLoginTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void passwordOfDescriptor_data();
    void passwordOfDescriptor();
    void readsOneLine();
    void descriptorStaysHere();
    void userOfOption_data();
    void userOfOption();
    void unfitDescriptor_data();
    void unfitDescriptor();
    void refusedPassword_data();
    void refusedPassword();
    void unknownHost_data();
    void unknownHost();
    void nobodyToAsk_data();
    void nobodyToAsk();
    void notNeeded();
    void unfitUser();
    void sambaAsks();
    void sambaThreeTries();
    void sambaEndOfInput();
    void sambaFromDescriptor();
    void sambaUserOfUrl();
    void sambaEmptyPassword();

private:
    /// With the network in a directory that has a share.
    QJsonObject sambaScript() const
    {
        QDir().mkpath(m_network.filePath(QStringLiteral("host/share/a")));
        return scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), m_network.path());
    }

    QByteArray shareLine(const char* below = "") const
    {
        return m_network.filePath(QStringLiteral("host/share")).toLocal8Bit() + below + '\n';
    }

    /// Neither the ticket of the user nor a guest is let in.
    static void refuseGuest(StandIn& tool)
    {
        tool.expect({"out NT_STATUS_LOGON_FAILURE\\n", "exit 1"});
        tool.expect({"out tree connect failed: NT_STATUS_ACCESS_DENIED\\n", "exit 1"});
    }

    QTemporaryDir m_network;
};

void ToolMountLoginTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountLoginTest::passwordOfDescriptor_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QByteArray>("text");
    QTest::addColumn<QByteArray>("typed");
    const QByteArray file = "\"$0\" mount --password-fd 7 sftp://me@host/ 7<\"$1\"";
    QTest::newRow("line") << file << QByteArray("geheim\n") << QByteArray("geheim\n");
    QTest::newRow("without its end") << file << QByteArray("geheim") << QByteArray("geheim\n");
    QTest::newRow("empty") << file << QByteArray("\n") << QByteArray("\n");
    QTest::newRow("blanks, UTF-8")
        << file << QByteArray(" g\u00e4 \t\n") << QByteArray(" g\u00e4 \t\n");
    QTest::newRow("longest") << file << QByteArray(1024, 'x') << QByteArray(1024, 'x') + '\n';
    QTest::newRow("standard input")
        << QByteArray("cat \"$1\" | \"$0\" mount --password-fd 0 sftp://me@host/")
        << QByteArray("geheim\n") << QByteArray("geheim\n");
    QTest::newRow("--no-input") << QByteArray("\"$0\" mount --no-input --password-fd 7 "
                                              "sftp://me@host/ 7<\"$1\"")
                                << QByteArray("geheim\n") << QByteArray("geheim\n");
}

void ToolMountLoginTest::passwordOfDescriptor()
{
    QFETCH(const QByteArray, line);
    QFETCH(const QByteArray, text);
    QFETCH(const QByteArray, typed);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    const ToolResult result = scene.runShell(line.constData(), text);
    QVERIFY2(result.exitCode == 0, result.err.constData());
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/me@host")));
    QCOMPARE(scene.tool.input(1), typed);
}

void ToolMountLoginTest::readsOneLine()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    const ToolResult result = scene.runShell(
        "{ \"$0\" mount --password-fd 0 sftp://me@host/; cat; } <\"$1\"", "geheim\nrest\n");
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/me@host")) + "rest\n");
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
}

void ToolMountLoginTest::descriptorStaysHere()
{
    MountScene scene("curlftpfs");
    scene.tool.expect(Said::ftpPassword() + Said::success());
    const ToolResult result =
        scene.runShell("\"$0\" mount --password-fd 7 ftp://me@host/ 7<\"$1\"", "geheim\n");
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
    QVERIFY(!scene.tool.descriptors(1).contains("7"));
}

void ToolMountLoginTest::userOfOption_data()
{
    QTest::addColumn<QByteArray>("url");
    QTest::newRow("none in the URL") << QByteArray("sftp://host/");
    QTest::newRow("the same") << QByteArray("sftp://me@host/");
}

void ToolMountLoginTest::userOfOption()
{
    QFETCH(const QByteArray, url);
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    const ToolResult result = scene.run("mount --user me " + url);
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/me@host")));
    QCOMPARE(scene.tool.arguments(1).value(0), QByteArray("me@host:/"));
}

void ToolMountLoginTest::unfitDescriptor_data()
{
    QTest::addColumn<QByteArray>("text");
    QTest::addColumn<QByteArray>("why");
    QTest::newRow("nothing") << QByteArray()
                             << QByteArray("no password could be read from descriptor 7");
    QTest::newRow("too long") << QByteArray(1025, 'x')
                              << QByteArray("a password can't be longer than 1024 bytes");
    QTest::newRow("keys of the terminal")
        << QByteArray("a\003b\n") << QByteArray("a password can't hold a control character");
    QTest::newRow("NUL") << QByteArray("a\0b\n", 4)
                         << QByteArray("a password can't hold a control character");
    QTest::newRow("encoding") << QByteArray("\xff\n")
                              << QByteArray(
                                     "the encoding of the locale can't express this password");
}

void ToolMountLoginTest::unfitDescriptor()
{
    QFETCH(const QByteArray, text);
    QFETCH(const QByteArray, why);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    const ToolResult result =
        scene.runShell("\"$0\" mount --password-fd 7 sftp://me@host/ 7<\"$1\"", text);
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, failure("sftp://me@host/", why));
    QCOMPARE(scene.tool.input(1), QByteArray("\n"));
    QVERIFY(scene.isClean());
}

void ToolMountLoginTest::refusedPassword_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArrayList>("run");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                          << Said::sshPassword() + Said::sshRefusal();
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/")
                         << Said::ftpPassword() + Said::ftpRefusal();
}

void ToolMountLoginTest::refusedPassword()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    QFETCH(const QByteArrayList, run);
    MountScene scene(tool);
    scene.tool.expect(run);
    const ToolResult result =
        scene.runShell("\"$0\" mount --password-fd 7 " + url + " 7<\"$1\"", "geheim\nother\n");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, failure(url, "the password was refused"));
    QCOMPARE(scene.tool.runs(), 1);
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
    QVERIFY(scene.isClean());
}

void ToolMountLoginTest::unknownHost_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::newRow("--no-input") << QByteArray("\"$0\" mount --no-input sftp://me@host/");
    QTest::newRow("--password-fd")
        << QByteArray("\"$0\" mount --password-fd 7 sftp://me@host/ 7<\"$1\"");
    QTest::newRow("no terminal") << QByteArray("\"$0\" mount sftp://me@host/");
}

void ToolMountLoginTest::unknownHost()
{
    QFETCH(const QByteArray, line);
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshHostKey() + Said::sshRefusal());
    const ToolResult result = scene.runShell(line.constData(), "geheim\n");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, "The authenticity of host 'host (192.0.2.1)' can't be established.\n"
                    "ED25519 key fingerprint is SHA256:c2VjcmV0.\n"
                    "This key is not known by any other names.\n"
                    "Are you sure you want to continue connecting (yes/no/[fingerprint])? \n" +
                        failure("sftp://me@host/", noKey));
    QCOMPARE(scene.tool.input(1), QByteArray("no\n"));
    QVERIFY(scene.isClean());
}

void ToolMountLoginTest::nobodyToAsk_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("options");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<QByteArray>("why");
    const QByteArrayList ssh = Said::sshPassword() + Said::sshRefusal();
    const QByteArrayList refused = {"err Error connecting to ftp: Access denied: 530\\n", "exit 1"};
    QTest::newRow("password") << QByteArray("sshfs") << QByteArray("")
                              << QByteArray("sftp://me@host/") << ssh
                              << QByteArray("a password for me on sftp://host is needed, and there "
                                            "is no terminal to ask on: use --password-fd");
    QTest::newRow("password, --no-input")
        << QByteArray("sshfs") << QByteArray("--no-input") << QByteArray("sftp://me@host/") << ssh
        << QByteArray("a password for me on sftp://host is needed, and --no-input forbids asking: "
                      "use --password-fd");
    QTest::newRow("password of the user's own")
        << QByteArray("sshfs") << QByteArray("--no-input") << QByteArray("sftp://host/") << ssh
        << QByteArray("a password for sftp://host is needed, and --no-input forbids asking: use "
                      "--password-fd");
    QTest::newRow("login") << QByteArray("curlftpfs") << QByteArray("") << QByteArray("ftp://host/")
                           << refused
                           << QByteArray("a login for ftp://host is needed, and there is no "
                                         "terminal to ask on: use --user and --password-fd");
    QTest::newRow("login, --no-input")
        << QByteArray("curlftpfs") << QByteArray("--no-input") << QByteArray("ftp://host/")
        << refused
        << QByteArray("a login for ftp://host is needed, and --no-input forbids asking: use "
                      "--user and --password-fd");
    QTest::newRow("user for the password")
        << QByteArray("curlftpfs") << QByteArray("--password-fd 7") << QByteArray("ftp://host/")
        << refused << QByteArray("a login for ftp://host is needed: use --user");
}

void ToolMountLoginTest::nobodyToAsk()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, options);
    QFETCH(const QByteArray, url);
    QFETCH(const QByteArrayList, run);
    QFETCH(const QByteArray, why);
    MountScene scene(tool);
    scene.tool.expect(run);
    const ToolResult result =
        scene.runShell("\"$0\" mount " + options + ' ' + url + " 7<\"$1\"", "geheim\n");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(result.err, failure(url, why));
    QCOMPARE(scene.tool.runs(), 1);
    QVERIFY(scene.isClean());
}

void ToolMountLoginTest::notNeeded()
{
    // A key, a ticket: nobody is asked, and the password stays where it is.
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    const ToolResult result = scene.runShell(
        "{ \"$0\" mount --password-fd 0 sftp://me@host/; cat; } <\"$1\"", "geheim\n");
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/me@host")) + "geheim\n");
}

void ToolMountLoginTest::unfitUser()
{
    MountScene scene("curlftpfs");
    const ToolResult result = scene.run("mount --user me,allow_other ftp://host/");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err,
        failure("ftp://host/", "curlftpfs can't be told of a user with ',' in its name"));
    QCOMPARE(scene.tool.runs(), 0);
}

void ToolMountLoginTest::sambaAsks()
{
    ToolScene service(sambaScript());
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    refuseGuest(scene.tool);
    scene.tool.expect({"out session setup failed: NT_STATUS_LOGON_FAILURE\\n", "exit 1"});
    scene.tool.expect({"out 1 blocks of size 1024. 1 blocks available\\n"});
    const auto session = scene.onTerminal("mount smb://WG;host/share/a");
    QVERIFY(session->waitFor("User name for smb://host/share [root]: "));
    session->type("you\n");
    QVERIFY(session->waitFor("Password for you on smb://host/share: "));
    QVERIFY2(!session->output().contains("ailure"), session->output().constData());
    session->type("wrong\n");
    QVERIFY(session->waitFor(
        "Logon failure for WG;host/share\nUser name for smb://host/share [you]: "));
    session->type("me\n");
    QVERIFY(session->waitFor("Password for me on smb://host/share: "));
    session->type("geheim\n");
    QCOMPARE(session->waitForEnd(), 0);
    QVERIFY2(session->output().endsWith(shareLine("/a")), session->output().constData());
    QVERIFY(!session->output().contains("geheim"));
    QVERIFY(scene.tool.arguments(3).contains("you"));
    QVERIFY(scene.tool.environment(3).contains("PASSWD=wrong"));
    QVERIFY(scene.tool.arguments(4).contains("me"));
    QVERIFY(scene.tool.environment(4).contains("PASSWD=geheim"));
    QVERIFY(!scene.tool.commandLine(4).contains("geheim"));
}

void ToolMountLoginTest::sambaThreeTries()
{
    ToolScene service(sambaScript());
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    refuseGuest(scene.tool);
    for (int i = 0; i < 3; ++i) {
        scene.tool.expect({"out NT_STATUS_LOGON_FAILURE\\n", "exit 1"});
    }
    const auto session = scene.onTerminal("mount --user you smb://host/share");
    for (int i = 1; i <= 3; ++i) {
        QVERIFY(session->waitFor("Password for you on smb://host/share: ", i));
        session->type("wrong\n");
    }
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith(failure("smb://host/share", "three passwords were refused")),
        session->output().constData());
    QCOMPARE(scene.tool.runs(), 5);
}

void ToolMountLoginTest::sambaEndOfInput()
{
    ToolScene service(sambaScript());
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    refuseGuest(scene.tool);
    const auto session = scene.onTerminal("mount smb://host/share");
    QVERIFY(session->waitFor("User name for smb://host/share [root]: "));
    session->type("\004");
    QCOMPARE(session->waitForEnd(), 1);
    QVERIFY2(
        session->output().endsWith("\n" + failure("smb://host/share", "cancelled")),
        session->output().constData());
    // Once, though the job asks twice.
    QCOMPARE(session->output().count("User name"), 1);
    QCOMPARE(scene.tool.runs(), 2);
}

void ToolMountLoginTest::sambaFromDescriptor()
{
    ToolScene service(sambaScript());
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    refuseGuest(scene.tool);
    scene.tool.expect({"out NT_STATUS_LOGON_FAILURE\\n", "exit 1"});
    const ToolResult result = scene.runShell(
        "\"$0\" mount --user you --password-fd 7 smb://host/share 7<\"$1\"", "geheim\n");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, failure("smb://host/share", "the password was refused"));
    QVERIFY(scene.tool.environment(3).contains("PASSWD=geheim"));
    QVERIFY(!scene.tool.descriptors(3).contains("7"));
}

void ToolMountLoginTest::sambaUserOfUrl()
{
    ToolScene service(sambaScript());
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    refuseGuest(scene.tool);
    scene.tool.expect({"out 1 blocks of size 1024. 1 blocks available\\n"});
    const ToolResult result =
        scene.runShell("\"$0\" mount --password-fd 7 smb://you@host/share 7<\"$1\"", "geheim\n");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.out, shareLine());
    QVERIFY(scene.tool.arguments(3).contains("you"));
}

void ToolMountLoginTest::sambaEmptyPassword()
{
    // smbclient would ask by itself then.
    ToolScene service(sambaScript());
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    refuseGuest(scene.tool);
    const ToolResult result =
        scene.runShell("\"$0\" mount --user you --password-fd 7 smb://host/share 7<\"$1\"", "\n");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, failure("smb://host/share", "smbclient can't be given an empty password"));
    QCOMPARE(scene.tool.runs(), 2);
}

QTEST_GUILESS_MAIN(ToolMountLoginTest)
#include "tst_tool_mount_login.moc"
