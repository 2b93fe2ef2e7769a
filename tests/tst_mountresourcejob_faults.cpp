// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountresourcescene.h"

#include <QElapsedTimer>
#include <QEventLoop>
#include <QPointer>
#include <QTimer>

#include <functional>

using namespace VeyFM;

namespace {

const QString finishedTooEarly = QStringLiteral("veyfm-mount has ended too early");
const QByteArray cancelRequest = R"({"do":"cancel"})";
const QByteArray takeRequest = R"({"do":"take"})";

/// All that there is to say, in some order, and no end before the host has said something.
QByteArrayList longTalk()
{
    return {
        "read",
        Helper::begin,
        Helper::line(R"({"say":"waiting","text":"another"})"),
        Helper::askConfirmation(),
        "read",
        Helper::line(R"({"say":"rejected","user":"anna"})"),
        Helper::askPassword(2),
        "read",
        "read",
        Helper::line(R"({"say":"accepted"})"),
        Helper::succeed(),
        "read",
        "exit 0"};
}

const char* const signalMoments[] = {
    "waitingForOther", "confirmationRequested", "credentialsRejected", "passwordRequested",
    "credentialsAccepted"};

} // namespace

/// A program that misbehaves, and a job that is cancelled or deleted at any moment.
class MountResourceJobFaultsTest : public MountResourceTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();
    void misbehaves_data();
    void misbehaves();
    void cantStart_data();
    void cantStart();
    void refusesToHandOver_data();
    void refusesToHandOver();
    void floods();
    void silence();
    void silenceOfTheUser();
    void silenceBeginsAnew();
    void cancelBeforeStart();
    void cancelInSignals_data();
    void cancelInSignals();
    void cancelAtQuestion();
    void cancelTwice();
    void cancelLate();
    void cancelMeetsSuccess();
    void cancelOfOneThatNeverEnds();
    void cancelOfOneThatIsStopped();
    void cancelAtAnyMoment();
    void deletedInSignals_data();
    void deletedInSignals();
    void deletedBetween_data();
    void deletedBetween();
    void cancelledUnderAuthenticator();
    void deletedUnderAuthenticator();
    void endsUnderAuthenticator_data();
    void endsUnderAuthenticator();
    void childrenAreIgnored();

private:
    /// Answers all questions.
    void answerAll(Job* job)
    {
        connect(job, &Job::confirmationRequested, job, [job] { job->confirm(true); });
        connect(job, &Job::passwordRequested, job, [job] {
            job->answerPassword(QStringLiteral("anna"), QStringLiteral("secret"));
        });
    }

    /// Calls @p action the first time that the job emits the signal.
    void whenEmitted(Job* job, const QByteArray& signal, const std::function<void()>& action)
    {
        const auto once = [action] {
            action();
        };
        if (signal == "waitingForOther") {
            connect(job, &Job::waitingForOther, this, once);
        } else if (signal == "confirmationRequested") {
            connect(job, &Job::confirmationRequested, this, once);
        } else if (signal == "credentialsRejected") {
            connect(job, &Job::credentialsRejected, this, once);
        } else if (signal == "passwordRequested") {
            connect(job, &Job::passwordRequested, this, once);
        } else {
            connect(job, &Job::credentialsAccepted, this, once);
        }
    }
};

void MountResourceJobFaultsTest::init()
{
    startScene();
}

void MountResourceJobFaultsTest::cleanup()
{
    endScene();
}

