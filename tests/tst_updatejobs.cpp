// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/fuse.h"
#include "jobs/checksmbshareauthjob.h"
#include "jobs/mounturljob.h"
#include "jobs/updatenetworkplacejob.h"
#include "jobs/updatesmbentryjob.h"
#include "service/smbbrowserproxy.h"
#include "support/mountjobtest.h"
#include "support/outsidegroup.h"
#include "support/rerun.h"

using namespace VeyFM;

namespace {

const QByteArrayList listed = {"out Total number of bytes: 12\\n"};
const QByteArrayList denied = {"out NT_STATUS_ACCESS_DENIED\\n", "exit 1"};

constexpr const char* unreadNetworkArgument = "unread-network";

const QString outsideTheGroup =
    QStringLiteral("You must be in 'fuse' group in order to browse samba shares!");

} // namespace

/// Places brought up to date, with scripted tools and a scripted service.
class UpdateJobsTest : public MountJobTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void noBookmark_data();
    void noBookmark();
    void bookmarkWithALocalPath();
    void bookmarkIsMounted();
    void bookmarkEndsOnAnyNews();
    void bookmarkEndsAgainOnMoreNews();
    void bookmarkThatChangesMeanwhile();
    void bookmarkErrorsPassThrough_data();
    void bookmarkErrorsPassThrough();
    void bookmarkOutsideTheGroup();
    void bookmarkWithoutAnAnswerWaits();
    void noSambaEntry_data();
    void noSambaEntry();
    void rescans_data();
    void rescans();
    void rescanEndsOnWhatIsKnown_data();
    void rescanEndsOnWhatIsKnown();
    void rescanOfAnUnreadNetwork();
    void rescanWithoutAnAnswerWaits();
    void shareWithALocalPath();
    void shareIsAttached_data();
    void shareIsAttached();
    void shareIsNoOption();
    void shareErrorsPassThrough();
    void shareOutsideTheGroup();
    void cleanupTestCase();

private:
    std::unique_ptr<UpdateNetworkPlaceJob> makePlaceJob(const Entry& entry)
    {
        auto job = std::make_unique<UpdateNetworkPlaceJob>(auth, entry);
        job->setDeleteOnFinish(false);
        return job;
    }

    std::unique_ptr<UpdateSmbEntryJob> makeSmbJob(const Entry& entry)
    {
        auto job = std::make_unique<UpdateSmbEntryJob>(auth, entry);
        job->setDeleteOnFinish(false);
        return job;
    }

    Entry place(const QString& path) const
    {
        return vfs->placeBase()->placeEntry(path);
    }

    void emitSmb(const QString& signal, const QJsonArray& arguments)
    {
        service->emitSignal(u"SmbBrowser"_s, signal, arguments);
    }

    /// Runs whenever the browser tells of a scan.
    template <typename Function>
    void onScanNews(QObject* receiver, Function function)
    {
        const SmbBrowserProxy* const browser = vfs->smbBrowser();
        connect(browser, &SmbBrowserProxy::workgroupsNotChanged, receiver, function);
        connect(browser, &SmbBrowserProxy::workgroupsChanged, receiver, function);
        connect(browser, &SmbBrowserProxy::workgroupNotUpdated, receiver, function);
        connect(browser, &SmbBrowserProxy::workgroupUpdated, receiver, function);
        connect(browser, &SmbBrowserProxy::hostNotUpdated, receiver, function);
        connect(browser, &SmbBrowserProxy::hostUpdated, receiver, function);
    }

    void emitBookmark(const QJsonArray& record)
    {
        service->emitSignal(u"NetworkPlacesManager"_s, u"networkPlaceUpdated"_s, arguments(record));
    }
};

