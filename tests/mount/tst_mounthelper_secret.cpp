// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/helpersession.h"
#include "support/mountscene.h"

#include <QTest>

#include <fcntl.h>

/// What others could see of a password, and what the tools get of the program and its host.
class MountHelperSecretTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void isNowhereInMemory();
    void isInNoErrorText();
    void leavesNoCore();
    void toolsGetNothingOfTheHost();
    void leadsAGroup();
};

void MountHelperSecretTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

namespace {

/// All that a process has written to its memory. Takes root.
QByteArray memoryOf(qint64 pid)
{
    QByteArray all;
    QFile maps(QStringLiteral("/proc/%1/maps").arg(pid));
    const int memory = ::open(
        QFile::encodeName(QStringLiteral("/proc/%1/mem").arg(pid)).constData(),
        O_RDONLY | O_CLOEXEC);
    if (!maps.open(QIODevice::ReadOnly) || memory < 0) {
        return all;
    }
    const QList<QByteArray> lines = maps.readAll().split('\n');
    for (const QByteArray& line : lines) {
        const QList<QByteArray> range = line.left(line.indexOf(' ')).split('-');
        if (range.size() != 2 || !line.contains(" rw")) {
            continue;
        }
        const quint64 begin = range.at(0).toULongLong(nullptr, 16);
        const quint64 end = range.at(1).toULongLong(nullptr, 16);
        constexpr quint64 most = 64 * 1024 * 1024; // Shadows of sanitizers are larger, and empty.
        if (end - begin > most) {
            continue;
        }
        QByteArray bytes(int(end - begin), '\0');
        const ssize_t size = ::pread(memory, bytes.data(), size_t(bytes.size()), off_t(begin));
        all += bytes.left(int(size));
    }
    ::close(memory);
    return all;
}

} // namespace

void MountHelperSecretTest::isNowhereInMemory()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::sshRefusal());
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.next(), "id"), 1);
    // In parts, so that this text is not found itself.
    const QByteArray first = QByteArray("Gehe") + "imnis-Eins";
    const QByteArray second = QByteArray("Gehe") + "imnis-Zwei";
    session.answerPassword(1, first);
    QCOMPARE(textOf(session.next(), "say"), QStringLiteral("rejected"));
    QCOMPARE(numberOf(session.next(), "id"), 2);
    session.answerPassword(2, second);
    QCOMPARE(numberOf(session.end(), "code"), 0);
    QCOMPARE(scene.tool.input(2), second + '\n');
    const QByteArray memory = memoryOf(session.pid());
    QVERIFY(memory.contains("me@host"));
    QVERIFY(!memory.contains(first));
    QVERIFY(!memory.contains(second));
    // The half that had to have it has gone.
    QTRY_VERIFY(session.workerId() == 0 || !MountScene::isRunning(session.workerId()));
}

void MountHelperSecretTest::isInNoErrorText()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.next(), "id"), 1);
    session.say(R"({"do":"answer","password":true,"id":1})");
    session.say(R"("geheim\x")");
    const QJsonObject end = session.next();
    QCOMPARE(numberOf(end, "code"), 5);
    QVERIFY(!textOf(end, "text").contains(QLatin1String("geheim")));
    QCOMPARE(session.errors(), QByteArray());
}

void MountHelperSecretTest::leavesNoCore()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.next(), "id"), 1);
    for (const qint64 pid : {session.pid(), session.workerId(), scene.tool.processId(1)}) {
        QFile limits(QStringLiteral("/proc/%1/limits").arg(pid));
        QVERIFY(limits.open(QIODevice::ReadOnly));
        const QByteArray text = limits.readAll().simplified();
        QVERIFY2(text.contains("Max core file size 0 0 "), text.constData());
    }
    // Who can't be dumped has files of root's in /proc, and root is nobody of a user's.
    for (const qint64 pid : {session.pid(), session.workerId()}) {
        QFile file(QStringLiteral("/proc/%1/coredump_filter").arg(pid));
        QVERIFY(file.open(QIODevice::ReadOnly));
        QCOMPARE(QFileInfo(file).ownerId(), 0U);
    }
}

void MountHelperSecretTest::toolsGetNothingOfTheHost()
{
    MountScene scene("curlftpfs");
    scene.tool.expect({"fork", "mount"});
    // As a host might leave one open.
    const int open = ::open("/dev/null", O_RDONLY);
    QVERIFY(open > STDERR_FILENO);
    HelperSession session(scene.environment());
    session.mount("ftp://me@host/");
    QCOMPARE(numberOf(session.end(), "code"), 0);
    ::close(open);
    QCOMPARE(scene.tool.descriptors(1), QByteArrayList());
    const qint64 daemon = scene.tool.childId(1);
    QVERIFY(MountScene::isRunning(daemon));
    session.take();
    QCOMPARE(session.waitForEnd(), 0);
    // What lives on holds no pipe of the host: its other ends are closed.
    for (const int descriptor : {0, 1}) {
        const QString path = QStringLiteral("/proc/%1/fd/%2").arg(daemon).arg(descriptor);
        const QString target = QFile::symLinkTarget(path);
        QVERIFY2(!target.isEmpty(), qPrintable(path));
    }
    ::kill(pid_t(daemon), SIGKILL);
}

void MountHelperSecretTest::leadsAGroup()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + Said::success());
    HelperSession session(scene.environment());
    QCOMPARE(qint64(::getpgid(pid_t(session.pid()))), session.pid());
    session.mount("sftp://me@host/");
    QCOMPARE(numberOf(session.next(), "id"), 1);
    // Away from the terminal of the host, on which a tool would ask by itself.
    QCOMPARE(qint64(::getsid(pid_t(session.workerId()))), session.workerId());
    QVERIFY(::getsid(pid_t(session.pid())) != pid_t(session.workerId()));
}

QTEST_GUILESS_MAIN(MountHelperSecretTest)
#include "tst_mounthelper_secret.moc"
