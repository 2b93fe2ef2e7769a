// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/fuse.h"
#include "jobs/checksmbshareauthjob.h"
#include "support/outsidegroup.h"
#include "support/scriptedauthenticator.h"
#include "support/servicescene.h"
#include "support/standin.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<QByteArrayList>)
Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

namespace {

using Auth = ScriptedAuthenticator;

// The host is written so that its canonical name differs.
const QString host = QStringLiteral("LOCALHOST");
const QString canonicalHost = QStringLiteral("localhost");

const QByteArrayList listed = {"out \\t65535 blocks of size 1024\\nTotal number of bytes: 12\\n"};
const QByteArrayList noTicket = {"out gensec_spnego_client_negTokenInit_step: failed\\n", "exit 1"};
const QByteArrayList denied = {"out tree connect failed: NT_STATUS_ACCESS_DENIED\\n", "exit 1"};
const QByteArrayList failure = {"out session setup: NT_STATUS_LOGON_FAILURE\\n", "exit 1"};

QByteArrayList passwords(const QByteArrayList& environment)
{
    QByteArrayList result;
    for (const QByteArray& variable : environment) {
        if (variable.startsWith("PASSWD=")) {
            result.append(variable.mid(7));
        }
    }
    return result;
}

} // namespace

/// The proof of access to a Samba share, with a scripted `smbclient`.
class CheckSmbShareAuthJobTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void partsLiveInTheAuthenticator();
    void resourcePath();
    void ticketWorks();
    void guestWorks();
    void kerberosVerdict_data();
    void kerberosVerdict();
    void verdict_data();
    void verdict();
    void passwordGoesIntoTheEnvironment();
    void userWithoutAPassword();
    void passwordWithoutAUserIsDropped();
    void commandIsSplitIntoWords_data();
    void commandIsSplitIntoWords();
    void namesAreNoOptions_data();
    void namesAreNoOptions();
    void usersAreNoOptions_data();
    void usersAreNoOptions();
    void conversation_data();
    void conversation();
    void triesWithoutBound();
    void missingToolReadsAsAccess();
    void execNeverRunsItsLoop();
    void outsideTheGroup();

private:
    std::unique_ptr<CheckSmbShareAuthJob>
    makeJob(const QString& share = u"share"_s, const QString& workgroup = QString())
    {
        auto job = std::make_unique<CheckSmbShareAuthJob>(m_auth, share, host, workgroup);
        job->setDeleteOnFinish(false);
        return job;
    }

    std::unique_ptr<StandIn> m_smbclient;
    QSharedPointer<ScriptedAuthenticator> m_auth;
};

void CheckSmbShareAuthJobTest::initTestCase()
{
    if (!Fuse::isInFuseGroup()) {
        QSKIP("needs root, or a user in the group \"fuse\"");
    }
}

void CheckSmbShareAuthJobTest::init()
{
    m_smbclient.reset(); // The next one builds on the PATH that this one puts back.
    m_smbclient = std::make_unique<StandIn>("smbclient");
    m_auth = QSharedPointer<ScriptedAuthenticator>::create();
}

void CheckSmbShareAuthJobTest::cleanup()
{
    // Every run that was expected came, and no other.
    QCOMPARE(m_smbclient->runs(), m_smbclient->expected());
    QVERIFY(m_auth->answers.isEmpty());
    m_smbclient.reset();
}

void CheckSmbShareAuthJobTest::partsLiveInTheAuthenticator()
{
    const auto job = makeJob(u"share"_s, u"WG"_s);
    QCOMPARE(m_auth->protocol(), u"smb"_s);
    QCOMPARE(m_auth->domain(), u"WG"_s);
    QCOMPARE(m_auth->server(), host);
    QCOMPARE(m_auth->object(), u"share"_s);
    // The job keeps none of them, so that a second one would change what the first is about.
    m_auth->setResource(u"smb"_s, u"W2"_s, u"h2"_s, u"s2"_s);
    QCOMPARE(job->workgroup(), u"W2"_s);
    QCOMPARE(job->host(), u"h2"_s);
    QCOMPARE(job->share(), u"s2"_s);
    QVERIFY(job->hostForKerberos().isEmpty());
}

void CheckSmbShareAuthJobTest::resourcePath()
{
    QCOMPARE(makeJob(u"share"_s)->resourcePath(), u"LOCALHOST/share"_s);
    QCOMPARE(makeJob(u"share"_s, u"WG"_s)->resourcePath(), u"WG;LOCALHOST/share"_s);
    QCOMPARE(makeJob(u"%1"_s, u"%2"_s)->resourcePath(), u"%2;LOCALHOST/%1"_s);
}

