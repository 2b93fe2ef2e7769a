// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/fusemountjobtest.h"

#include <csignal>

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<QByteArrayList>)
Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

namespace {

/// A question and its answer, as lines of a play.
QByteArrayList asks(const QByteArray& prompt)
{
    return {"echo off", "out " + prompt, "read", "out \\n", "echo on"};
}

const QByteArray jump = "\rjumper@gw.test's password: ";
const QByteArray own = "\rbob@host's password: ";
const QByteArrayList resets = {"out read: Connection reset by peer\\n", "exit 1"};

const QString usual = QStringLiteral("Enter host password for user:");

} // namespace

/// What SSH asks but for the password of the URL's user: that of a jump host, and in other words.
class MountSFtpURLJobPromptsTest : public FuseMountJobTest
{
    Q_OBJECT

public:
    MountSFtpURLJobPromptsTest()
        : FuseMountJobTest(FuseProtocol::sftp())
    {
    }

private Q_SLOTS:
    void conversation_data();
    void conversation();
    void changedUserOfAJumpHost_data();
    void changedUserOfAJumpHost();
    void changedUserOfTheHostByAnotherName_data();
    void changedUserOfTheHostByAnotherName();
    void givenUp_data();
    void givenUp();
    void uncertainHost_data();
    void uncertainHost();
    void restartBeforeAnotherPrompt();
    void noPrompt_data();
    void noPrompt();
    void helperInTheBackgroundIsNotAsked();

private:
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;

    static QString asked(const QString& host, const QString& user, const QString& message = usual)
    {
        return u"retry [sftp  %1 ] Access denied|%3|%2"_s.arg(host, user, message);
    }
};

void MountSFtpURLJobPromptsTest::conversation_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<Runs>("runs");
    QTest::addColumn<QStringList>("calls"); // But for "accepted".
    QTest::addColumn<QByteArray>("lastInput");
    const QString url = u"sftp://bob@host/"_s;
    const QString askJump = asked(u"gw.test"_s, u"jumper"_s);
    const QString askBob = asked(u"host"_s, u"bob"_s);
    const auto row = [&url](
                         const char* name, const Runs& runs, const QStringList& calls,
                         const QByteArray& lastInput) {
        QTest::newRow(name) << url << runs << calls << lastInput;
    };
    const auto own1 = [](const QString& message) {
        return asked(u"host"_s, u"bob"_s, message);
    };

    row("jump host", {asks(jump) + asks(own)}, {askJump, askBob}, "1\n2\n");
    row("jump host alone", {asks(jump)}, {askJump}, "1\n");
    row("two jump hosts", {asks(jump) + asks("ann@gw2's password: ") + asks(own)},
        {askJump, asked(u"gw2"_s, u"ann"_s), askBob}, "1\n2\n3\n");
    row("without a return, behind another line",
        {asks("Welcome.\\njumper@gw.test's password: ") + asks("bob@host's password: ")},
        {askJump, askBob}, "1\n2\n");
    row("jump host that asks again",
        {asks(jump) + asks("Permission denied, please try again.\\n" + jump) + asks(own)},
        {askJump, askJump, askBob}, "1\n2\n3\n");
    row("user that looks like an account", {asks("\rme@example.com@gw.test's password: ")},
        {asked(u"gw.test"_s, u"me@example.com"_s)}, "1\n");
    row("address", {asks("\rjumper@fe80::1%eth0's password: ")},
        {asked(u"fe80::1%eth0"_s, u"jumper"_s)}, "1\n");
    // The user alone changes nothing, nor does the case of the host.
    row("another user", {asks("\rbobby@host's password: ")}, {askBob}, "1\n");
    row("another case", {asks("\rbob@HOST's password: ")}, {askBob}, "1\n");
    row("nobody", {asks("Enter the password: ")}, {askBob}, "1\n");
    QTest::newRow("nobody in the URL")
        << u"sftp://host/"_s << Runs{asks("\rme@host's password: ")}
        << QStringList(asked(u"host"_s, QString())) << QByteArray("1\n");
    QTest::newRow("address in the URL")
        << u"sftp://bob@[FE80:0::1]/"_s << Runs{asks("\rbob@fe80::1's password: ")}
        << QStringList(asked(u"fe80::1"_s, u"bob"_s)) << QByteArray("1\n");

    // The refusal is that of whom the last question was about, and so is the next question, whose
    // answer goes nowhere.
    row("refused by the jump host", {asks(jump) + resets, asks(jump) + asks(own)},
        {askJump, u"rejected jumper"_s, askJump, askJump, askBob}, "3\n4\n");
    row("refused behind the jump host", {asks(jump) + asks(own) + resets, asks(jump) + asks(own)},
        {askJump, askBob, u"rejected bob"_s, askBob, askJump, askBob}, "4\n5\n");

    row("passphrase",
        {asks("\rEnter passphrase for key '/home/bob/.ssh/id_ed25519': ") + asks(own)},
        {own1(u"Enter passphrase for key '/home/bob/.ssh/id_ed25519': "_s), askBob}, "1\n2\n");
    row("passphrase behind a jump host",
        {asks(jump) + asks("\rEnter passphrase for key 'k': ") + asks(own)},
        {askJump, own1(u"Enter passphrase for key 'k': "_s), askBob}, "1\n2\n3\n");
    row("other words", {asks("\r(bob@host) Password: ")}, {own1(u"(bob@host) Password: "_s)},
        "1\n");
    row("other words of a jump host", {asks("\r(jumper@gw.test) Code: ") + asks(own)},
        {asked(u"gw.test"_s, u"jumper"_s, u"(jumper@gw.test) Code: "_s), askBob}, "1\n2\n");
    row("other words of a jump host that look like those of the host",
        {asks("\r(jumper@gw.test) bob@host's password: ")}, {asked(u"gw.test"_s, u"jumper"_s)},
        "1\n");
    row("other words, refused", {asks("\r(bob@host) Code: ") + resets, asks("\r(bob@host) Code: ")},
        {own1(u"(bob@host) Code: "_s), u"rejected bob"_s, askBob, own1(u"(bob@host) Code: "_s)},
        "3\n");
    row("control characters", {asks("\r\033[1mCo\007de\t\302\205: ")}, {own1(u"[1mCode: "_s)},
        "1\n");
    row("several lines", {asks("\\n1. Phone\\n2. \\\\n\\n\\nChoose (1-2): ")},
        {own1(u"1. Phone 2. \\n Choose (1-2): "_s)}, "1\n");
    // What a person types may be shown, and is no part of the next prompt.
    row("visible answers", {{"out Name: ", "read", "out Code: ", "read"}},
        {own1(u"Name: "_s), own1(u"Code: "_s)}, "1\n2\n");
    // One question, though it came in parts.
    row("in parts", {{"out Verif", "finish", "out ication", "finish", "out  code: ", "read"}},
        {own1(u"Verification code: "_s)}, "1\n");
    row("in parts across the words for a password",
        {{"out bob@host's pass", "finish", "out word: ", "read"}},
        {own1(u"bob@host's password: "_s)}, "1\n");
    // A line of a greeting does not name anybody.
    row("account in a greeting", {asks("\\n(admin@example.com) helps.\\n" + own)}, {askBob}, "1\n");
}

