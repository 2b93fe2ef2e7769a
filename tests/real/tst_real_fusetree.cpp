// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountfuseentryjob.h"
#include "real/realfusetest.h"
#include "support/rerun.h"
#include "support/vfsclient.h"

#include <QMap>

using namespace VeyFM;

namespace {

const QString aliceAccount = QStringLiteral("alice@server.test");
const QString bobAccount = QStringLiteral("bob@server.test");

// Has another process run one of its tests with the row of this one.
bool passesElsewhere(const char* test)
{
    return rerunPasses((QByteArray(test) + ':' + QTest::currentDataTag()).constData());
}

// Whether main() was started by passesElsewhere().
bool isElsewhere(const QByteArray& argument)
{
    return argument.startsWith("mounts:") || argument.startsWith("finds:");
}

} // namespace

/// FTP and SFTP mounts in the tree of places, in this process and in others. A place stays in the
/// tree of a process when its mount has gone, so each test has an account of its own.
class RealFuseTreeTest : public RealFuseTest
{
    Q_OBJECT

private Q_SLOTS:
    void isListedAndRead_data();
    void isListedAndRead();
    void anotherProcessFindsIt_data();
    void anotherProcessFindsIt();
    void outlivesItsProcess_data();
    void outlivesItsProcess();
    void pathOfAnSftpUrlIsDoubled();
};

void RealFuseTreeTest::isListedAndRead_data()
{
    addProtocols();
}

void RealFuseTreeTest::isListedAndRead()
{
    QFETCH(RealProtocol, protocol);
    const QString urlOfRoot = u"%1://%2"_s.arg(protocol.scheme, aliceAccount);
    const QString place = protocol.place + QLatin1Char('/') + aliceAccount;
    auth->answers = {password(Sandbox::alice)};
    const auto job = makeJob<MountFuseEntryJob>(urlOfRoot + QLatin1Char('/'));
    job->exec();
    QCOMPARE(job->errorString(), QString());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->path(), place + u"//"_s);
    const Entry mount = vfs->entry(job->path());
    QCOMPARE(mount.path(), place);
    QCOMPARE(mount.type(), protocol.mountType);
    QCOMPARE(childPaths(protocol.place), QStringList(place));
    QVERIFY(vfs->childs(mount).paths().contains(
        place + (protocol.rootIsHome ? u"/papers"_s : u"/run"_s)));

    const QString pathOfHome = protocol.rootIsHome ? QString() : Sandbox::home(Sandbox::alice);
    const QString home = place + pathOfHome;
    QStringList paths = vfs->childs(vfs->entry(home)).paths();
    paths.sort();
    QCOMPARE(paths, QStringList({home + u"/name.txt"_s, home + u"/papers"_s}));
    QCOMPARE(
        vfs->childs(vfs->entry(home + u"/papers"_s)).paths(),
        QStringList(home + u"/papers/draft.txt"_s));
    const Entry file = vfs->entry(home + u"/name.txt"_s);
    QCOMPARE(file.type(), int(TypeFile));
    QVERIFY(file.localPath().startsWith(mountDir(u"/%1/%2"_s.arg(protocol.scheme, aliceAccount))));
    QCOMPARE(fileContents(file.localPath()), QByteArray("alice"));

    // A path below the same root needs no other mount.
    const QMap<QString, QByteArray> files = {
        {u"/name.txt"_s, "alice"}, {u"/papers/draft.txt"_s, QByteArray()}};
    for (auto expected = files.begin(); expected != files.end(); ++expected) {
        const auto below = makeJob<MountFuseEntryJob>(urlOfRoot + pathOfHome + expected.key());
        below->exec();
        QCOMPARE(below->error(), 0);
        QCOMPARE(vfs->entry(below->path()).type(), int(TypeFile));
        QCOMPARE(fileContents(vfs->entry(below->path()).localPath()), expected.value());
    }
    QCOMPARE(mountDirs().size(), 1);
}

void RealFuseTreeTest::anotherProcessFindsIt_data()
{
    addProtocols();
}