void CheckSmbShareAuthJobTest::ticketWorks()
{
    m_smbclient->expect(listed);
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->hostForKerberos(), canonicalHost);
    QCOMPARE(m_smbclient->arguments(1), QByteArrayList({"//localhost/share", "-k", "-c", "du"}));
    QCOMPARE(m_auth->calls, QStringList());
}

void CheckSmbShareAuthJobTest::guestWorks()
{
    m_smbclient->expect(noTicket);
    m_smbclient->expect(listed);
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 0);
    QVERIFY(job->hostForKerberos().isEmpty());
    // The host as it was given, and not its canonical name.
    QCOMPARE(
        m_smbclient->arguments(2), QByteArrayList({"//LOCALHOST/share", "-U", "%", "-c", "du"}));
    QCOMPARE(m_auth->calls, QStringList());
}

void CheckSmbShareAuthJobTest::kerberosVerdict_data()
{
    QTest::addColumn<QByteArrayList>("lines");
    QTest::addColumn<bool>("works");
    QTest::newRow("sign") << listed << true;
    QTest::newRow("sign behind other lines")
        << QByteArrayList({"out first\\n\\nsecond\\n", "out Total number of bytes"}) << true;
    QTest::newRow("sign, but it fails") << listed + QByteArrayList({"exit 1"}) << true;
    QTest::newRow("sign, but it crashes") << listed + QByteArrayList({"kill 9"}) << true;
    QTest::newRow("sign and a refusal")
        << QByteArrayList({"out NT_STATUS_ACCESS_DENIED Total number of bytes\\n"}) << true;
    QTest::newRow("sign on standard error")
        << QByteArrayList({"err Total number of bytes: 1\\n"}) << false;
    QTest::newRow("another case") << QByteArrayList({"out total number of bytes: 1\\n"}) << false;
    QTest::newRow("sign over two lines")
        << QByteArrayList({"out Total number\\n of bytes\\n"}) << false;
    QTest::newRow("silence") << QByteArrayList() << false;
    QTest::newRow("crash") << QByteArrayList({"kill 9"}) << false;
}

void CheckSmbShareAuthJobTest::kerberosVerdict()
{
    QFETCH(QByteArrayList, lines);
    QFETCH(bool, works);
    m_smbclient->expect(lines);
    const auto job = makeJob();
    QCOMPARE(job->checkKerberosAuth() == 0, works);
    QCOMPARE(job->hostForKerberos(), works ? canonicalHost : QString());
}

void CheckSmbShareAuthJobTest::verdict_data()
{
    QTest::addColumn<QByteArrayList>("lines");
    QTest::addColumn<int>("result");
    QTest::newRow("listed") << listed << 0;
    QTest::newRow("silence") << QByteArrayList() << 0;
    QTest::newRow("denied") << denied << 1;
    QTest::newRow("logon failure") << failure << 2;
    QTest::newRow("both in a line")
        << QByteArrayList({"out NT_STATUS_LOGON_FAILURE NT_STATUS_ACCESS_DENIED\\n"}) << 1;
    QTest::newRow("logon failure in the line before")
        << QByteArrayList({"out NT_STATUS_LOGON_FAILURE\\nNT_STATUS_ACCESS_DENIED\\n"}) << 2;
    QTest::newRow("denied, though it lists")
        << QByteArrayList({"out Total number of bytes: 1\\nNT_STATUS_ACCESS_DENIED listing\\n"})
        << 1;
    // Anything else reads as access granted.
    QTest::newRow("on standard error") << QByteArrayList({"err NT_STATUS_ACCESS_DENIED\\n"}) << 0;
    QTest::newRow("another case") << QByteArrayList({"out nt_status_access_denied\\n"}) << 0;
    QTest::newRow("missing share")
        << QByteArrayList({"out tree connect failed: NT_STATUS_BAD_NETWORK_NAME\\n", "exit 1"})
        << 0;
    QTest::newRow("crash") << QByteArrayList({"kill 9"}) << 0;
}

void CheckSmbShareAuthJobTest::verdict()
{
    QFETCH(QByteArrayList, lines);
    QFETCH(int, result);
    m_smbclient->expect(lines);
    QCOMPARE(makeJob()->checkAuth(u"bob"_s, u"secret"_s), result);
}

