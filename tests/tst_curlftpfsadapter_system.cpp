// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/curlftpfsscene.h"
#include "support/terminalsession.h"

#include <QDir>

#include <csignal>
#include <memory>

namespace {

QString operator""_s(const char16_t* text, size_t size)
{
    return QString::fromUtf16(text, int(size));
}

// How it knows, and how it shows, that it has become another program before.
const QByteArray handedOver = "CURLFTPFS_RCLONE_HANDED_OVER=1";

bool makeProgram(const QString& path, const QByteArray& content)
{
    QFile file(path);
    return file.open(QIODevice::WriteOnly) && file.write(content) == content.size() &&
           file.setPermissions(QFile::ReadOwner | QFile::WriteOwner | QFile::ExeOwner);
}

void prependToPath(const QString& folder)
{
    qputenv("PATH", folder.toLocal8Bit() + ':' + qgetenv("PATH"));
}

} // namespace

/// How the curlftpfs of tools/curlftpfs-rclone gets on with what is around it: signals, terminals,
/// other programs of its name, and programs that are missing.
class CurlftpfsAdapterSystemTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void signalAtThePrompt_data();
    void signalAtThePrompt();
    void signalWhileMounting_data();
    void signalWhileMounting();
    void signalThatIsIgnored();
    void terminalDoesNotEcho();
    void terminalIsPutBack();
    void handsOverToTheRealOne();
    void passesItselfOver_data();
    void passesItselfOver();
    void comesBackOnce();
    void missingPrograms_data();
    void missingPrograms();
    void mountPoints_data();
    void mountPoints();

private:
    QByteArray m_path;
    std::unique_ptr<QTemporaryDir> m_folder;
};

void CurlftpfsAdapterSystemTest::initTestCase()
{
    SKIP_WITH_REAL_CURLFTPFS();
}

void CurlftpfsAdapterSystemTest::init()
{
    m_path = qgetenv("PATH");
    m_folder = std::make_unique<QTemporaryDir>();
}

void CurlftpfsAdapterSystemTest::cleanup()
{
    m_folder.reset();
    qputenv("PATH", m_path);
}

void CurlftpfsAdapterSystemTest::signalAtThePrompt_data()
{
    QTest::addColumn<int>("number");
    QTest::newRow("SIGTERM") << SIGTERM;
    QTest::newRow("SIGINT") << SIGINT;
    QTest::newRow("SIGHUP") << SIGHUP;
}

void CurlftpfsAdapterSystemTest::signalAtThePrompt()
{
    QFETCH(int, number);
    const CurlftpfsScene scene;
    Curlftpfs tool;
    tool.start(scene.arguments(u"host"_s, {u"-o"_s, u"user=bob"_s}));
    QVERIFY(tool.waitForPrompt("bob"));
    ::kill(pid_t(tool.process.processId()), number);
    QCOMPARE(tool.waitForEnd(), 128 + number);
    QCOMPARE(tool.errors, QByteArray());
    QCOMPARE(scene.rclone.runs(), 0);
}

void CurlftpfsAdapterSystemTest::signalWhileMounting_data()
{
    signalAtThePrompt_data();
}

void CurlftpfsAdapterSystemTest::signalWhileMounting()
{
    QFETCH(int, number);
    CurlftpfsScene scene;
    scene.expectMount({"hang"});
    Curlftpfs tool;
    tool.start(scene.arguments(u"host"_s));
    const qint64 rclone = scene.waitForRclone();
    QVERIFY(rclone > 0);
    ::kill(pid_t(tool.process.processId()), number);
    QCOMPARE(tool.waitForEnd(), 128 + number);
    QCOMPARE(tool.errors, QByteArray());
    QVERIFY(!QFile::exists(u"/proc/%1"_s.arg(rclone)));
}

