// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/fusemountquestionstest.h"

using namespace VeyFM;

namespace {

const FuseProtocol sftp = FuseProtocol::sftp();
const QByteArrayList asks = sftp.asks;
const QByteArrayList mounts = asks;
const QByteArrayList fails = sftp.waits;

const QByteArray rsaQuestion = "The authenticity of host 'h (10.0.0.1)' can't be established.\n"
                               "RSA key fingerprint is SHA256:ab/+cd.\n"
                               "Are you sure you want to continue connecting (yes/no)? ";

QByteArray prints(QByteArray text)
{
    return "out " + text.replace('\n', "\\n");
}

const QByteArrayList keyQuestion = {prints(rsaQuestion), "read"};

const QString askedForKey = QStringLiteral(
    "question Question|The authenticity of host 'h (10.0.0.1)' can't be established.\n"
    "RSA key fingerprint is SHA256:ab/+cd.\n"
    "Are you sure you want to continue connecting?");

bool isRunning(qint64 process)
{
    QFile status(QStringLiteral("/proc/%1/stat").arg(process));
    if (process == 0 || !status.open(QIODevice::ReadOnly)) {
        return false;
    }
    // The state stands behind the name, which is in brackets. One that has ended and was not
    // waited for is a zombie.
    const QByteArray line = status.readAll();
    return line.mid(line.lastIndexOf(')') + 2, 1) != "Z";
}

} // namespace

/// What SFTP mounts ask, and what comes of the answers.
class MountSFtpURLJobQuestionsTest : public FuseMountQuestionsTest
{
    Q_OBJECT

public:
    MountSFtpURLJobQuestionsTest()
        : FuseMountQuestionsTest(sftp)
    {
    }

protected:
    void addConversations() override;
    void addEndsWithFiles() override;

private Q_SLOTS:
    void keyQuestionCountsForItsRunAlone();
    void silentEnds_data();
    void silentEnds();
    void hostKeyText_data();
    void hostKeyText();
    void terminalNotReady_data();
    void terminalNotReady();
    void changedUserStandsBeforeTheHost();
    void changedUserIsNoOption_data();
    void changedUserIsNoOption();
};

void MountSFtpURLJobQuestionsTest::addConversations()
{
    const QString bob = u"sftp://bob@host"_s;
    const QString askBob = question(u"bob"_s);
    const QString rejected = u"rejected bob"_s;
    const QString accepted = u"accepted"_s;
    const auto right = Auth::password(u"right"_s);

    QTest::newRow("key with yes, then the password")
        << bob << Runs{keyQuestion + asks} << Answers{right}
        << QStringList{askedForKey, askBob, accepted} << bob << QByteArray("yes\nright\n");
    // Only a run with the question reads a refusal as a "no".
    QTest::newRow("refused, key question in the next run")
        << bob << Runs{sftp.refuses(), keyQuestion + asks} << Answers{right, right, right}
        << QStringList{askBob, rejected, askBob, askedForKey, askBob, accepted} << bob
        << QByteArray("yes\nright\n");
    // Of what comes in one read the password prompt wins, then the refusal.
    QTest::newRow("refusal and prompt at once")
        << bob << Runs{{"echo off", "out Connection reset by peer (yes/no) a password: ", "read"}}
        << Answers{right} << QStringList{askBob, accepted} << bob << QByteArray("right\n");
    QTest::newRow("key question and refusal at once")
        << bob << Runs{{"out (yes/no)? Connection reset by peer", "exit 1"}, {}} << Answers{right}
        << QStringList{rejected, askBob, accepted} << bob << QByteArray();
    QTest::newRow("ignored output")
        << bob
        << Runs{{"out bob@host Password: (password:)\\nconnection reset by peer\\nYES/NO\\n"}}
        << Answers{} << QStringList{accepted} << bob << QByteArray();
}

void MountSFtpURLJobQuestionsTest::addEndsWithFiles()
{
    QTest::newRow("given up") << Runs{fails} << Answers{Auth::cancel()} << false << 0;
}

