// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountsftpurljob.h"
#include "real/knownhosts.h"
#include "real/realmounttest.h"

#include <QDeadlineTimer>

#include <atomic>
#include <csignal>
#include <fcntl.h>
#include <termios.h>
#include <thread>
#include <unistd.h>

using namespace VeyFM;

namespace {

const QString accepted = QStringLiteral("accepted");

QString asked(const QString& user, const char* host = Sandbox::serverHost)
{
    return u"retry [sftp  %1 ] Access denied|Enter host password for user:|%2"_s.arg(
        QString::fromLatin1(host), user);
}

// What ssh prints, all of it.
QString askedForKey()
{
    return u"question Question|"
           "\rThe authenticity of host 'server.test (127.0.0.11)' can't be established.\n"
           "ED25519 key fingerprint is %1.\n"
           "This key is not known by any other names.\n"
           "Are you sure you want to continue connecting (yes/no/[fingerprint])? "_s.arg(
               SshServer::fingerprint(Sandbox::serverHost));
}

// Whether a terminal does not show what is typed, as while it waits for a password.
bool hidesInput(const QString& terminal)
{
    const int fd = ::open(QFile::encodeName(terminal).constData(), O_RDONLY | O_NOCTTY | O_CLOEXEC);
    termios mode = {};
    const bool hidden = fd >= 0 && ::tcgetattr(fd, &mode) == 0 && (mode.c_lflag & ECHO) == 0;
    ::close(fd);
    return hidden;
}

} // namespace

/// SFTP mounts from Debian's OpenSSH server, through Debian's sshfs.
class RealSftpTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void unknownKeyWithYes();
    void unknownKeyWithNo();
    void wrongPasswordBehindTheKey();
    void givenUp();
    void homeAndRootAreTwoMounts();
    void toolsOutliveTheJob();
    void cannotConnect_data();
    void cannotConnect();
    void otherPromptIsWaitedFor();

private:
    /// Everything happens inside start(). True when it said that it has ended.
    static bool starts(MountSFtpURLJob* job)
    {
        QSignalSpy finished(job, &Job::finished);
        job->start();
        return finished.count() == 1;
    }

    /// A job that has said nothing, and left nothing.
    void verifySilentEnd(const QString& url)
    {
        const auto job = makeJob<MountSFtpURLJob>(url);
        QVERIFY(!starts(job.get()));
        QCOMPARE(job->error(), 0);
        QVERIFY(job->localPath().isEmpty());
        verifyNothingLeft();
    }

    void verifyNothingLeft()
    {
        QCOMPARE(
            QDir(mountDir(u"/sftp"_s)).entryList(QDir::AllEntries | QDir::NoDotAndDotDot),
            QStringList());
        QCOMPARE(recordedMounts(), QStringList());
        QTRY_VERIFY(processesNamed("ssh").isEmpty());
        QVERIFY(processesNamed("sshfs").isEmpty());
    }
};

void RealSftpTest::initTestCase()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    QVERIFY2(startVfs(R"({"remember": true})"), qPrintable(service.errorString()));
}

void RealSftpTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    startScene();
    KnownHosts::add(Sandbox::serverHost);
}

void RealSftpTest::cleanup()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    endScene();
    QTRY_VERIFY(processesNamed("ssh").isEmpty());
    QTRY_VERIFY(processesNamed("sshfs").isEmpty());
    KnownHosts::clear();
}

void RealSftpTest::unknownKeyWithYes()
{
    KnownHosts::clear();
    auth->questionAnswers = {true};
    auth->answers = {password(Sandbox::alice)};
    QVERIFY(starts(makeJob<MountSFtpURLJob>(u"sftp://alice@server.test/"_s).get()));
    QVERIFY(SshServer::fingerprint(Sandbox::serverHost).startsWith(u"SHA256:"_s));
    QCOMPARE(auth->calls, QStringList({askedForKey(), asked(u"alice"_s), accepted}));
    QCOMPARE(mountDirs(), QStringList(mountDir(u"/sftp/alice@server.test"_s)));
    QVERIFY(QFile::exists(KnownHosts::path()));
}

void RealSftpTest::unknownKeyWithNo()
{
    KnownHosts::clear();
    auth->questionAnswers = {false};
    verifySilentEnd(u"sftp://alice@server.test/"_s);
    QCOMPARE(auth->calls, QStringList(askedForKey()));
    QVERIFY(!QFile::exists(KnownHosts::path()));
}

void RealSftpTest::wrongPasswordBehindTheKey()
{
    KnownHosts::clear();
    auth->questionAnswers = {true};
    auth->answers = {wrongPassword()};
    verifySilentEnd(u"sftp://alice@server.test/"_s);
    QCOMPARE(auth->calls, QStringList({askedForKey(), asked(u"alice"_s)}));
    // The key is known from now on, so that another job gets further.
    auth->calls.clear();
    auth->answers = {password(Sandbox::alice)};
    QVERIFY(starts(makeJob<MountSFtpURLJob>(u"sftp://alice@server.test/"_s).get()));
    QCOMPARE(auth->calls, QStringList({asked(u"alice"_s), accepted}));
}

void RealSftpTest::givenUp()
{
    auth->answers = {Auth::cancel()};
    verifySilentEnd(u"sftp://alice@server.test/"_s);
    QCOMPARE(auth->calls, QStringList(asked(u"alice"_s)));
}