void CurlftpfsAdapterSystemTest::signalThatIsIgnored()
{
    CurlftpfsScene scene;
    scene.expectMount({"exit 1"});
    Curlftpfs tool;
    // As nohup(1) starts its programs.
    const auto before = std::signal(SIGHUP, SIG_IGN);
    tool.start(scene.arguments(u"host"_s, {u"-o"_s, u"user=bob"_s}));
    std::signal(SIGHUP, before);
    QVERIFY(tool.waitForPrompt("bob"));
    ::kill(pid_t(tool.process.processId()), SIGHUP);
    tool.answer("secret\n");
    QCOMPARE(tool.waitForEnd(), 1);
    QCOMPARE(scene.rclone.runs(), 2);
}

void CurlftpfsAdapterSystemTest::terminalDoesNotEcho()
{
    CurlftpfsScene scene;
    scene.expectMount({"exit 1"});
    TerminalSession session(
        curlftpfsPath(), scene.arguments(u"host"_s, {u"-o"_s, u"user=bob"_s}), u"/"_s,
        QProcessEnvironment::systemEnvironment());
    // What is typed ahead is dropped with the echo, so it is not seen either.
    QVERIFY(session.waitFor("Enter host password for user 'bob':"));
    QVERIFY(QTest::qWaitFor([&] { return !session.hasEcho(); }, 20000));
    session.type("secret\n");
    QCOMPARE(session.waitForEnd(), 1);
    QCOMPARE(
        session.output(),
        QByteArray("Enter host password for user 'bob':\n"
                   "curlftpfs: can't mount ftp://bob@host/: rclone ended without a word\n"));
    QCOMPARE(scene.rclone.input(1), QByteArray("secret\n"));
}

void CurlftpfsAdapterSystemTest::terminalIsPutBack()
{
    const CurlftpfsScene scene;
    TerminalSession session(
        curlftpfsPath(), scene.arguments(u"host"_s, {u"-o"_s, u"user=bob"_s}), u"/"_s,
        QProcessEnvironment::systemEnvironment());
    QVERIFY(session.waitFor("Enter host password for user 'bob':"));
    QVERIFY(QTest::qWaitFor([&] { return !session.hasEcho(); }, 20000));
    session.type("\x03");
    QCOMPARE(session.waitForEnd(), 130);
    QVERIFY(session.hasEcho());
    QCOMPARE(session.output(), QByteArray("Enter host password for user 'bob':\n"));
}

void CurlftpfsAdapterSystemTest::handsOverToTheRealOne()
{
    StandIn real("curlftpfs");
    real.expect({"err the real one\\n", "read", "exit 7"});
    // The adapter comes first, as in /usr/local/bin.
    prependToPath(QStringLiteral(VEYFM_CURLFTPFS_FOLDER));
    const QStringList arguments = {u"-o"_s, u"user=a,ssl"_s, u"-v"_s, u""_s, u"a b"_s};
    Curlftpfs tool;
    tool.start(arguments, u"curlftpfs"_s);
    tool.answer("secret\n");
    QCOMPARE(tool.waitForEnd(), 7);
    QCOMPARE(tool.errors, QByteArray("the real one\n"));
    QCOMPARE(real.runs(), 1);
    QByteArrayList expected;
    for (const QString& argument : arguments) {
        expected << argument.toLocal8Bit();
    }
    QCOMPARE(real.arguments(1), expected);
    QCOMPARE(real.input(1), QByteArray("secret\n"));
}

void CurlftpfsAdapterSystemTest::passesItselfOver_data()
{
    QTest::addColumn<QString>("kind");
    for (const char* kind : {"link", "hard link", "copy", "folder", "not executable"}) {
        QTest::newRow(kind) << QString::fromLatin1(kind);
    }
}

