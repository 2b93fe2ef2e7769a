// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountlock.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>
#include <QTest>

#include <csignal>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

using VeyFM::Host::MountLock;

class MountLockTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void oneAtATime();
    void oneForEachDirectory();
    void sameByLinks();
    void killed();
    void notInherited();
    void permissions();
    void withoutRuntimeDirectory();
    void hostile_data();
    void hostile();

private:
    QString path(const QString& relative) const
    {
        return m_scene->filePath(relative);
    }
    QString root() const
    {
        return path(QStringLiteral("home/.vey-fm-vfs"));
    }
    QString directory() const
    {
        return root() + QStringLiteral("/sftp/anna@server");
    }
    QStringList lockFiles() const
    {
        return QDir(path(QStringLiteral("run/veyfm-vfs/locks"))).entryList(QDir::Files);
    }

    std::unique_ptr<QTemporaryDir> m_scene;
};

void MountLockTest::init()
{
    m_scene = std::make_unique<QTemporaryDir>();
    QVERIFY(QDir(m_scene->path()).mkdir(QStringLiteral("run")));
    QVERIFY(QDir(m_scene->path()).mkdir(QStringLiteral("home")));
    qputenv("XDG_RUNTIME_DIR", QFile::encodeName(path(QStringLiteral("run"))));
}

void MountLockTest::oneAtATime()
{
    MountLock first;
    MountLock second;
    QVERIFY(!first.isOpen());
    QVERIFY2(first.open(directory(), root()), qPrintable(first.why()));
    QVERIFY(second.open(directory(), root()));
    QVERIFY(first.tryLock());
    QVERIFY(first.tryLock());
    QVERIFY(!second.tryLock());
    first.close();
    QVERIFY(!first.isOpen());
    QVERIFY(second.tryLock());
    QVERIFY(first.open(directory(), root()));
    QVERIFY(!first.tryLock());
    QCOMPARE(lockFiles().size(), 1);
}

void MountLockTest::oneForEachDirectory()
{
    MountLock first;
    MountLock second;
    QVERIFY(first.open(directory(), root()));
    QVERIFY(second.open(directory() + QLatin1Char('~'), root()));
    QVERIFY(first.tryLock());
    QVERIFY(second.tryLock());
    QCOMPARE(lockFiles().size(), 2);
}

void MountLockTest::sameByLinks()
{
    QVERIFY(QFile::link(path(QStringLiteral("home")), path(QStringLiteral("link"))));
    const QString linkedRoot = path(QStringLiteral("link/.vey-fm-vfs"));
    MountLock first;
    QVERIFY(first.open(directory(), root()));
    QVERIFY(first.tryLock());
    MountLock second;
    QVERIFY(second.open(linkedRoot + QStringLiteral("//sftp/anna@server/"), linkedRoot));
    QVERIFY(!second.tryLock());
    // What is made meanwhile changes nothing.
    QVERIFY(QDir().mkpath(directory()));
    QVERIFY(second.open(linkedRoot + QStringLiteral("/sftp/anna@server"), linkedRoot));
    QVERIFY(!second.tryLock());
    QCOMPARE(lockFiles().size(), 1);
}

void MountLockTest::killed()
{
    int ready[2];
    QCOMPARE(::pipe(ready), 0);
    const pid_t holder = ::fork();
    if (holder == 0) {
        MountLock lock;
        const char result = lock.open(directory(), root()) && lock.tryLock() ? 'y' : 'n';
        if (::write(ready[1], &result, 1) == 1) {
            ::pause();
        }
        ::_exit(1);
    }
    char result = 0;
    QCOMPARE(::read(ready[0], &result, 1), ssize_t(1));
    ::close(ready[0]);
    ::close(ready[1]);
    MountLock lock;
    QVERIFY(lock.open(directory(), root()));
    const bool isFree = lock.tryLock();
    QCOMPARE(::kill(holder, SIGKILL), 0);
    QCOMPARE(::waitpid(holder, nullptr, 0), holder);
    QCOMPARE(result, 'y');
    QVERIFY(!isFree);
    QVERIFY(lock.tryLock());
}