void UpdateJobsTest::initTestCase()
{
    if (!Fuse::isInFuseGroup()) {
        QSKIP("needs root, or a user in the group \"fuse\"");
    }
    const QByteArray script = R"({"echo": false, "values": {
        "NetworkPlacesManager.networkPlaces": [
            ["Mounted", "sftp://m", "/mnt/m"], ["Ftp", "ftp://host/a", ""],
            ["Sftp", "sftp://host/a", ""], ["Web", "http://host", ""],
            ["Changes", "ftp://host/old", ""], ["Smb", "smb://localhost/pub", ""],
            ["Option", "sftp://[]-oProxyCommand=x@host/", ""]],
        "SmbBrowser.workgroups": ["WG", "Other"],
        "SmbBrowser.hosts": [],
        "SmbBrowser.hosts WG": ["localhost", "h2"],
        "SmbBrowser.shares": {},
        "SmbBrowser.shares localhost WG": {"pub": "", "home": "/mnt/home",
            "pub -Tc .profile a.txt": ""}}})";
    QVERIFY2(startVfs(script), qPrintable(service.errorString()));
    // Down to the shares, as a view that was opened there.
    vfs->childs(vfs->sambaNetworkEntry());
    vfs->childs(vfs->entry(u"Samba/WG"_s));
    vfs->childs(vfs->entry(u"Samba/Other"_s));
    vfs->childs(vfs->entry(u"Samba/WG/localhost"_s));
    vfs->childs(vfs->entry(u"Samba/WG/h2"_s));
    QVERIFY(!place(u"Samba/WG/localhost/pub"_s).isNull());
}

void UpdateJobsTest::init()
{
    service->load(object(R"({"echo": false})"));
    startScene("smbclient");
}

void UpdateJobsTest::cleanup()
{
    endScene();
}

void UpdateJobsTest::noBookmark_data()
{
    QTest::addColumn<QString>("path");
    QTest::newRow("null") << QString();
    QTest::newRow("another place") << u"Samba"_s;
    QTest::newRow("the place above") << u"Network"_s;
}

void UpdateJobsTest::noBookmark()
{
    QFETCH(QString, path);
    const Entry entry = path.isEmpty() ? Entry() : place(path);
    const auto job = makePlaceJob(entry);
    startToEnd(job.get());
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Can't find entry for network place"_s);
    QCOMPARE(job->netPlaceEntry(), entry);
}

void UpdateJobsTest::bookmarkWithALocalPath()
{
    const auto job = makePlaceJob(place(u"Network/Mounted"_s));
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QVERIFY(job->children().isEmpty());
    QCOMPARE(service->takeCalls(), QStringList());
}