void CheckSmbShareAuthJobTest::passwordGoesIntoTheEnvironment()
{
    m_smbclient->expect(listed);
    makeJob()->checkAuth(u"bob"_s, u"p w\u00e4"_s);
    QCOMPARE(
        m_smbclient->arguments(1), QByteArrayList({"//LOCALHOST/share", "-U", "bob", "-c", "du"}));
    QCOMPARE(
        passwords(m_smbclient->environment(1)), QByteArrayList({u"p w\u00e4"_s.toLocal8Bit()}));
    // On top of what the tool inherits.
    QVERIFY(m_smbclient->environment(1).contains("HOME=" + qgetenv("HOME")));
    QVERIFY(!m_smbclient->commandLine(1).contains("p w"));
    QVERIFY(!qEnvironmentVariableIsSet("PASSWD"));
}

void CheckSmbShareAuthJobTest::userWithoutAPassword()
{
    m_smbclient->expect(listed);
    makeJob()->checkAuth(u"bob"_s, QString());
    QCOMPARE(
        m_smbclient->arguments(1), QByteArrayList({"//LOCALHOST/share", "-U", "bob", "-c", "du"}));
    QCOMPARE(passwords(m_smbclient->environment(1)), QByteArrayList());
}

void CheckSmbShareAuthJobTest::passwordWithoutAUserIsDropped()
{
    m_smbclient->expect(listed);
    makeJob()->checkAuth(QString(), u"secret"_s);
    QCOMPARE(
        m_smbclient->arguments(1), QByteArrayList({"//LOCALHOST/share", "-U", "%", "-c", "du"}));
    QVERIFY(!m_smbclient->environment(1).join('\n').contains("secret"));
}

void CheckSmbShareAuthJobTest::commandIsSplitIntoWords_data()
{
    QTest::addColumn<QString>("share");
    QTest::addColumn<QByteArrayList>("words");
    QTest::newRow("blank") << u"my share"_s << QByteArrayList({"//LOCALHOST/my", "share"});
    QTest::newRow("quotes") << u"a\"b c\"d"_s << QByteArrayList({"//LOCALHOST/ab cd"});
    QTest::newRow("no shell") << u"a;b$(touch${IFS}x)`y`|z>w*"_s
                              << QByteArrayList({"//LOCALHOST/a;b$(touch${IFS}x)`y`|z>w*"});
    QTest::newRow("placeholders") << u"%3%1"_s << QByteArrayList({"//LOCALHOST/%3%1"});
    QTest::newRow("dashes") << u"a- b-c"_s << QByteArrayList({"//LOCALHOST/a-", "b-c"});
    QTest::newRow("dash at the beginning") << u"-x"_s << QByteArrayList({"//LOCALHOST/-x"});
    QTest::newRow("nothing") << QString() << QByteArrayList({"//LOCALHOST/"});
}

void CheckSmbShareAuthJobTest::commandIsSplitIntoWords()
{
    QFETCH(QString, share);
    QFETCH(QByteArrayList, words);
    m_smbclient->expect(listed);
    makeJob(share)->checkAuth(QString(), QString());
    QCOMPARE(m_smbclient->arguments(1), words + QByteArrayList({"-U", "%", "-c", "du"}));
}

void CheckSmbShareAuthJobTest::namesAreNoOptions_data()
{
    QTest::addColumn<QString>("host");
    QTest::addColumn<QString>("share");
    const auto share = [](const char* name, const QString& text) {
        QTest::newRow(name) << host << text;
    };
    share("option", u"pub -Tc .profile a.txt"_s);
    share("options behind words", u"pub a -N -c \"get payload .bashrc\""_s);
    share("quoted option", u"pub \"-Tc\" .profile"_s);
    share("quoted dash", u"pub \"-\"Tc .profile"_s);
    share("nothing in quotes before it", u"pub \"\"-Tc .profile"_s);
    share("dash alone", u"pub -"_s);
    share("the end of options", u"pub --"_s);
    share("one that we write too", u"pub -c du"_s);
    share("behind a wide blank", u"pub\u2003-Tc .profile"_s);
    share("behind a tab", u"pub\t-Tc .profile"_s);
    share("behind a newline", u"pub\n-Tc .profile"_s);
    share("tab", u"a\tb"_s);
    share("zero byte", u"a"_s + QChar(QChar::Null) + u"b"_s);
    share("our own mark of a dash", u"a \u0001c"_s);
    share("delete", u"a\u007f"_s);
    share("control character of Latin 1", u"a\u0085"_s);
    QTest::newRow("host is an option") << u"LOCALHOST -L x"_s << u"share"_s;
    QTest::newRow("host with a newline") << u"LOCAL\nHOST"_s << u"share"_s;
    // What one opens the other closes.
    QTest::newRow("quotes over both") << u"LOCALHOST\" "_s << u"share\" -Tc x"_s;
}