void RealSftpTest::homeAndRootAreTwoMounts()
{
    auth->answers = {password(Sandbox::alice), password(Sandbox::alice)};
    const auto home = makeJob<MountSFtpURLJob>(u"sftp://alice@server.test/~/papers"_s);
    const auto root = makeJob<MountSFtpURLJob>(u"sftp://alice@server.test/etc"_s);
    QVERIFY(starts(home.get()));
    QVERIFY(starts(root.get()));
    const QString homeDir = mountDir(u"/sftp/alice@server.test~"_s);
    const QString rootDir = mountDir(u"/sftp/alice@server.test"_s);
    QCOMPARE(mountDirs(), QStringList({rootDir, homeDir}));
    QCOMPARE(
        recordedMounts(), QStringList(
                              {recordedMount(u"sftp://alice@server.test/~/"_s, homeDir),
                               recordedMount(u"sftp://alice@server.test/"_s, rootDir)}));
    QCOMPARE(home->localPath(), homeDir + u"//papers"_s);
    QCOMPARE(root->localPath(), rootDir + u"//etc"_s);
    QCOMPARE(QDir(home->localPath()).entryList(QDir::Files), QStringList(u"draft.txt"_s));
    QCOMPARE(fileContents(root->localPath() + u"/hosts"_s), fileContents(u"/etc/hosts"_s));

    // What is below either is mounted now.
    auth->calls.clear();
    const auto below = makeJob<MountSFtpURLJob>(u"sftp://alice@server.test/~/name.txt"_s);
    QVERIFY(starts(below.get()));
    QCOMPARE(fileContents(below->localPath()), QByteArray("alice"));
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(processesNamed("sshfs").size(), 2);
}

void RealSftpTest::toolsOutliveTheJob()
{
    auth->answers = {password(Sandbox::alice)};
    auto job = makeJob<MountSFtpURLJob>(u"sftp://alice@server.test/~/"_s);
    QVERIFY(starts(job.get()));
    const QString path = job->localPath();
    job.reset();
    const QList<int> tools = processesNamed("sshfs") + processesNamed("ssh");
    QCOMPARE(tools.size(), 2);
    QCOMPARE(fileContents(path + u"name.txt"_s), QByteArray("alice"));
    // A change is one of the server's.
    QFile file(path + u"papers/new.txt"_s);
    QVERIFY(file.open(QIODevice::WriteOnly));
    QCOMPARE(file.write("new"), 3);
    file.close();
    const QString written = Sandbox::home(Sandbox::alice) + u"/papers/new.txt"_s;
    QCOMPARE(fileContents(written), QByteArray("new"));
    QVERIFY(QFile::remove(file.fileName()));
    QVERIFY(!QFile::exists(written));
    QCOMPARE(processesNamed("sshfs") + processesNamed("ssh"), tools);
}

void RealSftpTest::cannotConnect_data()
{
    QTest::addColumn<QByteArray>("host");
    QTest::newRow("nobody listens") << QByteArray(Sandbox::closedHost);
    QTest::newRow("unknown host") << QByteArray("unknown.test");
}

// sshfs ends with the same words as after a wrong password. Now and then ssh has ended before
// sshfs wrote to it, and then the words are "write: Broken pipe", which is a failure like any
// other.
void RealSftpTest::cannotConnect()
{
    QFETCH(QByteArray, host);
    auth->answers = {password(Sandbox::alice), Auth::cancel()};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://alice@%1/"_s.arg(QString::fromLatin1(host)));
    QVERIFY(starts(job.get()));
    const bool broken = !auth->answers.isEmpty();
    QCOMPARE(job->error(), broken ? 5 : 2);
    QCOMPARE(
        job->errorString(),
        broken ? u"Mounting sftp resource failed"_s : u"Accessing sftp resource was cancelled"_s);
    QStringList calls;
    for (int i = auth->answers.size(); i < 2; ++i) {
        calls << u"rejected alice"_s << asked(u"alice"_s, host.constData());
    }
    QCOMPARE(auth->calls, calls);
    auth->answers.clear();
    verifyNothingLeft();
}

// "(alice@other.test) Password: " is a prompt that the job does not know.
void RealSftpTest::otherPromptIsWaitedFor()
{
    KnownHosts::add(Sandbox::otherHost);
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://alice@other.test/"_s);
    std::atomic<bool> prompted = false;
    std::atomic<bool> ended = false;
    std::atomic<bool> waited = false;
    std::thread user([&] {
        const auto terminalHidesInput = [] {
            const QList<int> tools = processesNamed("sshfs");
            return tools.size() == 1 &&
                   hidesInput(QFile::symLinkTarget(u"/proc/%1/fd/0"_s.arg(tools.first())));
        };
        const QDeadlineTimer patience(20000);
        while (!prompted && !ended && !patience.hasExpired()) {
            prompted = terminalHidesInput();
        }
        const QDeadlineTimer bound(1000);
        while (prompted && !ended && !bound.hasExpired()) {
            ::usleep(10000);
        }
        waited = !ended && terminalHidesInput();
        for (const int tool : processesNamed("sshfs")) {
            ::kill(tool, SIGTERM);
        }
    });
    const bool finished = starts(job.get());
    ended = true;
    user.join();
    QVERIFY(prompted);
    QVERIFY(waited);
    QVERIFY(finished);
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Mounting sftp resource failed"_s);
    QCOMPARE(auth->calls, QStringList());
    verifyNothingLeft();
}

int main(int argc, char** argv)
{
    Sandbox sandbox({"/usr/bin/sshfs", "/usr/bin/fusermount3"});
    sandbox.addServer(std::make_unique<SecretWatch>());
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::serverHost));
    sandbox.addServer(
        std::make_unique<SshServer>(Sandbox::otherHost, SshServer::KeyboardInteractive));
    return sandbox.run([&] { return runSandboxTests<RealSftpTest>(argc, argv); });
}

#include "tst_real_sftp.moc"
