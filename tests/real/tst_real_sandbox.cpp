// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/fuse.h"
#include "real/sandbox.h"
#include "real/secretwatch.h"

#include <QDir>
#include <QFile>
#include <QProcess>
#include <QProcessEnvironment>
#include <QTemporaryDir>
#include <QTest>

#include <fcntl.h>
#include <netdb.h>
#include <pwd.h>
#include <sys/prctl.h>
#include <unistd.h>

using namespace VeyFM;

/// What the other tests of this folder rely on.
class RealSandboxTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void runsAsAnOrdinaryUser();
    void isInGroupFuse();
    void opensTheFuseDevice();
    void hasItsOwnProcesses();
    void hasItsOwnNetwork();
    void writesIntoMemoryAlone();
    void passwordsAreSeen_data();
    void passwordsAreSeen();
    void passwordsInFilesAreFound();
    void knowsItsHosts_data();
    void knowsItsHosts();
};

void RealSandboxTest::init()
{
    SKIP_WITHOUT_SANDBOX();
}

void RealSandboxTest::runsAsAnOrdinaryUser()
{
    QCOMPARE(::getuid(), Sandbox::tester.id);
    QCOMPARE(::geteuid(), Sandbox::tester.id);
    const passwd* const account = ::getpwuid(::getuid());
    QVERIFY(account);
    QCOMPARE(QFile::decodeName(account->pw_dir), QDir::homePath());
    QVERIFY(::open("/etc/shadow", O_RDONLY) < 0);
    QVERIFY(::seteuid(0) != 0);
}

void RealSandboxTest::isInGroupFuse()
{
    QVERIFY(Fuse::isInFuseGroup());
}

void RealSandboxTest::opensTheFuseDevice()
{
    QFile device(QStringLiteral("/dev/fuse"));
    QVERIFY(device.open(QIODevice::ReadWrite | QIODevice::Unbuffered | QIODevice::ExistingOnly));
}

void RealSandboxTest::hasItsOwnProcesses()
{
    // The first one, the watch and this.
    const QStringList processes =
        QDir(QStringLiteral("/proc")).entryList({QStringLiteral("[0-9]*")}, QDir::Dirs);
    QCOMPARE(processes.size(), 3);
    QCOMPARE(processes.first(), QStringLiteral("1"));
    QCOMPARE(processes.last(), QString::number(::getpid()));
    QCOMPARE(::prctl(PR_GET_DUMPABLE), 1);
}

void RealSandboxTest::hasItsOwnNetwork()
{
    QFile devices(QStringLiteral("/proc/self/net/dev"));
    QVERIFY(devices.open(QIODevice::ReadOnly));
    const QByteArrayList lines = devices.readAll().trimmed().split('\n').mid(2);
    QCOMPARE(lines.size(), 1);
    QVERIFY(lines.first().trimmed().startsWith("lo:"));
}

void RealSandboxTest::writesIntoMemoryAlone()
{
    const QTemporaryDir temporary;
    QVERIFY(temporary.isValid());
    QVERIFY(temporary.path().startsWith(Sandbox::directory()));
    QVERIFY(QDir::homePath().startsWith(Sandbox::directory()));
    QVERIFY(QDir::home().mkpath(QStringLiteral(".config")));
    QVERIFY(!QFileInfo(Sandbox::home(Sandbox::alice)).isWritable());
}

void RealSandboxTest::passwordsAreSeen_data()
{
    QTest::addColumn<QString>("argument");
    QTest::addColumn<QString>("variable");
    QTest::addColumn<QStringList>("findings");
    const QString password = QString::fromLatin1(Sandbox::alice.password);
    const QString argument = QStringLiteral("sh cmdline");
    const QString variable = QStringLiteral("sh environ");
    QTest::newRow("nowhere") << QString() << QString() << QStringList();
    QTest::newRow("argument") << password << QString() << QStringList(argument);
    QTest::newRow("environment") << QString() << password << QStringList(variable);
    QTest::newRow("in something") << QStringLiteral("pass=") + password
                                  << QStringLiteral("%1@host").arg(password)
                                  << QStringList({argument, variable});
}

void RealSandboxTest::passwordsAreSeen()
{
    QFETCH(QString, argument);
    QFETCH(QString, variable);
    QFETCH(QStringList, findings);
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QStringLiteral("PASS"), variable);
    process.setProcessEnvironment(environment);
    process.start(
        QStringLiteral("sh"), {QStringLiteral("-c"), QStringLiteral("read line"), argument});
    QVERIFY(process.waitForStarted());
    QCOMPARE(SecretWatch::takeFindings(), findings);
    process.kill();
    process.waitForFinished();
    SecretWatch::takeFindings();
    QCOMPARE(SecretWatch::takeFindings(), QStringList());
}

void RealSandboxTest::passwordsInFilesAreFound()
{
    const QTemporaryDir temporary;
    QFile file(temporary.filePath(QStringLiteral("x")));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write(QByteArray("a") + Sandbox::bob.password + "b");
    file.close();
    QCOMPARE(SecretWatch::findFiles(), QStringList(file.fileName()));
    QVERIFY(file.remove());
    QCOMPARE(SecretWatch::findFiles(), QStringList());
}

void RealSandboxTest::knowsItsHosts_data()
{
    QTest::addColumn<QByteArray>("host");
    QTest::addColumn<bool>("known");
    QTest::newRow("server") << QByteArray(Sandbox::serverHost) << true;
    QTest::newRow("other") << QByteArray(Sandbox::otherHost) << true;
    QTest::newRow("closed") << QByteArray(Sandbox::closedHost) << true;
    QTest::newRow("unknown") << QByteArray("unknown.test") << false;
}

void RealSandboxTest::knowsItsHosts()
{
    QFETCH(QByteArray, host);
    QFETCH(bool, known);
    addrinfo* found = nullptr;
    const int failure = ::getaddrinfo(host.constData(), nullptr, nullptr, &found);
    if (found) {
        ::freeaddrinfo(found);
    }
    QCOMPARE(failure, known ? 0 : EAI_NONAME);
}

int main(int argc, char** argv)
{
    Sandbox sandbox;
    sandbox.addServer(std::make_unique<SecretWatch>());
    return sandbox.run([&] { return runSandboxTests<RealSandboxTest>(argc, argv); });
}

#include "tst_real_sandbox.moc"
