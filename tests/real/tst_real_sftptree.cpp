// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountfuseentryjob.h"
#include "jobs/mountsftpurljob.h"
#include "real/realmounttest.h"
#include "real/sshserver.h"
#include "support/rerun.h"
#include "support/vfsclient.h"

using namespace VeyFM;

namespace {

constexpr const char* mountingArgument = "mounts";
constexpr const char* findingArgument = "finds";

// Alice's is mounted from the root, bob's from his home, and that of the tests from below the root.
const QString aliceUrl = QStringLiteral("sftp://alice@server.test/");
const QString bobUrl = QStringLiteral("sftp://bob@server.test/~/");
const QString deepUrl = QStringLiteral("sftp://server.test/run/sandbox/home/alice");

} // namespace

/// SFTP mounts in the tree of places, in this process and in others. A place stays in the tree of
/// a process when its mount has gone, so each test has an account of its own.
class RealSftpTreeTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void isListedAndRead();
    void anotherProcessFindsIt();
    void outlivesItsProcess();
    void pathOfTheUrlIsDoubled();
};

void RealSftpTreeTest::initTestCase()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    QVERIFY2(startVfs(R"({"remember": true})"), qPrintable(service.errorString()));
    QDir::home().mkpath(u".ssh"_s);
    QFile knownHosts(QDir::homePath() + u"/.ssh/known_hosts"_s);
    QVERIFY(knownHosts.open(QIODevice::WriteOnly));
    knownHosts.write("server.test " + SshServer::publicKey(Sandbox::serverHost) + '\n');
}

void RealSftpTreeTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    startScene();
}

void RealSftpTreeTest::cleanup()
{
    if (Sandbox::isEntered()) {
        endScene();
    }
}

void RealSftpTreeTest::isListedAndRead()
{
    auth->answers = {password(Sandbox::alice)};
    const auto job = makeJob<MountFuseEntryJob>(aliceUrl);
    job->exec();
    QCOMPARE(job->errorString(), QString());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->path(), u"SFTP/alice@server.test//"_s);
    const Entry mount = vfs->entry(job->path());
    QCOMPARE(mount.path(), u"SFTP/alice@server.test"_s);
    QCOMPARE(mount.type(), int(TypeSFtpSharePlace));
    QCOMPARE(childPaths(u"SFTP"_s), QStringList(mount.path()));
    QVERIFY(vfs->childs(mount).paths().contains(u"SFTP/alice@server.test/run"_s));

    const QString home = mount.path() + Sandbox::home(Sandbox::alice);
    QStringList paths = vfs->childs(vfs->entry(home)).paths();
    paths.sort();
    QCOMPARE(paths, QStringList({home + u"/name.txt"_s, home + u"/papers"_s}));
    const Entry file = vfs->entry(home + u"/name.txt"_s);
    QCOMPARE(file.type(), int(TypeFile));
    QVERIFY(file.localPath().startsWith(mountDir(u"/sftp/alice@server.test"_s)));
    QCOMPARE(fileContents(file.localPath()), QByteArray("alice"));

    // A path below the same root needs no other mount.
    const auto below =
        makeJob<MountFuseEntryJob>(u"sftp://alice@server.test/run/sandbox/home/alice/name.txt"_s);
    below->exec();
    QCOMPARE(below->error(), 0);
    QCOMPARE(fileContents(vfs->entry(below->path()).localPath()), QByteArray("alice"));
    QCOMPARE(mountDirs().size(), 1);
}

void RealSftpTreeTest::anotherProcessFindsIt()
{
    VfsClient before;
    QVERIFY(before.start());
    auth->answers = {password(Sandbox::bob)};
    const auto job = makeJob<MountFuseEntryJob>(bobUrl);
    job->exec();
    QCOMPARE(job->error(), 0);
    const QList<int> tools = processesNamed("sshfs") + processesNamed("ssh");
    QCOMPARE(tools.size(), 2);

    // One that was there is told of the place, before the mark, and one that comes later asks.
    service->emitSignal(
        u"FileSystem"_s, u"notifyWatchersSignal"_s, array("[[[\"mark\", \"\", 0]]]"));
    QVERIFY(before.waitFor(u"reset mark"_s));
    before.send(u"childs SFTP/bob@server.test/papers"_s);
    QVERIFY(before.waitFor(u"childs SFTP/bob@server.test/papers/draft.txt"_s));
    QCOMPARE(before.quit(), 0);
    QVERIFY(rerunPasses(findingArgument));
    QCOMPARE(processesNamed("sshfs") + processesNamed("ssh"), tools);
}

