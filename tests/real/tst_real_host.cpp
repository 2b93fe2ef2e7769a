// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountresourcejob.h"
#include "host/unmountresourcejob.h"
#include "real/knownhosts.h"
#include "real/realftptest.h"
#include "real/sshagent.h"
#include "real/sshserver.h"
#include "real/stallingserver.h"
#include "support/loopgap.h"

#include <QElapsedTimer>

#include <csignal>
#include <memory>
#include <vector>

using namespace VeyFM;

/// The jobs of the library for hosts, with veyfm-mount and real servers. The event loop of the host
/// never stands still, and nothing is left of what is not mounted.
class RealHostTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void mountsAndUnmounts_data();
    void mountsAndUnmounts();
    void firstContact();
    void givenUp();
    void authenticator();
    void behindAJumpHost();
    void cancelledBehindAJumpHost();
    void encryptedKey();
    void keyOfAnAgent();
    void silentServer_data();
    void silentServer();
    void silenceLimit();
    void stalledAmidAStage();
    void stoppedProcesses();
    void cancelledAtAnyMoment();
    void deletedAtAnyMoment();
    void threeAtOnce();
    void busyAndDead();

private:
    static QString aliceUrl()
    {
        return u"sftp://alice@%1/~/papers"_s.arg(QLatin1String(Sandbox::serverHost));
    }

    std::unique_ptr<MountResourceJob> makeHostJob(const QString& url)
    {
        auto job = std::make_unique<MountResourceJob>(url);
        job->setDeleteOnFinish(false);
        return job;
    }

    /// Answers all questions, later, as dialogs do.
    void answerAll(MountResourceJob* job, const QStringList& passwords)
    {
        const auto left = std::make_shared<QStringList>(passwords);
        connect(job, &MountResourceJob::passwordRequested, job, [job, left] {
            QTimer::singleShot(20, job, [job, left] {
                job->answerPassword(u"alice"_s, left->isEmpty() ? QString() : left->takeFirst());
            });
        });
        connect(job, &MountResourceJob::confirmationRequested, job, [job] {
            QTimer::singleShot(20, job, [job] { job->confirm(true); });
        });
    }

    static QStringList processes()
    {
        QStringList result;
        for (const char* name :
             {"veyfm-mount", "sshfs", "ssh", "fusermount3", "rclone", "curlftpfs"}) {
            for (const int pid : processesNamed(name)) {
                // What has ended is not waited for by anybody in a sandbox.
                const QByteArray stat = fileContents(u"/proc/%1/stat"_s.arg(pid));
                if (stat != "unreadable" && !stat.contains(") Z ")) {
                    result += QString::fromLatin1(name);
                }
            }
        }
        return result;
    }

    static QStringList leftovers()
    {
        QStringList result = mountDirs() + processes();
        if (QFile::exists(mountDir(QString()))) {
            result += mountDir(QString());
        }
        return result;
    }

    /// What stands behind it is server.test.
    static void addStalledHost()
    {
        QFile known(KnownHosts::path());
        QVERIFY(known.open(QIODevice::Append));
        known.write(
            QByteArray(Sandbox::stalledHost) + ' ' + SshServer::publicKey(Sandbox::serverHost) +
            '\n');
    }

    static void jumpToStalledHost()
    {
        addStalledHost();
        KnownHosts::setConfiguration("Host stalled.test\n  ProxyJump bob@server.test\n");
        StallingServer::stallAfter(1 << 30);
    }

    static void offerKey()
    {
        KnownHosts::add(Sandbox::keyHost);
        KnownHosts::setConfiguration(
            "Host key.test\nIdentityFile " +
            QFile::encodeName(SshServer::clientKey(Sandbox::keyHost)) + '\n');
    }

    /// The mount is served, and can be taken away.
    static void verifyMount(const MountResourceJob& job, const QString& place)
    {
        QCOMPARE(job.errorString(), QString());
        QCOMPARE(job.entry().path(), place);
        QVERIFY(QFile::exists(job.localPath() + u"/draft.txt"_s));
        UnmountResourceJob unmount(job.directory());
        unmount.setDeleteOnFinish(false);
        QVERIFY(runToEnd(&unmount));
        QCOMPARE(unmount.errorString(), QString());
        QTRY_COMPARE(mountDirs() + processes(), QStringList());
    }

    static bool runToEnd(VeyFM::Job* job, int milliseconds = 20000)
    {
        QSignalSpy finished(job, &VeyFM::Job::finished);
        job->start();
        return finished.wait(milliseconds);
    }

    const QString m_password = QString::fromLatin1(Sandbox::alice.password);
    std::unique_ptr<LoopGap> m_gap;
    std::unique_ptr<SshAgent> m_agent;
};