void MountResourceJobFaultsTest::misbehaves_data()
{
    QTest::addColumn<QByteArrayList>("play");
    QTest::addColumn<QString>("text");
    const auto cantUnderstand = [](const char* why) {
        return QStringLiteral("Can't understand veyfm-mount: ") + QString::fromUtf8(why);
    };
    QTest::newRow("garbage") << QByteArrayList{"read", "out garbage\\n", "read", "read"}
                             << cantUnderstand("a line is no JSON: illegal value");
    QTest::newRow("garbage later")
        << QByteArrayList{"read", Helper::begin, "out {}\\n", "read", "read"}
        << cantUnderstand("\"say\" is not a text");
    QTest::newRow("too long") << QByteArrayList{"read", "out " + QByteArray(70000, 'x'), "read"}
                              << cantUnderstand("a line is too long");
    QTest::newRow("wrong version")
        << QByteArrayList{"read", R"(out {"say":"ready","version":2,"program":"x"}\n)", "read"}
        << cantUnderstand("version 2 of the protocol is not known, only 1");
    QTest::newRow("no begin") << QByteArrayList{"read", Helper::askPassword(), "read"}
                              << cantUnderstand("a line that does not belong here");
    QTest::newRow("success without a begin")
        << QByteArrayList{"read", Helper::succeed(), "read", "read"}
        << cantUnderstand("an end without a begin");
    QTest::newRow("two begins") << QByteArrayList{"read", Helper::begin, Helper::begin, "read"}
                                << cantUnderstand("a line that does not belong here");
    QTest::newRow("two questions")
        << QByteArrayList{"read", Helper::begin, Helper::askPassword(), Helper::askConfirmation(2), "read"}
        << cantUnderstand("a second question at the same time");
    QTest::newRow("ends at once") << QByteArrayList{"exit 0"} << finishedTooEarly;
    QTest::newRow("ends early") << QByteArrayList{"read", Helper::begin, "exit 0"}
                                << finishedTooEarly;
    QTest::newRow("fails early") << QByteArrayList{"read", Helper::begin, "exit 3"}
                                 << finishedTooEarly;
    QTest::newRow("killed") << QByteArrayList{"read", Helper::begin, "kill 9"}
                            << u"veyfm-mount was ended by signal 9"_s;
    QTest::newRow("killed at question")
        << QByteArrayList{"read", Helper::begin, Helper::askPassword(), "kill 15"}
        << u"veyfm-mount was ended by signal 15"_s;
    QTest::newRow("half a line") << QByteArrayList{"read", Helper::begin, "out {\"say\"", "exit 0"}
                                 << finishedTooEarly;
}

void MountResourceJobFaultsTest::misbehaves()
{
    QFETCH(QByteArrayList, play);
    QFETCH(QString, text);
    tool->expect(play);
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), text);
    QCOMPARE(job->localPath(), QString());
    QVERIFY(!job->question());
    // With the news that it is not wanted any more, or a pipe that nobody writes to.
    QVERIFY(!said().contains(takeRequest));
}

void MountResourceJobFaultsTest::cantStart_data()
{
    QTest::addColumn<QString>("program");
    QTest::addColumn<QString>("why");
    QTest::newRow("missing") << u"/nonexistent/veyfm-mount"_s << u"No such file or directory"_s;
    QTest::newRow("missing in PATH") << u"veyfm-mount-nowhere"_s << u"No such file or directory"_s;
    QTest::newRow("directory") << u"/usr"_s << u"Permission denied"_s;
}

void MountResourceJobFaultsTest::cantStart()
{
    QFETCH(QString, program);
    QFETCH(QString, why);
    const auto job = makeJob();
    job->setHelperProgram(program);
    QCOMPARE(job->helperProgram(), program);
    finish(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Can't start %1: %2"_s.arg(program, why));
}

void MountResourceJobFaultsTest::refusesToHandOver_data()
{
    QTest::addColumn<QByteArray>("end");
    QTest::newRow("fails") << QByteArray("exit 1");
    QTest::newRow("killed") << QByteArray("kill 9");
    QTest::newRow("never ends") << QByteArray("hang");
}

void MountResourceJobFaultsTest::refusesToHandOver()
{
    QFETCH(QByteArray, end);
    tool->expect({"read", Helper::begin, Helper::succeed(), "read", end});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"veyfm-mount has not handed the mount over"_s);
    QCOMPARE(job->localPath(), QString());
    QCOMPARE(said().value(1), takeRequest);
    if (end == "hang") {
        ::kill(pid_t(tool->processId(1)), SIGKILL);
    }
}

