// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mounturljob.h"
#include "support/mountjobtest.h"

#include <QDirIterator>
#include <QLoggingCategory>

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<QByteArrayList>)

namespace {

const QString secret = QStringLiteral("c0rrect-h0rse");

const QByteArrayList ftpAsks = {"err Enter host password for user 'bob':", "read"};
const QByteArrayList sftpAsks = {"echo off", "out bob@host's password: ", "read", "echo on"};
const QByteArrayList refused = {"out session setup failed: NT_STATUS_LOGON_FAILURE\\n", "exit 1"};
const QByteArrayList listed = {"out Total number of bytes: 12\\n"};

QStringList logged;

void collect(QtMsgType, const QMessageLogContext& context, const QString& message)
{
    logged.append(QString::fromLatin1(context.category) + QLatin1Char(' ') + message);
}

} // namespace

/// Passwords reach the tool that asks, and nothing else; URLs start the one tool of their scheme,
/// as one argument each.
class MountSecretsTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void passwordReachesTheToolAlone_data();
    void passwordReachesTheToolAlone();
    void oddNamesAreOneArgument_data();
    void oddNamesAreOneArgument();

private:
    void runToEnd(MountURLJob* job)
    {
        QSignalSpy finished(job, &Job::finished);
        job->start();
        QVERIFY(!finished.isEmpty() || finished.wait(20000));
    }

    /// The files below the home that hold a text.
    QStringList filesWith(const QString& text) const
    {
        QStringList found;
        QDirIterator files(
            scene.home(), QDir::Files | QDir::Hidden | QDir::System, QDirIterator::Subdirectories);
        while (files.hasNext()) {
            QFile file(files.next());
            if (!file.open(QIODevice::ReadOnly) || file.readAll().contains(text.toUtf8())) {
                found.append(file.fileName());
            }
        }
        return found;
    }
};

void MountSecretsTest::initTestCase()
{
    startVfsInGroup(R"({"values": {"SmbBrowser.smbNetworkLocalPath": "/net"}})");
}

void MountSecretsTest::cleanup()
{
    endScene();
}

void MountSecretsTest::passwordReachesTheToolAlone_data()
{
    QTest::addColumn<QByteArray>("toolName");
    QTest::addColumn<QString>("url");
    QTest::addColumn<QList<QByteArrayList>>("plays");
    QTest::addColumn<QByteArray>("input");

    using Plays = QList<QByteArrayList>;
    const QByteArray typed = secret.toUtf8() + '\n';
    QTest::newRow("sftp") << QByteArray("sshfs") << u"sftp://bob@host/a"_s << Plays{sftpAsks}
                          << typed;
    QTest::newRow("ftp") << QByteArray("curlftpfs") << u"ftp://bob@host/a"_s << Plays{ftpAsks}
                         << typed;
    // No ticket, no guest, then the password.
    QTest::newRow("smb") << QByteArray("smbclient") << u"smb://localhost/share"_s
                         << Plays{refused, refused, listed} << QByteArray();
}

void MountSecretsTest::passwordReachesTheToolAlone()
{
    QFETCH(QByteArray, toolName);
    QFETCH(QString, url);
    QFETCH(QList<QByteArrayList>, plays);
    QFETCH(QByteArray, input);
    startScene(toolName);
    for (const QByteArrayList& play : plays) {
        tool->expect(play);
    }
    auth->answers = {Auth::password(secret, u"bob"_s)};

    QLoggingCategory::setFilterRules(u"*=true"_s);
    logged.clear();
    const QtMessageHandler before = qInstallMessageHandler(collect);
    qDebug("heard"); // The proof that the log is listened to.
    const auto job = makeJob<MountURLJob>(url);
    runToEnd(job.get());
    qInstallMessageHandler(before);
    QLoggingCategory::setFilterRules(QString());
    QCOMPARE(job->error(), 0);

    const bool isSmb = toolName == "smbclient";
    const QByteArray bytes = secret.toUtf8();
    const int last = plays.size();
    QCOMPARE(tool->input(last), input);
    for (int run = 1; run <= last; ++run) {
        QVERIFY(!tool->commandLine(run).isEmpty());
        QVERIFY(!tool->commandLine(run).contains(bytes));
        QByteArrayList environment = tool->environment(run);
        QVERIFY(!environment.isEmpty());
        QCOMPARE(environment.removeAll("PASSWD=" + bytes), isSmb && run == last ? 1 : 0);
        QVERIFY(!environment.join('\n').contains(bytes));
    }
    QVERIFY(logged.filter(u"heard"_s).size() == 1);
    QCOMPARE(logged.filter(secret), QStringList());
    QCOMPARE(service->takeCalls().filter(secret), QStringList());
    QCOMPARE(filesWith(secret), QStringList());
    QVERIFY(!qEnvironmentVariableIsSet("PASSWD"));
}

void MountSecretsTest::oddNamesAreOneArgument_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QString>("user");
    const QStringList users = {
        u"a b"_s,     u"a\"b'c`d"_s,         u";touch x;$(touch y)|touch z&"_s,
        u"a\\b"_s,    u"a -o allow_other"_s, u".."_s,
        u"$HOME~*?"_s};
    for (const QString& kind : {u"sftp"_s, u"ftp"_s}) {
        for (const QString& user : users) {
            QTest::newRow(qPrintable(kind + u' ' + user)) << kind << user;
        }
    }
}

void MountSecretsTest::oddNamesAreOneArgument()
{
    QFETCH(QString, kind);
    QFETCH(QString, user);
    const bool isSftp = kind == QLatin1String("sftp");
    startScene(isSftp ? "sshfs" : "curlftpfs");
    tool->expect({});
    // Any other program is not to be found; the stand-in puts the rest back.
    qputenv("PATH", qgetenv("PATH").split(':').first());
    const QString url =
        u"%1://%2@host/%2"_s.arg(kind, QString::fromLatin1(QUrl::toPercentEncoding(user)));
    const auto job = makeJob<MountURLJob>(url);
    runToEnd(job.get());
    QCOMPARE(job->error(), 0);

    const QByteArray name = user.toUtf8();
    const QByteArray directory = mountDir(u"/%1/%2@host"_s.arg(kind, user)).toUtf8();
    const QByteArrayList sshfs = {name + "@host:/", directory, "-o", "NumberOfPasswordPrompts=1"};
    const QByteArrayList curlftpfs = {"-o", "user=" + name, "host", directory};
    QCOMPARE(tool->arguments(1), isSftp ? sshfs : curlftpfs);

    // One directory, straight below that of its kind, and nothing else anywhere.
    const QDir::Filters all = QDir::AllEntries | QDir::Hidden | QDir::NoDotAndDotDot;
    QCOMPARE(QDir(mountDir(QString())).entryList(all), QStringList(kind));
    QCOMPARE(QDir(mountDir(u'/' + kind)).entryList(all), QStringList(user + u"@host"_s));
}

QTEST_GUILESS_MAIN(MountSecretsTest)
#include "tst_mountsecrets.moc"
