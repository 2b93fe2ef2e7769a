// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/realftptest.h"

#include <fcntl.h>
#include <unistd.h>

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

namespace {

const QString accepted = QStringLiteral("accepted");

QString asked(const QString& user)
{
    return u"retry [ftp  server.test ] Access denied|Enter host password for user:|%1"_s.arg(user);
}

// How many connections to FTP servers are not closed by them, as the kernel has it: "remote port
// 21, established".
int openConnections()
{
    int count = 0;
    const QList<QByteArray> lines = fileContents(u"/proc/self/net/tcp"_s).split('\n');
    for (const QByteArray& line : lines) {
        const QList<QByteArray> fields = line.simplified().split(' ');
        count += fields.value(2).endsWith(":0015") && fields.value(3) == "01" ? 1 : 0;
    }
    return count;
}

// What a process holds in memory as files.
QList<QByteArray> filesInMemory(int process)
{
    QList<QByteArray> result;
    const QDir folder(u"/proc/%1/fd"_s.arg(process));
    const QStringList names = folder.entryList(QDir::Files | QDir::System);
    for (const QString& name : names) {
        if (QFile::symLinkTarget(folder.filePath(name)).startsWith(u"/memfd:"_s)) {
            result.append(fileContents(folder.filePath(name)));
        }
    }
    return result;
}

// Whether a whole file could be written, which is known when it is closed.
bool writesFile(const QString& path, const QByteArray& content, int flags = O_CREAT | O_TRUNC)
{
    const int fd = ::open(QFile::encodeName(path).constData(), O_WRONLY | O_CLOEXEC | flags, 0644);
    const bool written =
        fd >= 0 && ::write(fd, content.constData(), size_t(content.size())) == content.size();
    return fd >= 0 && ::close(fd) == 0 && written;
}

} // namespace

/// FTP mounts from pyftpdlib, through the curlftpfs that does its work with Debian's rclone.
class RealFtpTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void anonymous();
    void givenUp_data();
    void givenUp();
    void cannotConnect_data();
    void cannotConnect();
    void twoPathsShareAMount();
    void unmountEndsTheTool();
    void passwordIsNowhere();
    void logsInAgain();
    void writes();
    void failedWriteIsTold();
    void onlyWholeFilesAreWritten();

private:
    static bool finishes(MountFtpURLJob* job)
    {
        QSignalSpy finished(job, &Job::finished);
        job->start();
        return (finished.count() == 1 || finished.wait(20000)) && finished.count() == 1;
    }

    /// Mounts alice's home; its local path.
    QString mountAlice(const char* host = Sandbox::serverHost)
    {
        auth->answers = {password(Sandbox::alice)};
        const auto job = makeJob<MountFtpURLJob>(u"ftp://alice@%1/"_s.arg(QLatin1String(host)));
        return finishes(job.get()) && job->error() == 0 ? job->localPath() : u"/nonexistent"_s;
    }

    static QStringList directories()
    {
        return QDir(mountDir(u"/ftp"_s)).entryList(QDir::AllEntries | QDir::NoDotAndDotDot);
    }
};

void RealFtpTest::initTestCase()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    useCurlftpfsAdapter();
    QVERIFY2(startVfs(R"({"remember": true})"), qPrintable(service.errorString()));
}

void RealFtpTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    startScene();
}

void RealFtpTest::cleanup()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    endScene();
    verifyNoRclone();
}

void RealFtpTest::anonymous()
{
    const auto job = makeJob<MountFtpURLJob>(u"ftp://other.test/papers"_s);
    QVERIFY(finishes(job.get()));
    QCOMPARE(job->errorString(), QString());
    QCOMPARE(auth->calls, QStringList(accepted));
    QCOMPARE(job->localPath(), mountDir(u"/ftp/other.test//papers"_s));
    QCOMPARE(QDir(job->localPath()).entryList(QDir::Files), QStringList(u"draft.txt"_s));
}

void RealFtpTest::givenUp_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    using Answers = QList<Auth::Answer>;
    const QString alice = u"alice"_s;
    const QString url = u"ftp://alice@server.test/"_s;
    QTest::newRow("at the prompt") << url << Answers{Auth::cancel()} << QStringList{asked(alice)};
    QTest::newRow("after a refusal")
        << url << Answers{wrongPassword(), Auth::cancel()}
        << QStringList{asked(alice), u"rejected alice"_s, asked(alice)};
    QTest::newRow("no visitors") << u"ftp://server.test/"_s << Answers{Auth::cancel()}
                                 << QStringList{asked(u""_s)};
}

void RealFtpTest::givenUp()
{
    QFETCH(QString, url);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    auth->answers = answers;
    const auto job = makeJob<MountFtpURLJob>(url);
    QVERIFY(finishes(job.get()));
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Accessing ftp resource was cancelled"_s);
    QCOMPARE(auth->calls, calls);
    QTRY_COMPARE(directories(), QStringList());
    QCOMPARE(recordedMounts(), QStringList());
}

void RealFtpTest::cannotConnect_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QList<Auth::Answer>>("answers");
    using Answers = QList<Auth::Answer>;
    QTest::newRow("nobody listens") << u"ftp://closed.test/"_s << Answers{};
    QTest::newRow("nobody listens to a user")
        << u"ftp://alice@closed.test/"_s << Answers{password(Sandbox::alice)};
    QTest::newRow("unknown host") << u"ftp://unknown.test/"_s << Answers{};
}

void RealFtpTest::cannotConnect()
{
    QFETCH(QString, url);
    QFETCH(QList<Auth::Answer>, answers);
    auth->answers = answers;
    const auto job = makeJob<MountFtpURLJob>(url);
    QVERIFY(finishes(job.get()));
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Mounting ftp resource failed"_s);
    QVERIFY(!auth->calls.contains(accepted));
    QCOMPARE(directories(), QStringList());
    QCOMPARE(recordedMounts(), QStringList());
}

