// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountftpurljob.h"
#include "support/mountjobtest.h"

#include <QPointer>
#include <QProcess>

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<QByteArrayList>)
Q_DECLARE_METATYPE(ScriptedAuthenticator::Answer)
Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

namespace {

const QByteArray prompt = "err Enter host password for user 'x': ";
const QByteArray refusal = "err Error connecting to ftp: Access denied: 530\\n";
const QByteArrayList mounts = {prompt, "read"};
const QByteArrayList refuses = {prompt, "read", refusal, "exit 1"};
const QByteArrayList waits = {prompt, "hang"};
const QByteArrayList refusesAndWaits = {refusal, "drained", prompt, "hang"};

QString question(const QString& user, const QString& server = QStringLiteral("host"))
{
    return QStringLiteral("retry [ftp  %1 ] Access denied|Enter host password for user:|%2")
        .arg(server, user);
}

} // namespace

/// What FTP mounts ask, and what comes of the answers, with a scripted `curlftpfs` and service.
class MountFtpURLJobQuestionsTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void passwordGoesToTheInput_data();
    void passwordGoesToTheInput();
    void conversation_data();
    void conversation();
    void conversationFails_data();
    void conversationFails();
    void ignoredOutput_data();
    void ignoredOutput();
    void givenUpAtThePrompt_data();
    void givenUpAtThePrompt();
    void givenUpJobTakesItsToolAlong();
    void toolIsAskedToEnd_data();
    void toolIsAskedToEnd();
    void isRecordedBeforeItIsAccepted();
    void filesInTheDirectorySurvive_data();
    void filesInTheDirectorySurvive();
    void filesSurviveADeletedJob();
    void changedUserMovesTheDirectory();
    void changedUserIsMountedAlready_data();
    void changedUserIsMountedAlready();
    void unsafeChangedUser();
    void cleanupTestCase();
};

void MountFtpURLJobQuestionsTest::initTestCase()
{
    QVERIFY2(startVfs("{}"), qPrintable(service.errorString()));
}

void MountFtpURLJobQuestionsTest::init()
{
    QVERIFY(!QFileInfo::exists(mountDir(QString())));
    startScene("curlftpfs");
}

void MountFtpURLJobQuestionsTest::cleanup()
{
    checkScene();
    QDir(mountDir(QString())).removeRecursively();
}

void MountFtpURLJobQuestionsTest::passwordGoesToTheInput_data()
{
    QTest::addColumn<QString>("password");
    QTest::newRow("plain") << u"secret"_s;
    QTest::newRow("empty") << QString();
    QTest::newRow("blanks and letters") << u" p\u00e4ss \\ $(x) "_s;
}

void MountFtpURLJobQuestionsTest::passwordGoesToTheInput()
{
    QFETCH(QString, password);
    tool->expect(mounts);
    auth->answers = {Auth::password(password)};
    const auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(tool->input(1), password.toLocal8Bit() + '\n');
    // The title says so on the very first question too, which counts as a retry.
    QCOMPARE(auth->calls, QStringList({question(u"bob"_s), u"accepted"_s}));
    if (!password.isEmpty()) {
        QVERIFY(!tool->commandLine(1).contains(password.toLocal8Bit()));
        QVERIFY(!tool->environment(1).join('\n').contains(password.toLocal8Bit()));
    }
}