// Other programs of the network may have told them. No tool runs, which reads as a missing one.
void CheckSmbShareAuthJobTest::namesAreNoOptions()
{
    QFETCH(QString, host);
    QFETCH(QString, share);
    CheckSmbShareAuthJob job(m_auth, share, host, QString());
    job.setDeleteOnFinish(false);
    QSignalSpy finished(&job, &Job::finished);
    QVERIFY(job.checkKerberosAuth() != 0);
    QCOMPARE(job.checkAuth(QString(), QString()), 0);
    QCOMPARE(job.checkAuth(u"bob"_s, u"secret"_s), 0);
    job.start();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job.error(), 0);
    QVERIFY(job.hostForKerberos().isEmpty());
    QCOMPARE(m_auth->calls, QStringList());
    QCOMPARE(m_smbclient->runs(), 0);
}

void CheckSmbShareAuthJobTest::usersAreNoOptions_data()
{
    QTest::addColumn<QString>("share");
    QTest::addColumn<QString>("user");
    QTest::newRow("option") << u"share"_s << u"-x"_s;
    QTest::newRow("option behind a word") << u"share"_s << u"bob -N"_s;
    QTest::newRow("quoted option") << u"share"_s << u"\"-x\""_s;
    QTest::newRow("newline") << u"share"_s << u"bob\nann"_s;
    QTest::newRow("quotes from the share on") << u"a\""_s << u"b\" -U \"x"_s;
}

void CheckSmbShareAuthJobTest::usersAreNoOptions()
{
    QFETCH(QString, share);
    QFETCH(QString, user);
    QCOMPARE(makeJob(share)->checkAuth(user, u"secret"_s), 0);
    QCOMPARE(m_smbclient->runs(), 0);
}

void CheckSmbShareAuthJobTest::conversation_data()
{
    QTest::addColumn<QList<QByteArrayList>>("runs"); // Behind the one with the ticket.
    QTest::addColumn<QList<Auth::Answer>>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<int>("code");
    QTest::addColumn<QString>("error");
    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;
    const QString first = u"ask [smb WG LOCALHOST share] ||"_s;
    const QString again = u"retry [smb WG LOCALHOST share] "_s;
    const QString whenDenied = again + u"Access denied|Access denied for WG;LOCALHOST/share|"_s;
    const QString whenFailed = again + u"Logon failure|Logon failure for WG;LOCALHOST/share|"_s;
    const auto secret = Auth::password(u"right"_s, u"bob"_s);
    Auth::Answer goOn = secret;
    goOn.cancelled = 0;

    // Not reported as accepted, unlike a later one.
    QTest::newRow("first answer is right")
        << Runs{denied, listed} << Answers{secret} << QStringList{first} << 0 << QString();
    QTest::newRow("wrong, then right")
        << Runs{denied, failure, listed} << Answers{Auth::password(u"wrong"_s, u"bob"_s), secret}
        << QStringList{first, u"rejected bob"_s, whenFailed + u"bob"_s, u"accepted"_s} << 0
        << QString();
    QTest::newRow("the reason is that of the last try")
        << Runs{failure, denied, failure, listed}
        << Answers{Auth::password(u"1"_s, u"ann"_s), Auth::password(u"2"_s, u"bob"_s), Auth::password(u"right"_s)}
        << QStringList{first,
                       u"rejected ann"_s,
                       whenDenied + u"ann"_s,
                       u"rejected bob"_s,
                       whenFailed + u"bob"_s,
                       u"accepted"_s}
        << 0 << QString();
    // Giving up at the first question is not the end.
    QTest::newRow("given up, denied as guest")
        << Runs{denied} << Answers{Auth::cancel(), Auth::password(QString())}
        << QStringList{first, whenDenied + u" +cancelled"_s} << 2 << u"Login cancelled"_s;
    QTest::newRow("given up, logon failure as guest")
        << Runs{failure} << Answers{Auth::cancel(), Auth::cancel()}
        << QStringList{first, whenFailed + u" +cancelled"_s} << 2 << u"Login cancelled"_s;
    QTest::newRow("given up, then not")
        << Runs{failure, listed} << Answers{Auth::cancel(), goOn}
        << QStringList{first, whenFailed + u" +cancelled"_s, u"accepted"_s} << 0 << QString();
    QTest::newRow("given up later")
        << Runs{denied, failure} << Answers{Auth::password(u"wrong"_s, u"bob"_s), Auth::cancel()}
        << QStringList{first, u"rejected bob"_s, whenFailed + u"bob"_s} << 2
        << u"Login cancelled"_s;
    // The flag is handed over, kept and never looked at.
    QTest::newRow("changed user")
        << Runs{denied, failure, listed}
        << Answers{Auth::changeUser(u"bob"_s, u"wrong"_s), Auth::password(u"right"_s)}
        << QStringList{first, u"rejected bob"_s, whenFailed + u"bob +userChanged"_s, u"accepted"_s}
        << 0 << QString();
    QTest::newRow("no user at all")
        << Runs{denied, denied, listed} << Answers{Auth::password(u"x"_s), secret}
        << QStringList{first, u"rejected "_s, whenDenied, u"accepted"_s} << 0 << QString();
}

