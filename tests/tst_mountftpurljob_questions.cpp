// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/fusemountquestionstest.h"

#include <QPointer>
#include <QProcess>

using namespace VeyFM;

namespace {

const FuseProtocol ftp = FuseProtocol::ftp();
const QByteArray prompt = ftp.asks.first();
const QByteArrayList mounts = ftp.asks;
const QByteArrayList refusesAndWaits = {ftp.refusal, "drained", prompt, "hang"};

} // namespace

/// What FTP mounts ask, and what comes of the answers.
class MountFtpURLJobQuestionsTest : public FuseMountQuestionsTest
{
    Q_OBJECT

public:
    MountFtpURLJobQuestionsTest()
        : FuseMountQuestionsTest(ftp)
    {
    }

protected:
    void addConversations() override;
    void addEndsWithFiles() override;
    void addChangesToAMountedUser() override;

private Q_SLOTS:
    void ignoredOutput_data();
    void ignoredOutput();
    void givenUpAtThePrompt_data();
    void givenUpAtThePrompt();
    void givenUpJobTakesItsToolAlong();
    void toolIsAskedToEnd_data();
    void toolIsAskedToEnd();
    void changedUserIsAnOption();
};

void MountFtpURLJobQuestionsTest::addConversations()
{
    const QString ann = u"ftp://ann@host"_s;
    const QString bob = u"ftp://bob@host"_s;
    const QString askBob = question(u"bob"_s);
    const QString rejected = u"rejected bob"_s;
    const auto right = Auth::password(u"right"_s);

    QTest::newRow("asked twice in one run")
        << bob << Runs{{prompt, "read", prompt, "read"}} << Answers{Auth::password(u"x"_s), right}
        << QStringList{askBob, askBob, u"accepted"_s} << bob << QByteArray("x\nright\n");
    // Two words make a refusal, whatever else is said.
    QTest::newRow("refused twice in one run")
        << bob << Runs{{ftp.refusal, "drained", "err Access denied", "exit 1"}, {}}
        << Answers{right} << QStringList{rejected, rejected, askBob, u"accepted"_s} << bob
        << QByteArray();
    // The question wins where both come in one read, so that no refusal is seen.
    QTest::newRow("refusal and question at once")
        << bob << Runs{{"err Access denied\\nEnter host password for user:", "read"}}
        << Answers{right} << QStringList{askBob, u"accepted"_s} << bob << QByteArray("right\n");
    // The changed name comes first. The refusal is asked about when the new user's run has ended.
    QTest::newRow("refused, then changed at the prompt")
        << ann << Runs{refusesAndWaits, mounts, mounts}
        << Answers{Auth::changeUser(u"bob"_s), right, right, right}
        << QStringList{u"rejected ann"_s, question(u"ann"_s), askBob, askBob, askBob, u"accepted"_s}
        << bob << QByteArray("right\n");
}

void MountFtpURLJobQuestionsTest::addEndsWithFiles()
{
    QTest::newRow("given up") << Runs{ftp.waits} << Answers{Auth::cancel()} << true << 2;
}

void MountFtpURLJobQuestionsTest::addChangesToAMountedUser()
{
    QTest::newRow("at the prompt behind a refusal") << refusesAndWaits << true;
}

void MountFtpURLJobQuestionsTest::ignoredOutput_data()
{
    QTest::addColumn<QByteArrayList>("lines");
    QTest::newRow("over two reads")
        << QByteArrayList({"err Enter host pass", "drained", "err word for user:", "drained"});
    QTest::newRow("refusal over two reads")
        << QByteArrayList({"err Access", "drained", "err  denied", "drained"});
    QTest::newRow("behind a zero byte")
        << QByteArrayList({"err x\\0Enter host password for user\\nAccess denied", "drained"});
    QTest::newRow("another case") << QByteArrayList(
        {"err enter host password for user, access denied", "drained"});
    QTest::newRow("on standard output")
        << QByteArrayList({"out Enter host password for user\\nAccess denied"});
}

void MountFtpURLJobQuestionsTest::ignoredOutput()
{
    QFETCH(QByteArrayList, lines);
    tool->expect(lines);
    const auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    finish(job.get());
    QCOMPARE(auth->calls, QStringList(u"accepted"_s));
    QCOMPARE(job->error(), 0);
}