void MountFtpURLJobQuestionsTest::conversation_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QString>("mountedUrl");
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;
    const QString plain = u"ftp://host"_s;
    const QString bob = u"ftp://bob@host"_s;
    const QString askBob = question(u"bob"_s);
    const QString rejected = u"rejected bob"_s;
    const auto right = Auth::password(u"right"_s);

    QTest::newRow("asked twice in one run")
        << bob << Runs{{prompt, "read", prompt, "read"}} << Answers{Auth::password(u"x"_s), right}
        << QStringList{askBob, askBob, u"accepted"_s} << bob;
    // The answer to the second question goes nowhere: the third is what the new run gets.
    QTest::newRow("refused")
        << bob << Runs{refuses, mounts}
        << Answers{Auth::password(u"wrong"_s), Auth::password(u"lost"_s), right}
        << QStringList{askBob, rejected, askBob, askBob, u"accepted"_s} << bob;
    QTest::newRow("refused again and again")
        << bob << Runs{refuses, refuses, refuses, mounts}
        << Answers{right, right, right, right, right, right, right}
        << QStringList{askBob, rejected, askBob, askBob, rejected,     askBob,
                       askBob, rejected, askBob, askBob, u"accepted"_s}
        << bob;
    QTest::newRow("refused without a user")
        << plain << Runs{refuses, mounts} << Answers{right, right, right}
        << QStringList{question(u""_s), question(u""_s), question(u""_s), u"accepted"_s} << plain;
    QTest::newRow("refused before it asks")
        << bob << Runs{{refusal, "exit 1"}, mounts} << Answers{right, right}
        << QStringList{rejected, askBob, askBob, u"accepted"_s} << bob;
    // The words alone count, and not how the tool ends.
    QTest::newRow("refused, but it ends well")
        << bob << Runs{{refusal}, {}} << Answers{right}
        << QStringList{rejected, askBob, u"accepted"_s} << bob;
    QTest::newRow("refused twice in one run")
        << bob << Runs{{refusal, "drained", refusal, "exit 1"}, {}} << Answers{right}
        << QStringList{rejected, rejected, askBob, u"accepted"_s} << bob;
    // The question wins where both come in one read, so that no refusal is seen.
    QTest::newRow("refusal and question at once")
        << bob << Runs{{"err Access denied\\nEnter host password for user:", "read"}}
        << Answers{right} << QStringList{askBob, u"accepted"_s} << bob;
    QTest::newRow("changed at the prompt")
        << plain << Runs{waits, mounts} << Answers{Auth::changeUser(u"bob"_s, u"lost"_s), right}
        << QStringList{question(u""_s), askBob, u"accepted"_s} << bob;
    QTest::newRow("changed after a refusal")
        << u"ftp://ann@host"_s << Runs{refuses, mounts}
        << Answers{right, Auth::changeUser(u"bob"_s, u"lost"_s), right}
        << QStringList{question(u"ann"_s), u"rejected ann"_s, question(u"ann"_s), askBob, u"accepted"_s}
        << bob;
    // The changed name comes first. The refusal is asked about when the new user's run has ended.
    QTest::newRow("refused, then changed at the prompt")
        << u"ftp://ann@host"_s << Runs{refusesAndWaits, mounts, mounts}
        << Answers{Auth::changeUser(u"bob"_s), right, right, right}
        << QStringList{u"rejected ann"_s, question(u"ann"_s), askBob, askBob, askBob, u"accepted"_s}
        << bob;
    QTest::newRow("changed to nobody")
        << bob << Runs{waits, mounts} << Answers{Auth::changeUser(u""_s), right}
        << QStringList{askBob, question(u""_s), u"accepted"_s} << u"ftp://@host"_s;
    // The name counts only with the flag.
    QTest::newRow("name without the flag")
        << bob << Runs{mounts} << Answers{Auth::password(u"right"_s, u"ann"_s)}
        << QStringList{askBob, u"accepted"_s} << bob;
    // Each run says anew what its questions are about.
    Auth::Answer spoils = Auth::password(u"lost"_s);
    spoils.before = [this] {
        auth->setResource(u"x"_s, u"x"_s, u"x"_s, u"x"_s);
    };
    QTest::newRow("spoilt resource")
        << bob << Runs{refuses, mounts} << Answers{Auth::password(u"wrong"_s), spoils, right}
        << QStringList{askBob, rejected, askBob, askBob, u"accepted"_s} << bob;
}

