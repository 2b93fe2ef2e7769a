// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/realfusetest.h"

using namespace VeyFM;

Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

namespace {

const QString accepted = QStringLiteral("accepted");

QString asked(const RealProtocol& protocol, const QString& user)
{
    return u"retry [%1  server.test ] Access denied|Enter host password for user:|%2"_s.arg(
        protocol.scheme, user);
}

} // namespace

/// Logins to FTP and SFTP servers, where both jobs ask the same.
class RealFuseLoginTest : public RealFuseTest
{
    Q_OBJECT

private Q_SLOTS:
    void logsIn_data();
    void logsIn();

private:
    using Answers = QList<Auth::Answer>;

    static void addLogins(const RealProtocol& protocol);
};

void RealFuseLoginTest::addLogins(const RealProtocol& protocol)
{
    const auto newRow = [&](const char* name) -> QTestData& {
        return QTest::addRow("%s: %s", qPrintable(protocol.scheme), name) << protocol;
    };
    const QString nobody = u"server.test"_s;
    const QString alice = u"alice@server.test"_s;
    const QString bob = u"bob@server.test"_s;
    const QString askNobody = asked(protocol, QString());
    const QString askAlice = asked(protocol, u"alice"_s);
    const QString askBob = asked(protocol, u"bob"_s);
    const QString rejected = u"rejected alice"_s;
    const auto wrong = wrongPassword();
    const auto lost = Auth::password(u"lost"_s);
    const auto alices = password(Sandbox::alice);
    const auto bobs = password(Sandbox::bob);

    newRow("right password") << alice << Answers{alices} << QStringList{askAlice, accepted}
                             << alice;
    newRow("wrong, then right") << alice << Answers{wrong, lost, alices}
                                << QStringList{askAlice, rejected, askAlice, askAlice, accepted}
                                << alice;
    newRow("empty, then right") << alice << Answers{Auth::password(QString()), lost, alices}
                                << QStringList{askAlice, rejected, askAlice, askAlice, accepted}
                                << alice;
    newRow("wrong twice") << alice << Answers{wrong, lost, bobs, lost, alices}
                          << QStringList{askAlice, rejected, askAlice, askAlice,
                                         rejected, askAlice, askAlice, accepted}
                          << alice;
    newRow("changed name") << alice << Answers{Auth::changeUser(u"bob"_s), bobs}
                           << QStringList{askAlice, askBob, accepted} << bob;
    newRow("changed name after a refusal")
        << alice << Answers{wrong, Auth::changeUser(u"bob"_s), bobs}
        << QStringList{askAlice, rejected, askAlice, askBob, accepted} << bob;
    newRow("no name, then one") << nobody << Answers{Auth::changeUser(u"alice"_s), alices}
                                << QStringList{askNobody, askAlice, accepted} << alice;
}

void RealFuseLoginTest::logsIn_data()
{
    QTest::addColumn<RealProtocol>("protocol");
    QTest::addColumn<QString>("account");
    QTest::addColumn<Answers>("answers");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QString>("mountedAccount");
    const RealProtocol sftp = RealProtocol::sftp();
    addLogins(RealProtocol::ftp());
    addLogins(sftp);
    // Whoever has no name in the URL has one for ssh. Of them nothing is rejected.
    const QString asks = asked(sftp, QString());
    QTest::newRow("sftp: no name")
        << sftp << u"server.test"_s
        << Answers{wrongPassword(), Auth::password(u"lost"_s), password(Sandbox::tester)}
        << QStringList{asks, asks, asks, accepted} << u"server.test"_s;
}

void RealFuseLoginTest::logsIn()
{
    QFETCH(RealProtocol, protocol);
    QFETCH(QString, account);
    QFETCH(Answers, answers);
    QFETCH(QStringList, calls);
    QFETCH(QString, mountedAccount);
    auth->answers = answers;
    const FuseMountJob job = FuseMountJob::make(protocol.scheme, auth, protocol.urlOfHome(account));
    QSignalSpy finished(job.job.get(), &Job::finished);
    job->start();
    QVERIFY(protocol.endsInStart || finished.wait(20000));
    QCOMPARE(finished.count(), 1);
    QCOMPARE(auth->calls, calls);
    QCOMPARE(job->errorString(), QString());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job.url(), protocol.urlOfHome(mountedAccount));
    const QString mounts = mountDir(u"/"_s + protocol.scheme);
    const QString name = mountedAccount + protocol.homeMark;
    const QString directory = mounts + QLatin1Char('/') + name;
    QCOMPARE(mountDirs(), QStringList(directory));
    QCOMPARE(job.localPath(), directory + u"//"_s);
    QCOMPARE(recordedMounts(), QStringList(recordedMount(job.url(), directory)));
    const QString user = QUrl(job.url()).userName();
    QCOMPARE(
        fileContents(job.localPath() + u"name.txt"_s),
        user.isEmpty() ? QByteArray(Sandbox::tester.name) : user.toLatin1());
    // Of the directories of other users none stays.
    QCOMPARE(QDir(mounts).entryList(QDir::AllEntries | QDir::NoDotAndDotDot), QStringList(name));
}

int main(int argc, char** argv)
{
    FuseSandbox sandbox;
    return sandbox.run([&] { return runSandboxTests<RealFuseLoginTest>(argc, argv); });
}

#include "tst_real_fuselogin.moc"