void MountFtpURLJobQuestionsTest::givenUpAtThePrompt_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<Answers>("answers");
    QTest::addColumn<QStringList>("calls");
    const QString askBob = question(u"bob"_s);
    QTest::newRow("at once") << ftp.waits << Answers{Auth::cancel()} << QStringList{askBob};
    // Nobody asks again, or starts again, for a user who has given up.
    QTest::newRow("behind a refusal")
        << refusesAndWaits << Answers{Auth::cancel()} << QStringList{u"rejected bob"_s, askBob};
    QTest::newRow("behind a changed name")
        << QByteArrayList({"block 15", prompt, "await 15", prompt, "await 15"})
        << Answers{Auth::changeUser(u"ann"_s), Auth::cancel()}
        << QStringList{askBob, question(u"ann"_s)};
}

void MountFtpURLJobQuestionsTest::givenUpAtThePrompt()
{
    QFETCH(QByteArrayList, run);
    QFETCH(Answers, answers);
    QFETCH(QStringList, calls);
    tool->expect(run);
    auth->answers = answers;
    const auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    bool running = false;
    connect(job.get(), &Job::finished, this, [&] { running = isMountDir(u"/ftp/bob@host"_s); });
    job->start();
    QVERIFY(finished.wait(20000));
    // Before the end of the tool, which takes the directory along.
    QVERIFY(running);
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Accessing ftp resource was cancelled"_s);
    QTRY_VERIFY(!isMountDir(u"/ftp/bob@host"_s));
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 2);
    QCOMPARE(auth->calls, calls);
    QCOMPARE(recordedMounts(), QStringList());
}

void MountFtpURLJobQuestionsTest::givenUpJobTakesItsToolAlong()
{
    tool->expect(ftp.waits);
    auth->answers = {Auth::cancel()};
    const QPointer<MountFtpURLJob> job = new MountFtpURLJob(auth, u"ftp://bob@host"_s);
    job->start();
    const QPointer<QProcess> process = job->findChild<QProcess*>();
    QVERIFY(process);
    QTRY_VERIFY(!job);
    QVERIFY(!process);
    QCOMPARE(auth->calls, QStringList(question(u"bob"_s)));
}

void MountFtpURLJobQuestionsTest::toolIsAskedToEnd_data()
{
    QTest::addColumn<Auth::Answer>("answer");
    QTest::addColumn<bool>("deleted");
    QTest::newRow("given up") << Auth::cancel() << false;
    QTest::newRow("changed user") << Auth::changeUser(u"mounted"_s) << false;
    QTest::newRow("deleted job") << Auth::cancel() << true;
}

// And not killed: it may have something to clean up.
void MountFtpURLJobQuestionsTest::toolIsAskedToEnd()
{
    QFETCH(Auth::Answer, answer);
    QFETCH(bool, deleted);
    tool->expect({"block 15", prompt, "await 15"});
    setFuseMounts({{u"ftp://mounted@host/"_s, u"/mnt"_s}});
    auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    answer.before = [&] {
        if (deleted) {
            job.reset();
        }
    };
    auth->answers = {answer};
    job->start();
    QTRY_COMPARE(tool->receivedSignals(1), QByteArray("15\n"));
}

void MountFtpURLJobQuestionsTest::changedUserIsAnOption()
{
    tool->expect(ftp.waits);
    tool->expect({});
    auth->answers = {Auth::changeUser(u"b ob"_s)};
    const auto job = makeJob<MountFtpURLJob>(u"ftp://host/a"_s);
    finish(job.get());
    // Nothing was typed for the tool that was ended.
    QCOMPARE(tool->input(1), QByteArray());
    QCOMPARE(tool->arguments(1).size(), 2);
    QCOMPARE(
        tool->arguments(2),
        QByteArrayList({"-o", "user=b ob", "host", mountDir(u"/ftp/b ob@host"_s).toLocal8Bit()}));
}

QTEST_GUILESS_MAIN(MountFtpURLJobQuestionsTest)
#include "tst_mountftpurljob_questions.moc"
