// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/servicescene.h"
#include "support/standin.h"
#include "support/terminalsession.h"
#include "support/vfsscene.h"

#include <QTest>

#include <memory>

#include <signal.h>

namespace {

const QByteArrayList asks = {"echo off", "out anna@host's password: ", "read", "echo on"};
const QByteArrayList refuses =
    asks + QByteArrayList({"out read: Connection reset by peer\\n", "exit 1"});
const QByteArrayList asksForKey = {"out key fingerprint is SHA256:ab (yes/no)? ", "read"};

} // namespace

/// The example of a host that mounts, at work on a terminal.
class ExampleMountTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void asksOnceForWhatTheJobAsksTwice();
    void interruptBringsTheEchoBack();
    void takesWhatIsMounted();
    void takesWhatIsMountedForAnotherUser();
    void showsEachFolderOfAServer();
    void asksForEachHostByItself();
    void asksInOtherWords();
    void endsWhereTheJobDoesNot_data();
    void endsWhereTheJobDoesNot();
    void tellsFailures();

private:
    std::unique_ptr<TerminalSession> run(const QString& url) const
    {
        return std::make_unique<TerminalSession>(
            QStringLiteral(VEYFM_EXAMPLE), QStringList(url), scene.root(),
            QProcessEnvironment::systemEnvironment());
    }

    VfsScene scene;
    ServiceScene service;
    std::unique_ptr<StandIn> tool;
};

void ExampleMountTest::initTestCase()
{
    QVERIFY2(
        service.start(object(R"({"echo": true, "remember": true})")),
        qPrintable(service.errorString()));
}

void ExampleMountTest::init()
{
    tool = std::make_unique<StandIn>("sshfs");
    service->setValue(QStringLiteral("NetworkMountsManager.mounts"), QJsonObject());
    service->setValue(QStringLiteral("FuseMountsManager.mounts"), QJsonObject());
}

void ExampleMountTest::cleanup()
{
    QCOMPARE(tool->runs(), tool->expected());
    tool.reset();
}

void ExampleMountTest::asksOnceForWhatTheJobAsksTwice()
{
    tool->expect(asks); // As nobody in particular, to learn the name.
    tool->expect(refuses);
    tool->expect(asks);
    QVERIFY(scene.makeDir("home/.vey-fm-vfs") && scene.makeDir("home/.vey-fm-vfs/sftp"));
    QVERIFY(scene.makeDir("home/.vey-fm-vfs/sftp/anna@host"));
    QVERIFY(scene.makeDir("home/.vey-fm-vfs/sftp/anna@host/letters"));
    QVERIFY(scene.makeFile("home/.vey-fm-vfs/sftp/anna@host/letters/first"));

    const auto example = run(QStringLiteral("sftp://host/letters"));
    QVERIFY2(example->waitFor("User on host []: "), example->output().constData());
    example->type("anna\n");
    QVERIFY(example->waitFor("Password: "));
    example->type("wrong\n");
    QVERIFY2(example->waitFor("User on host [anna]: "), example->output().constData());
    example->type("\n");
    QVERIFY(example->waitFor("[anna]: \nPassword: "));
    example->type("right\n");
    QCOMPARE(example->waitForEnd(), 0);

    QCOMPARE(example->output().count("Password: "), 2);
    QCOMPARE(example->output().count("The login was refused."), 1);
    QVERIFY2(
        example->output().endsWith("SFTP/anna@host/letters/first\n"),
        example->output().constData());
    QVERIFY(!example->output().contains("wrong") && !example->output().contains("right"));
    QCOMPARE(tool->input(1), QByteArray("\n"));
    QCOMPARE(tool->input(2), QByteArray("wrong\n"));
    QCOMPARE(tool->input(3), QByteArray("right\n"));
}

// The place of the mount above, as another process finds it.
void ExampleMountTest::interruptBringsTheEchoBack()
{
    tool->expect(asks);
    const auto example = run(QStringLiteral("sftp://host/letters"));
    QVERIFY2(example->waitFor("User on host []: "), example->output().constData());
    QVERIFY(example->hasEcho());
    example->type("anna\n");
    QVERIFY(example->waitFor("Password: "));
    QTRY_VERIFY(!example->hasEcho());
    example->type("\003");
    QCOMPARE(example->waitForEnd(), 128 + SIGINT); // By the signal.
    QVERIFY(example->hasEcho());
}

void ExampleMountTest::takesWhatIsMounted()
{
    service->setValue(
        QStringLiteral("NetworkMountsManager.mounts"),
        object(
            R"({"sftp://anna@host/": ["SFTP/anna@host", ")" + scene.path("").toUtf8() +
            R"(home/.vey-fm-vfs/sftp/anna@host", 4003]})"));
    const auto example = run(QStringLiteral("sftp://anna@host/letters"));
    QCOMPARE(example->waitForEnd(), 0);
    QCOMPARE(example->output(), QByteArray("SFTP/anna@host/letters/first\n"));
}