void UpdateJobsTest::bookmarkIsMounted()
{
    startScene("curlftpfs");
    tool->expect({});
    const auto job = makePlaceJob(place(u"Network/Ftp"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    int endsWhenTold = -1;
    job->start();
    QVERIFY(job->findChild<MountURLJob*>());
    // The job connects when the mount is there, and this slot before.
    QSignalSpy mounted(job->findChild<MountURLJob*>(), &Job::finished);
    QVERIFY(mounted.wait(20000));
    QCOMPARE(finished.count(), 0);
    const QString local = mountDir(u"/ftp/host//a"_s);
    QCOMPARE(
        calls(u"NetworkPlacesManager"_s),
        QStringList(
            u"NetworkPlacesManager.updateNetworkPlace[[\"Ftp\",\"ftp://host/a\",\"%1\"]]"_s.arg(
                local)));
    const auto connection =
        connect(vfs, &VFS::networkPlaceUpdated, this, [&] { endsWhenTold = finished.count(); });
    emitBookmark({u"Ftp"_s, u"ftp://host/a"_s, local});
    QVERIFY(finished.wait(20000));
    disconnect(connection);
    QCOMPARE(endsWhenTold, 0);
    QCOMPARE(job->error(), 0);
    QCOMPARE(treeLocalPath(u"Network/Ftp"_s), local);
}

void UpdateJobsTest::bookmarkEndsOnAnyNews()
{
    startScene("sshfs");
    tool->expect({});
    const auto job = makePlaceJob(place(u"Network/Sftp"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 0);
    emitBookmark({u"Mounted"_s, u"sftp://m"_s, u"/mnt/m"_s});
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
    QVERIFY(treeLocalPath(u"Network/Sftp"_s).isEmpty());
}

void UpdateJobsTest::bookmarkEndsAgainOnMoreNews()
{
    startScene("sshfs");
    tool->expect({});
    const auto job = makePlaceJob(place(u"Network/Sftp"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    emitBookmark({u"Mounted"_s, u"sftp://m"_s, u"/mnt/m"_s});
    QVERIFY(finished.wait(20000));
    // The connection lives as long as the job, here longer than it needs to.
    emitBookmark({u"Mounted"_s, u"sftp://m"_s, u"/mnt/m"_s});
    QTRY_COMPARE(finished.count(), 2);
}

void UpdateJobsTest::bookmarkThatChangesMeanwhile()
{
    startScene("curlftpfs");
    tool->expect({"err Enter host password for user 'x': ", "read"});
    Auth::Answer answer = Auth::password(u"x"_s);
    answer.before = [this] {
        emitBookmark({u"Changes"_s, u"ftp://host/new"_s, QString()});
        log->takeAll(service);
    };
    auth->answers = {answer};
    const auto job = makePlaceJob(place(u"Network/Changes"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QSignalSpy mounted(job->findChild<MountURLJob*>(), &Job::finished);
    QVERIFY(mounted.wait(20000));
    // The new URL, though the old one is what was mounted.
    QCOMPARE(
        calls(u"NetworkPlacesManager"_s),
        QStringList(
            u"NetworkPlacesManager.updateNetworkPlace[[\"Changes\",\"ftp://host/new\",\"%1\"]]"_s
                .arg(mountDir(u"/ftp/host//old"_s))));
    QCOMPARE(finished.count(), 0);
}

void UpdateJobsTest::bookmarkErrorsPassThrough_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<int>("code");
    QTest::addColumn<QString>("error");
    using Runs = QList<QByteArrayList>;
    QTest::newRow("scheme") << u"Network/Web"_s << Runs{} << 5
                            << u"This network protocol is not supported"_s;
    QTest::newRow("option") << u"Network/Option"_s << Runs{} << 5
                            << u"Mounting sftp resource failed"_s;
    QTest::newRow("given up") << u"Network/Smb"_s << Runs{{"exit 1"}, denied} << 2
                              << u"Login cancelled"_s;
}

void UpdateJobsTest::bookmarkErrorsPassThrough()
{
    QFETCH(QString, path);
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(int, code);
    QFETCH(QString, error);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
        auth->answers.append(Auth::cancel());
    }
    const auto job = makePlaceJob(place(path));
    startToEnd(job.get());
    QCOMPARE(job->error(), code);
    QCOMPARE(job->errorString(), error);
    QCOMPARE(calls(u"NetworkPlacesManager"_s), QStringList());
}

void UpdateJobsTest::bookmarkOutsideTheGroup()
{
    const auto job = makePlaceJob(place(u"Network/Smb"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    if (!startOutsideGroup(job.get())) {
        QSKIP("can't leave the group \"fuse\"");
    }
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 4);
    QCOMPARE(job->errorString(), outsideTheGroup);
}

void UpdateJobsTest::bookmarkWithoutAnAnswerWaits()
{
    startScene("sshfs");
    tool->expect({});
    service->setRules(u"NetworkPlacesManager.updateNetworkPlace"_s, array(R"([{"error": "no"}])"));
    const auto job = makePlaceJob(place(u"Network/Sftp"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
}

void UpdateJobsTest::noSambaEntry_data()
{
    QTest::addColumn<QString>("path");
    QTest::newRow("null") << QString();
    QTest::newRow("network") << u"Network"_s;
    QTest::newRow("bookmark") << u"Network/Sftp"_s;
}

void UpdateJobsTest::noSambaEntry()
{
    QFETCH(QString, path);
    const Entry entry = path.isEmpty() ? Entry() : place(path);
    const auto job = makeSmbJob(entry);
    startToEnd(job.get());
    QCOMPARE(job->error(), 1);
    QCOMPARE(job->errorString(), u"Not a samba entry"_s);
    QCOMPARE(job->smbEntry(), entry);
    QCOMPARE(service->takeCalls(), QStringList());
}

void UpdateJobsTest::rescans_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("request");
    QTest::addColumn<QString>("signal");
    QTest::addColumn<QJsonArray>("arguments");
    const QString network = u"SmbBrowser.rescan[]"_s;
    const QString workgroup = u"SmbBrowser.rescanWorkgroup[\"WG\"]"_s;
    const QString host = u"SmbBrowser.rescanHost[\"localhost\",\"WG\"]"_s;
    const QString finished = u"rescanFinished"_s;
    const QString workgroupFinished = u"rescanWorkgroupFinished"_s;
    const QString hostFinished = u"rescanHostFinished"_s;
    QTest::newRow("network") << u"Samba"_s << network << finished << QJsonArray{true};
    QTest::newRow("network, nothing new") << u"Samba"_s << network << finished << QJsonArray{false};
    QTest::newRow("workgroup") << u"Samba/WG"_s << workgroup << workgroupFinished
                               << QJsonArray{u"WG"_s, true};
    QTest::newRow("workgroup, nothing new")
        << u"Samba/WG"_s << workgroup << workgroupFinished << QJsonArray{u"WG"_s, false};
    // Whichever it is about.
    QTest::newRow("another workgroup")
        << u"Samba/WG"_s << workgroup << workgroupFinished << QJsonArray{u"Other"_s, false};
    QTest::newRow("host") << u"Samba/WG/localhost"_s << host << hostFinished
                          << QJsonArray{u"localhost"_s, u"WG"_s, true};
    QTest::newRow("host, nothing new") << u"Samba/WG/localhost"_s << host << hostFinished
                                       << QJsonArray{u"localhost"_s, u"WG"_s, false};
    QTest::newRow("another host") << u"Samba/WG/localhost"_s << host << hostFinished
                                  << QJsonArray{u"h2"_s, u"WG"_s, true};
}

void UpdateJobsTest::rescans()
{
    QFETCH(QString, path);
    QFETCH(QString, request);
    QFETCH(QString, signal);
    QFETCH(QJsonArray, arguments);
    const auto job = makeSmbJob(place(path));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    // The request goes out without waiting for its answer.
    QTRY_COMPARE(service->calls(), QStringList(request));
    // News of the other levels are not waited for.
    if (signal != u"rescanFinished"_s) {
        emitSmb(u"rescanFinished"_s, {false});
    }
    if (signal != u"rescanHostFinished"_s) {
        emitSmb(u"rescanHostFinished"_s, {u"localhost"_s, u"WG"_s, false});
    }
    log->takeAll(service);
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
    // Connected behind the job, and still told before it ends.
    int endsWhenTold = -1;
    QObject receiver;
    onScanNews(&receiver, [&] { endsWhenTold = finished.count(); });
    emitSmb(signal, arguments);
    QVERIFY(finished.wait(20000));
    QCOMPARE(endsWhenTold, 0);
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 0);
    QCOMPARE(tool->runs(), 0);
}

void UpdateJobsTest::rescanEndsOnWhatIsKnown_data()
{
    QTest::addColumn<QString>("path");
    QTest::newRow("workgroup") << u"Samba/New"_s;
    QTest::newRow("host") << u"Samba/Other/n1"_s;
}

void UpdateJobsTest::rescanEndsOnWhatIsKnown()
{
    QFETCH(QString, path);
    // What is below them nobody has read yet: it is told from inside the request.
    service->setValue(u"SmbBrowser.workgroups"_s, array(R"(["New", "Other", "WG"])"));
    service->setValue(u"SmbBrowser.hosts New"_s, array(R"(["n1"])"));
    service->setValue(u"SmbBrowser.hosts Other"_s, array(R"(["n1"])"));
    service->setValue(u"SmbBrowser.shares n1 Other"_s, object(R"({"pub": ""})"));
    emitSmb(u"rescanFinished"_s, {true});
    emitSmb(u"rescanWorkgroupFinished"_s, {u"Other"_s, true});
    QTRY_VERIFY(!place(path).isNull());
    const auto job = makeSmbJob(place(path));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 0);
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
}

void UpdateJobsTest::rescanOfAnUnreadNetwork()
{
    QVERIFY(rerunPasses(unreadNetworkArgument));
}

void UpdateJobsTest::rescanWithoutAnAnswerWaits()
{
    const auto job = makeSmbJob(place(u"Samba/WG"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    // Swallowed by the client: it knows no such workgroup.
    emitSmb(u"rescanWorkgroupFinished"_s, {u"nobody"_s, true});
    log->takeAll(service);
    QCoreApplication::processEvents();
    QCOMPARE(finished.count(), 0);
}

void UpdateJobsTest::shareWithALocalPath()
{
    const auto job = makeSmbJob(
        makeEntry(u"Samba/WG/localhost/home"_s, u"/mnt/home"_s, int(TypeSambaSharePlace)));
    startToEnd(job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(service->takeCalls(), QStringList());
    QVERIFY(auth->protocol().isEmpty());
}

void UpdateJobsTest::shareIsAttached_data()
{
    QTest::addColumn<QList<QByteArrayList>>("runs");
    QTest::addColumn<QString>("hostForKerberos");
    using Runs = QList<QByteArrayList>;
    QTest::newRow("ticket") << Runs{listed} << u"localhost"_s;
    QTest::newRow("guest") << Runs{{"exit 1"}, listed} << QString();
}

void UpdateJobsTest::shareIsAttached()
{
    QFETCH(QList<QByteArrayList>, runs);
    QFETCH(QString, hostForKerberos);
    for (const QByteArrayList& run : runs) {
        tool->expect(run);
    }
    const auto job = makeSmbJob(place(u"Samba/WG/localhost/pub"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(finished.count(), 0);
    QVERIFY(job->findChild<CheckSmbShareAuthJob*>());
    QCOMPARE(
        service->takeCalls(),
        QStringList(u"SmbBrowser.shareLocalPath[\"pub\",\"localhost\",\"WG\",\"%1\"]"_s.arg(
            hostForKerberos)));
    // Whichever share it is about.
    int endsWhenTold = -1;
    const auto connection =
        connect(vfs, &VFS::smbShareUpdated, this, [&] { endsWhenTold = finished.count(); });
    emitSmb(u"shareUpdated"_s, {u"home"_s, u"localhost"_s, u"WG"_s, u"/mnt/home"_s});
    QVERIFY(finished.wait(20000));
    disconnect(connection);
    QCOMPARE(endsWhenTold, 0);
    QCOMPARE(job->error(), 0);
}

// Told by a server whose owner would like to write files here.
void UpdateJobsTest::shareIsNoOption()
{
    const auto job = makeSmbJob(place(u"Samba/WG/localhost/pub -Tc .profile a.txt"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    job->start();
    QCOMPARE(tool->runs(), 0);
    QCOMPARE(auth->calls, QStringList());
    // As where smbclient is missing.
    QCOMPARE(
        service->takeCalls(), QStringList(u"SmbBrowser.shareLocalPath[\"pub -Tc .profile "
                                          "a.txt\",\"localhost\",\"WG\",\"\"]"_s));
    emitSmb(u"shareUpdated"_s, {u"home"_s, u"localhost"_s, u"WG"_s, u"/mnt/home"_s});
    QVERIFY(finished.wait(20000));
    QCOMPARE(job->error(), 0);
}

void UpdateJobsTest::shareErrorsPassThrough()
{
    tool->expect({"exit 1"});
    tool->expect(denied);
    auth->answers = {Auth::cancel(), Auth::cancel()};
    const auto job = makeSmbJob(place(u"Samba/WG/localhost/pub"_s));
    startToEnd(job.get());
    QCOMPARE(job->error(), 2);
    QCOMPARE(job->errorString(), u"Login cancelled"_s);
    QCOMPARE(service->takeCalls(), QStringList());
    QCOMPARE(auth->domain(), u"WG"_s);
    QCOMPARE(auth->object(), u"pub"_s);
}

void UpdateJobsTest::shareOutsideTheGroup()
{
    const auto job = makeSmbJob(place(u"Samba/WG/localhost/pub"_s));
    QSignalSpy finished(job.get(), &Job::finished);
    if (!startOutsideGroup(job.get())) {
        QSKIP("can't leave the group \"fuse\"");
    }
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), 4);
    QCOMPARE(job->errorString(), outsideTheGroup);
    QCOMPARE(service->takeCalls(), QStringList());
}

void UpdateJobsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

/// A network that nobody has read yet, of which there is one in a process.
class UnreadNetworkTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void rescanEndsOnWhatIsKnown()
    {
        const QByteArray script = R"({"echo": false, "values": {"SmbBrowser.workgroups": ["WG"]}})";
        QVERIFY2(startVfs(script), qPrintable(service.errorString()));
        UpdateSmbEntryJob job(
            QSharedPointer<ScriptedAuthenticator>::create(), vfs->sambaNetworkEntry());
        job.setDeleteOnFinish(false);
        QSignalSpy finished(&job, &Job::finished);
        job.start();
        QCOMPARE(finished.count(), 0);
        QVERIFY(finished.wait(20000));
        QCOMPARE(job.error(), 0);
    }

private:
    const VfsScene m_scene;
};

int main(int argc, char** argv)
{
    const bool unread = isRerun(argc, argv, unreadNetworkArgument);
    QCoreApplication app(argc, argv);
    if (unread) {
        return runTests<UnreadNetworkTest>(argv);
    }
    UpdateJobsTest test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_updatejobs.moc"
