// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountresourcescene.h"

#include <QFileInfo>
#include <QTimer>

using namespace VeyFM;

/// What a MountResourceJob and its program say to each other, and what comes of it.
class MountResourceJobTest : public MountResourceTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void mounts();
    void takesPresent();
    void reachesSamba();
    void codesPassThrough_data();
    void codesPassThrough();
    void endsBeforeTheBegin();
    void passesUserOn();
    void asksPassword();
    void asksAnotherUser();
    void answersWithUserAlone_data();
    void answersWithUserAlone();
    void answersForTheLastTime();
    void asksConfirmation_data();
    void asksConfirmation();
    void givesUp_data();
    void givesUp();
    void answersLater();
    void wrongAnswersDoNothing();
    void tellsOfCredentials();
    void asksAuthenticator();
    void authenticatorChangesUser_data();
    void authenticatorChangesUser();
    void authenticatorGivesUp();
    void runsInExec();
    void startsOnce();
    void findsProgram();
    void programGetsNothingElse();
    void passwordIsNotKept();
    void entryOfRoot();
    void entryBelow();
    void entryAfterTheEnd();
    void entryOfNobody();
    void noEntryOfOthers();

private:
    void announce(const QString& url, const QString& path, const QString& directory)
    {
        service->emitSignal(
            u"NetworkMountsManager"_s, u"mountAdded"_s,
            {url, QJsonArray{path, directory, int(TypeSFtpSharePlace)}});
    }
};

void MountResourceJobTest::initTestCase()
{
    QVERIFY2(startVfs("{}"), qPrintable(service.errorString()));
}

void MountResourceJobTest::init()
{
    startScene();
}

void MountResourceJobTest::cleanup()
{
    endScene();
}

void MountResourceJobTest::mounts()
{
    tool->expect({"read", Helper::begin, Helper::succeed(), "read", "exit 0"});
    const auto job = makeJob();
    QCOMPARE(job->isNew(), false);
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QVERIFY(job->errorString().isNull());
    QCOMPARE(job->url(), u"sftp://anna@server/papers"_s);
    QCOMPARE(job->localPath(), u"/mnt/server/papers"_s);
    QCOMPARE(job->directory(), u"/mnt/server"_s);
    QCOMPARE(job->path(), u"SFTP/anna@server/papers"_s);
    QVERIFY(job->entry().isNull());
    QVERIFY(job->isNew());
    QVERIFY(!job->isShared());
    QCOMPARE(job->whyNotShared(), u"no service"_s);
    QCOMPARE(said(), QByteArrayList({Helper::mountRequest, R"({"do":"take"})"}));
}

void MountResourceJobTest::takesPresent()
{
    QByteArray end = Helper::succeed();
    tool->expect({"read", Helper::begin, end.replace("\"new\"", "\"present\""), "read", "exit 0"});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/mnt/server/papers"_s);
    QVERIFY(!job->isNew());
}

void MountResourceJobTest::reachesSamba()
{
    tool->expect(
        {"read", Helper::begin,
         Helper::line(R"({"say":"end","code":0,"text":"","url":"smb://server/share","path":"",)"
                      R"("localPath":"/smb/share","mounted":"reached","directory":"",)"
                      R"("shared":true})"),
         "read", "exit 0"});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/smb/share"_s);
    QCOMPARE(job->directory(), QString());
    QVERIFY(!job->isNew());
    QVERIFY(job->isShared());
    QVERIFY(job->entry().isNull());
}

void MountResourceJobTest::codesPassThrough_data()
{
    QTest::addColumn<int>("code");
    QTest::addColumn<QString>("text");
    QTest::newRow("1") << 1 << u"Couldn't access resource"_s;
    QTest::newRow("2") << 2 << u"Accessing sftp resource was cancelled"_s;
    QTest::newRow("4") << 4 << u"fuse"_s;
    QTest::newRow("5") << 5 << u"Mounting sftp resource failed"_s;
    QTest::newRow("unknown") << 77 << u"Größe"_s;
    QTest::newRow("no text") << 5 << QString();
}

