// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountsftpurljob.h"
#include "real/knownhosts.h"
#include "real/realmounttest.h"

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

const QString askedInOtherWords =
    QStringLiteral("retry [sftp  other.test ] Access denied|(alice@other.test) Password: |alice");

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
    void otherPromptIsAsked();
    void otherPromptRefuses();
    void jumpHostIsAskedAboutByItself();
    void jumpHostRefuses();
    void givenUpAtAJumpHost();
    void hostOfAnotherName();
    void passphraseOfAKey();
    void givenUpAtAPassphrase();
    void addressOfVersion6();

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

// "(alice@other.test) Password: ", which PAM makes of it, is shown as it is.
void RealSftpTest::otherPromptIsAsked()
{
    KnownHosts::add(Sandbox::otherHost);
    auth->answers = {password(Sandbox::alice)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://alice@other.test/~/"_s);
    QVERIFY(starts(job.get()));
    QCOMPARE(auth->calls, QStringList({askedInOtherWords, accepted}));
    QCOMPARE(fileContents(job->localPath() + u"name.txt"_s), QByteArray("alice"));
}

void RealSftpTest::otherPromptRefuses()
{
    KnownHosts::add(Sandbox::otherHost);
    auth->answers = {wrongPassword(), wrongPassword(), password(Sandbox::alice)};
    QVERIFY(starts(makeJob<MountSFtpURLJob>(u"sftp://alice@other.test/"_s).get()));
    QCOMPARE(
        auth->calls, QStringList(
                         {askedInOtherWords, u"rejected alice"_s,
                          asked(u"alice"_s, Sandbox::otherHost), askedInOtherWords, accepted}));
}

void RealSftpTest::jumpHostIsAskedAboutByItself()
{
    KnownHosts::add(Sandbox::otherHost);
    KnownHosts::setConfiguration("Host other.test\nProxyJump bob@server.test\n");
    auth->answers = {password(Sandbox::bob), password(Sandbox::alice)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://alice@other.test/~/"_s);
    QVERIFY(starts(job.get()));
    QCOMPARE(auth->calls, QStringList({asked(u"bob"_s), askedInOtherWords, accepted}));
    QCOMPARE(fileContents(job->localPath() + u"name.txt"_s), QByteArray("alice"));
}

void RealSftpTest::jumpHostRefuses()
{
    KnownHosts::add(Sandbox::otherHost);
    KnownHosts::setConfiguration("Host other.test\nProxyJump bob@server.test\n");
    // ssh asks three times there.
    auth->answers = {wrongPassword(), wrongPassword(),        wrongPassword(),
                     wrongPassword(), password(Sandbox::bob), password(Sandbox::alice)};
    QVERIFY(starts(makeJob<MountSFtpURLJob>(u"sftp://alice@other.test/"_s).get()));
    const QString askBob = asked(u"bob"_s);
    QCOMPARE(
        auth->calls, QStringList(
                         {askBob, askBob, askBob, u"rejected bob"_s, askBob, askBob,
                          askedInOtherWords, accepted}));
}

void RealSftpTest::givenUpAtAJumpHost()
{
    KnownHosts::add(Sandbox::otherHost);
    KnownHosts::setConfiguration("Host other.test\nProxyJump bob@server.test\n");
    auth->answers = {Auth::cancel()};
    verifySilentEnd(u"sftp://alice@other.test/"_s);
    QCOMPARE(auth->calls, QStringList(asked(u"bob"_s)));
}

// Of the host that ssh goes to in the end.
void RealSftpTest::hostOfAnotherName()
{
    KnownHosts::setConfiguration("Host work\nHostName server.test\n");
    auth->answers = {password(Sandbox::alice)};
    QVERIFY(starts(makeJob<MountSFtpURLJob>(u"sftp://alice@work/"_s).get()));
    QCOMPARE(auth->calls, QStringList({asked(u"alice"_s), accepted}));
}

void RealSftpTest::passphraseOfAKey()
{
    const QString key = SshServer::clientKey(Sandbox::keyHost);
    KnownHosts::add(Sandbox::keyHost);
    KnownHosts::setConfiguration("Host key.test\nIdentityFile " + QFile::encodeName(key) + '\n');
    auth->answers = {Auth::password(QString::fromLatin1(SshServer::passphrase))};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://alice@key.test/~/"_s);
    QVERIFY(starts(job.get()));
    QCOMPARE(
        auth->calls,
        QStringList(
            {u"retry [sftp  key.test ] Access denied|Enter passphrase for key '%1': |alice"_s.arg(
                 key),
             accepted}));
    QCOMPARE(fileContents(job->localPath() + u"name.txt"_s), QByteArray("alice"));
}

void RealSftpTest::givenUpAtAPassphrase()
{
    KnownHosts::add(Sandbox::keyHost);
    KnownHosts::setConfiguration(
        "Host key.test\nIdentityFile " + QFile::encodeName(SshServer::clientKey(Sandbox::keyHost)) +
        '\n');
    auth->answers = {Auth::cancel()};
    verifySilentEnd(u"sftp://alice@key.test/"_s);
    QCOMPARE(auth->calls.size(), 1);
}

void RealSftpTest::addressOfVersion6()
{
    if (!Sandbox::hasVersion6()) {
        QSKIP("no IPv6 here");
    }
    KnownHosts::add("::1");
    auth->answers = {password(Sandbox::alice)};
    const auto job = makeJob<MountSFtpURLJob>(u"sftp://alice@[::1]/~/"_s);
    QVERIFY(starts(job.get()));
    QCOMPARE(auth->calls, QStringList({asked(u"alice"_s, "::1"), accepted}));
    QCOMPARE(job->localPath(), mountDir(u"/sftp/alice@::1~//"_s));
    QCOMPARE(fileContents(job->localPath() + u"name.txt"_s), QByteArray("alice"));
}

int main(int argc, char** argv)
{
    Sandbox sandbox({"/usr/bin/sshfs", "/usr/bin/fusermount3"});
    sandbox.addServer(std::make_unique<SecretWatch>());
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::serverHost));
    sandbox.addServer(
        std::make_unique<SshServer>(Sandbox::otherHost, SshServer::KeyboardInteractive));
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::keyHost, SshServer::Key));
    if (Sandbox::hasVersion6()) {
        sandbox.addServer(std::make_unique<SshServer>("::1"));
    }
    return sandbox.run([&] { return runSandboxTests<RealSftpTest>(argc, argv); });
}

#include "tst_real_sftp.moc"