void MountSFtpURLJobQuestionsTest::keyQuestionCountsForItsRunAlone()
{
    tool->expect(keyQuestion + fails);
    tool->expect(sftp.refuses());
    tool->expect(mounts);
    auth->questionAnswers = {true};
    const auto answer = Auth::password(u"x"_s);
    auth->answers = {Auth::changeUser(u"bob"_s), answer, answer, answer};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://ann@host"_s);
    startToEnd(job.get());
    const QString askBob = question(u"bob"_s);
    QCOMPARE(
        auth->calls, QStringList(
                         {askedForKey, question(u"ann"_s), askBob, u"rejected bob"_s, askBob,
                          askBob, u"accepted"_s}));
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->url(), u"sftp://bob@host"_s);
}

void MountSFtpURLJobQuestionsTest::silentEnds_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<Answers>("answers");
    QTest::addColumn<bool>("yes");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QByteArray>("input");
    const QString askBob = question(u"bob"_s);
    QTest::newRow("given up at the prompt")
        << fails << Answers{Auth::cancel()} << false << QStringList{askBob} << QByteArray("\n");
    QTest::newRow("given up, but it mounts")
        << mounts << Answers{Auth::cancel()} << false << QStringList{askBob} << QByteArray("\n");
    QTest::newRow("changed and given up") << fails << Answers{{QString(), u"ann"_s, 1, 1}} << false
                                          << QStringList{askBob} << QByteArray("\n");
    QTest::newRow("key with no") << keyQuestion + sftp.refusesAtOnce() << Answers{} << false
                                 << QStringList{askedForKey} << QByteArray("no\n");
    QTest::newRow("key with yes, then refused")
        << keyQuestion + sftp.refuses() << Answers{Auth::password(u"wrong"_s)} << true
        << QStringList{askedForKey, askBob} << QByteArray("yes\nwrong\n");
}

void MountSFtpURLJobQuestionsTest::silentEnds()
{
    QFETCH(QByteArrayList, run);
    QFETCH(Answers, answers);
    QFETCH(bool, yes);
    QFETCH(QStringList, calls);
    QFETCH(QByteArray, input);
    tool->expect(run);
    auth->answers = answers;
    if (calls.contains(askedForKey)) {
        auth->questionAnswers = {yes};
    }
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    // Neither now nor later: nothing is left that could end the job.
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
    QCOMPARE(job->error(), 0);
    QCOMPARE(auth->calls, calls);
    QCOMPARE(tool->input(1), input);
    QCOMPARE(job->url(), u"sftp://bob@host"_s);
    QVERIFY(job->localPath().isEmpty());
    QVERIFY(!isMountDir(u"/sftp/bob@host"_s));
    QCOMPARE(recordedMounts(), QStringList());
}

void MountSFtpURLJobQuestionsTest::hostKeyText_data()
{
    QTest::addColumn<QByteArray>("printed");
    QTest::addColumn<bool>("known");
    QTest::newRow("RSA") << rsaQuestion << true;
    QTest::newRow("behind other text") << "Warning: something.\n" + rsaQuestion << true;
    QTest::newRow("in one line") << QByteArray(rsaQuestion).replace('\n', ' ') << true;
    QTest::newRow("blank lines") << QByteArray(rsaQuestion).replace("\n", " \n\n") << true;
    QTest::newRow("another key")
        << QByteArray("The authenticity of host 'h (10.0.0.1)' can't be established.\n"
                      "ED25519 key fingerprint is SHA256:ab/+cd.\n"
                      "This key is not known by any other names.\n"
                      "Are you sure you want to continue connecting (yes/no/[fingerprint])? ")
        << false;
    QTest::newRow("RSA with today's answers")
        << QByteArray(rsaQuestion).replace("(yes/no)", "(yes/no/[fingerprint])") << false;
    QTest::newRow("no brackets") << QByteArray(rsaQuestion).replace("(yes/no)", "yes/no") << false;
    QTest::newRow("another case") << QByteArray(rsaQuestion).replace("RSA", "rsa") << false;
    QTest::newRow("no full stop") << QByteArray(rsaQuestion).replace("established.", "established!")
                                  << false;
    QTest::newRow("stop in the fingerprint")
        << QByteArray(rsaQuestion).replace("ab/", "ab.") << false;
}

