// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountsftpurljob.h"
#include "support/mountjobtest.h"

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<QByteArrayList>)
Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

namespace {

// The end of sshfs as users know it after any failed login.
const QByteArray refusal = "out read: Connection reset by peer\\n";
const QByteArrayList asks = {"echo off", "out x@host's password: ", "read", "echo on"};
const QByteArrayList mounts = asks;
const QByteArrayList fails = asks + QByteArrayList({"exit 1"});
const QByteArrayList refuses = asks + QByteArrayList({refusal, "exit 1"});

const QByteArray rsaQuestion = "The authenticity of host 'h (10.0.0.1)' can't be established.\n"
                               "RSA key fingerprint is SHA256:ab/+cd.\n"
                               "Are you sure you want to continue connecting (yes/no)? ";

QByteArray prints(QByteArray text)
{
    return "out " + text.replace('\n', "\\n");
}

const QByteArrayList keyQuestion = {prints(rsaQuestion), "read"};

QString question(const QString& user)
{
    return QStringLiteral("retry [sftp  host ] Access denied|Enter host password for user:|") +
           user;
}

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

/// What SFTP mounts ask, and what comes of the answers, with a scripted `sshfs` on its terminal and
/// a scripted service.
class MountSFtpURLJobQuestionsTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void passwordIsTyped_data();
    void passwordIsTyped();
    void conversation_data();
    void conversation();
    void conversationFails_data();
    void conversationFails();
    void keyQuestionCountsForItsRunAlone();
    void silentEnds_data();
    void silentEnds();
    void hostKeyText_data();
    void hostKeyText();
    void terminalNotReady_data();
    void terminalNotReady();
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

void MountSFtpURLJobQuestionsTest::initTestCase()
{
    QVERIFY2(startVfs("{}"), qPrintable(service.errorString()));
}

void MountSFtpURLJobQuestionsTest::init()
{
    QVERIFY(!QFileInfo::exists(mountDir(QString())));
    startScene("sshfs");
}

void MountSFtpURLJobQuestionsTest::cleanup()
{
    checkScene();
    QDir(mountDir(QString())).removeRecursively();
}

void MountSFtpURLJobQuestionsTest::passwordIsTyped_data()
{
    QTest::addColumn<QString>("password");
    QTest::newRow("plain") << u"secret"_s;
    QTest::newRow("empty") << QString();
    QTest::newRow("blanks and letters") << u" p\u00e4ss $(x) "_s;
}

void MountSFtpURLJobQuestionsTest::passwordIsTyped()
{
    QFETCH(QString, password);
    tool->expect(mounts);
    auth->answers = {Auth::password(password)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(tool->input(1), password.toLocal8Bit() + '\n');
    // The title says so on the very first question too, which counts as a retry.
    QCOMPARE(auth->calls, QStringList({question(u"bob"_s), u"accepted"_s}));
    if (!password.isEmpty()) {
        QVERIFY(!tool->commandLine(1).contains(password.toLocal8Bit()));
        QVERIFY(!tool->environment(1).join('\n').contains(password.toLocal8Bit()));
    }
}

void MountSFtpURLJobQuestionsTest::conversation_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QByteArray>("lastInput");
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;
    const QString plain = u"sftp://host"_s;
    const QString bob = u"sftp://bob@host"_s;
    const QString askBob = question(u"bob"_s);
    const QString rejected = u"rejected bob"_s;
    const QString accepted = u"accepted"_s;
    const auto right = Auth::password(u"right"_s);

    QTest::newRow("key with yes, then the password")
        << bob << Runs{keyQuestion + asks} << Answers{right}
        << QStringList{askedForKey, askBob, accepted} << QByteArray("yes\nright\n");
    // The answer to the second question goes nowhere: the third is what the new run gets.
    QTest::newRow("refused")
        << bob << Runs{refuses, mounts}
        << Answers{Auth::password(u"wrong"_s), Auth::password(u"lost"_s), right}
        << QStringList{askBob, rejected, askBob, askBob, accepted} << QByteArray("right\n");
    QTest::newRow("refused again and again")
        << bob << Runs{refuses, refuses, mounts} << Answers{right, right, right, right, right}
        << QStringList{askBob, rejected, askBob, askBob, rejected, askBob, askBob, accepted}
        << QByteArray("right\n");
    QTest::newRow("refused without a user")
        << plain << Runs{refuses, mounts} << Answers{right, right, right}
        << QStringList{question(u""_s), question(u""_s), question(u""_s), accepted}
        << QByteArray("right\n");
    QTest::newRow("refused before it asks")
        << bob << Runs{{refusal, "exit 1"}, {}} << Answers{right}
        << QStringList{rejected, askBob, accepted} << QByteArray();
    QTest::newRow("refused, but it ends well")
        << bob << Runs{{refusal}, {}} << Answers{right} << QStringList{rejected, askBob, accepted}
        << QByteArray();
    // Only a run with the question reads a refusal as a "no".
    QTest::newRow("refused, key question in the next run")
        << bob << Runs{refuses, keyQuestion + asks} << Answers{right, right, right}
        << QStringList{askBob, rejected, askBob, askedForKey, askBob, accepted}
        << QByteArray("yes\nright\n");
    // Of what comes in one read the password prompt wins, then the refusal.
    QTest::newRow("refusal and prompt at once")
        << bob << Runs{{"echo off", "out Connection reset by peer (yes/no) a password: ", "read"}}
        << Answers{right} << QStringList{askBob, accepted} << QByteArray("right\n");
    QTest::newRow("key question and refusal at once")
        << bob << Runs{{"out (yes/no)? Connection reset by peer", "exit 1"}, {}} << Answers{right}
        << QStringList{rejected, askBob, accepted} << QByteArray();
    QTest::newRow("ignored output")
        << bob
        << Runs{{"out bob@host Password: (password:)\\nconnection reset by peer\\nYES/NO\\n"}}
        << Answers{} << QStringList{accepted} << QByteArray();
    QTest::newRow("name without the flag")
        << bob << Runs{mounts} << Answers{Auth::password(u"right"_s, u"ann"_s)}
        << QStringList{askBob, accepted} << QByteArray("right\n");
    // Each run says anew what its questions are about.
    Auth::Answer spoils = Auth::password(u"lost"_s);
    spoils.before = [this] {
        auth->setResource(u"x"_s, u"x"_s, u"x"_s, u"x"_s);
    };
    QTest::newRow("spoilt resource")
        << bob << Runs{refuses, mounts} << Answers{Auth::password(u"wrong"_s), spoils, right}
        << QStringList{askBob, rejected, askBob, askBob, accepted} << QByteArray("right\n");
}

void MountSFtpURLJobQuestionsTest::conversation()
{
    QFETCH(QString, url);
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    QFETCH(QByteArray, lastInput);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    auth->answers = answers;
    for (int i = calls.filter(u"question "_s).size(); i > 0; --i) {
        auth->questionAnswers.append(true);
    }
    const auto job = makeJob<MountSFtpURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->url(), url);
    QCOMPARE(tool->input(tool->runs()), lastInput);
    QCOMPARE(
        recordedMounts(),
        QStringList(recordedMount(url + u"/"_s, mountDir(u"/sftp/"_s + url.mid(7)))));
}