void CheckSmbShareAuthJobTest::conversation()
{
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QList<Auth::Answer>, answers);
    QFETCH(QStringList, calls);
    QFETCH(int, code);
    QFETCH(QString, error);
    m_smbclient->expect(noTicket);
    for (const QByteArrayList& run : runs) {
        m_smbclient->expect(run);
    }
    m_auth->answers = answers;
    const auto job = makeJob(u"share"_s, u"WG"_s);
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(m_auth->calls, calls);
    QCOMPARE(job->error(), code);
    QCOMPARE(job->errorString(), error);
    QVERIFY(job->hostForKerberos().isEmpty());
    const int last = m_smbclient->runs();
    if (code == 0) {
        QCOMPARE(passwords(m_smbclient->environment(last)), QByteArrayList({"right"}));
    }
    for (int run = 1; run <= last; ++run) {
        QVERIFY(!m_smbclient->commandLine(run).contains("right"));
    }
}

void CheckSmbShareAuthJobTest::triesWithoutBound()
{
    m_smbclient->expect(noTicket);
    m_smbclient->expect(denied);
    for (int i = 0; i < 25; ++i) {
        m_smbclient->expect(failure);
        m_auth->answers.append(Auth::password(u"wrong"_s, u"bob"_s));
    }
    m_smbclient->expect(listed);
    m_auth->answers.append(Auth::password(u"right"_s));
    const auto job = makeJob();
    job->start();
    QCOMPARE(job->error(), 0);
    QCOMPARE(m_auth->calls.count(u"rejected bob"_s), 25);
    QCOMPARE(m_auth->calls.last(), u"accepted"_s);
}

void CheckSmbShareAuthJobTest::missingToolReadsAsAccess()
{
    const QByteArray path = qgetenv("PATH");
    qputenv("PATH", "/nonexistent");
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &Job::finished);
    QVERIFY(job->checkKerberosAuth() != 0);
    QCOMPARE(job->checkAuth(u"bob"_s, u"secret"_s), 0);
    job->start();
    qputenv("PATH", path);
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 0);
    QVERIFY(job->hostForKerberos().isEmpty());
    QCOMPARE(m_auth->calls, QStringList());
}

void CheckSmbShareAuthJobTest::execNeverRunsItsLoop()
{
    m_smbclient->expect(listed);
    const auto job = makeJob();
    bool turned = false;
    QMetaObject::invokeMethod(
        this, [&turned] { turned = true; }, Qt::QueuedConnection);
    job->exec();
    QVERIFY(!turned);
    QCOMPARE(job->error(), 0);
    QTRY_VERIFY(turned);
}

void CheckSmbShareAuthJobTest::outsideTheGroup()
{
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &Job::finished);
    if (!startOutsideGroup(job.get())) {
        QSKIP("can't leave the group \"fuse\"");
    }
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 4);
    QCOMPARE(job->errorString(), u"You must be in 'fuse' group in order to browse samba shares!"_s);
    QCOMPARE(m_auth->calls, QStringList());
}

QTEST_GUILESS_MAIN(CheckSmbShareAuthJobTest)
#include "tst_checksmbshareauthjob.moc"