void RealHostTest::initTestCase()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    QVERIFY2(startVfs(R"({"remember": true})"), qPrintable(service.errorString()));
}

void RealHostTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    startScene();
    KnownHosts::clear();
    KnownHosts::add(Sandbox::serverHost);
    m_gap = std::make_unique<LoopGap>();
}

void RealHostTest::cleanup()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    const int ticks = m_gap->ticks();
    const double largest = m_gap->largest();
    m_gap.reset();
    m_agent.reset();
    endScene();
    QDir(mountDir(QString())).removeRecursively();
    QTRY_COMPARE(processes(), QStringList());
    QVERIFY(ticks > 0);
    QVERIFY2(largest <= 50, qPrintable(QString::number(largest)));
}

void RealHostTest::mountsAndUnmounts_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("place");
    QTest::addColumn<QString>("relative");
    const QString server = QString::fromLatin1(Sandbox::serverHost);
    QTest::newRow("sftp") << aliceUrl() << u"SFTP/alice@server.test/papers"_s
                          << u"/sftp/alice@server.test~"_s;
    QTest::newRow("ftp") << u"ftp://alice@server.test/papers"_s << u"FTP/alice@server.test/papers"_s
                         << u"/ftp/alice@server.test"_s;
}

void RealHostTest::mountsAndUnmounts()
{
    QFETCH(QString, url);
    QFETCH(QString, place);
    QFETCH(QString, relative);
    const auto job = makeHostJob(url);
    answerAll(job.get(), {QString::fromLatin1(Sandbox::wrongPassword), m_password});
    QSignalSpy asked(job.get(), &MountResourceJob::passwordRequested);
    QSignalSpy rejected(job.get(), &MountResourceJob::credentialsRejected);
    QSignalSpy accepted(job.get(), &MountResourceJob::credentialsAccepted);
    QVERIFY(runToEnd(job.get()));
    QCOMPARE(job->errorString(), QString());
    QCOMPARE(asked.count(), 2);
    QCOMPARE(rejected.count(), 1);
    QCOMPARE(accepted.count(), 1);
    QVERIFY(job->isNew());
    QVERIFY(job->isShared());
    QCOMPARE(job->directory(), mountDir(relative));
    QCOMPARE(job->localPath(), mountDir(relative) + u"/papers"_s);
    QCOMPARE(job->path(), place);
    QCOMPARE(job->entry().path(), place);
    QVERIFY(job->entry().isDir());
    QCOMPARE(QDir(job->localPath()).entryList(QDir::Files), QStringList(u"draft.txt"_s));
    QVERIFY(!processes().contains(u"veyfm-mount"_s));

    // The second one takes it.
    const auto second = makeHostJob(url);
    QVERIFY(runToEnd(second.get()));
    QCOMPARE(second->error(), 0);
    QVERIFY(!second->isNew());
    QCOMPARE(second->entry().path(), place);

    UnmountResourceJob unmount(job->entry());
    unmount.setDeleteOnFinish(false);
    QVERIFY(runToEnd(&unmount));
    QCOMPARE(unmount.errorString(), QString());
    QCOMPARE(unmount.directory(), mountDir(relative));
    QCOMPARE(mountDirs(), QStringList());
    QVERIFY(!QFile::exists(mountDir(relative)));
    QTRY_COMPARE(processes(), QStringList());
}

void RealHostTest::firstContact()
{
    KnownHosts::clear();
    const auto job = makeHostJob(aliceUrl());
    answerAll(job.get(), {m_password});
    QSignalSpy confirmed(job.get(), &MountResourceJob::confirmationRequested);
    QVERIFY(runToEnd(job.get()));
    QCOMPARE(job->errorString(), QString());
    QCOMPARE(confirmed.count(), 1);
    QVERIFY(confirmed.at(0).at(0).value<MountQuestion>().message.contains(
        SshServer::fingerprint(Sandbox::serverHost)));
}

