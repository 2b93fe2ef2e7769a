// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/helpersession.h"
#include "support/mountscene.h"

#include <QTest>

/// What veyfm-mount asks, and what it makes of the answers.
class MountHelperLoginTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void passwordOfSftp();
    void passwordOfFtp();
    void passwordOfSamba();
    void wrongPassword_data();
    void wrongPassword();
    void lastPassword_data();
    void lastPassword();
    void wrongPasswordBehindTheKey();
    void keyRefused();
    void endsBeforeThePassword();
    void endsBehindTheKey();
    void givenUp_data();
    void givenUp();
    void givenUpAtSamba();
    void otherUser_data();
    void otherUser();
    void otherUserWithoutPassword();
    void unfitUser();
    void guestRefused();
    void userOfTheRequest();
    void toolIsMissing();

private:
    static QJsonObject samba(const QString& directory)
    {
        return scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), directory);
    }
};

void MountHelperLoginTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void MountHelperLoginTest::passwordOfSftp()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    const QJsonObject question = session.next();
    QCOMPARE(textOf(question, "say"), QStringLiteral("question"));
    QCOMPARE(textOf(question, "kind"), QStringLiteral("password"));
    QCOMPARE(numberOf(question, "id"), 1);
    QCOMPARE(textOf(question, "title"), QStringLiteral("Access denied"));
    QCOMPARE(textOf(question, "message"), QStringLiteral("Enter host password for user:"));
    QCOMPARE(textOf(question, "user"), QStringLiteral("me"));
    QCOMPARE(textOf(question, "protocol"), QStringLiteral("sftp"));
    QCOMPARE(textOf(question, "host"), QStringLiteral("host"));
    QCOMPARE(flagOf(question, "retry"), false);
    session.answerPassword(1, "ge\\u0068eim \\u00e4");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("accepted"));
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "text"), QString());
    QCOMPARE(textOf(end, "url"), QStringLiteral("sftp://me@host/"));
    QCOMPARE(textOf(end, "localPath"), scene.directory(QStringLiteral("sftp/me@host")));
    QCOMPARE(textOf(end, "directory"), scene.directory(QStringLiteral("sftp/me@host")));
    QCOMPARE(textOf(end, "mounted"), QStringLiteral("new"));
    QCOMPARE(flagOf(end, "shared"), false);
    QVERIFY(textOf(end, "why").startsWith(QLatin1String("no session bus")));
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(session.errors(), QByteArray());
    QCOMPARE(scene.tool.input(1), QByteArray("geheim \xc3\xa4\n"));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("sftp/me@host")));
}

void MountHelperLoginTest::passwordOfFtp()
{
    MountScene scene("curlftpfs");
    scene.tool.expect(Said::ftpPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("ftp://me@host/");
    const QJsonObject question = session.next();
    QCOMPARE(textOf(question, "kind"), QStringLiteral("password"));
    QCOMPARE(textOf(question, "protocol"), QStringLiteral("ftp"));
    QCOMPARE(textOf(question, "user"), QStringLiteral("me"));
    QCOMPARE(flagOf(question, "retry"), false);
    session.answerPassword(1, "geheim");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("accepted"));
    QCOMPARE(numberOf(session.next(), "code"), 0);
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("geheim\n"));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("ftp/me@host")));
}