void CurlftpfsAdapterSystemTest::passesItselfOver()
{
    QFETCH(QString, kind);
    const QString mine = m_folder->filePath(u"mine"_s);
    const QString other = m_folder->filePath(u"curlftpfs"_s);
    QVERIFY(QFile::copy(curlftpfsPath(), mine));
    if (kind == u"link"_s) {
        QVERIFY(QFile::link(mine, other));
    } else if (kind == u"hard link"_s) {
        QCOMPARE(::link(QFile::encodeName(mine), QFile::encodeName(other)), 0);
    } else if (kind == u"copy"_s) {
        QVERIFY(QFile::copy(mine, other));
    } else if (kind == u"folder"_s) {
        QVERIFY(QDir().mkdir(other));
    } else {
        QVERIFY(QFile(other).open(QIODevice::WriteOnly));
    }
    prependToPath(m_folder->path());
    CurlftpfsScene scene;
    scene.expectMount({"exit 1"});
    Curlftpfs tool;
    tool.start(scene.arguments(u"host"_s), mine);
    QCOMPARE(tool.waitForEnd(), 1);
    QCOMPARE(scene.rclone.runs(), 2);
    QVERIFY(!scene.rclone.environment(2).contains(handedOver));
}

// Somebody's wrapper looks like a real one and leads back.
void CurlftpfsAdapterSystemTest::comesBackOnce()
{
    const QByteArray back = "#!/bin/sh\nexec '" + curlftpfsPath().toLocal8Bit() + "' \"$@\"\n";
    QVERIFY(makeProgram(m_folder->filePath(u"curlftpfs"_s), back));
    prependToPath(m_folder->path());
    CurlftpfsScene scene;
    scene.expectMount({"exit 1"});
    Curlftpfs tool;
    tool.start(scene.arguments(u"host"_s));
    QCOMPARE(tool.waitForEnd(), 1);
    QCOMPARE(scene.rclone.runs(), 2);
    QVERIFY(scene.rclone.environment(2).contains(handedOver));
}

void CurlftpfsAdapterSystemTest::missingPrograms_data()
{
    QTest::addColumn<QString>("present");
    QTest::addColumn<QByteArray>("message");
    QTest::newRow("rclone") << u"fusermount"_s
                            << QByteArray("rclone is missing: apt install rclone\n");
    QTest::newRow("fusermount") << u"rclone"_s
                                << QByteArray("fusermount is missing: apt install fuse3\n");
}

void CurlftpfsAdapterSystemTest::missingPrograms()
{
    QFETCH(QString, present);
    QFETCH(QByteArray, message);
    QVERIFY(makeProgram(m_folder->filePath(present), "#!/bin/false\n"));
    qputenv("PATH", m_folder->path().toLocal8Bit());
    Curlftpfs tool;
    tool.start({u"-o"_s, u"user=bob"_s, u"host"_s, u"/"_s});
    QCOMPARE(tool.waitForEnd(), 127);
    QCOMPARE(tool.errors, "curlftpfs: " + message);
}

void CurlftpfsAdapterSystemTest::mountPoints_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QByteArray>("message");
    QTest::newRow("missing") << u"/nonexistent"_s
                             << QByteArray("/nonexistent: No such file or directory\n");
    QTest::newRow("file") << u"/etc/passwd"_s << QByteArray("/etc/passwd: Not a directory\n");
    QTest::newRow("taken") << u"/proc/"_s
                           << QByteArray(
                                  "/proc is a mount point already: fusermount3 -u unmounts it\n");
}

void CurlftpfsAdapterSystemTest::mountPoints()
{
    QFETCH(QString, path);
    QFETCH(QByteArray, message);
    const CurlftpfsScene scene;
    Curlftpfs tool;
    tool.start({u"-o"_s, u"user=bob"_s, u"host"_s, path});
    QCOMPARE(tool.waitForEnd(), 1);
    QCOMPARE(tool.errors, "curlftpfs: " + message);
    QCOMPARE(scene.rclone.runs(), 0);
}

QTEST_GUILESS_MAIN(CurlftpfsAdapterSystemTest)

#include "tst_curlftpfsadapter_system.moc"