void MountResourceJobTest::codesPassThrough()
{
    QFETCH(int, code);
    QFETCH(QString, text);
    tool->expect({"read", Helper::begin, Helper::fail(code, text.toUtf8()), "read", "exit 1"});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), code);
    QCOMPARE(job->errorString(), text);
    QCOMPARE(job->localPath(), QString());
    QCOMPARE(job->url(), QString());
    QVERIFY(!job->isNew());
    // It has ended and waits for no more words.
    QCOMPARE(said(), QByteArrayList({Helper::mountRequest}));
}

void MountResourceJobTest::endsBeforeTheBegin()
{
    tool->expect({"read", Helper::fail(5, "no memory")});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"no memory"_s);
}

void MountResourceJobTest::passesUserOn()
{
    tool->expect({"read", Helper::begin, Helper::fail(5, "x")});
    const auto job = makeJob();
    job->setUser(u"böb"_s);
    finish(job.get());
    QCOMPARE(
        said().value(0),
        QByteArray("{\"do\":\"mount\",\"url\":\"sftp://anna@server/papers\",\"user\":\"b\xc3\xb6"
                   "b\",\"version\":1}"));
}

void MountResourceJobTest::asksPassword()
{
    tool->expect(
        {"read", Helper::begin, Helper::askPassword(7), "read", "read",
         Helper::line(R"({"say":"rejected","user":"anna"})"), Helper::askPassword(8, "anna", true),
         "read", "read", Helper::line(R"({"say":"accepted"})"), Helper::succeed(), "read"});
    const auto job = makeJob();
    QList<MountQuestion> questions;
    connect(job.get(), &Job::passwordRequested, this, [&](const MountQuestion& question) {
        questions.append(question);
        QVERIFY(job->question());
        QCOMPARE(job->question()->host, question.host);
        const QString password = questions.size() == 1 ? u"wrong"_s : u"a \"b\\ ö\t\U0001F511"_s;
        job->answerPassword(question.user, password);
        QVERIFY(!job->question());
    });
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(questions.size(), 2);
    const MountQuestion& first = questions.at(0);
    QCOMPARE(first.title, u"T"_s);
    QCOMPARE(first.message, u"M"_s);
    QCOMPARE(first.user, u"anna"_s);
    QCOMPARE(first.protocol, u"sftp"_s);
    QCOMPARE(first.host, u"server"_s);
    QVERIFY(!first.isRetry);
    QVERIFY(questions.at(1).isRetry);
    const QByteArrayList lines = said();
    QCOMPARE(lines.size(), 6);
    QCOMPARE(lines.at(1), QByteArray(R"({"do":"answer","id":7,"password":true})"));
    QCOMPARE(lines.at(2), QByteArray(R"("wrong")"));
    QCOMPARE(lines.at(3), QByteArray(R"({"do":"answer","id":8,"password":true})"));
    // However it is written, it is this text.
    QCOMPARE(
        QJsonDocument::fromJson('[' + lines.at(4) + ']').array().at(0).toString(),
        u"a \"b\\ ö\t\U0001F511"_s);
    QCOMPARE(lines.at(5), QByteArray(R"({"do":"take"})"));
}

void MountResourceJobTest::asksAnotherUser()
{
    tool->expect(
        {"read", Helper::begin, Helper::askPassword(), "read", "read", Helper::fail(5, "x")});
    const auto job = makeJob();
    connect(job.get(), &Job::passwordRequested, this, [&] {
        job->answerPassword(u"bob"_s, QString());
    });
    finish(job.get());
    QCOMPARE(said().value(1), QByteArray(R"({"do":"answer","id":1,"password":true,"user":"bob"})"));
    QCOMPARE(said().value(2), QByteArray(R"("")"));
}

void MountResourceJobTest::answersWithUserAlone_data()
{
    QTest::addColumn<bool>("withAuthenticator");
    QTest::newRow("method") << false;
    QTest::newRow("authenticator") << true;
}

void MountResourceJobTest::answersWithUserAlone()
{
    QFETCH(bool, withAuthenticator);
    tool->expect({"read", Helper::begin, Helper::askPassword(), "read", Helper::fail(5, "x")});
    const auto job = makeJob(withAuthenticator);
    if (withAuthenticator) {
        auth->answers = {Auth::changeUser(u"bob"_s)};
    }
    connect(job.get(), &Job::passwordRequested, this, [&] { job->answerUser(u"bob"_s); });
    finish(job.get());
    QCOMPARE(
        said().mid(1), QByteArrayList({R"({"do":"answer","id":1,"password":false,"user":"bob"})"}));
}