void MountFtpURLJobQuestionsTest::conversation()
{
    QFETCH(QString, url);
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    QFETCH(QString, mountedUrl);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    auth->answers = answers;
    const auto job = makeJob<MountFtpURLJob>(url);
    finish(job.get());
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->url(), mountedUrl);
    const QString name = QString(mountedUrl).remove(u"ftp://@"_s).remove(u"ftp://"_s);
    const QString mountPath = mountDir(u"/ftp/"_s + name);
    QCOMPARE(job->localPath(), mountPath + QLatin1Char('/'));
    QCOMPARE(recordedMounts(), QStringList(recordedMount(mountedUrl + u"/"_s, mountPath)));
    // No directory of an earlier attempt is left.
    QCOMPARE(
        QDir(mountDir(u"/ftp"_s)).entryList(QDir::Dirs | QDir::NoDotAndDotDot), QStringList(name));
    if (tool->input(tool->runs()).contains('\n')) {
        QVERIFY(tool->input(tool->runs()).endsWith("right\n"));
    }
}

void MountFtpURLJobQuestionsTest::conversationFails_data()
{
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<int>("code");
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;
    const QString askBob = question(u"bob"_s);
    QTest::newRow("fails") << Runs{{"exit 1"}} << Answers{} << QStringList{} << 5;
    QTest::newRow("crashes") << Runs{{"kill 9"}} << Answers{} << QStringList{} << 5;
    QTest::newRow("fails behind the password")
        << Runs{{prompt, "read", "exit 7"}} << Answers{Auth::password(u"x"_s)}
        << QStringList{askBob} << 5;
    QTest::newRow("refused and given up")
        << Runs{refuses} << Answers{Auth::password(u"x"_s), Auth::cancel()}
        << QStringList{askBob, u"rejected bob"_s, askBob} << 2;
    // Giving up wins over a changed name.
    QTest::newRow("refused, changed and given up")
        << Runs{refuses} << Answers{Auth::password(u"x"_s), {QString(), u"ann"_s, 1, 1}}
        << QStringList{askBob, u"rejected bob"_s, askBob} << 2;
    QTest::newRow("refused, then fails")
        << Runs{refuses, {"exit 1"}} << Answers{Auth::password(u"x"_s), Auth::password(u"y"_s)}
        << QStringList{askBob, u"rejected bob"_s, askBob} << 5;
}

void MountFtpURLJobQuestionsTest::conversationFails()
{
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    QFETCH(int, code);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    auth->answers = answers;
    const auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    finish(job.get());
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), code);
    QCOMPARE(
        job->errorString(),
        code == 2 ? u"Accessing ftp resource was cancelled"_s : u"Mounting ftp resource failed"_s);
    QCOMPARE(job->url(), u"ftp://bob@host"_s);
    QVERIFY(job->localPath().isEmpty());
    QVERIFY(!isMountDir(u"/ftp/bob@host"_s));
    QCOMPARE(recordedMounts(), QStringList());
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
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    using Answers = QList<Auth::Answer>;
    const QString askBob = question(u"bob"_s);
    QTest::newRow("at once") << waits << Answers{Auth::cancel()} << QStringList{askBob};
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
    QFETCH(QList<Auth::Answer>, answers);
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
    tool->expect(waits);
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

