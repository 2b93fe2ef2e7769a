// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/checksmbshareauthjob.h"
#include "jobs/mountsmburljob.h"
#include "jobs/updatesmbentryjob.h"
#include "real/realmounttest.h"
#include "real/smbserver.h"
#include "vfs/standardpaths.h"

#include <QElapsedTimer>

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

namespace {

const QString resource = QStringLiteral("[smb  server.test private] ");
const QString firstAsked = QStringLiteral("ask ") + resource + QStringLiteral("||");

QString askedAgain(const QString& title, const QString& user)
{
    return u"retry %1%2|%2 for server.test/private|%3"_s.arg(resource, title, user);
}

} // namespace

/// Samba shares of Debian's server, tried with Debian's smbclient.
class RealSmbTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void nameIsResolved();
    void judgesShares_data();
    void judgesShares();
    void missingShareIsNamed();
    void mountsWithoutQuestion_data();
    void mountsWithoutQuestion();
    void logsIn_data();
    void logsIn();
    void givenUp_data();
    void givenUp();
    void emptyPasswordIsRefused();
    void shareIsNoCommand();
    void urlIsNoCommand();
    void cleanupTestCase();

private:
    static QString alicesPassword()
    {
        return QString::fromLatin1(Sandbox::alice.password);
    }
    static Auth::Answer answer(const QString& user, const char* password)
    {
        return Auth::password(QString::fromLatin1(password), user);
    }

    /// Everything happens inside start().
    static void startToEnd(MountSmbURLJob* job)
    {
        QSignalSpy finished(job, &Job::finished);
        job->start();
        QCOMPARE(finished.count(), 1);
    }

    bool m_passwordWasSeen = false;
};

void RealSmbTest::initTestCase()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    QVERIFY2(
        startVfs(R"({"values": {
            "SmbBrowser.smbNetworkLocalPath": "/net/smb",
            "SmbBrowser.workgroups": ["SANDBOX"],
            "SmbBrowser.hosts SANDBOX": ["server.test"],
            "SmbBrowser.shares server.test SANDBOX": {"public -Tc .profile name.txt": ""}}})"),
        qPrintable(service.errorString()));
}

void RealSmbTest::init()
{
    SKIP_WITHOUT_SANDBOX();
    startScene();
}

void RealSmbTest::cleanup()
{
    if (!Sandbox::isEntered()) {
        return;
    }
    // The one place where a password may stand.
    QStringList findings = SecretWatch::takeFindings();
    m_passwordWasSeen = findings.removeAll(u"smbclient environ"_s) > 0 || m_passwordWasSeen;
    QCOMPARE(findings, QStringList());
    QVERIFY(processesNamed("smbclient").isEmpty());
    endScene();
}

void RealSmbTest::nameIsResolved()
{
    QCOMPARE(StandardPaths::toCanonicalHostName(u"server"_s), u"server.test"_s);
}

void RealSmbTest::judgesShares_data()
{
    QTest::addColumn<QString>("share");
    QTest::addColumn<QString>("user");
    QTest::addColumn<QString>("password");
    QTest::addColumn<int>("verdict");
    const QString publicShare = u"public"_s;
    const QString privateShare = u"private"_s;
    const QString wrong = QString::fromLatin1(Sandbox::wrongPassword);
    const QString bobs = QString::fromLatin1(Sandbox::bob.password);
    QTest::newRow("guest") << publicShare << QString() << QString() << 0;
    QTest::newRow("user at the guests'") << publicShare << u"alice"_s << alicesPassword() << 0;
    QTest::newRow("refused guest") << privateShare << QString() << QString() << 1;
    QTest::newRow("guest with a password") << privateShare << QString() << alicesPassword() << 1;
    QTest::newRow("user") << privateShare << u"alice"_s << alicesPassword() << 0;
    QTest::newRow("user of the domain")
        << privateShare << u"SANDBOX/alice"_s << alicesPassword() << 0;
    QTest::newRow("wrong password") << privateShare << u"alice"_s << wrong << 2;
    QTest::newRow("wrong user") << privateShare << u"bob"_s << bobs << 1;
    QTest::newRow("unknown user") << privateShare << u"carol"_s << wrong << 1;
    QTest::newRow("missing share") << u"missing"_s << QString() << QString() << 0;
}