void MountSFtpURLJobQuestionsTest::conversationFails_data()
{
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<int>("code");
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;
    const QString askBob = question(u"bob"_s);
    const auto answer = Auth::password(u"x"_s);
    QTest::newRow("fails") << Runs{{"exit 1"}} << Answers{} << QStringList{} << 5;
    QTest::newRow("crashes") << Runs{{"kill 9"}} << Answers{} << QStringList{} << 5;
    QTest::newRow("fails behind the password")
        << Runs{fails} << Answers{answer} << QStringList{askBob} << 5;
    QTest::newRow("refused and given up") << Runs{refuses} << Answers{answer, Auth::cancel()}
                                          << QStringList{askBob, u"rejected bob"_s, askBob} << 2;
    // Giving up wins over a changed name.
    QTest::newRow("refused, changed and given up")
        << Runs{refuses} << Answers{answer, {QString(), u"ann"_s, 1, 1}}
        << QStringList{askBob, u"rejected bob"_s, askBob} << 2;
    QTest::newRow("refused, then fails") << Runs{refuses, {"exit 1"}} << Answers{answer, answer}
                                         << QStringList{askBob, u"rejected bob"_s, askBob} << 5;
}

void MountSFtpURLJobQuestionsTest::conversationFails()
{
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    QFETCH(int, code);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    auth->answers = answers;
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://bob@host"_s);
    startToEnd(job.get());
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), code);
    QCOMPARE(
        job->errorString(), code == 2 ? u"Accessing sftp resource was cancelled"_s
                                      : u"Mounting sftp resource failed"_s);
    QCOMPARE(job->url(), u"sftp://bob@host"_s);
    QVERIFY(job->localPath().isEmpty());
    QVERIFY(!isMountDir(u"/sftp/bob@host"_s));
    QCOMPARE(recordedMounts(), QStringList());
}