void MountResourceJobFaultsTest::floods()
{
    QTemporaryDir directory;
    const QString program = directory.filePath(u"flood"_s);
    QFile file(program);
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write(R"(#!/bin/sh
echo $$ >pid
echo '{"say":"ready","version":1,"program":"flood"}'
exec yes '{"say":"accepted"}'
)");
    file.close();
    QVERIFY(file.setPermissions(file.permissions() | QFileDevice::ExeOwner));
    const QString before = QDir::currentPath();
    QVERIFY(QDir::setCurrent(directory.path()));
    const auto job = makeJob();
    job->setHelperProgram(program);
    int accepted = 0;
    connect(job.get(), &Job::credentialsAccepted, this, [&] {
        if (++accepted == 20000) {
            job->cancel();
        }
    });
    finish(job.get());
    QVERIFY(QDir::setCurrent(before));
    QCOMPARE(job->error(), 2);
    QCOMPARE(accepted, 20000);
    QFile id(directory.filePath(u"pid"_s));
    QVERIFY(id.open(QIODevice::ReadOnly));
    const int pid = id.readAll().trimmed().toInt();
    QVERIFY(pid > 0);
    QTRY_VERIFY(::kill(pid, 0) != 0);
}

void MountResourceJobFaultsTest::silence()
{
    tool->expect({"read", Helper::begin, "read", "read"});
    const auto job = makeJob();
    QCOMPARE(job->silenceLimit(), 0);
    job->setSilenceLimit(250);
    QCOMPARE(job->silenceLimit(), 250);
    finish(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"No progress within 0.25 s"_s);
    QCOMPARE(said().value(1), cancelRequest);
}

void MountResourceJobFaultsTest::silenceOfTheUser()
{
    tool->expect({"read", Helper::begin, Helper::askConfirmation(), "read", "read", "read"});
    const auto job = makeJob();
    job->setSilenceLimit(200);
    QSignalSpy asked(job.get(), &Job::confirmationRequested);
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QVERIFY(asked.wait());
    QVERIFY(!finished.wait(600));
    job->confirm(true);
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 5);
}

void MountResourceJobFaultsTest::silenceBeginsAnew()
{
    const QByteArray accepted = Helper::line(R"({"say":"accepted"})");
    tool->expect(
        {"block 10", "read", Helper::begin, "await 10", accepted, "await 10", accepted, "await 10",
         Helper::succeed(), "read", "exit 0"});
    const auto job = makeJob();
    job->setSilenceLimit(2000);
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_COMPARE(said(), QByteArrayList({Helper::mountRequest}));
    for (int i = 0; i < 3; ++i) {
        QVERIFY(!finished.wait(900));
        QCOMPARE(::kill(pid_t(tool->processId(1)), 10), 0);
    }
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 0);
}

void MountResourceJobFaultsTest::cancelBeforeStart()
{
    const auto job = makeJob();
    job->cancel();
    finish(job.get());
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Mounting was cancelled"_s);
    QCOMPARE(tool->runs(), 0);
}

void MountResourceJobFaultsTest::cancelInSignals_data()
{
    QTest::addColumn<QByteArray>("signal");
    for (const char* signal : signalMoments) {
        QTest::newRow(signal) << QByteArray(signal);
    }
}

void MountResourceJobFaultsTest::cancelInSignals()
{
    QFETCH(QByteArray, signal);
    QByteArrayList play = longTalk();
    play.removeLast();
    play.append("read"); // It does not go before its input does.
    tool->expect(play);
    const auto job = makeJob();
    whenEmitted(job.get(), signal, [&] { job->cancel(); });
    answerAll(job.get());
    finish(job.get());
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Mounting was cancelled"_s);
    QVERIFY(!job->question());
    QVERIFY(said().contains(cancelRequest));
    QVERIFY(!said().contains(takeRequest));
}

void MountResourceJobFaultsTest::cancelAtQuestion()
{
    tool->expect(
        {"read", Helper::begin, Helper::askPassword(), "read",
         Helper::fail(2, "Accessing sftp resource was cancelled"), "exit 1"});
    const auto job = makeJob();
    QSignalSpy asked(job.get(), &Job::passwordRequested);
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QVERIFY(asked.wait());
    job->cancel();
    QVERIFY(!job->question());
    QCOMPARE(finished.count(), 0);
    // Too late, and never sent.
    job->answerPassword(u"anna"_s, u"secret"_s);
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Accessing sftp resource was cancelled"_s);
    QCOMPARE(said(), QByteArrayList({Helper::mountRequest, cancelRequest}));
}

void MountResourceJobFaultsTest::cancelTwice()
{
    tool->expect({"read", Helper::begin, "read", "read"});
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    job->cancel();
    job->cancel();
    QVERIFY(finished.wait());
    job->cancel();
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 2);
    QCOMPARE(said(), QByteArrayList({Helper::mountRequest, cancelRequest}));
}