void MountHelperLoginTest::passwordOfSamba()
{
    QTemporaryDir network;
    QVERIFY(QDir(network.path()).mkpath(QStringLiteral("host/share/a")));
    ToolScene service(samba(network.path()));
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    scene.tool.expect({});
    scene.tool.expect({"out NT_STATUS_LOGON_FAILURE\\n"});
    scene.tool.expect({"out NT_STATUS_LOGON_FAILURE\\n"});
    scene.tool.expect({});
    HelperSession session(scene.environment());
    session.mount("smb://me@host/share/a");
    const QJsonObject question = session.next();
    QCOMPARE(textOf(question, "protocol"), QStringLiteral("smb"));
    QCOMPARE(textOf(question, "user"), QStringLiteral("me"));
    QCOMPARE(textOf(question, "object"), QStringLiteral("share"));
    QCOMPARE(textOf(question, "title"), QString());
    QCOMPARE(flagOf(question, "retry"), false);
    session.answerPassword(1, "falsch");
    const QJsonObject rejected = session.next();
    QCOMPARE(textOf(rejected, "say"), QStringLiteral("rejected"));
    QCOMPARE(textOf(rejected, "user"), QStringLiteral("me"));
    const QJsonObject again = session.next();
    QCOMPARE(textOf(again, "title"), QStringLiteral("Logon failure"));
    QCOMPARE(textOf(again, "message"), QStringLiteral("Logon failure for host/share"));
    QCOMPARE(flagOf(again, "retry"), true);
    session.answerPassword(2, "geheim", R"(,"user":"you")");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("accepted"));
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "mounted"), QStringLiteral("reached"));
    QCOMPARE(textOf(end, "localPath"), network.filePath(QStringLiteral("host/share/a")));
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    QVERIFY(scene.tool.arguments(3).contains("me"));
    QVERIFY(scene.tool.environment(3).contains("PASSWD=falsch"));
    QVERIFY(scene.tool.arguments(4).contains("you"));
    QVERIFY(scene.tool.environment(4).contains("PASSWD=geheim"));
}

void MountHelperLoginTest::wrongPassword_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArrayList>("prompt");
    QTest::addColumn<QByteArrayList>("refusal");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                          << Said::sshPassword() << Said::sshRefusal();
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/")
                         << Said::ftpPassword() << Said::ftpRefusal();
}

void MountHelperLoginTest::wrongPassword()
{
    QFETCH(QByteArray, tool);
    QFETCH(QByteArray, url);
    QFETCH(QByteArrayList, prompt);
    QFETCH(QByteArrayList, refusal);
    MountScene scene(tool);
    scene.tool.expect(prompt + refusal);
    scene.tool.expect(prompt + refusal);
    scene.tool.expect(prompt + Said::success());
    HelperSession session(scene.environment());
    session.mount(url);
    // The question that a job throws the answer of away is not among them.
    for (int i = 1; i <= 3; ++i) {
        const QJsonObject question = session.next();
        QCOMPARE(textOf(question, "kind"), QStringLiteral("password"));
        QCOMPARE(numberOf(question, "id"), i);
        QCOMPARE(flagOf(question, "retry"), i > 1);
        session.answerPassword(i, "geheim" + QByteArray::number(i));
        if (i < 3) {
            const QJsonObject rejected = session.next();
            QCOMPARE(textOf(rejected, "say"), QStringLiteral("rejected"));
            QCOMPARE(textOf(rejected, "user"), QStringLiteral("me"));
        }
    }
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("accepted"));
    QCOMPARE(numberOf(session.next(), "code"), 0);
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(scene.tool.input(3), QByteArray("geheim3\n"));
}

void MountHelperLoginTest::lastPassword_data()
{
    wrongPassword_data();
}

void MountHelperLoginTest::lastPassword()
{
    // The server is not troubled once more to have it ask for what there is not.
    QFETCH(QByteArray, tool);
    QFETCH(QByteArray, url);
    QFETCH(QByteArrayList, prompt);
    QFETCH(QByteArrayList, refusal);
    MountScene scene(tool);
    scene.tool.expect(prompt + refusal);
    HelperSession session(scene.environment());
    session.mount(url);
    QCOMPARE(textOf(session.next(), "kind"), QStringLiteral("password"));
    session.say(R"({"do":"answer","id":1,"password":true,"last":true})");
    session.say(R"("geheim")");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("rejected"));
    QCOMPARE(numberOf(session.next(), "code"), 2);
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(scene.tool.runs(), 1);
    QVERIFY(scene.isClean());
}

void MountHelperLoginTest::wrongPasswordBehindTheKey()
{
    // Of which an SFTP job does not tell.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshHostKey() + Said::sshPassword() + Said::sshRefusal());
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    const QJsonObject key = session.next();
    QCOMPARE(textOf(key, "kind"), QStringLiteral("confirm"));
    QVERIFY(textOf(key, "message").contains(QLatin1String("SHA256:c2VjcmV0")));
    session.confirm(1, true);
    QCOMPARE(flagOf(session.next(), "retry"), false);
    session.answerPassword(2, "falsch");
    const QJsonObject again = session.next();
    QCOMPARE(textOf(again, "kind"), QStringLiteral("password"));
    QCOMPARE(flagOf(again, "retry"), true);
    session.answerPassword(3, "geheim");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(scene.tool.input(1), QByteArray("yes\nfalsch\n"));
    QCOMPARE(scene.tool.input(2), QByteArray("geheim\n"));
}