void MountFtpURLJobQuestionsTest::isRecordedBeforeItIsAccepted()
{
    tool->expect({});
    const auto job = makeJob<MountFtpURLJob>(u"ftp://host"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    QStringList recorded;
    int endsWhenAccepted = -1;
    auth->whenAccepted = [&] {
        recorded = recordedMounts();
        endsWhenAccepted = finished.count();
    };
    finish(job.get());
    QCOMPARE(recorded.size(), 1);
    QCOMPARE(endsWhenAccepted, 0);
}

void MountFtpURLJobQuestionsTest::filesInTheDirectorySurvive_data()
{
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<int>("code");
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;
    const auto cancel = Auth::cancel();
    QTest::newRow("failed") << Runs{{"exit 1"}} << Answers{} << 5;
    QTest::newRow("given up") << Runs{waits} << Answers{cancel} << 2;
    QTest::newRow("given up after a refusal") << Runs{{refusal, "exit 1"}} << Answers{cancel} << 2;
    QTest::newRow("changed user") << Runs{waits, {}} << Answers{Auth::changeUser(u"bob"_s)} << 0;
    QTest::newRow("changed to an unsafe user")
        << Runs{waits} << Answers{Auth::changeUser(u"../bob"_s)} << 5;
}

// As when the directory is still the root of a mount: they would be those of the server.
void MountFtpURLJobQuestionsTest::filesInTheDirectorySurvive()
{
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(int, code);
    const QString file = makeFileInMountDir(u"/ftp/ann@host"_s);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    auth->answers = answers;
    const auto job = makeJob<MountFtpURLJob>(u"ftp://ann@host"_s);
    finish(job.get());
    QCOMPARE(job->error(), code);
    // The directory goes with the tool, which may end behind the job.
    QTRY_COMPARE(job->findChild<QProcess*>()->state(), QProcess::NotRunning);
    QVERIFY(QFileInfo::exists(file));
}

void MountFtpURLJobQuestionsTest::filesSurviveADeletedJob()
{
    const QString file = makeFileInMountDir(u"/ftp/ann@host"_s);
    tool->expect(waits);
    auto job = makeJob<MountFtpURLJob>(u"ftp://ann@host"_s);
    Auth::Answer answer = Auth::cancel();
    answer.before = [&job] {
        job.reset();
    };
    auth->answers = {answer};
    job->start();
    QTRY_VERIFY(!job);
    QVERIFY(QFileInfo::exists(file));
}

void MountFtpURLJobQuestionsTest::changedUserMovesTheDirectory()
{
    tool->expect(waits);
    tool->expect(mounts);
    bool first = false;
    bool moved = false;
    Auth::Answer change = Auth::changeUser(u"b ob"_s);
    change.before = [&] {
        first = isMountDir(u"/ftp/host"_s) && !isMountDir(u"/ftp/b ob@host"_s);
    };
    Auth::Answer answer = Auth::password(u"x"_s);
    answer.before = [&] {
        moved = isMountDir(u"/ftp/b ob@host"_s) && !isMountDir(u"/ftp/host"_s);
    };
    auth->answers = {change, answer};
    const auto job = makeJob<MountFtpURLJob>(u"ftp://host/a"_s);
    finish(job.get());
    QVERIFY(first);
    QVERIFY(moved);
    // Nothing was typed for the tool that was ended.
    QCOMPARE(tool->input(1), QByteArray());
    QCOMPARE(tool->arguments(1).size(), 2);
    QCOMPARE(
        tool->arguments(2),
        QByteArrayList({"-o", "user=b ob", "host", mountDir(u"/ftp/b ob@host"_s).toLocal8Bit()}));
    QCOMPARE(QUrl(job->url()).userName(), u"b ob"_s);
}

void MountFtpURLJobQuestionsTest::changedUserIsMountedAlready_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<bool>("refused");
    QTest::newRow("at the prompt") << waits << false;
    QTest::newRow("after a refusal") << QByteArrayList({refusal, "exit 1"}) << true;
    QTest::newRow("at the prompt behind a refusal") << refusesAndWaits << true;
}

void MountFtpURLJobQuestionsTest::changedUserIsMountedAlready()
{
    QFETCH(QByteArrayList, run);
    QFETCH(bool, refused);
    tool->expect(run);
    auth->answers = {Auth::changeUser(u"bob"_s)};
    setFuseMounts({{u"ftp://bob@host/"_s, u"/mnt/bob"_s}});
    const auto job = makeJob<MountFtpURLJob>(u"ftp://ann@host/a"_s);
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/mnt/bob//a"_s);
    QCOMPARE(job->url(), u"ftp://bob@host/a"_s);
    QCOMPARE(recordedMounts(), QStringList());
    // Nobody says that the credentials worked: they were not used.
    const QStringList asked(question(u"ann"_s));
    QCOMPARE(auth->calls, refused ? QStringList(u"rejected ann"_s) + asked : asked);
}

void MountFtpURLJobQuestionsTest::unsafeChangedUser()
{
    tool->expect(waits);
    auth->answers = {Auth::changeUser(u"../bob"_s)};
    const auto job = makeJob<MountFtpURLJob>(u"ftp://host"_s);
    finish(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Mounting ftp resource failed"_s);
    QVERIFY(!isMountDir(u"/ftp/host"_s));
}

void MountFtpURLJobQuestionsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(MountFtpURLJobQuestionsTest)
#include "tst_mountftpurljob_questions.moc"
