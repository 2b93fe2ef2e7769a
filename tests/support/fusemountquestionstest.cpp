// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/fusemountquestionstest.h"

#include <QProcess>

using namespace VeyFM;

void FuseMountQuestionsTest::expect(const Runs& runs) const
{
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
}

void FuseMountQuestionsTest::passwordReachesTheTool_data()
{
    QTest::addColumn<QString>("password");
    QTest::newRow("plain") << u"secret"_s;
    QTest::newRow("empty") << QString();
    QTest::newRow("blanks and letters") << u" p\u00e4ss \\ $(x) "_s;
}

void FuseMountQuestionsTest::passwordReachesTheTool()
{
    QFETCH(QString, password);
    tool->expect(protocol.asks);
    auth->answers = {Auth::password(password)};
    const FuseMountJob job = makeMountJob(url(u"bob@host"_s));
    finish(job);
    QCOMPARE(job->error(), 0);
    QCOMPARE(tool->input(1), password.toLocal8Bit() + '\n');
    // The title says so on the very first question too, which counts as a retry.
    QCOMPARE(auth->calls, QStringList({question(u"bob"_s), u"accepted"_s}));
    if (!password.isEmpty()) {
        QVERIFY(!tool->commandLine(1).contains(password.toLocal8Bit()));
        QVERIFY(!tool->environment(1).join('\n').contains(password.toLocal8Bit()));
    }
}

void FuseMountQuestionsTest::conversation_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<Runs>("runs");
    QTest::addColumn<Answers>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QString>("mountedUrl");
    QTest::addColumn<QByteArray>("lastInput");
    const QByteArrayList mounts = protocol.asks;
    const QByteArrayList refuses = protocol.refuses();
    const QString plain = url(u"host"_s);
    const QString ann = url(u"ann@host"_s);
    const QString bob = url(u"bob@host"_s);
    const QString ask = question(QString());
    const QString askAnn = question(u"ann"_s);
    const QString askBob = question(u"bob"_s);
    const QString rejected = u"rejected bob"_s;
    const QString accepted = u"accepted"_s;
    const auto wrong = Auth::password(u"wrong"_s);
    const auto lost = Auth::password(u"lost"_s);
    const auto right = Auth::password(u"right"_s);
    const QByteArray typed = "right\n";

    // The answer to the second question goes nowhere: the third is what the new run gets.
    QTest::newRow("refused") << bob << Runs{refuses, mounts} << Answers{wrong, lost, right}
                             << QStringList{askBob, rejected, askBob, askBob, accepted} << bob
                             << typed;
    QTest::newRow("refused again and again")
        << bob << Runs{refuses, refuses, refuses, mounts}
        << Answers{right, right, right, right, right, right, right}
        << QStringList{askBob, rejected, askBob, askBob, rejected, askBob,
                       askBob, rejected, askBob, askBob, accepted}
        << bob << typed;
    QTest::newRow("refused without a user")
        << plain << Runs{refuses, mounts} << Answers{right, right, right}
        << QStringList{ask, ask, ask, accepted} << plain << typed;
    QTest::newRow("refused before it asks")
        << bob << Runs{protocol.refusesAtOnce(), mounts} << Answers{right, right}
        << QStringList{rejected, askBob, askBob, accepted} << bob << typed;
    // The words alone count, and not how the tool ends.
    QTest::newRow("refused, but it ends well")
        << bob << Runs{{protocol.refusal}, {}} << Answers{right}
        << QStringList{rejected, askBob, accepted} << bob << QByteArray();
    QTest::newRow("changed at the prompt") << plain << Runs{protocol.waits, mounts}
                                           << Answers{Auth::changeUser(u"bob"_s, u"lost"_s), right}
                                           << QStringList{ask, askBob, accepted} << bob << typed;
    QTest::newRow("changed after a refusal")
        << ann << Runs{refuses, mounts}
        << Answers{wrong, Auth::changeUser(u"bob"_s, u"lost"_s), right}
        << QStringList{askAnn, u"rejected ann"_s, askAnn, askBob, accepted} << bob << typed;
    QTest::newRow("changed to nobody")
        << bob << Runs{protocol.waits, mounts} << Answers{Auth::changeUser(u""_s), right}
        << QStringList{askBob, ask, accepted} << url(u"@host"_s) << typed;
    // The name counts only with the flag.
    QTest::newRow("name without the flag")
        << bob << Runs{mounts} << Answers{Auth::password(u"right"_s, u"ann"_s)}
        << QStringList{askBob, accepted} << bob << typed;
    // Each run says anew what its questions are about.
    Auth::Answer spoils = lost;
    spoils.before = [this] {
        auth->setResource(u"x"_s, u"x"_s, u"x"_s, u"x"_s);
    };
    QTest::newRow("spoilt resource")
        << bob << Runs{refuses, mounts} << Answers{wrong, spoils, right}
        << QStringList{askBob, rejected, askBob, askBob, accepted} << bob << typed;
    addConversations();
}