void RealSmbTest::judgesShares()
{
    QFETCH(QString, share);
    QFETCH(QString, user);
    QFETCH(QString, password);
    QFETCH(int, verdict);
    CheckSmbShareAuthJob job(auth, share, u"server.test"_s, QString());
    QCOMPARE(job.checkAuth(user, password), verdict);
    QVERIFY(job.checkKerberosAuth() != 0);
    QCOMPARE(job.hostForKerberos(), QString());
}

// What a missing share is told by, and no test of the job knows.
void RealSmbTest::missingShareIsNamed()
{
    QProcess process;
    process.start(u"smbclient"_s, {u"//server.test/missing"_s, u"-U"_s, u"%"_s, u"-c"_s, u"du"_s});
    QVERIFY(process.waitForFinished());
    QCOMPARE(process.exitCode(), 1);
    QCOMPARE(
        process.readAllStandardOutput(),
        QByteArray("tree connect failed: NT_STATUS_BAD_NETWORK_NAME\n"));
}

void RealSmbTest::mountsWithoutQuestion_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("localPath");
    QTest::newRow("guest") << u"smb://server.test/public"_s << u"/net/smb/server.test/public/"_s;
    QTest::newRow("file") << u"smb://server.test/public/papers/draft.txt"_s
                          << u"/net/smb/server.test/public/papers/draft.txt"_s;
    QTest::newRow("by another name") << u"smb://server/public"_s << u"/net/smb/server/public/"_s;
    // What is no refusal reads as success.
    QTest::newRow("missing share")
        << u"smb://server.test/missing"_s << u"/net/smb/server.test/missing/"_s;
    QTest::newRow("nobody listens")
        << u"smb://closed.test/public"_s << u"/net/smb/closed.test/public/"_s;
    QTest::newRow("unknown host") << u"smb://unknown.test/public"_s
                                  << u"/net/smb/unknown.test/public/"_s;
}

void RealSmbTest::mountsWithoutQuestion()
{
    QFETCH(QString, url);
    QFETCH(QString, localPath);
    const auto job = makeJob<MountSmbURLJob>(url);
    startToEnd(job.get());
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), localPath);
}

void RealSmbTest::logsIn_data()
{
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    using Answers = QList<Auth::Answer>;
    const QString alice = u"alice"_s;
    const QString denied = u"Access denied"_s;
    const QString failure = u"Logon failure"_s;
    const auto right = answer(alice, Sandbox::alice.password);
    const auto wrong = answer(alice, Sandbox::wrongPassword);
    const QString accepted = u"accepted"_s;
    const QString rejected = u"rejected alice"_s;
    QTest::newRow("right") << Answers{right} << QStringList(firstAsked);
    QTest::newRow("wrong, then right")
        << Answers{wrong, right}
        << QStringList{firstAsked, rejected, askedAgain(failure, alice), accepted};
    QTest::newRow("wrong twice") << Answers{wrong, wrong, right}
                                 << QStringList{firstAsked,
                                                rejected,
                                                askedAgain(failure, alice),
                                                rejected,
                                                askedAgain(failure, alice),
                                                accepted};
    QTest::newRow("wrong user, then right")
        << Answers{answer(u"bob"_s, Sandbox::bob.password), right}
        << QStringList{firstAsked, u"rejected bob"_s, askedAgain(denied, u"bob"_s), accepted};
}

void RealSmbTest::logsIn()
{
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    auth->answers = answers;
    const auto job = makeJob<MountSmbURLJob>(u"smb://server.test/private/name.txt"_s);
    startToEnd(job.get());
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/net/smb/server.test/private/name.txt"_s);
}