void MountSFtpURLJobPromptsTest::conversation()
{
    QFETCH(QString, url);
    QFETCH(Runs, runs);
    QFETCH(QStringList, calls);
    QFETCH(QByteArray, lastInput);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    for (int i = 1; i <= calls.filter(u"retry "_s).size(); ++i) {
        auth->answers.append(Auth::password(QString::number(i)));
    }
    const auto job = makeJob<MountSFtpURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(auth->calls, calls + QStringList(u"accepted"_s));
    QCOMPARE(job->error(), 0);
    QCOMPARE(tool->input(tool->runs()), lastInput);
}

void MountSFtpURLJobPromptsTest::changedUserOfAJumpHost_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<Answers>("answers");
    QTest::addColumn<QByteArray>("input");
    const auto change = Auth::changeUser(u"ann"_s, u"secret"_s);
    QTest::newRow("at the prompt")
        << asks(jump) + QByteArrayList({"exit 1"}) << Answers{change} << QByteArray("\n");
    QTest::newRow("at the prompt, but it mounts")
        << asks(jump) << Answers{change} << QByteArray("\n");
    QTest::newRow("after a refusal")
        << asks(jump) + resets << Answers{Auth::password(u"x"_s), change} << QByteArray("x\n");
}

// Nobody can tell ssh of another user there. The one of the URL is not meant.
void MountSFtpURLJobPromptsTest::changedUserOfAJumpHost()
{
    QFETCH(QByteArrayList, run);
    QFETCH(Answers, answers);
    QFETCH(QByteArray, input);
    tool->expect(run);
    auth->answers = answers;
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host/"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), failure());
    QCOMPARE(job->url(), u"sftp://bob@host/"_s);
    QCOMPARE(tool->input(1), input);
    QVERIFY(!isMountDir(u"/sftp/bob@host"_s));
    QCOMPARE(recordedMounts(), QStringList());
}

void MountSFtpURLJobPromptsTest::changedUserOfTheHostByAnotherName_data()
{
    QTest::addColumn<QString>("url");
    QTest::newRow("user of the URL") << u"sftp://bob@work/"_s;
    QTest::newRow("nobody in the URL") << u"sftp://work/"_s;
}

// The configuration of ssh has "HostName" for it.
void MountSFtpURLJobPromptsTest::changedUserOfTheHostByAnotherName()
{
    QFETCH(QString, url);
    tool->expect(asks("\rbob@host.test's password: ") + QByteArrayList({"exit 1"}));
    tool->expect(asks("\rann@host.test's password: "));
    auth->answers = {Auth::changeUser(u"ann"_s), Auth::password(u"x"_s)};
    const auto job = makeJob<MountSFtpURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->url(), u"sftp://ann@work/"_s);
    QCOMPARE(
        auth->calls,
        QStringList(
            {asked(u"host.test"_s, u"bob"_s), asked(u"host.test"_s, u"ann"_s), u"accepted"_s}));
}