void FuseMountQuestionsTest::conversation()
{
    QFETCH(QString, url);
    QFETCH(Runs, runs);
    QFETCH(Answers, answers);
    QFETCH(QStringList, calls);
    QFETCH(QString, mountedUrl);
    QFETCH(QByteArray, lastInput);
    expect(runs);
    auth->answers = answers;
    for (int i = calls.filter(u"question "_s).size(); i > 0; --i) {
        auth->questionAnswers.append(true);
    }
    const FuseMountJob job = makeMountJob(url);
    finish(job);
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), 0);
    QCOMPARE(job.url(), mountedUrl);
    QCOMPARE(tool->input(tool->runs()), lastInput);
    const QString account = mountedUrl.mid(protocol.scheme.size() + 3);
    const QString name = account.startsWith(QLatin1Char('@')) ? account.mid(1) : account;
    const QString mountPath = mountDir(directory(name));
    QCOMPARE(job.localPath(), mountPath + QLatin1Char('/'));
    QCOMPARE(recordedMounts(), QStringList(recordedMount(mountedUrl + u"/"_s, mountPath)));
    // No directory of an earlier attempt is left.
    QCOMPARE(
        QDir(mountDir(directory(QString()))).entryList(QDir::Dirs | QDir::NoDotAndDotDot),
        QStringList(name));
}

void FuseMountQuestionsTest::conversationFails_data()
{
    QTest::addColumn<Runs>("runs");
    QTest::addColumn<Answers>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<int>("code");
    const QByteArrayList refuses = protocol.refuses();
    const QString askBob = question(u"bob"_s);
    const QString rejected = u"rejected bob"_s;
    const auto answer = Auth::password(u"x"_s);
    QTest::newRow("fails") << Runs{{"exit 1"}} << Answers{} << QStringList{} << 5;
    QTest::newRow("crashes") << Runs{{"kill 9"}} << Answers{} << QStringList{} << 5;
    QTest::newRow("fails behind the password") << Runs{protocol.asks + QByteArrayList({"exit 7"})}
                                               << Answers{answer} << QStringList{askBob} << 5;
    QTest::newRow("refused and given up") << Runs{refuses} << Answers{answer, Auth::cancel()}
                                          << QStringList{askBob, rejected, askBob} << 2;
    // Giving up wins over a changed name.
    QTest::newRow("refused, changed and given up")
        << Runs{refuses} << Answers{answer, {QString(), u"ann"_s, 1, 1}}
        << QStringList{askBob, rejected, askBob} << 2;
    QTest::newRow("refused, then fails") << Runs{refuses, {"exit 1"}} << Answers{answer, answer}
                                         << QStringList{askBob, rejected, askBob} << 5;
}

void FuseMountQuestionsTest::conversationFails()
{
    QFETCH(Runs, runs);
    QFETCH(Answers, answers);
    QFETCH(QStringList, calls);
    QFETCH(int, code);
    expect(runs);
    auth->answers = answers;
    const FuseMountJob job = makeMountJob(url(u"bob@host"_s));
    finish(job);
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), code);
    QCOMPARE(job->errorString(), code == 2 ? cancellation() : failure());
    QCOMPARE(job.url(), url(u"bob@host"_s));
    QVERIFY(job.localPath().isEmpty());
    QVERIFY(!isMountDir(directory(u"bob@host"_s)));
    QCOMPARE(recordedMounts(), QStringList());
}

void FuseMountQuestionsTest::isRecordedBeforeItIsAccepted()
{
    tool->expect({});
    const FuseMountJob job = makeMountJob(url(u"host"_s));
    QSignalSpy finished(job.job.get(), &Job::finished);
    QStringList recorded;
    int endsWhenAccepted = -1;
    auth->whenAccepted = [&] {
        recorded = recordedMounts();
        endsWhenAccepted = finished.count();
    };
    finish(job);
    QCOMPARE(recorded.size(), 1);
    QCOMPARE(endsWhenAccepted, 0);
}