void MountLockTest::notInherited()
{
    MountLock lock;
    QVERIFY(lock.open(directory(), root()));
    QVERIFY(lock.tryLock());
    const pid_t program = ::fork();
    if (program == 0) {
        ::execlp("sleep", "sleep", "100", nullptr);
        ::_exit(1);
    }
    QTRY_VERIFY(
        QFileInfo(QStringLiteral("/proc/%1/exe").arg(program)).symLinkTarget() !=
        QFileInfo(QStringLiteral("/proc/self/exe")).symLinkTarget());
    lock.close();
    MountLock other;
    QVERIFY(other.open(directory(), root()));
    const bool isFree = other.tryLock();
    QCOMPARE(::kill(program, SIGKILL), 0);
    QCOMPARE(::waitpid(program, nullptr, 0), program);
    QVERIFY(isFree);
}

void MountLockTest::permissions()
{
    const mode_t before = ::umask(0);
    MountLock lock;
    const bool isOpen = lock.open(directory(), root());
    ::umask(before);
    QVERIFY(isOpen);
    const auto mode = [this](const QString& relative) {
        struct stat status = {};
        ::stat(QFile::encodeName(path(relative)).constData(), &status);
        return status.st_mode & 07777;
    };
    QCOMPARE(mode(QStringLiteral("run/veyfm-vfs")), mode_t(0700));
    QCOMPARE(mode(QStringLiteral("run/veyfm-vfs/locks")), mode_t(0700));
    QCOMPARE(mode(QStringLiteral("run/veyfm-vfs/locks/") + lockFiles().value(0)), mode_t(0600));
    // Whom somebody mounts with is nobody's business, and no name of a file either.
    QCOMPARE(lockFiles().value(0).size(), 64);
}

void MountLockTest::withoutRuntimeDirectory()
{
    qunsetenv("XDG_RUNTIME_DIR");
    MountLock first;
    MountLock second;
    QVERIFY2(first.open(directory(), root()), qPrintable(first.why()));
    QVERIFY(second.open(directory(), root()));
    QVERIFY(first.tryLock());
    QVERIFY(!second.tryLock());
    QCOMPARE(
        QDir(root() + QStringLiteral("/.locks")).entryList(QDir::Files | QDir::Hidden).size(), 1);
}

void MountLockTest::hostile_data()
{
    QTest::addColumn<QString>("inTheWay");
    QTest::newRow("folder of all") << QStringLiteral("run/veyfm-vfs");
    QTest::newRow("folder of locks") << QStringLiteral("run/veyfm-vfs/locks");
    QTest::newRow("file") << QString();
}

void MountLockTest::hostile()
{
    QFETCH(QString, inTheWay);
    QVERIFY(QDir(m_scene->path()).mkdir(QStringLiteral("elsewhere")));
    if (inTheWay.isEmpty()) {
        MountLock lock;
        QVERIFY(lock.open(directory(), root()));
        inTheWay = QStringLiteral("run/veyfm-vfs/locks/") + lockFiles().value(0);
        QVERIFY(QFile::remove(path(inTheWay)));
    } else {
        QVERIFY(QDir().mkpath(QFileInfo(path(inTheWay)).path()));
    }
    QVERIFY(QFile::link(path(QStringLiteral("elsewhere/target")), path(inTheWay)));
    MountLock lock;
    QVERIFY(!lock.open(directory(), root()));
    QVERIFY(lock.why().startsWith(path(QStringLiteral("run/veyfm-vfs/locks: "))));
    QVERIFY(!lock.isOpen());
    QVERIFY(!lock.tryLock());
    QVERIFY(QDir(path(QStringLiteral("elsewhere"))).isEmpty());
}

QTEST_GUILESS_MAIN(MountLockTest)
#include "tst_mountlock.moc"