void RealHostTest::givenUp()
{
    const auto job = makeHostJob(aliceUrl());
    connect(job.get(), &MountResourceJob::passwordRequested, job.get(), &MountResourceJob::giveUp);
    QVERIFY(runToEnd(job.get()));
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Accessing sftp resource was cancelled"_s);
    QCOMPARE(leftovers().join(u' '), QString());
}

void RealHostTest::authenticator()
{
    MountResourceJob job(auth, aliceUrl());
    job.setDeleteOnFinish(false);
    auth->answers = {wrongPassword(), password(Sandbox::alice)};
    QVERIFY(runToEnd(&job));
    QCOMPARE(job.errorString(), QString());
    // Once for each answer that is needed.
    QCOMPARE(auth->calls.filter(u"Access denied"_s).size(), 2);
    QCOMPARE(auth->calls.filter(u"rejected alice"_s).size(), 1);
    QCOMPARE(auth->calls.constLast(), u"accepted"_s);
}

void RealHostTest::behindAJumpHost()
{
    jumpToStalledHost();
    const auto job = makeHostJob(u"sftp://alice@stalled.test/~/papers"_s);
    QStringList asked;
    connect(job.get(), &MountResourceJob::passwordRequested, this, [&](const MountQuestion& of) {
        asked += of.user + u'@' + of.host + (of.isRetry ? u" again"_s : QString());
        const bool isFirst = of.host == QLatin1String(Sandbox::stalledHost) && !of.isRetry;
        const char* const password = of.user == u"bob"_s ? Sandbox::bob.password
                                     : isFirst           ? Sandbox::wrongPassword
                                                         : Sandbox::alice.password;
        QTimer::singleShot(
            20, job.get(), [&job, user = of.user, text = QString::fromLatin1(password)] {
                job->answerPassword(user, text);
            });
    });
    QSignalSpy rejected(job.get(), &MountResourceJob::credentialsRejected);
    QVERIFY(runToEnd(job.get()));
    QCOMPARE(
        asked, QStringList(
                   {u"bob@server.test"_s, u"alice@stalled.test"_s, u"bob@server.test"_s,
                    u"alice@stalled.test again"_s}));
    QCOMPARE(rejected.count(), 1);
    verifyMount(*job, u"SFTP/alice@stalled.test/papers"_s);
}

void RealHostTest::cancelledBehindAJumpHost()
{
    for (int answers : {0, 1}) {
        jumpToStalledHost();
        const auto job = makeHostJob(u"sftp://alice@stalled.test/"_s);
        QSignalSpy asked(job.get(), &MountResourceJob::passwordRequested);
        QSignalSpy finished(job.get(), &VeyFM::Job::finished);
        job->start();
        QVERIFY(asked.wait());
        if (answers == 1) {
            job->answerPassword(u"bob"_s, QString::fromLatin1(Sandbox::bob.password));
            QVERIFY(asked.wait());
        }
        // Each of the two hosts has one of its own.
        QVERIFY(processes().count(u"ssh"_s) >= 2);
        job->cancel();
        QVERIFY(finished.wait());
        QCOMPARE(job->error(), 2);
        QCOMPARE(leftovers().join(u' '), QString());
    }
}

void RealHostTest::encryptedKey()
{
    offerKey();
    const auto job = makeHostJob(u"sftp://alice@key.test/~/papers"_s);
    QSignalSpy asked(job.get(), &MountResourceJob::passwordRequested);
    answerAll(
        job.get(),
        {QString::fromLatin1(Sandbox::wrongPassword), QString::fromLatin1(SshServer::passphrase)});
    QVERIFY(runToEnd(job.get()));
    QCOMPARE(asked.count(), 2);
    for (int i = 0; i < asked.count(); ++i) {
        const auto question = asked.at(i).at(0).value<MountQuestion>();
        QVERIFY(question.message.contains(u"Enter passphrase for key"_s));
        QCOMPARE(question.host, QString::fromLatin1(Sandbox::keyHost));
        QCOMPARE(question.isRetry, i == 1);
    }
    verifyMount(*job, u"SFTP/alice@key.test/papers"_s);
}

