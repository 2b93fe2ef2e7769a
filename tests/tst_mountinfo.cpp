// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountinfo.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <QTest>

using namespace VeyFM::Host;

class MountInfoTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void reads_data();
    void reads();
    void passesOver_data();
    void passesOver();
    void fuse();
    void mountPoints();
    void ownMounts();
    void kernelPaths();
};

void MountInfoTest::reads_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QStringList>("mount");
    QTest::newRow("no optional field")
        << QByteArray("36 35 98:0 / /mnt rw,noatime - ext3 /dev/root rw")
        << QStringList(
               {QStringLiteral("/mnt"), QStringLiteral("ext3"), QStringLiteral("/dev/root")});
    QTest::newRow("optional fields")
        << QByteArray("36 35 0:60 / /mnt rw shared:1 master:2 - fuse.sshfs me@host:/ rw,user_id=0")
        << QStringList(
               {QStringLiteral("/mnt"), QStringLiteral("fuse.sshfs"), QStringLiteral("me@host:/")});
    QTest::newRow("escapes")
        << QByteArray("1 2 0:1 / /a\\040b\\011c\\012d\\134e rw - t a\\134040 rw")
        << QStringList(
               {QStringLiteral("/a b\tc\nd\\e"), QStringLiteral("t"), QStringLiteral("a\\040")});
    QTest::newRow("no escapes") << QByteArray("1 2 0:1 / /a\\04\\x\\9990 rw - t s\\ rw")
                                << QStringList(
                                       {QStringLiteral("/a\\04\\x\\9990"), QStringLiteral("t"),
                                        QStringLiteral("s\\")});
    QTest::newRow("bytes of UTF-8")
        << QByteArray("1 2 0:1 / /\\303\\244\xc3\xb6 rw - t s rw")
        << QStringList({QStringLiteral("/\u00e4\u00f6"), QStringLiteral("t"), QStringLiteral("s")});
    QTest::newRow("empty source") << QByteArray("1 2 0:1 / /a rw - t  rw")
                                  << QStringList(
                                         {QStringLiteral("/a"), QStringLiteral("t"), QString()});
    QTest::newRow("dash as a directory")
        << QByteArray("1 2 0:1 - - - - t s rw")
        << QStringList({QStringLiteral("-"), QStringLiteral("t"), QStringLiteral("s")});
}

void MountInfoTest::reads()
{
    QFETCH(const QByteArray, line);
    QFETCH(const QStringList, mount);
    const QVector<KernelMount> mounts = MountInfo("x\n" + line + '\n').mounts();
    QCOMPARE(mounts.size(), 1);
    QCOMPARE(mounts.at(0).directory, mount.at(0));
    QCOMPARE(mounts.at(0).type, mount.at(1));
    QCOMPARE(mounts.at(0).source, mount.at(2));
}

void MountInfoTest::passesOver_data()
{
    QTest::addColumn<QByteArray>("text");
    QTest::newRow("nothing") << QByteArray();
    QTest::newRow("blanks") << QByteArray("        \n         ");
    QTest::newRow("no separator") << QByteArray(
        "36 35 98:0 / /mnt rw,noatime shared:1 ext3 /dev/sda");
    QTest::newRow("cut") << QByteArray("36 35 98:0 / /mnt rw - ext3");
    QTest::newRow("NUL") << QByteArray("\0\0\0", 3);
}

void MountInfoTest::passesOver()
{
    QFETCH(const QByteArray, text);
    const MountInfo info(text);
    QVERIFY(info.mounts().isEmpty());
    QVERIFY(!info.isMountPoint(QStringLiteral("/mnt")));
}

void MountInfoTest::fuse()
{
    const auto isFuse = [](const char* type) {
        return KernelMount{QString(), QString::fromLatin1(type), QString()}.isFuse();
    };
    QVERIFY(isFuse("fuse"));
    QVERIFY(isFuse("fuse.rclone"));
    QVERIFY(!isFuse("fusectl"));
    // A disk.
    QVERIFY(!isFuse("fuseblk"));
    QVERIFY(!isFuse("ext4"));
}

void MountInfoTest::mountPoints()
{
    const MountInfo info("1 2 0:1 / /a\\040b rw - t s rw\n1 2 0:1 / /c rw - t s rw\n");
    QVERIFY(info.isMountPoint(QStringLiteral("/a b")));
    QVERIFY(info.isMountPoint(QStringLiteral("/c")));
    QVERIFY(!info.isMountPoint(QStringLiteral("/c/d")));
    QVERIFY(!info.isMountPoint(QStringLiteral("/")));
    QVERIFY(!info.isMountPoint(QString()));
}

void MountInfoTest::ownMounts()
{
    const MountInfo info = MountInfo::read();
    QCOMPARE(info.why(), QString());
    QVERIFY(info.isMountPoint(QStringLiteral("/proc")));
    QVERIFY(!info.isMountPoint(QDir::homePath()));
}

void MountInfoTest::kernelPaths()
{
    QTemporaryDir directory;
    const QString top = QDir(directory.path()).canonicalPath();
    QVERIFY(QDir(top).mkpath(QStringLiteral("real/root")));
    QVERIFY(QFile::link(top + QStringLiteral("/real"), top + QStringLiteral("/link")));
    const QString root = top + QStringLiteral("/link/root");
    const QString real = top + QStringLiteral("/real/root");
    QCOMPARE(kernelPath(root, root), real);
    QCOMPARE(
        kernelPath(root + QStringLiteral("/sftp//host/"), root),
        real + QStringLiteral("/sftp/host"));
    QVERIFY(QDir(top).mkpath(QStringLiteral("other")));
    QVERIFY(QFile::link(top + QStringLiteral("/other"), real + QStringLiteral("/ftp")));
    QCOMPARE(
        kernelPath(root + QStringLiteral("/ftp/host"), root), top + QStringLiteral("/other/host"));
    // The last link is not followed: it may lead to a server that has gone.
    QVERIFY(QFile::link(QStringLiteral("/usr"), real + QStringLiteral("/usr")));
    QCOMPARE(kernelPath(root + QStringLiteral("/usr"), root), real + QStringLiteral("/usr"));
    QVERIFY(QFile::link(QStringLiteral("/usr"), top + QStringLiteral("/other/usr")));
    QCOMPARE(
        kernelPath(root + QStringLiteral("/ftp/usr"), root), top + QStringLiteral("/other/usr"));
    QCOMPARE(kernelPath(root + QStringLiteral("2/x"), root), root + QStringLiteral("2/x"));
    QCOMPARE(kernelPath(root + QStringLiteral("/../x/"), root), top + QStringLiteral("/link/x"));
    QCOMPARE(
        kernelPath(QStringLiteral("/nowhere/x"), QStringLiteral("/nowhere")),
        QStringLiteral("/nowhere/x"));
    // A root that is not there yet has the path that it will have.
    QCOMPARE(
        kernelPath(
            top + QStringLiteral("/link/later/sftp/host"), top + QStringLiteral("/link/later")),
        top + QStringLiteral("/real/later/sftp/host"));
}

QTEST_GUILESS_MAIN(MountInfoTest)
#include "tst_mountinfo.moc"