void RealFuseTreeTest::anotherProcessFindsIt()
{
    QFETCH(RealProtocol, protocol);
    VfsClient before;
    QVERIFY(before.start());
    auth->answers = {password(Sandbox::bob)};
    const auto job = makeJob<MountFuseEntryJob>(protocol.urlOfHome(bobAccount));
    job->exec();
    QCOMPARE(job->error(), 0);
    const QList<int> processes = protocol.processes();
    QCOMPARE(processes.size(), protocol.tools.size());

    // One that was there is told of the place, before the mark, and one that comes later asks.
    service->emitSignal(
        u"FileSystem"_s, u"notifyWatchersSignal"_s, array("[[[\"mark\", \"\", 0]]]"));
    QVERIFY(before.waitFor(u"reset mark"_s));
    const QString papers = u"childs %1/%2/papers"_s.arg(protocol.place, bobAccount);
    before.send(papers);
    QVERIFY(before.waitFor(papers + u"/draft.txt"_s));
    QCOMPARE(before.quit(), 0);
    QVERIFY(passesElsewhere("finds"));
    QCOMPARE(protocol.processes(), processes);
}

void RealFuseTreeTest::outlivesItsProcess_data()
{
    addProtocols();
}

void RealFuseTreeTest::outlivesItsProcess()
{
    QFETCH(RealProtocol, protocol);
    QVERIFY(passesElsewhere("mounts"));
    const auto job = makeJob<MountFuseEntryJob>(protocol.urlOfHome(bobAccount, u"name.txt"_s));
    job->exec();
    QCOMPARE(job->error(), 0);
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(fileContents(vfs->entry(job->path()).localPath()), QByteArray("bob"));
}

// The local path of a new mount has the path of the URL in it already, and the path of the result
// has it once more, where it leads nowhere. Neither is so for a mount that was found.
void RealFuseTreeTest::pathOfAnSftpUrlIsDoubled()
{
    auth->answers = {password(Sandbox::tester)};
    const auto job = makeJob<MountFuseEntryJob>(u"sftp://server.test/run/sandbox/home/alice"_s);
    job->exec();
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->path(), u"SFTP/server.test//run/sandbox/home/alice"_s);
    QVERIFY(!QFile::exists(vfs->entry(job->path()).localPath()));
    const QString localPath = vfs->entry(u"SFTP/server.test"_s).localPath();
    QCOMPARE(localPath, mountDir(u"/sftp/server.test//run/sandbox/home/alice"_s));
    QCOMPARE(fileContents(localPath + u"/name.txt"_s), QByteArray("alice"));

    auth->answers = {password(Sandbox::bob)};
    const auto home = makeJob<MountFuseEntryJob>(RealProtocol::sftp().urlOfHome(bobAccount));
    home->exec();
    QCOMPARE(home->error(), 0);
    QCOMPARE(home->path(), u"SFTP/bob@server.test//~/"_s);
    QVERIFY(!QFile::exists(vfs->entry(home->path()).localPath()));
    const Entry place = vfs->entry(u"SFTP/bob@server.test"_s);
    QCOMPARE(fileContents(place.localPath() + u"/name.txt"_s), QByteArray("bob"));
}

/// What another process does, with mounts of its own or with those that it finds.
class OtherProcessTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void init()
    {
        VFS::initialize();
        vfs = VFS::ptr();
        auth = QSharedPointer<ScriptedAuthenticator>::create();
    }

    void mounts_data()
    {
        addProtocols();
    }
    void mounts()
    {
        QFETCH(RealProtocol, protocol);
        auth->answers = {password(Sandbox::bob)};
        const auto job = makeJob<MountFuseEntryJob>(protocol.urlOfHome(bobAccount));
        job->exec();
        QCOMPARE(job->error(), 0);
        QVERIFY(auth->calls.contains(u"accepted"_s));
    }

    void finds_data()
    {
        addProtocols();
    }
    // By its own jobs, and it asks nobody.
    void finds()
    {
        QFETCH(RealProtocol, protocol);
        const QString url = protocol.urlOfHome(bobAccount, u"name.txt"_s);
        QCOMPARE(
            childPaths(protocol.place),
            QStringList(protocol.place + QLatin1Char('/') + bobAccount));
        const auto job = makeJob<MountFuseEntryJob>(url);
        job->exec();
        QCOMPARE(job->error(), 0);
        QCOMPARE(fileContents(vfs->entry(job->path()).localPath()), QByteArray("bob"));
        const FuseMountJob urlJob = FuseMountJob::make(protocol.scheme, auth, url);
        urlJob->exec();
        QCOMPARE(urlJob->error(), 0);
        QCOMPARE(fileContents(urlJob.localPath()), QByteArray("bob"));
        QCOMPARE(auth->calls, QStringList());
    }
};

int main(int argc, char** argv)
{
    if (argc > 1 && isElsewhere(argv[1])) {
        return runSandboxTests<OtherProcessTest>(argc, argv);
    }
    FuseSandbox sandbox;
    return sandbox.run([&] { return runSandboxTests<RealFuseTreeTest>(argc, argv); });
}

#include "tst_real_fusetree.moc"