void MountResourceJobTest::answersForTheLastTime()
{
    tool->expect(
        {"read", Helper::begin, Helper::askPassword(), "read", "read",
         Helper::askPassword(2, "anna", true), "read", "read", Helper::fail(2, "x")});
    const auto job = makeJob();
    connect(job.get(), &Job::passwordRequested, this, [&](const MountQuestion& question) {
        job->setLastTry(question.isRetry);
        job->answerPassword(u"anna"_s, u"geheim"_s);
    });
    finish(job.get());
    QCOMPARE(said().value(1), QByteArray(R"({"do":"answer","id":1,"password":true})"));
    QCOMPARE(said().value(3), QByteArray(R"({"do":"answer","id":2,"last":true,"password":true})"));
}

void MountResourceJobTest::asksConfirmation_data()
{
    QTest::addColumn<bool>("yes");
    QTest::newRow("yes") << true;
    QTest::newRow("no") << false;
}

void MountResourceJobTest::asksConfirmation()
{
    QFETCH(bool, yes);
    tool->expect({"read", Helper::begin, Helper::askConfirmation(3), "read", Helper::fail(5, "x")});
    const auto job = makeJob();
    QString asked;
    connect(job.get(), &Job::confirmationRequested, this, [&](const MountQuestion& question) {
        asked = question.message;
        job->confirm(yes);
    });
    finish(job.get());
    QCOMPARE(asked, u"fingerprint"_s);
    QCOMPARE(
        said().value(1),
        QByteArray(R"({"do":"answer","id":3,"yes":)") + (yes ? "true}" : "false}"));
}

void MountResourceJobTest::givesUp_data()
{
    QTest::addColumn<QByteArray>("question");
    QTest::newRow("password") << Helper::askPassword();
    QTest::newRow("confirmation") << Helper::askConfirmation();
}

void MountResourceJobTest::givesUp()
{
    QFETCH(QByteArray, question);
    tool->expect({"read", Helper::begin, question, "read", Helper::fail(2, "given up")});
    const auto job = makeJob();
    connect(job.get(), &Job::passwordRequested, job.get(), &Job::giveUp);
    connect(job.get(), &Job::confirmationRequested, job.get(), &Job::giveUp);
    finish(job.get());
    QCOMPARE(said().value(1), QByteArray(R"({"cancelled":true,"do":"answer","id":1})"));
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"given up"_s);
}

void MountResourceJobTest::answersLater()
{
    tool->expect(
        {"read", Helper::begin, Helper::askPassword(), "read", "read", Helper::succeed(), "read"});
    const auto job = makeJob();
    QSignalSpy asked(job.get(), &Job::passwordRequested);
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QVERIFY(asked.wait());
    // The dialog is open, and the loop turns; the limit counts none of that.
    QVERIFY(!finished.wait(200));
    QVERIFY(job->question());
    const int ticks = gap->ticks();
    QTRY_VERIFY(gap->ticks() > ticks + 10);
    job->answerPassword(u"anna"_s, u"secret"_s);
    QVERIFY(finished.wait());
    QCOMPARE(asked.count(), 1);
    QCOMPARE(job->error(), 0);
}

void MountResourceJobTest::wrongAnswersDoNothing()
{
    tool->expect(
        {"read", Helper::begin, Helper::askConfirmation(), "read", Helper::askPassword(2), "read",
         "read", Helper::fail(5, "x"), "read"});
    const auto job = makeJob();
    const auto answerAll = [&] {
        job->answerPassword(u"anna"_s, u"one"_s);
        job->confirm(true);
        job->answerPassword(u"anna"_s, u"two"_s);
        job->confirm(false);
        job->giveUp();
    };
    answerAll();
    connect(job.get(), &Job::confirmationRequested, this, answerAll);
    connect(job.get(), &Job::passwordRequested, this, answerAll);
    finish(job.get());
    answerAll();
    QCOMPARE(
        said(), QByteArrayList(
                    {Helper::mountRequest, R"({"do":"answer","id":1,"yes":true})",
                     R"({"do":"answer","id":2,"password":true})", R"("one")"}));
}

