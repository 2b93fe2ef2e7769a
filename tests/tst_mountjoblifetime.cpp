// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/checksmbshareauthjob.h"
#include "jobs/mountftpurljob.h"
#include "jobs/mountfuseentryjob.h"
#include "support/mountjobtest.h"

#include <QElapsedTimer>
#include <QPointer>
#include <QProcess>

#include <cerrno>
#include <signal.h>

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<QByteArrayList>)

namespace {

using Plays = QList<QByteArrayList>;

const QByteArray prompt = "err Enter host password for user:";
const QByteArrayList ftpWaits = {prompt, "hang"};
const QByteArrayList ftpRefuses = {"err Access denied: 530\\n", "exit 1"};
const QByteArrayList sftpWaits = {"echo off", "out bob@host's password: ", "hang"};
const QByteArrayList keyWaits = {"out Are you sure (yes/no)? ", "hang"};
const QByteArrayList resets = {"out read: Connection reset by peer\\n", "exit 1"};
const QByteArrayList smbRefuses = {"out NT_STATUS_LOGON_FAILURE\\n", "exit 1"};

bool hasEnded(qint64 processId)
{
    return ::kill(pid_t(processId), 0) != 0 && errno == ESRCH;
}

} // namespace

/// Authenticators that run an event loop, as dialogs do: the tool and the job's owner go on.
class MountJobLifetimeTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void jobIsDeletedDuringAQuestion_data();
    void jobIsDeletedDuringAQuestion();
    void ftpToolEndsDuringAQuestion_data();
    void ftpToolEndsDuringAQuestion();
    void ftpOutputIsNotHeld();
    void runningFtpToolIsToldToEnd();
    void emptySambaPasswordIsRefusedAtOnce();

private:
    /// Turns the event loop until the tool of the job has ended.
    static void waitForTool(const MountFtpURLJob* job)
    {
        const auto* const process = job->findChild<QProcess*>();
        QVERIFY(QTest::qWaitFor([&] { return process->state() == QProcess::NotRunning; }, 20000));
    }
};

void MountJobLifetimeTest::initTestCase()
{
    startVfsInGroup("{}");
}

void MountJobLifetimeTest::cleanup()
{
    endScene();
}

void MountJobLifetimeTest::jobIsDeletedDuringAQuestion_data()
{
    QTest::addColumn<QByteArray>("toolName");
    QTest::addColumn<QString>("url");
    QTest::addColumn<Plays>("plays");
    QTest::addColumn<int>("fatalQuestion"); // Counted from 0.

    QTest::newRow("ftp prompt") << QByteArray("curlftpfs") << u"ftp://bob@host"_s << Plays{ftpWaits}
                                << 0;
    QTest::newRow("ftp refusal") << QByteArray("curlftpfs") << u"ftp://bob@host"_s
                                 << Plays{ftpRefuses} << 0;
    QTest::newRow("sftp prompt") << QByteArray("sshfs") << u"sftp://bob@host"_s << Plays{sftpWaits}
                                 << 0;
    QTest::newRow("sftp, other words") << QByteArray("sshfs") << u"sftp://bob@host"_s
                                       << Plays{{"out \r(bob@host) Code: ", "hang"}} << 0;
    QTest::newRow("sftp jump host")
        << QByteArray("sshfs") << u"sftp://bob@host"_s
        << Plays{{"echo off", "out \rbob@gw.test's password: ", "hang"}} << 0;
    QTest::newRow("sftp host key")
        << QByteArray("sshfs") << u"sftp://bob@host"_s << Plays{keyWaits} << 0;
    QTest::newRow("sftp refusal") << QByteArray("sshfs") << u"sftp://bob@host"_s << Plays{resets}
                                  << 0;
    QTest::newRow("smb first") << QByteArray("smbclient") << u"smb://localhost/share"_s
                               << Plays{smbRefuses, smbRefuses} << 0;
    QTest::newRow("smb later") << QByteArray("smbclient") << u"smb://localhost/share"_s
                               << Plays{smbRefuses, smbRefuses, smbRefuses} << 1;
}