void MountHelperLoginTest::keyRefused()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshHostKey() + Said::sshRefusal());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "kind"), QStringLiteral("confirm"));
    session.confirm(1, false);
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 2);
    QCOMPARE(textOf(end, "text"), QStringLiteral("Accessing sftp resource was cancelled"));
    QVERIFY(scene.isClean());
    QCOMPARE(scene.tool.input(1), QByteArray("no\n"));
}

void MountHelperLoginTest::endsBeforeThePassword()
{
    // The job would run its tool again and again.
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshRefusal());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("rejected"));
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    QCOMPARE(
        textOf(end, "text"),
        QStringLiteral("the connection ended before a password was asked for"));
    QVERIFY(scene.isClean());
    QCOMPARE(scene.tool.runs(), 1);
}

void MountHelperLoginTest::endsBehindTheKey()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshHostKey() + Said::sshRefusal());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(textOf(session.next(), "kind"), QStringLiteral("confirm"));
    session.confirm(1, true);
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    QCOMPARE(textOf(end, "text"), QStringLiteral("the server ended the connection"));
    QVERIFY(scene.isClean());
}

void MountHelperLoginTest::givenUp_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArrayList>("said");
    QTest::addColumn<QString>("text");
    const QString sftp = QStringLiteral("Accessing sftp resource was cancelled");
    QTest::newRow("sftp password") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                                   << Said::sshPassword() + QByteArrayList{"exit 1"} << sftp;
    QTest::newRow("sftp key") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                              << Said::sshHostKey() + Said::sshRefusal() << sftp;
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/")
                         << Said::ftpPassword() + QByteArrayList{"exit 1"}
                         << QStringLiteral("Accessing ftp resource was cancelled");
}

void MountHelperLoginTest::givenUp()
{
    QFETCH(QByteArray, tool);
    QFETCH(QByteArray, url);
    QFETCH(QByteArrayList, said);
    QFETCH(QString, text);
    MountScene scene(tool);
    scene.tool.expect(said);
    HelperSession session(scene.environment());
    session.mount(url);
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("question"));
    session.giveUp(1);
    const QJsonObject end = session.next();
    QCOMPARE(textOf(end, "say"), QStringLiteral("end"));
    QCOMPARE(numberOf(end, "code"), 2);
    QCOMPARE(textOf(end, "text"), text);
    QVERIFY(scene.isClean());
    QVERIFY(!MountScene::isRunning(scene.tool.processId(1)));
    QCOMPARE(session.waitForEnd(), 1);
}

void MountHelperLoginTest::givenUpAtSamba()
{
    // The job asks once more; the person is not.
    ToolScene service;
    QVERIFY(service.isReady());
    MountScene scene("smbclient", &service);
    scene.tool.expect({});
    scene.tool.expect({"out NT_STATUS_ACCESS_DENIED\\n"});
    HelperSession session(scene.environment());
    session.mount("smb://host/share");
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("question"));
    session.giveUp(1);
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 2);
    QCOMPARE(textOf(end, "text"), QStringLiteral("Login cancelled"));
}

void MountHelperLoginTest::otherUser_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("scheme");
    QTest::addColumn<QByteArrayList>("first");
    QTest::addColumn<QByteArrayList>("second");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("sftp")
                          << Said::sshPassword() + QByteArrayList{"exit 1"}
                          << Said::sshPassword("you") + Said::success();
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp")
                         << Said::ftpPassword() + QByteArrayList{"exit 1"}
                         << Said::ftpPassword("you") + Said::success();
}