void MountResourceJobTest::tellsOfCredentials()
{
    tool->expect(
        {"read", Helper::begin,
         Helper::line(R"({"say":"waiting","text":"being mounted by another program"})"),
         Helper::line(R"({"say":"rejected","user":"bob"})"), Helper::line(R"({"say":"accepted"})"),
         Helper::fail(5, "x")});
    const auto job = makeJob();
    QStringList told;
    connect(job.get(), &Job::waitingForOther, this, [&](const QString& text) { told += text; });
    connect(job.get(), &Job::credentialsRejected, this, [&](const QString& user) { told += user; });
    connect(job.get(), &Job::credentialsAccepted, this, [&] { told += u"accepted"_s; });
    finish(job.get());
    QCOMPARE(told, QStringList({u"being mounted by another program"_s, u"bob"_s, u"accepted"_s}));
}

void MountResourceJobTest::asksAuthenticator()
{
    tool->expect(
        {"read", Helper::begin, Helper::askConfirmation(), "read", Helper::askPassword(2), "read",
         "read", Helper::line(R"({"say":"rejected","user":"anna"})"),
         Helper::askPassword(3, "anna", true), "read", "read",
         Helper::line(R"({"say":"accepted"})"), Helper::succeed(), "read"});
    auth->questionAnswers = {true};
    auth->answers = {Auth::password(u"wrong"_s), Auth::password(u"right"_s)};
    const auto job = makeJob(true);
    QSignalSpy asked(job.get(), &Job::passwordRequested);
    QSignalSpy confirmed(job.get(), &Job::confirmationRequested);
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(
        auth->calls, QStringList(
                         {u"question T|fingerprint"_s, u"ask [sftp  server ] T|M|anna"_s,
                          u"rejected anna"_s, u"retry [sftp  server ] T|M|anna"_s, u"accepted"_s}));
    QCOMPARE(asked.count() + confirmed.count(), 0);
    QCOMPARE(
        said().mid(1),
        QByteArrayList(
            {R"({"do":"answer","id":1,"yes":true})", R"({"do":"answer","id":2,"password":true})",
             R"("wrong")", R"({"do":"answer","id":3,"password":true})", R"("right")",
             R"({"do":"take"})"}));
}

void MountResourceJobTest::authenticatorChangesUser_data()
{
    QTest::addColumn<QByteArray>("protocol");
    QTest::addColumn<bool>("userChanged");
    QTest::addColumn<bool>("isTaken");
    QTest::newRow("sftp, changed") << QByteArray("sftp") << true << true;
    // As the job itself would: the name is only looked at behind the flag.
    QTest::newRow("sftp, not said") << QByteArray("sftp") << false << false;
    QTest::newRow("smb, not said") << QByteArray("smb") << false << true;
}

void MountResourceJobTest::authenticatorChangesUser()
{
    QFETCH(QByteArray, protocol);
    QFETCH(bool, userChanged);
    QFETCH(bool, isTaken);
    QByteArray question = Helper::askPassword();
    question.replace("\"sftp\"", '"' + protocol + '"');
    tool->expect({"read", Helper::begin, question, "read", "read", Helper::fail(5, "x")});
    auth->answers = {
        userChanged ? Auth::changeUser(u"bob"_s, u"p"_s) : Auth::password(u"p"_s, u"bob"_s)};
    const auto job = makeJob(true);
    finish(job.get());
    QCOMPARE(said().value(1).contains(R"("user":"bob")"), isTaken);
}

void MountResourceJobTest::authenticatorGivesUp()
{
    tool->expect({"read", Helper::begin, Helper::askPassword(), "read", Helper::fail(2, "x")});
    auth->answers = {Auth::cancel()};
    const auto job = makeJob(true);
    finish(job.get());
    QCOMPARE(said().value(1), QByteArray(R"({"cancelled":true,"do":"answer","id":1})"));
    QCOMPARE(job->error(), 2);
}