void MountSFtpURLJobQuestionsTest::hostKeyText()
{
    QFETCH(QByteArray, printed);
    QFETCH(bool, known);
    tool->expect({prints(printed), "read"});
    auth->questionAnswers = {true};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://host"_s);
    startToEnd(job.get());
    // Any other wording is shown as the tool has it.
    const QString raw = u"question Question|"_s + QString::fromLocal8Bit(printed);
    QCOMPARE(auth->calls, QStringList({known ? askedForKey : raw, u"accepted"_s}));
    QCOMPARE(tool->input(1), QByteArray("yes\n"));
}

void MountSFtpURLJobQuestionsTest::terminalNotReady_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<bool>("runs");
    QTest::newRow("ended") << QByteArrayList({"out x@host's password: "}) << false;
    QTest::newRow("echoes") << QByteArrayList({"out x@host's password: ", "hang"}) << true;
}

void MountSFtpURLJobQuestionsTest::terminalNotReady()
{
    QFETCH(QByteArrayList, run);
    QFETCH(bool, runs);
    tool->expect(run);
    auth->answers = {Auth::password(u"secret"_s)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://host"_s);
    bool runsAtTheEnd = false;
    connect(job.get(), &Job::finished, this, [&] { runsAtTheEnd = isRunning(tool->processId(1)); });
    startToEnd(job.get());
    QCOMPARE(runsAtTheEnd, runs);
    QCOMPARE(isRunning(tool->processId(1)), runs);
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Can't pass password to sshfs"_s);
    QCOMPARE(auth->calls, QStringList(question(u""_s)));
    // The tool is left alone, so its directory stays.
    QVERIFY(isMountDir(u"/sftp/host"_s));
    QCOMPARE(recordedMounts(), QStringList());
}

void MountSFtpURLJobQuestionsTest::changedUserStandsBeforeTheHost()
{
    tool->expect(fails);
    tool->expect({});
    auth->answers = {Auth::changeUser(u"bob"_s)};
    bool first = false;
    auth->answers.first().before = [&] {
        first = isMountDir(u"/sftp/host~"_s);
    };
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://host/~/a"_s);
    startToEnd(job.get());
    // A line without a password lets the tool go.
    QCOMPARE(tool->input(1), QByteArray("\n"));
    QCOMPARE(tool->arguments(1).first(), QByteArray("host:"));
    QCOMPARE(tool->arguments(2).first(), QByteArray("bob@host:"));
    QVERIFY(first);
    QVERIFY(!isMountDir(u"/sftp/host~"_s));
    QVERIFY(isMountDir(u"/sftp/bob@host~"_s));
    QCOMPARE(job->url(), u"sftp://bob@host/~/a"_s);
}

void MountSFtpURLJobQuestionsTest::changedUserIsNoOption_data()
{
    QTest::addColumn<QString>("user");
    QTest::newRow("option") << u"-oProxyCommand=x"_s;
    QTest::newRow("behind brackets") << u"[]-oProxyCommand=x"_s;
    QTest::newRow("another host") << u"elsewhere:x"_s;
}

void MountSFtpURLJobQuestionsTest::changedUserIsNoOption()
{
    QFETCH(QString, user);
    tool->expect(fails);
    auth->answers = {Auth::changeUser(user)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://host"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Mounting sftp resource failed"_s);
    QVERIFY(!isMountDir(u"/sftp/host"_s));
}

QTEST_GUILESS_MAIN(MountSFtpURLJobQuestionsTest)
#include "tst_mountsftpurljob_questions.moc"