void RealSmbTest::givenUp_data()
{
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    using Answers = QList<Auth::Answer>;
    // Asked once more, with why the guest was refused.
    QTest::newRow("at once") << Answers{Auth::cancel(), Auth::cancel()}
                             << QStringList{
                                    firstAsked,
                                    askedAgain(u"Access denied"_s, QString()) + u" +cancelled"_s};
    QTest::newRow("after a refusal")
        << Answers{answer(u"alice"_s, Sandbox::wrongPassword), Auth::cancel()}
        << QStringList{firstAsked, u"rejected alice"_s, askedAgain(u"Logon failure"_s, u"alice"_s)};
}

void RealSmbTest::givenUp()
{
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    auth->answers = answers;
    const auto job = makeJob<MountSmbURLJob>(u"smb://server.test/private"_s);
    startToEnd(job.get());
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Login cancelled"_s);
    QCOMPARE(job->localPath(), QString());
}

// Without a password smbclient asks for one, and learns at once that nobody answers.
void RealSmbTest::emptyPasswordIsRefused()
{
    auth->answers = {answer(u"alice"_s, ""), Auth::cancel()};
    const auto job = makeJob<MountSmbURLJob>(u"smb://server.test/private"_s);
    QElapsedTimer timer;
    timer.start();
    startToEnd(job.get());
    QVERIFY(timer.elapsed() < 20000); // A run that nobody ends takes 30 seconds.
    QCOMPARE(auth->calls.mid(0, 2), QStringList({firstAsked, u"rejected alice"_s}));
    QCOMPARE(job->error(), 2);
}

// The server advertises a share that has smbclient write a file, for whoever splits the name.
void RealSmbTest::shareIsNoCommand()
{
    const QString name = u"public -Tc .profile name.txt"_s;
    const QString profile = QDir::home().filePath(u".profile"_s);
    const QByteArray mine = "mine";
    QFile file(profile);
    QVERIFY(file.open(QIODevice::WriteOnly) && file.write(mine) == mine.size());
    file.close();
    QCOMPARE(QDir::currentPath(), QDir::homePath());
    QProcess list;
    list.start(u"smbclient"_s, {u"-L"_s, u"server.test"_s, u"-U"_s, u"%"_s, u"-g"_s});
    QVERIFY(list.waitForFinished());
    QVERIFY(list.readAllStandardOutput().contains("Disk|" + name.toLatin1() + '|'));

    vfs->childs(vfs->sambaNetworkEntry());
    vfs->childs(vfs->entry(u"Samba/SANDBOX"_s));
    vfs->childs(vfs->entry(u"Samba/SANDBOX/server.test"_s));
    const Entry share = vfs->placeBase()->placeEntry(u"Samba/SANDBOX/server.test/"_s + name);
    QVERIFY(share.isSambaSharePlace());
    UpdateSmbEntryJob job(auth, share);
    job.setDeleteOnFinish(false);
    service->takeCalls();
    job.start();
    QCOMPARE(service->takeCalls().filter(u"shareLocalPath"_s).size(), 1);
    QCOMPARE(job.error(), 0);
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(fileContents(profile), mine);

    // What the words would have done.
    QProcess trap;
    trap.start(
        u"smbclient"_s, QStringList(u"//server.test/"_s + name.section(u' ', 0, 0)) +
                            name.split(u' ').mid(1) + QStringList({u"-U"_s, u"%"_s}));
    QVERIFY(trap.waitForFinished());
    QVERIFY(fileContents(profile).contains("name.txt")); // An archive.
    QVERIFY(QFile::remove(profile));
}

void RealSmbTest::urlIsNoCommand()
{
    // The last quote swallows what the job has behind it.
    const auto job =
        makeJob<MountSmbURLJob>(u"smb://server.test/public -N -c \"get name.txt stolen\" \""_s);
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QVERIFY(!QDir::home().exists(u"stolen"_s));
}

void RealSmbTest::cleanupTestCase()
{
    QVERIFY(m_passwordWasSeen || !Sandbox::isEntered());
}

int main(int argc, char** argv)
{
    Sandbox sandbox({"/usr/bin/smbclient"});
    sandbox.addServer(std::make_unique<SecretWatch>());
    sandbox.addServer(std::make_unique<SmbServer>());
    return sandbox.run([&] { return runSandboxTests<RealSmbTest>(argc, argv); });
}

#include "tst_real_smb.moc"