void RealSftpTreeTest::outlivesItsProcess()
{
    QVERIFY(rerunPasses(mountingArgument));
    const auto job = makeJob<MountFuseEntryJob>(bobUrl + u"name.txt"_s);
    job->exec();
    QCOMPARE(job->error(), 0);
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(fileContents(vfs->entry(job->path()).localPath()), QByteArray("bob"));
}

// The local path of a new mount has the path of the URL in it already, and the path of the result
// has it once more, where it leads nowhere. Neither is so for a mount that was found.
void RealSftpTreeTest::pathOfTheUrlIsDoubled()
{
    auth->answers = {password(Sandbox::tester)};
    const auto job = makeJob<MountFuseEntryJob>(deepUrl);
    job->exec();
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->path(), u"SFTP/server.test//run/sandbox/home/alice"_s);
    QVERIFY(!QFile::exists(vfs->entry(job->path()).localPath()));
    const QString localPath = vfs->entry(u"SFTP/server.test"_s).localPath();
    QCOMPARE(localPath, mountDir(u"/sftp/server.test//run/sandbox/home/alice"_s));
    QCOMPARE(fileContents(localPath + u"/name.txt"_s), QByteArray("alice"));

    auth->answers = {password(Sandbox::bob)};
    const auto home = makeJob<MountFuseEntryJob>(bobUrl);
    home->exec();
    QCOMPARE(home->error(), 0);
    QCOMPARE(home->path(), u"SFTP/bob@server.test//~/"_s);
    QVERIFY(!QFile::exists(vfs->entry(home->path()).localPath()));
    const Entry place = vfs->entry(u"SFTP/bob@server.test"_s);
    QCOMPARE(fileContents(place.localPath() + u"/name.txt"_s), QByteArray("bob"));
}

/// What another process does: it mounts and ends.
class MountingTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void mounts()
    {
        VFS::initialize();
        vfs = VFS::ptr();
        auth = QSharedPointer<ScriptedAuthenticator>::create();
        auth->answers = {password(Sandbox::bob)};
        const auto job = makeJob<MountFuseEntryJob>(bobUrl);
        job->exec();
        QCOMPARE(job->error(), 0);
        QVERIFY(auth->calls.contains(u"accepted"_s));
    }
};

/// What another process does: it finds what is mounted, by its own jobs, and asks nobody.
class FindingTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void finds()
    {
        VFS::initialize();
        vfs = VFS::ptr();
        QCOMPARE(childPaths(u"SFTP"_s), QStringList(u"SFTP/bob@server.test"_s));
        auth = QSharedPointer<ScriptedAuthenticator>::create();
        const auto job = makeJob<MountFuseEntryJob>(bobUrl + u"name.txt"_s);
        job->exec();
        QCOMPARE(job->error(), 0);
        QCOMPARE(fileContents(vfs->entry(job->path()).localPath()), QByteArray("bob"));
        const auto urlJob = makeJob<MountSFtpURLJob>(bobUrl + u"name.txt"_s);
        urlJob->exec();
        QCOMPARE(urlJob->error(), 0);
        QCOMPARE(fileContents(urlJob->localPath()), QByteArray("bob"));
        QCOMPARE(auth->calls, QStringList());
    }
};

int main(int argc, char** argv)
{
    if (isRerun(argc, argv, mountingArgument)) {
        return runSandboxTests<MountingTest>(1, argv);
    }
    if (isRerun(argc, argv, findingArgument)) {
        return runSandboxTests<FindingTest>(1, argv);
    }
    Sandbox sandbox({"/usr/bin/sshfs", "/usr/bin/fusermount3"});
    sandbox.addServer(std::make_unique<SecretWatch>());
    sandbox.addServer(std::make_unique<SshServer>(Sandbox::serverHost));
    return sandbox.run([&] { return runSandboxTests<RealSftpTreeTest>(argc, argv); });
}

#include "tst_real_sftptree.moc"