void RealFtpTest::twoPathsShareAMount()
{
    auth->answers = {password(Sandbox::alice)};
    const auto folder = makeJob<MountFtpURLJob>(u"ftp://alice@server.test/papers"_s);
    QVERIFY(finishes(folder.get()));
    QCOMPARE(folder->error(), 0);
    const auto file = makeJob<MountFtpURLJob>(u"ftp://alice@server.test/name.txt"_s);
    QVERIFY(finishes(file.get()));
    QCOMPARE(file->error(), 0);
    QCOMPARE(auth->calls, QStringList({asked(u"alice"_s), accepted}));
    QCOMPARE(QDir(folder->localPath()).entryList(QDir::Files), QStringList(u"draft.txt"_s));
    QCOMPARE(fileContents(file->localPath()), QByteArray("alice"));
    QCOMPARE(mountDirs().size(), 1);
    QCOMPARE(processesNamed("rclone").size(), 1);
}

void RealFtpTest::unmountEndsTheTool()
{
    const QString path = mountAlice();
    const QList<int> tools = processesNamed("rclone");
    QCOMPARE(tools.size(), 1);
    // Apart from whoever started it: no session, terminal or folder in common.
    QVERIFY(::getsid(tools.first()) == tools.first());
    const QString process = u"/proc/%1"_s.arg(tools.first());
    QCOMPARE(QFile::symLinkTarget(process + u"/cwd"_s), u"/"_s);
    QCOMPARE(QFile::symLinkTarget(process + u"/fd/0"_s), u"/dev/null"_s);
    QCOMPARE(QFile::symLinkTarget(process + u"/fd/1"_s), u"/dev/null"_s);
    QCOMPARE(fileContents(path + u"name.txt"_s), QByteArray("alice"));
    QCOMPARE(QProcess::execute(u"fusermount3"_s, {u"-u"_s, mountDirs().value(0)}), 0);
    QTRY_VERIFY(processesNamed("rclone").isEmpty());
    QVERIFY(QDir(mountDir(u"/ftp"_s)).rmdir(u"alice@server.test"_s));
}

void RealFtpTest::passwordIsNowhere()
{
    const QString path = mountAlice();
    QCOMPARE(fileContents(path + u"name.txt"_s), QByteArray("alice"));
    const QList<int> tools = processesNamed("rclone");
    QCOMPARE(tools.size(), 1);
    // Where it came from, and where rclone's words went, which has no end that could be read.
    QCOMPARE(filesInMemory(tools.first()), QList<QByteArray>({QByteArray(), QByteArray()}));
    QCOMPARE(SecretWatch::findFiles(), QStringList());
    QCOMPARE(SecretWatch::takeFindings(), QStringList());
}

// The password is asked for once, though the server ends the connection and rclone can't read it
// again. The first access meets the dead connection.
void RealFtpTest::logsInAgain()
{
    const QString path = mountAlice(Sandbox::otherHost);
    QCOMPARE(fileContents(path + u"name.txt"_s), QByteArray("alice"));
    QTRY_COMPARE(openConnections(), 0);
    QTRY_COMPARE(QDir(path + u"papers"_s).entryList(QDir::Files), QStringList(u"draft.txt"_s));
    QCOMPARE(fileContents(path + u"name.txt"_s), QByteArray("alice"));
}

void RealFtpTest::writes()
{
    const QString path = mountAlice();
    const QString home = Sandbox::home(Sandbox::alice) + QLatin1Char('/');
    const QByteArray large(3000000, 'x');
    QVERIFY(writesFile(path + u"new.bin"_s, large));
    QCOMPARE(fileContents(home + u"new.bin"_s), large);
    QVERIFY(writesFile(path + u"new.bin"_s, "short"));
    QCOMPARE(fileContents(home + u"new.bin"_s), QByteArray("short"));
    QVERIFY(QDir(path).mkdir(u"folder"_s));
    QVERIFY(QFile::rename(path + u"new.bin"_s, path + u"folder/old.bin"_s));
    QCOMPARE(fileContents(home + u"folder/old.bin"_s), QByteArray("short"));
    // What the server has changed is seen within seconds.
    QCOMPARE(QDir(path + u"papers"_s).entryList(QDir::Files), QStringList(u"draft.txt"_s));
    QVERIFY(QFile::remove(path + u"folder/old.bin"_s));
    QVERIFY(QDir(path).rmdir(u"folder"_s));
    QVERIFY(!QFile::exists(home + u"folder"_s));
}

void RealFtpTest::failedWriteIsTold()
{
    const auto job = makeJob<MountFtpURLJob>(u"ftp://other.test/"_s);
    QVERIFY(finishes(job.get()));
    QCOMPARE(job->error(), 0);
    QVERIFY(!writesFile(job->localPath() + u"new.txt"_s, "new"));
    QVERIFY(!QFile::exists(Sandbox::home(Sandbox::bob) + u"/new.txt"_s));
}

void RealFtpTest::onlyWholeFilesAreWritten()
{
    const QString path = mountAlice();
    QVERIFY(!writesFile(path + u"name.txt"_s, " and more", O_APPEND));
    QCOMPARE(fileContents(Sandbox::home(Sandbox::alice) + u"/name.txt"_s), QByteArray("alice"));
}

int main(int argc, char** argv)
{
    FtpSandbox sandbox;
    return sandbox.run([&] { return runSandboxTests<RealFtpTest>(argc, argv); });
}

#include "tst_real_ftp.moc"