// What has been handed over stays.
void MountResourceJobFaultsTest::cancelLate()
{
    tool->expect(
        {"block 10", "read", Helper::begin, Helper::succeed(), "read", "await 10", "exit 0"});
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_COMPARE(said().value(1), takeRequest);
    job->cancel();
    QCOMPARE(::kill(pid_t(tool->processId(1)), 10), 0);
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/mnt/server/papers"_s);
    job->cancel();
    QCOMPARE(job->error(), 0);
}

void MountResourceJobFaultsTest::cancelMeetsSuccess()
{
    // Said before it had heard of the cancel.
    tool->expect(
        {"block 10", "read", Helper::begin, "await 10", Helper::succeed(), "read", "read",
         "exit 0"});
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_COMPARE(said(), QByteArrayList({Helper::mountRequest}));
    job->cancel();
    QCOMPARE(::kill(pid_t(tool->processId(1)), 10), 0);
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Mounting was cancelled"_s);
    QCOMPARE(job->localPath(), QString());
    QCOMPARE(said(), QByteArrayList({Helper::mountRequest, cancelRequest}));
}

void MountResourceJobFaultsTest::cancelOfOneThatNeverEnds()
{
    tool->expect({"read", Helper::begin, "hang"});
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_COMPARE(said(), QByteArrayList({Helper::mountRequest}));
    QElapsedTimer clock;
    clock.start();
    job->cancel();
    QVERIFY(finished.wait(10000));
    QVERIFY(clock.elapsed() > 4500);
    QCOMPARE(job->error(), 2);
    // It is left alone, and not killed.
    QCOMPARE(::kill(pid_t(tool->processId(1)), 0), 0);
    ::kill(pid_t(tool->processId(1)), SIGKILL);
}

void MountResourceJobFaultsTest::cancelOfOneThatIsStopped()
{
    tool->expect({"read", Helper::begin, "read", "read"});
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_COMPARE(said(), QByteArrayList({Helper::mountRequest}));
    ::kill(pid_t(tool->processId(1)), SIGSTOP);
    job->cancel();
    QVERIFY(!finished.wait(1000));
    ::kill(pid_t(tool->processId(1)), SIGCONT);
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 2);
}

void MountResourceJobFaultsTest::cancelAtAnyMoment()
{
    int cancelled = 0;
    for (int i = 0; i < 100; ++i) {
        tool->expect(longTalk());
        const auto job = makeJob();
        answerAll(job.get());
        QSignalSpy finished(job.get(), &VeyFM::Job::finished);
        job->start();
        // A turn of the event loop more each time.
        for (int turn = 0; turn < i / 4 && finished.isEmpty(); ++turn) {
            QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
        }
        job->cancel();
        QVERIFY(finished.count() == 1 || finished.wait());
        QCOMPARE(finished.count(), 1);
        if (job->error() != 0) {
            QCOMPARE(job->error(), 2);
            ++cancelled;
        }
        QCOMPARE(job->error() == 0, !job->localPath().isEmpty());
        QCOMPARE(said(i + 1).contains(takeRequest), job->error() == 0);
    }
    QVERIFY(cancelled > 0);
}

void MountResourceJobFaultsTest::deletedInSignals_data()
{
    cancelInSignals_data();
}

void MountResourceJobFaultsTest::deletedInSignals()
{
    QFETCH(QByteArray, signal);
    tool->expect(longTalk());
    QPointer<Job> job = makeJob().release();
    // Behind the answers, and in their place.
    whenEmitted(job, signal, [&] { delete job; });
    answerAll(job);
    job->start();
    QTRY_VERIFY(!job);
    QTRY_VERIFY(hasNoChildren());
    QVERIFY(!said().contains(takeRequest));
}

