// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountdirectory_p.h"
#include "support/vfsscene.h"

#include <QTest>

#include <memory>

#include <sched.h>
#include <sys/mount.h>

using VeyFM::makeMountDirectory;

namespace {

/// The umask of this process, until the end of the scope.
class Umask
{
public:
    explicit Umask(mode_t mask)
        : m_before(::umask(mask))
    {
    }
    ~Umask()
    {
        ::umask(m_before);
    }
    Umask(const Umask&) = delete;
    Umask& operator=(const Umask&) = delete;

private:
    const mode_t m_before;
};

} // namespace

/// The directories that mounts are made on. As a user whom rights bind.
class MountDirectoryTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();
    void modeWhateverTheUmask_data();
    void modeWhateverTheUmask();
    void leavesWhatIsThere();
    void linkIsRefused_data();
    void linkIsRefused();
    void linkAboveIsFollowed();
    void directoryOfAnotherUserIsRefused();
    void mountOfAnybodyIsTaken();
    void whatCannotBeMadeIsForTheToolToTell_data();
    void whatCannotBeMadeIsForTheToolToTell();

private:
    /// -1 where there is none.
    int mode(const char* relative) const
    {
        struct stat info = {};
        return ::lstat(scene->bytes(relative).constData(), &info) == 0 ? int(info.st_mode & 07777)
                                                                       : -1;
    }
    bool make(const char* relative) const
    {
        return makeMountDirectory(scene->path(relative));
    }

    std::unique_ptr<VfsScene> scene;
    std::unique_ptr<Unprivileged> user;
};

void MountDirectoryTest::init()
{
    scene = std::make_unique<VfsScene>();
    QVERIFY(scene->makeDir("own"));
    QCOMPARE(::chmod(scene->bytes("own").constData(), 0777), 0);
    user = std::make_unique<Unprivileged>();
    QVERIFY(user->isDropped());
}

void MountDirectoryTest::cleanup()
{
    user.reset();
    scene.reset();
}

void MountDirectoryTest::modeWhateverTheUmask_data()
{
    QTest::addColumn<int>("mask");
    QTest::newRow("none") << 0;
    QTest::newRow("usual") << 022;
    QTest::newRow("of the user") << 0700;
    QTest::newRow("all") << 0777;
}

void MountDirectoryTest::modeWhateverTheUmask()
{
    QFETCH(int, mask);
    {
        const Umask umask{mode_t(mask)};
        QVERIFY(make("own/root/sftp/host"));
        QCOMPARE(int(::umask(mode_t(mask))), mask);
    }
    QCOMPARE(mode("own/root"), 0700);
    QCOMPARE(mode("own/root/sftp"), 0700);
    QCOMPARE(mode("own/root/sftp/host"), 0700);
}

void MountDirectoryTest::leavesWhatIsThere()
{
    const Umask umask(0);
    QVERIFY(scene->makeDir("own/root") && scene->makeDir("own/root/sftp"));
    QVERIFY(scene->makeDir("own/root/sftp/host") && scene->makeFile("own/root/sftp/host/file"));
    QVERIFY(make("own/root/sftp/host"));
    QCOMPARE(mode("own"), 0777);
    QCOMPARE(mode("own/root"), 0755);
    QCOMPARE(mode("own/root/sftp/host"), 0755);
    QVERIFY(mode("own/root/sftp/host/file") >= 0);
}

void MountDirectoryTest::linkIsRefused_data()
{
    QTest::addColumn<QByteArray>("target");
    QTest::newRow("to a directory") << QByteArray("..");
    QTest::newRow("to a directory of one's own") << QByteArray("mine");
    QTest::newRow("to nothing") << QByteArray("nothing");
    QTest::newRow("to itself") << QByteArray("host");
}

void MountDirectoryTest::linkIsRefused()
{
    QFETCH(QByteArray, target);
    QVERIFY(scene->makeDir("own/mine"));
    QVERIFY(scene->makeLink(target, "own/host"));
    QVERIFY(!make("own/host"));
    QCOMPARE(mode("own/nothing"), -1);
    QVERIFY(QFileInfo(scene->path("own/host")).isSymLink());
}

// Somebody may keep all mounts elsewhere.
void MountDirectoryTest::linkAboveIsFollowed()
{
    QVERIFY(scene->makeDir("own/elsewhere"));
    QVERIFY(scene->makeLink("elsewhere", "own/root"));
    QVERIFY(make("own/root/sftp/host"));
    QCOMPARE(mode("own/elsewhere/sftp/host"), 0700);
}

void MountDirectoryTest::directoryOfAnotherUserIsRefused()
{
    if (::getuid() != 0) {
        QSKIP("only root can make the directory of another user");
    }
    QVERIFY(make("own/mine"));
    user.reset();
    QVERIFY(scene->makeDir("own/host"));
    QVERIFY(!make("own/mine")); // The other way round: root is nobody special here.
    user = std::make_unique<Unprivileged>();
    QVERIFY(!make("own/host"));
    QCOMPARE(mode("own/host"), 0755);
}

// The owner of what is mounted is one of the server.
void MountDirectoryTest::mountOfAnybodyIsTaken()
{
    QVERIFY(make("own/host"));
    user.reset();
    if (::unshare(CLONE_NEWNS) != 0 ||
        ::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) {
        QSKIP("only root can mount");
    }
    QCOMPARE(::mount("none", scene->bytes("own/host").constData(), "tmpfs", 0, nullptr), 0);
    user = std::make_unique<Unprivileged>();
    const bool isTaken = make("own/host");
    user.reset();
    QCOMPARE(::umount(scene->bytes("own/host").constData()), 0);
    QVERIFY(isTaken);
}

void MountDirectoryTest::whatCannotBeMadeIsForTheToolToTell_data()
{
    QTest::addColumn<QString>("path");
    QTest::newRow("file in its place") << QStringLiteral("own/file");
    QTest::newRow("file above it") << QStringLiteral("own/file/sftp/host");
    QTest::newRow("closed directory") << QStringLiteral("work/root/host");
    QTest::newRow("name too long") << QStringLiteral("own/") + QString(300, QLatin1Char('x'));
}

void MountDirectoryTest::whatCannotBeMadeIsForTheToolToTell()
{
    QFETCH(QString, path);
    QVERIFY(scene->makeFile("own/file"));
    QVERIFY(makeMountDirectory(scene->path(path)));
    QVERIFY(!QFileInfo(scene->path(path)).isDir());
}

QTEST_GUILESS_MAIN(MountDirectoryTest)
#include "tst_mountdirectory.moc"