void FuseMountQuestionsTest::filesInTheDirectorySurvive_data()
{
    QTest::addColumn<Runs>("runs");
    QTest::addColumn<Answers>("answers");
    QTest::addColumn<bool>("finishes");
    QTest::addColumn<int>("code");
    const QByteArrayList waits = protocol.waits;
    QTest::newRow("failed") << Runs{{"exit 1"}} << Answers{} << true << 5;
    QTest::newRow("given up after a refusal")
        << Runs{protocol.refusesAtOnce()} << Answers{Auth::cancel()} << true << 2;
    QTest::newRow("changed user") << Runs{waits, {}} << Answers{Auth::changeUser(u"bob"_s)} << true
                                  << 0;
    QTest::newRow("changed to an unsafe user")
        << Runs{waits} << Answers{Auth::changeUser(u"../bob"_s)} << true << 5;
    addEndsWithFiles();
}

// As when the directory is still the root of a mount: they would be those of the server.
void FuseMountQuestionsTest::filesInTheDirectorySurvive()
{
    QFETCH(Runs, runs);
    QFETCH(Answers, answers);
    QFETCH(bool, finishes);
    QFETCH(int, code);
    const QString file = makeFileInMountDir(directory(u"ann@host"_s));
    expect(runs);
    auth->answers = answers;
    const FuseMountJob job = makeMountJob(url(u"ann@host"_s));
    if (finishes) {
        finish(job);
    } else {
        QSignalSpy finished(job.job.get(), &Job::finished);
        job->start();
        QCOMPARE(finished.count(), 0);
    }
    QCOMPARE(job->error(), code);
    if (!protocol.endsInStart) {
        // The directory goes with the tool, which may end behind the job.
        QTRY_COMPARE(job->findChild<QProcess*>()->state(), QProcess::NotRunning);
    }
    QVERIFY(QFileInfo::exists(file));
}

void FuseMountQuestionsTest::filesSurviveADeletedJob()
{
    const QString file = makeFileInMountDir(directory(u"ann@host"_s));
    tool->expect(protocol.waits);
    FuseMountJob job = makeMountJob(url(u"ann@host"_s));
    Auth::Answer answer = Auth::cancel();
    answer.before = [&job] {
        job.job.reset();
    };
    auth->answers = {answer};
    job->start();
    QTRY_VERIFY(!job.job);
    QVERIFY(QFileInfo::exists(file));
}

void FuseMountQuestionsTest::changedUserMovesTheDirectory()
{
    tool->expect(protocol.waits);
    tool->expect(protocol.asks);
    const QString before = directory(u"host"_s);
    const QString after = directory(u"b ob@host"_s);
    bool first = false;
    bool moved = false;
    Auth::Answer change = Auth::changeUser(u"b ob"_s, u"lost"_s);
    change.before = [&] {
        first = isMountDir(before) && !isMountDir(after);
    };
    Auth::Answer answer = Auth::password(u"x"_s);
    answer.before = [&] {
        moved = isMountDir(after) && !isMountDir(before);
    };
    auth->answers = {change, answer};
    const FuseMountJob job = makeMountJob(url(u"host/a"_s));
    finish(job);
    QCOMPARE(job->error(), 0);
    QVERIFY(first);
    QVERIFY(moved);
    QCOMPARE(QUrl(job.url()), QUrl(url(u"b%20ob@host/a"_s)));
    QCOMPARE(auth->calls, QStringList({question(QString()), question(u"b ob"_s), u"accepted"_s}));
}

void FuseMountQuestionsTest::changedUserIsMountedAlready_data()
{
    QTest::addColumn<QByteArrayList>("run");
    QTest::addColumn<bool>("refused");
    QTest::newRow("at the prompt") << protocol.waits << false;
    QTest::newRow("after a refusal") << protocol.refusesAtOnce() << true;
    addChangesToAMountedUser();
}

void FuseMountQuestionsTest::changedUserIsMountedAlready()
{
    QFETCH(QByteArrayList, run);
    QFETCH(bool, refused);
    tool->expect(run);
    auth->answers = {Auth::changeUser(u"bob"_s)};
    setFuseMounts({{url(u"bob@host/"_s), u"/mnt/bob"_s}});
    const FuseMountJob job = makeMountJob(url(u"ann@host/a"_s));
    finish(job);
    QCOMPARE(job->error(), 0);
    QCOMPARE(job.localPath(), u"/mnt/bob//a"_s);
    QCOMPARE(job.url(), url(u"bob@host/a"_s));
    QCOMPARE(recordedMounts(), QStringList());
    // Nobody says that the credentials worked: they were not used.
    const QStringList asked(question(u"ann"_s));
    QCOMPARE(auth->calls, refused ? QStringList(u"rejected ann"_s) + asked : asked);
}

void FuseMountQuestionsTest::unsafeChangedUser()
{
    tool->expect(protocol.waits);
    auth->answers = {Auth::changeUser(u"../bob"_s)};
    const FuseMountJob job = makeMountJob(url(u"host"_s));
    finish(job);
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), failure());
    QVERIFY(!isMountDir(directory(u"host"_s)));
}