void MountJobLifetimeTest::jobIsDeletedDuringAQuestion()
{
    QFETCH(QByteArray, toolName);
    QFETCH(QString, url);
    QFETCH(Plays, plays);
    QFETCH(int, fatalQuestion);
    startScene(toolName);
    for (const QByteArrayList& play : plays) {
        tool->expect(play);
    }
    // Its parent and its parent's parent go with it.
    auto job = makeJob<MountFuseEntryJob>(url);
    QSignalSpy finished(job.get(), &Job::finished);
    for (int question = 0; question < fatalQuestion; ++question) {
        auth->answers.append(Auth::password(u"x"_s, u"bob"_s));
    }
    Auth::Answer answer = Auth::password(u"x"_s, u"bob"_s);
    QPointer<QProcess> process;
    bool isProcessLeft = false;
    answer.before = [&] {
        process = job->findChild<QProcess*>();
        const bool hasProcess = process;
        job.reset();
        // It may be amid one of its signals.
        isProcessLeft = !hasProcess || process;
    };
    if (plays.first() == keyWaits) {
        auth->duringQuestion = answer.before;
        auth->questionAnswers = {true};
    } else {
        auth->answers.append(answer);
    }
    // Nobody but the job holds the authenticator, which so goes with it, but not amid its call.
    const QWeakPointer<ScriptedAuthenticator> held = auth;
    auth = QSharedPointer<ScriptedAuthenticator>::create();
    job->start();
    QVERIFY(QTest::qWaitFor([&job] { return !job; }, 20000));

    QVERIFY(isProcessLeft);
    QTRY_VERIFY(process.isNull());
    QCOMPARE(finished.count(), 0);
    QVERIFY(held.isNull());
    for (int run = 1; run <= plays.size(); ++run) {
        QVERIFY(hasEnded(tool->processId(run)));
    }
    QVERIFY(!QFileInfo::exists(mountDir(u"/ftp/bob@host"_s)));
    QVERIFY(!QFileInfo::exists(mountDir(u"/sftp/bob@host"_s)));
}

void MountJobLifetimeTest::ftpToolEndsDuringAQuestion_data()
{
    QTest::addColumn<QByteArrayList>("play");
    QTest::addColumn<bool>("cancel");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<int>("error");

    const QString ask = u"retry [ftp  host ] Access denied|Enter host password for user:|bob"_s;
    QTest::newRow("fails") << QByteArrayList({prompt, "drained", "exit 1"}) << false
                           << QStringList(ask) << 5;
    QTest::newRow("fails, given up")
        << QByteArrayList({prompt, "drained", "exit 1"}) << true << QStringList(ask) << 2;
    QTest::newRow("succeeds") << QByteArrayList({prompt, "drained"}) << false
                              << QStringList({ask, u"accepted"_s}) << 0;
    // One question after the other, though the refusal came during the first.
    QTest::newRow("refuses") << QByteArrayList({prompt, "drained"}) + ftpRefuses << false
                             << QStringList({ask, u"rejected bob"_s, ask}) << 2;
}

void MountJobLifetimeTest::ftpToolEndsDuringAQuestion()
{
    QFETCH(QByteArrayList, play);
    QFETCH(bool, cancel);
    QFETCH(QStringList, calls);
    QFETCH(int, error);
    startScene("curlftpfs");
    tool->expect(play);
    const auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    int questions = 0;
    Auth::Answer answer = cancel ? Auth::cancel() : Auth::password(u"x"_s);
    answer.before = [&] {
        ++questions;
        waitForTool(job.get());
        QCOMPARE(questions, 1);
        --questions;
    };
    auth->answers = {answer};
    if (calls.size() == 3) {
        auth->answers.append(Auth::cancel());
    }
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QVERIFY(finished.wait(20000));
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), error);
    QCOMPARE(auth->calls, calls);
    QCOMPARE(QFileInfo::exists(mountDir(u"/ftp/bob@host"_s)), error == 0);
}

void MountJobLifetimeTest::ftpOutputIsNotHeld()
{
    startScene("curlftpfs");
    tool->expect({prompt, "read"});
    Auth::Answer answer = Auth::password(u"x"_s);
    QString output;
    answer.before = [&] {
        output = QFile::symLinkTarget(u"/proc/%1/fd/1"_s.arg(tool->processId(1)));
    };
    auth->answers = {answer};
    const auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
    QCOMPARE(output, u"/dev/null"_s);
}

void MountJobLifetimeTest::runningFtpToolIsToldToEnd()
{
    startScene("curlftpfs");
    tool->expect(ftpWaits);
    bool isThere = false;
    Auth::Answer answer = Auth::password(u"x"_s);
    answer.before = [&] {
        isThere = QFileInfo::exists(mountDir(u"/ftp/bob@host"_s));
    };
    auth->answers = {answer};
    auto job = makeJob<MountFtpURLJob>(u"ftp://bob@host"_s);
    job->start();
    QTRY_COMPARE(auth->calls.size(), 1);
    QVERIFY(isThere);
    job.reset();
    QVERIFY(hasEnded(tool->processId(1)));
    QVERIFY(!QFileInfo::exists(mountDir(u"/ftp/bob@host"_s)));
}

// Without PASSWD smbclient asks for itself, and would wait for what nobody types.
void MountJobLifetimeTest::emptySambaPasswordIsRefusedAtOnce()
{
    startScene("smbclient");
    tool->expect(QByteArrayList({"read"}) + smbRefuses);
    CheckSmbShareAuthJob job(auth, u"share"_s, u"localhost"_s, QString());
    QElapsedTimer timer;
    timer.start();
    QCOMPARE(job.checkAuth(u"bob"_s, QString()), int(CheckSmbShareAuthJob::LogonFailure));
    QVERIFY(timer.elapsed() < 20000);
    QCOMPARE(tool->input(1), QByteArray());
}

QTEST_GUILESS_MAIN(MountJobLifetimeTest)
#include "tst_mountjoblifetime.moc"