void ExampleMountTest::takesWhatIsMountedForAnotherUser()
{
    tool->expect(asks); // As nobody in particular, to learn the name.
    const QByteArray directory = scene.path("").toUtf8() + "home/.vey-fm-vfs/sftp/anna@host";
    service->setValue(
        QStringLiteral("FuseMountsManager.mounts"),
        object(R"({"sftp://anna@host/": ")" + directory + R"("})"));
    service->setValue(
        QStringLiteral("NetworkMountsManager.mounts"),
        object(R"({"sftp://anna@host/": ["SFTP/anna@host", ")" + directory + R"(", 4003]})"));
    const auto example = run(QStringLiteral("sftp://host/letters"));
    QVERIFY2(example->waitFor("User on host []: "), example->output().constData());
    example->type("anna\n");
    QVERIFY(example->waitFor("Password: "));
    example->type("right\n");
    QCOMPARE(example->waitForEnd(), 0);
    QVERIFY2(
        example->output().endsWith("SFTP/anna@host/letters/first\n"),
        example->output().constData());
}

void ExampleMountTest::showsEachFolderOfAServer()
{
    const QByteArray root = "home/.vey-fm-vfs/sftp/bert@host";
    QVERIFY(scene.makeDir(root) && scene.makeDir(root + "/letters"));
    QVERIFY(scene.makeFile(root + "/letters/first"));
    QVERIFY(scene.makeDir(root + "/photos") && scene.makeFile(root + "/photos/second"));
    QVERIFY(scene.makeDir(root + "~") && scene.makeFile(root + "~/third"));
    tool->expect({});
    tool->expect({}); // The home there is a mount of its own.

    const auto output = [this](const char* url) {
        const auto example = run(QString::fromLatin1(url));
        return example->waitForEnd() == 0 ? example->output() : "failed: " + example->output();
    };
    QCOMPARE(output("sftp://bert@host/letters"), QByteArray("SFTP/bert@host/letters/first\n"));
    QCOMPARE(output("sftp://bert@host/photos/"), QByteArray("SFTP/bert@host/photos/second\n"));
    const QByteArray third = scene.bytes(root + "~/third\n");
    QCOMPARE(output("sftp://bert@host/~/"), third);
    QCOMPARE(output("sftp://bert@host/~"), third);
    QCOMPARE(
        output("sftp://bert@host/"), QByteArray("SFTP/bert@host/letters\nSFTP/bert@host/photos\n"));
    QCOMPARE(
        output("sftp://bert@host/missing"),
        QByteArray("failed: mount-example: the server has no such folder\n"));
}

void ExampleMountTest::asksForEachHostByItself()
{
    const QByteArrayList asksJumpHost = {
        "echo off", "out jumper@gw's password: ", "read", "echo on"};
    tool->expect(asksJumpHost + refuses);
    tool->expect(asksJumpHost + asks);
    const auto example = run(QStringLiteral("sftp://anna@host/"));
    QVERIFY2(example->waitFor("User on gw [jumper]: "), example->output().constData());
    example->type("\n");
    QVERIFY(example->waitFor("Password: "));
    example->type("first\n");
    for (const char* password : {"wrong\n", "right\n"}) {
        const int times = password[0] == 'w' ? 1 : 2;
        QVERIFY2(example->waitFor("User on host [anna]: ", times), example->output().constData());
        example->type("\n");
        QVERIFY(example->waitFor("Password: ", 1 + times));
        example->type(password);
    }
    QCOMPARE(example->waitForEnd(), 0);
    QCOMPARE(tool->input(1), QByteArray("first\nwrong\n"));
    QCOMPARE(tool->input(2), QByteArray("first\nright\n"));
}

void ExampleMountTest::asksInOtherWords()
{
    const QByteArrayList asksCode = {"echo off", "out (anna@host) Code: ", "read", "echo on"};
    tool->expect(asksCode + refuses.mid(4));
    tool->expect(asksCode);
    const auto example = run(QStringLiteral("sftp://anna@host/"));
    QVERIFY2(example->waitFor("(anna@host) Code: "), example->output().constData());
    example->type("1\n");
    QVERIFY2(example->waitFor("(anna@host) Code: ", 2), example->output().constData());
    example->type("2\n");
    QCOMPARE(example->waitForEnd(), 0);
    QVERIFY(!example->output().contains("User on"));
    QCOMPARE(tool->input(2), QByteArray("2\n"));
}

void ExampleMountTest::endsWhereTheJobDoesNot_data()
{
    QTest::addColumn<QByteArrayList>("play");
    QTest::addColumn<QByteArrayList>("dialogue"); // A prompt, and what is typed there.

    const QByteArray password = "Password: ";
    QTest::newRow("given up") << asks + QByteArrayList({"exit 1"})
                              << QByteArrayList({"User on host [anna]: ", "\x04"});
    QTest::newRow("host not trusted") << asksForKey + QByteArrayList({refuses.at(4), "exit 1"})
                                      << QByteArrayList({"(yes/no)? ", "no\n"});
    QTest::newRow("refused in the run of the host key")
        << asksForKey + refuses
        << QByteArrayList(
               {"(yes/no)? ", "yes\n", "User on host [anna]: ", "\n", password, "secret\n"});
}

void ExampleMountTest::endsWhereTheJobDoesNot()
{
    QFETCH(QByteArrayList, play);
    QFETCH(QByteArrayList, dialogue);
    tool->expect(play);

    const auto example = run(QStringLiteral("sftp://anna@host/"));
    for (int i = 0; i < dialogue.size(); i += 2) {
        QVERIFY2(example->waitFor(dialogue.at(i)), example->output().constData());
        example->type(dialogue.at(i + 1));
    }
    QCOMPARE(example->waitForEnd(), 1);
    QVERIFY2(
        example->output().endsWith("mount-example: the login was given up or failed\n"),
        example->output().constData());
}

void ExampleMountTest::tellsFailures()
{
    const auto example = run(QStringLiteral("http://host/"));
    QCOMPARE(example->waitForEnd(), 1);
    QVERIFY2(
        example->output().endsWith("mount-example: This network protocol is not supported\n"),
        example->output().constData());
}

QTEST_GUILESS_MAIN(ExampleMountTest)
#include "tst_example_mount.moc"