void MountSFtpURLJobPromptsTest::givenUp_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<QByteArray>("input");
    const QByteArrayList ends = {"exit 1"};
    const QByteArrayList again = {"out Permission denied, please try again.\\n" + jump, "hang"};
    QTest::newRow("at a jump host") << asks(jump) + ends << QByteArray("\n");
    // As ssh does on the way: three times.
    QTest::newRow("at a jump host that asks again") << asks(jump) + again << QByteArray("\n");
    QTest::newRow("at a passphrase, and a password is asked for")
        << asks("\rEnter passphrase for key 'k': ") + QByteArrayList({"out " + own, "hang"})
        << QByteArray("\n");
    QTest::newRow("in other words") << asks("\r(bob@host) Code: ") + ends << QByteArray("\n");
    QTest::newRow("in other words, and the key is asked about")
        << asks("\rCode: ") + QByteArrayList({"out Continue (yes/no)? ", "hang"})
        << QByteArray("\n");
}

// Silently, as at the prompt of the URL's host.
void MountSFtpURLJobPromptsTest::givenUp()
{
    QFETCH(QByteArrayList, run);
    QFETCH(QByteArray, input);
    tool->expect(run);
    auth->answers = {Auth::cancel()};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host/"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
    QCOMPARE(job->error(), 0);
    QCOMPARE(auth->calls.size(), 1);
    QCOMPARE(tool->input(1), input);
    QVERIFY(!isMountDir(u"/sftp/bob@host"_s));
    QCOMPARE(recordedMounts(), QStringList());
}

void MountSFtpURLJobPromptsTest::uncertainHost_data()
{
    QTest::addColumn<QByteArray>("printed");
    // What a server wants asked stands behind who asks, and may look like another prompt.
    QTest::newRow("jump host as the host")
        << QByteArray("\r(jumper@gw.test) \rbob@host's password: ");
    QTest::newRow("jump host as the host, in a line")
        << QByteArray("\r(jumper@gw.test) Hello.\\nbob@host's password: ");
    QTest::newRow("jump host as the host, in other words")
        << QByteArray("\r(jumper@gw.test) Hello.\\n(bob@host) Password: ");
    QTest::newRow("jump host as the host, far behind")
        << "\r(jumper@gw.test) " + QByteArray(70000, 'x') + "\\nbob@host's password: ";
    QTest::newRow("host as a jump host") << QByteArray("\r(bob@host) \rme@bank's password: ");
    QTest::newRow("greeting as the host")
        << QByteArray("\rbob@host's password: \r(jumper@gw.test) Code: ");
}

// No answer is better than one that goes to another host.
void MountSFtpURLJobPromptsTest::uncertainHost()
{
    QFETCH(QByteArray, printed);
    tool->expect(asks(printed));
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host/"_s);
    startToEnd(job.get());
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), failure());
    QCOMPARE(tool->input(1), QByteArray("\n"));
    QVERIFY(!isMountDir(u"/sftp/bob@host"_s));
}

// The tool is not content with no password: it has another way to log in.
void MountSFtpURLJobPromptsTest::restartBeforeAnotherPrompt()
{
    tool->expect(asks("\r(bob@host) Password: ") + QByteArrayList({"out " + own, "hang"}));
    tool->expect(asks("\rann@host's password: "));
    auth->answers = {Auth::changeUser(u"ann"_s), Auth::password(u"x"_s)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host/"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->url(), u"sftp://ann@host/"_s);
    QCOMPARE(tool->input(2), QByteArray("x\n"));
}

void MountSFtpURLJobPromptsTest::noPrompt_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::newRow("lines") << QByteArrayList({"out Welcome.\\n", "finish", "out Bye.\\n"});
    QTest::newRow("part of a line at the end") << QByteArrayList({"out Welcome"});
    QTest::newRow("part of a line, and more soon")
        << QByteArrayList({"out Connecting", "finish", "out ...", "finish", "out done.\\n"});
    QTest::newRow("blanks alone") << QByteArrayList(
        {"out \r\t  \033", "finish", "finish", "finish", "finish", "out \\n"});
}

void MountSFtpURLJobPromptsTest::noPrompt()
{
    QFETCH(QByteArrayList, run);
    tool->expect(run);
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host/"_s);
    startToEnd(job.get());
    QCOMPARE(auth->calls, QStringList(u"accepted"_s));
    QCOMPARE(job->error(), 0);
}

// It holds the terminal of a tool that has done its work.
void MountSFtpURLJobPromptsTest::helperInTheBackgroundIsNotAsked()
{
    tool->expect({"out Welcome", "fork"});
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host/"_s);
    startToEnd(job.get());
    const auto helper = pid_t(tool->childId(1));
    const bool isRunning = ::kill(helper, SIGTERM) == 0;
    QVERIFY(isRunning);
    QCOMPARE(auth->calls, QStringList(u"accepted"_s));
    QCOMPARE(job->error(), 0);
}

QTEST_GUILESS_MAIN(MountSFtpURLJobPromptsTest)
#include "tst_mountsftpurljob_prompts.moc"