void MountResourceJobFaultsTest::deletedBetween_data()
{
    QTest::addColumn<QByteArrayList>(
        "play");                    // What comes before it waits for the end of its input.
    QTest::addColumn<int>("lines"); // That are said to it.
    QTest::addColumn<bool>("isCancelled");
    const QByteArrayList begun = {"read", Helper::begin};
    const QByteArrayList asked = begun + QByteArrayList{Helper::askConfirmation(), "read"};
    QTest::newRow("at once") << QByteArrayList() << 0 << false;
    QTest::newRow("begun") << begun << 1 << false;
    QTest::newRow("answered") << asked << 2 << false;
    QTest::newRow("answered twice")
        << asked + QByteArrayList{Helper::askPassword(2), "read", "read"} << 4 << false;
    QTest::newRow("handing over") << begun + QByteArrayList{Helper::succeed(), "read"} << 2
                                  << false;
    QTest::newRow("cancelled") << begun << 1 << true;
    QTest::newRow("cancelled at once") << QByteArrayList() << 0 << true;
}

void MountResourceJobFaultsTest::deletedBetween()
{
    QFETCH(QByteArrayList, play);
    QFETCH(int, lines);
    QFETCH(bool, isCancelled);
    tool->expect(play + QByteArrayList{"read", "read", "read"});
    auto job = makeJob();
    answerAll(job.get());
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_COMPARE(said().size(), lines);
    if (isCancelled) {
        job->cancel();
    }
    job.reset();
    QTRY_COMPARE(tool->runs(), 1);
    QTRY_VERIFY(hasNoChildren());
    QCOMPARE(finished.count(), 0);
}

void MountResourceJobFaultsTest::cancelledUnderAuthenticator()
{
    tool->expect({"read", Helper::begin, Helper::askPassword(), "read", "read"});
    const auto job = makeJob(true);
    Auth::Answer answer = Auth::password(u"too late"_s);
    answer.before = [&] {
        // The dialog of the host.
        QEventLoop loop;
        connect(job.get(), &VeyFM::Job::finished, &loop, &QEventLoop::quit);
        QTimer::singleShot(0, job.get(), &Job::cancel);
        loop.exec();
    };
    auth->answers = {answer};
    finish(job.get());
    QCOMPARE(job->error(), 2);
    QCOMPARE(said(), QByteArrayList({Helper::mountRequest, cancelRequest}));
}

void MountResourceJobFaultsTest::deletedUnderAuthenticator()
{
    tool->expect({"read", Helper::begin, Helper::askConfirmation(), "read", "read"});
    QPointer<Job> job = makeJob(true).release();
    auth->duringQuestion = [&] {
        QEventLoop loop;
        connect(job, &QObject::destroyed, &loop, &QEventLoop::quit);
        QTimer::singleShot(0, job, &QObject::deleteLater);
        loop.exec();
    };
    auth->questionAnswers = {true};
    job->start();
    QTRY_VERIFY(auth->questionAnswers.isEmpty());
    QVERIFY(!job);
    QTRY_VERIFY(hasNoChildren());
    QCOMPARE(said(), QByteArrayList({Helper::mountRequest}));
}

void MountResourceJobFaultsTest::endsUnderAuthenticator_data()
{
    QTest::addColumn<QByteArrayList>("end");
    QTest::addColumn<QString>("text");
    QTest::newRow("fails") << QByteArrayList{Helper::fail(5, "gone"), "exit 1"} << u"gone"_s;
    QTest::newRow("killed") << QByteArrayList{"kill 9"} << u"veyfm-mount was ended by signal 9"_s;
}

void MountResourceJobFaultsTest::endsUnderAuthenticator()
{
    QFETCH(QByteArrayList, end);
    QFETCH(QString, text);
    tool->expect(QByteArrayList{"read", Helper::begin, Helper::askPassword()} + end);
    const auto job = makeJob(true);
    Auth::Answer answer = Auth::password(u"too late"_s);
    answer.before = [&] {
        QEventLoop loop;
        connect(job.get(), &VeyFM::Job::finished, &loop, &QEventLoop::quit);
        loop.exec();
    };
    auth->answers = {answer};
    finish(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), text);
}

void MountResourceJobFaultsTest::childrenAreIgnored()
{
    ::signal(SIGCHLD, SIG_IGN);
    tool->expect({"read", Helper::begin, Helper::succeed(), "read", "exit 0"});
    const auto job = makeJob();
    finish(job.get());
    ::signal(SIGCHLD, SIG_DFL);
    QCOMPARE(job->error(), 0);
}

QTEST_GUILESS_MAIN(MountResourceJobFaultsTest)
#include "tst_mountresourcejob_faults.moc"