void RealHostTest::keyOfAnAgent()
{
    offerKey();
    m_agent = std::make_unique<SshAgent>(SshServer::clientKey(Sandbox::keyHost));
    QVERIFY(m_agent->holdsKey());
    m_gap = std::make_unique<LoopGap>(); // That has taken its time.
    qputenv("SSH_AUTH_SOCK", QFile::encodeName(m_agent->socket()));
    const auto job = makeHostJob(u"sftp://alice@key.test/~/papers"_s);
    QSignalSpy asked(job.get(), &MountResourceJob::passwordRequested);
    QSignalSpy accepted(job.get(), &MountResourceJob::credentialsAccepted);
    const bool hasEnded = runToEnd(job.get());
    qunsetenv("SSH_AUTH_SOCK");
    QVERIFY(hasEnded);
    QCOMPARE(asked.count(), 0);
    QCOMPARE(accepted.count(), 1);
    verifyMount(*job, u"SFTP/alice@key.test/papers"_s);
    // It is no process of the mount.
    QVERIFY(m_agent->isRunning());
}

void RealHostTest::silentServer_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QByteArray>("tool");
    QTest::newRow("sftp") << u"sftp://alice@stalled.test/"_s << QByteArray("ssh");
    QTest::newRow("ftp") << u"ftp://alice@stalled.test/"_s << QByteArray("rclone");
}

void RealHostTest::silentServer()
{
    QFETCH(QString, url);
    QFETCH(QByteArray, tool);
    StallingServer::stallAfter(0);
    const auto job = makeHostJob(url);
    answerAll(job.get(), {m_password});
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_VERIFY(!processesNamed(tool.constData()).isEmpty());
    QVERIFY(!finished.wait(500));
    job->cancel();
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 2);
    QCOMPARE(leftovers().join(u' '), QString());
}

void RealHostTest::silenceLimit()
{
    StallingServer::stallAfter(0);
    const auto job = makeHostJob(u"sftp://alice@stalled.test/"_s);
    job->setSilenceLimit(1500);
    QVERIFY(runToEnd(job.get()));
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"No progress within 1.5 s"_s);
    QCOMPARE(leftovers().join(u' '), QString());
}

void RealHostTest::stalledAmidAStage()
{
    addStalledHost();
    int stalled = 0;
    for (int bytes = 1; bytes < 3500; bytes += 500) {
        StallingServer::stallAfter(bytes);
        const auto job = makeHostJob(u"sftp://alice@stalled.test/~/papers"_s);
        answerAll(job.get(), {m_password});
        QSignalSpy finished(job.get(), &VeyFM::Job::finished);
        job->start();
        QTRY_VERIFY(StallingServer::hasStalled() || !finished.isEmpty());
        stalled += finished.isEmpty() ? 1 : 0;
        job->cancel();
        QVERIFY(!finished.isEmpty() || finished.wait());
        QVERIFY(job->error() == 2 || job->error() == 0);
        if (job->error() == 2) {
            QCOMPARE(leftovers().join(u' '), QString());
        }
    }
    QVERIFY(stalled > 2);
}

void RealHostTest::stoppedProcesses()
{
    for (const char* name : {"ssh", "sshfs"}) {
        const auto job = makeHostJob(aliceUrl());
        QSignalSpy asked(job.get(), &MountResourceJob::passwordRequested);
        QSignalSpy finished(job.get(), &VeyFM::Job::finished);
        job->start();
        QVERIFY(asked.wait());
        const QList<int> pids = processesNamed(name);
        QVERIFY(!pids.isEmpty());
        for (const int pid : pids) {
            QCOMPARE(::kill(pid, SIGSTOP), 0);
        }
        job->answerPassword(u"alice"_s, m_password);
        QVERIFY(!finished.wait(300));
        job->cancel();
        QVERIFY(finished.wait());
        QCOMPARE(job->error(), 2);
        QCOMPARE(leftovers().join(u' '), QString());
    }
}

void RealHostTest::cancelledAtAnyMoment()
{
    int cancelled = 0;
    for (int i = 0; i < 20; ++i) {
        const auto job = makeHostJob(aliceUrl());
        answerAll(job.get(), {m_password});
        QSignalSpy finished(job.get(), &VeyFM::Job::finished);
        job->start();
        finished.wait(i * i * 2);
        job->cancel();
        QVERIFY(!finished.isEmpty() || finished.wait());
        if (job->error() != 0) {
            QCOMPARE(job->error(), 2);
            QCOMPARE(leftovers().join(u' '), QString());
            ++cancelled;
        } else {
            UnmountResourceJob unmount(job->directory());
            unmount.setDeleteOnFinish(false);
            QVERIFY(runToEnd(&unmount));
            QCOMPARE(unmount.errorString(), QString());
            // So that what the next one leaves is its own.
            QVERIFY(QDir().rmdir(mountDir(u"/sftp"_s)) && QDir().rmdir(mountDir(QString())));
        }
    }
    QVERIFY(cancelled > 0);
}