void MountHelperLoginTest::otherUser()
{
    QFETCH(QByteArray, tool);
    QFETCH(QByteArray, scheme);
    QFETCH(QByteArrayList, first);
    QFETCH(QByteArrayList, second);
    MountScene scene(tool);
    scene.tool.expect(first);
    scene.tool.expect(second);
    HelperSession session(scene.environment());
    session.mount(scheme + "://me@host/");
    QCOMPARE(textOf(session.next(), "user"), QStringLiteral("me"));
    session.answerPassword(1, "geheim", R"(,"user":"you")");
    // Which came with the name.
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("accepted"));
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "url"), QString::fromLatin1(scheme) + QLatin1String("://you@host/"));
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(scene.tool.input(2), QByteArray("geheim\n"));
    const QString directory = QString::fromLatin1(scheme) + QLatin1String("/you@host");
    QCOMPARE(scene.mounts(), QStringList(directory));
    QCOMPARE(
        QDir(scene.directory(QString::fromLatin1(scheme)))
            .entryList(QDir::Dirs | QDir::NoDotAndDotDot),
        QStringList(QStringLiteral("you@host")));
}

void MountHelperLoginTest::otherUserWithoutPassword()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword("root") + QByteArrayList{"exit 1"});
    scene.tool.expect(Said::sshPassword("you") + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://host/");
    QCOMPARE(textOf(session.next(), "user"), QString());
    session.say(R"({"do":"answer","id":1,"user":"you"})");
    const QJsonObject question = session.next();
    QCOMPARE(textOf(question, "user"), QStringLiteral("you"));
    QCOMPARE(flagOf(question, "retry"), false);
    session.answerPassword(2, "geheim");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    QCOMPARE(scene.tool.input(2), QByteArray("geheim\n"));
}

void MountHelperLoginTest::unfitUser()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.next(), "id"), 1);
    session.answerPassword(1, "geheim", R"(,"user":"-oProxyCommand=true")");
    const QJsonObject again = session.next();
    QCOMPARE(numberOf(again, "id"), 2);
    QCOMPARE(flagOf(again, "retry"), true);
    QCOMPARE(
        textOf(again, "message"),
        QStringLiteral("the name of the user must not begin with a dash"));
    QCOMPARE(scene.tool.runs(), 1);
    session.answerPassword(2, "geheim");
    QCOMPARE(numberOf(session.end(), "code"), 0);
}

void MountHelperLoginTest::guestRefused()
{
    // Without a password to be refused: it is the user that is asked for.
    MountScene scene("curlftpfs");
    scene.tool.expect(Said::ftpRefusal());
    scene.tool.expect(Said::ftpPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("ftp://host/");
    const QJsonObject question = session.next();
    QCOMPARE(textOf(question, "say"), QStringLiteral("question"));
    QCOMPARE(textOf(question, "user"), QString());
    QCOMPARE(flagOf(question, "retry"), true);
    session.answerPassword(1, "geheim", R"(,"user":"me")");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    QCOMPARE(scene.tool.input(2), QByteArray("geheim\n"));
    QCOMPARE(scene.mounts(), QStringList(QStringLiteral("ftp/me@host")));
}

void MountHelperLoginTest::userOfTheRequest()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://host/~/a", R"(,"user":"me")");
    const QJsonObject end = session.end();
    // Nobody serves it, and so nobody says that there is no such folder.
    QCOMPARE(numberOf(end, "code"), 0);
    QCOMPARE(textOf(end, "url"), QStringLiteral("sftp://me@host/~/a"));
    QCOMPARE(textOf(end, "localPath"), scene.directory(QStringLiteral("sftp/me@host~/a")));
    QCOMPARE(scene.tool.arguments(1).constFirst(), QByteArray("me@host:"));
}

void MountHelperLoginTest::toolIsMissing()
{
    MountScene scene("sshfs");
    QProcessEnvironment environment = scene.environment();
    environment.insert(QStringLiteral("PATH"), QStringLiteral("/nonexistent"));
    HelperSession session(environment);
    session.mount("ftp://me@host/");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    QVERIFY2(
        textOf(end, "text").startsWith(QLatin1String("curlftpfs can't be started: ")),
        qPrintable(textOf(end, "text")));
    QVERIFY(scene.isClean());
}

QTEST_GUILESS_MAIN(MountHelperLoginTest)
#include "tst_mounthelper_login.moc"