void MountResourceJobTest::runsInExec()
{
    tool->expect({"read", Helper::begin, Helper::succeed(), "read"});
    const auto job = makeJob();
    job->exec();
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->localPath(), u"/mnt/server/papers"_s);
}

void MountResourceJobTest::startsOnce()
{
    tool->expect({"read", Helper::begin, Helper::fail(5, "x")});
    const auto job = makeJob();
    job->start();
    finish(job.get());
    job->start();
    QCoreApplication::processEvents();
    QCOMPARE(tool->runs(), 1);
}

void MountResourceJobTest::findsProgram()
{
    const Job job(u"sftp://server/"_s);
    const QString suffix = u"/tools/veyfm-mount/veyfm-mount"_s;
    const QString libexec = u"/veyfm-mount"_s;
    QVERIFY(QFileInfo(job.helperProgram()).isAbsolute());
    QVERIFY2(
        job.helperProgram().endsWith(QFileInfo::exists(job.helperProgram()) ? suffix : libexec),
        qPrintable(job.helperProgram()));
}

void MountResourceJobTest::programGetsNothingElse()
{
    // What a host may do to itself.
    ::signal(SIGPIPE, SIG_IGN);
    sigset_t usual;
    sigset_t blocked;
    sigemptyset(&blocked);
    sigaddset(&blocked, SIGTERM);
    sigprocmask(SIG_BLOCK, &blocked, &usual);
    int open[2];
    QCOMPARE(::pipe(open), 0);

    tool->expect({"read", Helper::begin, Helper::fail(5, "x")});
    const auto job = makeJob();
    finish(job.get());
    ::close(open[0]);
    ::close(open[1]);
    sigprocmask(SIG_SETMASK, &usual, nullptr);
    ::signal(SIGPIPE, SIG_DFL);

    QCOMPARE(tool->descriptors(1), QByteArrayList());
    QCOMPARE(tool->status(1, "SigBlk:"), QByteArray(16, '0'));
    // The C library has two signals of its own, which it lets nobody have.
    const quint64 ignored = tool->status(1, "SigIgn:").toULongLong(nullptr, 16);
    QCOMPARE(ignored & ~quint64(0x180000000), quint64(0));
    QCOMPARE(tool->arguments(1), QByteArrayList());
}

void MountResourceJobTest::passwordIsNotKept()
{
    tool->expect(
        {"read", Helper::begin, Helper::askPassword(), "read", "read", Helper::succeed(), "read"});
    const auto job = makeJob();
    connect(job.get(), &Job::passwordRequested, this, [&] {
        // Not as bytes, which a search would find in the program itself.
        QString password;
        for (int i = 0; i < 24; ++i) {
            password += QChar(ushort(u'a' + (i * 7) % 26));
        }
        job->answerPassword(u"anna"_s, password);
    });
    finish(job.get());
    QCOMPARE(job->error(), 0);

    // The halves meet nowhere but in what is looked for.
    QByteArray half = "ahovcjqxelsz";
    QFile maps(u"/proc/self/maps"_s);
    QFile memory(u"/proc/self/mem"_s);
    QVERIFY(maps.open(QIODevice::ReadOnly));
    QVERIFY(memory.open(QIODevice::ReadOnly | QIODevice::Unbuffered));
    int found = 0;
    qint64 searched = 0;
    const QList<QByteArray> lines = maps.readAll().split('\n');
    for (const QByteArray& line : lines) {
        const QList<QByteArray> range = line.left(line.indexOf(' ')).split('-');
        if (!line.contains(" rw-p ") || line.contains("[stack]")) {
            continue;
        }
        qint64 at = range.value(0).toLongLong(nullptr, 16);
        const qint64 size = range.value(1).toLongLong(nullptr, 16) - at;
        if (size > 64 << 20 || !memory.seek(at)) {
            continue;
        }
        const QByteArray bytes = memory.read(size);
        searched += bytes.size();
        for (int i = bytes.indexOf(half); i >= 0; i = bytes.indexOf(half, i + 1)) {
            found += bytes.mid(i + 12, 12) == "gnubipwdkryf" ? 1 : 0;
        }
    }
    QVERIFY(searched > 1 << 20);
    QCOMPARE(found, 0);
    QCOMPARE(said().value(2), '"' + half + "gnubipwdkryf\"");
}