void MountSFtpURLJobQuestionsTest::keyQuestionCountsForItsRunAlone()
{
    tool->expect(keyQuestion + fails);
    tool->expect(refuses);
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
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<bool>("yes");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QByteArray>("input");
    using Answers = QList<Auth::Answer>;
    const QString askBob = question(u"bob"_s);
    QTest::newRow("given up at the prompt")
        << fails << Answers{Auth::cancel()} << false << QStringList{askBob} << QByteArray("\n");
    QTest::newRow("given up, but it mounts")
        << mounts << Answers{Auth::cancel()} << false << QStringList{askBob} << QByteArray("\n");
    QTest::newRow("changed and given up") << fails << Answers{{QString(), u"ann"_s, 1, 1}} << false
                                          << QStringList{askBob} << QByteArray("\n");
    QTest::newRow("key with no") << keyQuestion + QByteArrayList({refusal, "exit 1"}) << Answers{}
                                 << false << QStringList{askedForKey} << QByteArray("no\n");
    QTest::newRow("key with yes, then refused")
        << keyQuestion + refuses << Answers{Auth::password(u"wrong"_s)} << true
        << QStringList{askedForKey, askBob} << QByteArray("yes\nwrong\n");
}

void MountSFtpURLJobQuestionsTest::silentEnds()
{
    QFETCH(QByteArrayList, run);
    QFETCH(QList<Auth::Answer>, answers);
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

void MountSFtpURLJobQuestionsTest::isRecordedBeforeItIsAccepted()
{
    tool->expect({});
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://host"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    QStringList recorded;
    int endsWhenAccepted = -1;
    auth->whenAccepted = [&] {
        recorded = recordedMounts();
        endsWhenAccepted = finished.count();
    };
    startToEnd(job.get());
    QCOMPARE(recorded.size(), 1);
    QCOMPARE(endsWhenAccepted, 0);
}

void MountSFtpURLJobQuestionsTest::filesInTheDirectorySurvive_data()
{
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<int>("ends");
    QTest::addColumn<int>("code");
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;
    const auto cancel = Auth::cancel();
    QTest::newRow("failed") << Runs{{"exit 1"}} << Answers{} << 1 << 5;
    QTest::newRow("given up") << Runs{fails} << Answers{cancel} << 0 << 0;
    QTest::newRow("given up after a refusal")
        << Runs{{refusal, "exit 1"}} << Answers{cancel} << 1 << 2;
    QTest::newRow("changed user") << Runs{fails, {}} << Answers{Auth::changeUser(u"bob"_s)} << 1
                                  << 0;
    QTest::newRow("changed to an unsafe user")
        << Runs{fails} << Answers{Auth::changeUser(u"../bob"_s)} << 1 << 5;
}

// As when the directory is still the root of a mount: they would be those of the server.
void MountSFtpURLJobQuestionsTest::filesInTheDirectorySurvive()
{
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(int, ends);
    QFETCH(int, code);
    const QString file = makeFileInMountDir(u"/sftp/ann@host"_s);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    auth->answers = answers;
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://ann@host"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), ends);
    QCOMPARE(job->error(), code);
    QVERIFY(QFileInfo::exists(file));
}

void MountSFtpURLJobQuestionsTest::filesSurviveADeletedJob()
{
    const QString file = makeFileInMountDir(u"/sftp/ann@host"_s);
    tool->expect(fails);
    auto job = makeJob<MountSFtpURLJob>(u"sftp://ann@host"_s);
    Auth::Answer answer = Auth::cancel();
    answer.before = [&job] {
        job.reset();
    };
    auth->answers = {answer};
    job->start();
    QTRY_VERIFY(!job);
    QVERIFY(QFileInfo::exists(file));
}

void MountSFtpURLJobQuestionsTest::changedUserMovesTheDirectory()
{
    tool->expect(fails);
    tool->expect(mounts);
    bool first = false;
    bool moved = false;
    Auth::Answer change = Auth::changeUser(u"bob"_s, u"lost"_s);
    change.before = [&] {
        first = isMountDir(u"/sftp/host~"_s) && !isMountDir(u"/sftp/bob@host~"_s);
    };
    Auth::Answer answer = Auth::password(u"x"_s);
    answer.before = [&] {
        moved = isMountDir(u"/sftp/bob@host~"_s) && !isMountDir(u"/sftp/host~"_s);
    };
    auth->answers = {change, answer};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://host/~/a"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QVERIFY(first);
    QVERIFY(moved);
    // A line without a password lets the tool go.
    QCOMPARE(tool->input(1), QByteArray("\n"));
    QCOMPARE(tool->arguments(1).first(), QByteArray("host:"));
    QCOMPARE(tool->arguments(2).first(), QByteArray("bob@host:"));
    QCOMPARE(job->url(), u"sftp://bob@host/~/a"_s);
    QCOMPARE(auth->calls, QStringList({question(u""_s), question(u"bob"_s), u"accepted"_s}));
}

void MountSFtpURLJobQuestionsTest::changedUserIsMountedAlready_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<bool>("refused");
    QTest::newRow("at the prompt") << fails << false;
    QTest::newRow("after a refusal") << QByteArrayList({refusal, "exit 1"}) << true;
}

void MountSFtpURLJobQuestionsTest::changedUserIsMountedAlready()
{
    QFETCH(QByteArrayList, run);
    QFETCH(bool, refused);
    tool->expect(run);
    auth->answers = {Auth::changeUser(u"bob"_s)};
    setFuseMounts({{u"sftp://bob@host/"_s, u"/mnt/bob"_s}});
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://ann@host/a"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/mnt/bob//a"_s);
    QCOMPARE(job->url(), u"sftp://bob@host/a"_s);
    QCOMPARE(recordedMounts(), QStringList());
    const QStringList asked(question(u"ann"_s));
    QCOMPARE(auth->calls, refused ? QStringList(u"rejected ann"_s) + asked : asked);
}

void MountSFtpURLJobQuestionsTest::unsafeChangedUser()
{
    tool->expect(fails);
    auth->answers = {Auth::changeUser(u"-oProxyCommand=x"_s)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://host"_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Mounting sftp resource failed"_s);
    QVERIFY(!isMountDir(u"/sftp/host"_s));
}

void MountSFtpURLJobQuestionsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(MountSFtpURLJobQuestionsTest)
#include "tst_mountsftpurljob_questions.moc"
