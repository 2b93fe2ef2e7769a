// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountfuseentryjob.h"
#include "real/realftptest.h"
#include "support/rerun.h"
#include "support/vfsclient.h"

using namespace VeyFM;

namespace {

constexpr const char* mountingArgument = "mounts";
constexpr const char* findingArgument = "finds";

const QString aliceUrl = QStringLiteral("ftp://alice@server.test/");
const QString bobUrl = QStringLiteral("ftp://bob@server.test/");

} // namespace

/// FTP mounts in the tree of places, in this process and in others. A place stays in the tree of
/// a process when its mount has gone, so each test has an account of its own.
class RealFtpTreeTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void isListedAndRead();
    void anotherProcessFindsIt();
    void outlivesItsProcess();
};

void RealFtpTreeTest::initTestCase()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    useCurlftpfsAdapter();
    QVERIFY2(startVfs(R"({"remember": true})"), qPrintable(service.errorString()));
}

void RealFtpTreeTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    startScene();
}

void RealFtpTreeTest::cleanup()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    endScene();
    QTRY_VERIFY(processesNamed("rclone").isEmpty());
}

void RealFtpTreeTest::isListedAndRead()
{
    auth->answers = {password(Sandbox::alice)};
    const auto job = makeJob<MountFuseEntryJob>(aliceUrl);
    job->exec();
    QCOMPARE(job->errorString(), QString());
    QCOMPARE(job->error(), 0);
    const Entry mount = vfs->entry(job->path());
    QCOMPARE(mount.path(), u"FTP/alice@server.test"_s);
    QCOMPARE(mount.type(), int(TypeFtpSharePlace));
    QCOMPARE(childPaths(u"FTP"_s), QStringList(mount.path()));
    QStringList paths = vfs->childs(mount).paths();
    paths.sort();
    QCOMPARE(paths, QStringList({mount.path() + u"/name.txt"_s, mount.path() + u"/papers"_s}));
    QCOMPARE(
        vfs->childs(vfs->entry(mount.path() + u"/papers"_s)).paths(),
        QStringList(mount.path() + u"/papers/draft.txt"_s));

    const Entry file = vfs->entry(mount.path() + u"/name.txt"_s);
    QCOMPARE(file.type(), int(TypeFile));
    QVERIFY(file.localPath().startsWith(mountDir(u"/ftp/alice@server.test"_s)));
    QCOMPARE(fileContents(file.localPath()), QByteArray("alice"));

    // A path below the same root needs no other mount.
    const auto below = makeJob<MountFuseEntryJob>(aliceUrl + u"papers/draft.txt"_s);
    below->exec();
    QCOMPARE(below->error(), 0);
    QCOMPARE(vfs->entry(below->path()).type(), int(TypeFile));
    QCOMPARE(fileContents(vfs->entry(below->path()).localPath()), QByteArray());
    QCOMPARE(mountDirs().size(), 1);
}

void RealFtpTreeTest::anotherProcessFindsIt()
{
    VfsClient before;
    QVERIFY(before.start());
    auth->answers = {password(Sandbox::bob)};
    const auto job = makeJob<MountFuseEntryJob>(bobUrl);
    job->exec();
    QCOMPARE(job->error(), 0);
    const QList<int> tools = processesNamed("rclone");
    QCOMPARE(tools.size(), 1);

    // One that was there is told of the place, before the mark, and one that comes later asks.
    service->emitSignal(
        u"FileSystem"_s, u"notifyWatchersSignal"_s, array("[[[\"mark\", \"\", 0]]]"));
    QVERIFY(before.waitFor(u"reset mark"_s));
    before.send(u"childs FTP/bob@server.test/papers"_s);
    QVERIFY(before.waitFor(u"childs FTP/bob@server.test/papers/draft.txt"_s));
    QCOMPARE(before.quit(), 0);
    QVERIFY(rerunPasses(findingArgument));
    QCOMPARE(processesNamed("rclone"), tools);
}

void RealFtpTreeTest::outlivesItsProcess()
{
    QVERIFY(rerunPasses(mountingArgument));
    const auto job = makeJob<MountFuseEntryJob>(bobUrl + u"name.txt"_s);
    job->exec();
    QCOMPARE(job->error(), 0);
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(fileContents(vfs->entry(job->path()).localPath()), QByteArray("bob"));
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
        QCOMPARE(childPaths(u"FTP"_s), QStringList(u"FTP/bob@server.test"_s));
        auth = QSharedPointer<ScriptedAuthenticator>::create();
        const auto job = makeJob<MountFuseEntryJob>(bobUrl + u"name.txt"_s);
        job->exec();
        QCOMPARE(job->error(), 0);
        QCOMPARE(fileContents(vfs->entry(job->path()).localPath()), QByteArray("bob"));
        const auto urlJob = makeJob<MountFtpURLJob>(bobUrl + u"name.txt"_s);
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
    FtpSandbox sandbox;
    return sandbox.run([&] { return runSandboxTests<RealFtpTreeTest>(argc, argv); });
}

#include "tst_real_ftptree.moc"