void RealHostTest::deletedAtAnyMoment()
{
    for (int i = 0; i < 10; ++i) {
        auto job = makeHostJob(aliceUrl());
        answerAll(job.get(), {m_password});
        QSignalSpy finished(job.get(), &VeyFM::Job::finished);
        job->start();
        if (finished.wait(i * i * 3)) {
            break; // Mounted before: it is there to stay.
        }
        job.reset();
        // What it was about to take over is decided by its program, which a thread may be about to
        // start still.
        QElapsedTimer calm;
        calm.start();
        QVERIFY(QTest::qWaitFor([&calm] {
            if (processes().contains(u"veyfm-mount"_s)) {
                calm.restart();
            }
            return calm.hasExpired(300);
        }));
        if (!mountDirs().isEmpty()) {
            break;
        }
        QTRY_COMPARE(leftovers(), QStringList());
    }
}

void RealHostTest::threeAtOnce()
{
    for (int round = 0; round < 5; ++round) {
        std::vector<std::unique_ptr<MountResourceJob>> jobs;
        std::vector<std::unique_ptr<QSignalSpy>> spies;
        for (int i = 0; i < 3; ++i) {
            jobs.push_back(makeHostJob(aliceUrl()));
            answerAll(jobs.back().get(), {m_password});
            spies.push_back(std::make_unique<QSignalSpy>(jobs.back().get(), &VeyFM::Job::finished));
            jobs.back()->start();
        }
        int made = 0;
        for (size_t i = 0; i < jobs.size(); ++i) {
            QVERIFY(!spies[i]->isEmpty() || spies[i]->wait(20000));
            QCOMPARE(jobs[i]->errorString(), QString());
            made += jobs[i]->isNew() ? 1 : 0;
        }
        QCOMPARE(made, 1);
        QCOMPARE(mountDirs().size(), 1);
        UnmountResourceJob unmount(aliceUrl());
        unmount.setDeleteOnFinish(false);
        QVERIFY(runToEnd(&unmount));
        QCOMPARE(unmount.errorString(), QString());
        QTRY_COMPARE(processes(), QStringList());
    }
}

void RealHostTest::busyAndDead()
{
    const auto job = makeHostJob(aliceUrl());
    answerAll(job.get(), {m_password});
    QVERIFY(runToEnd(job.get()));
    QProcess holder;
    holder.setWorkingDirectory(job->localPath());
    holder.start(u"sleep"_s, {u"100"_s});
    QVERIFY(holder.waitForStarted());
    UnmountResourceJob busy(job->entry());
    busy.setDeleteOnFinish(false);
    QVERIFY(runToEnd(&busy));
    QCOMPARE(busy.error(), 5);
    QCOMPARE(
        busy.errorString(),
        u"%1 is in use by: sleep (%2)"_s.arg(job->directory()).arg(holder.processId()));
    QCOMPARE(mountDirs().size(), 1);

    // Its server does not answer any more, and the holder is still there.
    const QList<int> tools = processesNamed("sshfs");
    QCOMPARE(tools.size(), 1);
    ::kill(tools.first(), SIGSTOP);
    UnmountResourceJob lazy(aliceUrl());
    lazy.setDeleteOnFinish(false);
    lazy.setLazy(true);
    QVERIFY(runToEnd(&lazy));
    QCOMPARE(lazy.errorString(), QString());
    QCOMPARE(mountDirs(), QStringList());
    QVERIFY(!QFile::exists(job->directory()));
    ::kill(tools.first(), SIGCONT);
    holder.kill();
    QVERIFY(holder.waitForFinished());
}

int main(int argc, char** argv)
{
    Sandbox sandbox({"/usr/bin/sshfs", "/usr/bin/fusermount3", "/usr/bin/rclone"});
    sandbox.addServer(std::make_unique<SecretWatch>());
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::serverHost));
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::keyHost, SshServer::Key));
    sandbox.addServer(std::make_unique<FtpServer>(Sandbox::serverHost));
    sandbox.addServer(std::make_unique<StallingServer>());
    return sandbox.run([&] {
        useCurlftpfsAdapter();
        return runSandboxTests<RealHostTest>(argc, argv);
    });
}

#include "tst_real_host.moc"