void MountResourceJobTest::entryOfRoot()
{
    QDir().mkpath(scene.root() + u"/mnt1"_s);
    announce(u"sftp://r1@server/"_s, u"SFTP/r1@server"_s, scene.root() + u"/mnt1"_s);
    QTRY_VERIFY(!vfs->placeBase()->placeEntry(u"SFTP/r1@server"_s).isNull());
    QByteArray end = Helper::succeed(QFile::encodeName(scene.root() + u"/mnt1"_s), "", true);
    tool->expect(
        {"read", Helper::begin, end.replace("anna@server", "r1@server"), "read", "exit 0"});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QVERIFY(job->isShared());
    QCOMPARE(job->entry().path(), u"SFTP/r1@server"_s);
    QCOMPARE(job->entry().localPath(), scene.root() + u"/mnt1"_s);
}

void MountResourceJobTest::entryBelow()
{
    QDir().mkpath(scene.root() + u"/mnt2/papers"_s);
    announce(u"sftp://r2@server/"_s, u"SFTP/r2@server"_s, scene.root() + u"/mnt2"_s);
    QTRY_VERIFY(!vfs->placeBase()->placeEntry(u"SFTP/r2@server"_s).isNull());
    QByteArray end = Helper::succeed(QFile::encodeName(scene.root() + u"/mnt2"_s), "/papers", true);
    tool->expect(
        {"read", Helper::begin, end.replace("anna@server", "r2@server"), "read", "exit 0"});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->entry().path(), u"SFTP/r2@server/papers"_s);
    QCOMPARE(job->entry().localPath(), scene.root() + u"/mnt2/papers"_s);
    QVERIFY(job->entry().isDir());
}

void MountResourceJobTest::entryAfterTheEnd()
{
    QDir().mkpath(scene.root() + u"/mnt3"_s);
    QByteArray end = Helper::succeed(QFile::encodeName(scene.root() + u"/mnt3"_s), "", true);
    tool->expect(
        {"read", Helper::begin, end.replace("anna@server", "r3@server"), "read", "exit 0"});
    const auto job = makeJob();
    QSignalSpy finished(job.get(), &VeyFM::Job::finished);
    job->start();
    QTRY_VERIFY(tool->runs() == 1 && hasNoChildren());
    QVERIFY(!finished.wait(100));
    announce(u"sftp://other@server/"_s, u"SFTP/other@server"_s, u"/mnt"_s);
    announce(u"sftp://r3@server/"_s, u"SFTP/r3@server"_s, scene.root() + u"/mnt3"_s);
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job->entry().path(), u"SFTP/r3@server"_s);
}

void MountResourceJobTest::entryOfNobody()
{
    QByteArray end = Helper::succeed("/mnt/r4", "", true);
    tool->expect(
        {"read", Helper::begin, end.replace("anna@server", "r4@server"), "read", "exit 0"});
    const auto job = makeJob();
    QElapsedTimer clock;
    clock.start();
    finish(job.get());
    QVERIFY(clock.elapsed() >= 900);
    QCOMPARE(job->error(), 0);
    QVERIFY(job->entry().isNull());
    QCOMPARE(job->localPath(), u"/mnt/r4"_s);
}

void MountResourceJobTest::noEntryOfOthers()
{
    // The place is that of the home directory there, which has the same name.
    announce(u"sftp://r5@server/~/"_s, u"SFTP/r5@server"_s, u"/mnt/r5@server~"_s);
    QTRY_VERIFY(!vfs->placeBase()->placeEntry(u"SFTP/r5@server"_s).isNull());
    QByteArray end = Helper::succeed("/mnt/r5@server", "/papers", true);
    tool->expect(
        {"read", Helper::begin, end.replace("anna@server", "r5@server"), "read", "exit 0"});
    const auto job = makeJob();
    finish(job.get());
    QCOMPARE(job->error(), 0);
    QVERIFY(job->entry().isNull());
}

QTEST_GUILESS_MAIN(MountResourceJobTest)
#include "tst_mountresourcejob.moc"
