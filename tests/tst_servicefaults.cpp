// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"
#include "jobs/job.h"
#include "service/smbbrowserproxy.h"
#include "support/vfstest.h"

#include <QElapsedTimer>
#include <QSignalSpy>

#include <chrono>
#include <functional>
#include <thread>

#include <csignal>

using namespace VeyFM;

namespace {

/// Does something to a process from another thread, while this one waits for it.
class Meanwhile
{
public:
    explicit Meanwhile(std::function<void()> work)
        : m_thread([work = std::move(work)] {
            // Long enough for the call of the other thread to be on its way.
            std::this_thread::sleep_for(std::chrono::milliseconds(200));
            work();
        })
    {
    }

    ~Meanwhile()
    {
        m_thread.join();
    }

private:
    std::thread m_thread;
};

} // namespace

/// A service that dies, stands still, or sends what no service should.
class ServiceFaultsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void stoppedDuringARead();
    void killedDuringARead();
    void diesInsteadOfAnAnswer();
    void deadBeforeACall();
    void newsOfARestartedService();
    void stoppedDuringAJob();
    void newsBeforeTheReplyTheyBelongTo();
    void newsOfRecordsNeverSeen();
    void oddNames_data();
    void oddNames();
    void oddFavouritesCanBeRemoved();

private:
    void revive()
    {
        QDBusConnection::sessionBus().interface()->startService(ServiceScene::name());
        QVERIFY(service->waitForService());
    }
};

void ServiceFaultsTest::initTestCase()
{
    const QByteArray script = R"({"values": {
        "SmbBrowser.workgroups": ["WG"],
        "SmbBrowser.hosts": ["h"],
        "SmbBrowser.shares": {"s": "/s"},
        "SmbBrowser.smbNetworkLocalPath": "/mnt"}})";
    QVERIFY(startVfs(script));
}

void ServiceFaultsTest::stoppedDuringARead()
{
    QElapsedTimer timer;
    timer.start();
    service->stop();
    {
        Meanwhile resume([pid = service->stoppedProcess()] { ::kill(pid_t(pid), SIGCONT); });
        // The answer counts, however late.
        QCOMPARE(vfs->smbBrowser()->smbNetworkLocalPath(), u"/mnt"_s);
    }
    QVERIFY(timer.elapsed() >= 150);
    service->resume();
}

void ServiceFaultsTest::killedDuringARead()
{
    const qint64 before = service->processId();
    service->stop();
    {
        Meanwhile kill([pid = before] { ::kill(pid_t(pid), SIGKILL); });
        QVERIFY(vfs->smbBrowser()->smbNetworkLocalPath().isEmpty());
    }
    QTRY_VERIFY(service->processId() != before);
    revive();
}

void ServiceFaultsTest::diesInsteadOfAnAnswer()
{
    service->setRules(u"SmbBrowser.workgroups"_s, array(R"([{"exit": 1}])"));
    QVERIFY(vfs->childs(vfs->sambaNetworkEntry()).isEmpty());
    QCOMPARE(log->take(), QStringList({u"started"_s, u"reset Samba"_s, u"finished"_s}));
    revive();
    // The failed read stands, and a changed rescan makes it good.
    QVERIFY(vfs->childs(vfs->sambaNetworkEntry()).isEmpty());
    QCOMPARE(
        news(u"SmbBrowser"_s, u"rescanFinished"_s, {true}), QStringList(u"created Samba/WG"_s));
}

void ServiceFaultsTest::deadBeforeACall()
{
    service->kill();
    QVERIFY(!service->isRunning());
    // The bus starts it again for the call.
    QCOMPARE(vfs->childs(vfs->entry(u"Samba/WG"_s)).paths(), QStringList(u"Samba/WG/h"_s));
    QVERIFY(service->isRunning());
    log->take();
}

void ServiceFaultsTest::newsOfARestartedService()
{
    service->exit();
    revive();
    QCOMPARE(
        news(u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, arguments({u"F"_s, u"/f"_s})),
        QStringList(u"created Favourites/F=/f"_s));
    // It is not told of this process again.
    QVERIFY(!service->calls().contains(u"Service.incrementProcessRef[]"_s));
}

void ServiceFaultsTest::stoppedDuringAJob()
{
    news(
        u"NetworkMountsManager"_s, u"mountAdded"_s,
        array(R"(["ftp://dev", ["FTP/dev", "/m", 3500]])"));
    service->stop();
    Job* const job = vfs->mount(vfs->entry(u"FTP/dev"_s));
    QSignalSpy finished(job, &Job::finished);
    job->setDeleteOnFinish(false);
    // The loop of this process runs on.
    QVERIFY(!finished.wait(100));
    QElapsedTimer timer;
    timer.start();
    job->start();
    QVERIFY(timer.elapsed() < 5000);
    QVERIFY(!finished.wait(100));
    service->resume();
    QVERIFY(finished.wait());
    QCOMPARE(job->error(), 0);
    delete job;
}

void ServiceFaultsTest::newsBeforeTheReplyTheyBelongTo()
{
    const QJsonArray added = device(u"sda"_s, u"A"_s);
    QJsonArray listed;
    listed.append(added);
    QJsonObject rule;
    rule.insert(u"value"_s, listed);
    rule.insert(
        u"signals"_s,
        arguments({u"StoragePlacesManager"_s, u"storagePlaceAdded"_s, arguments(added)}));
    service->setRules(u"StoragePlacesManager.availableStoragePlaces"_s, {rule});
    QCOMPARE(vfs->childs(vfs->storageDevicesEntry()).size(), 1);
    // The signal is handled behind the read, and adds what is there: twice in the list, which is
    // not searched for duplicates, and once in the tree.
    QCOMPARE(log->takeAll(service), QStringList({u"started"_s, u"finished"_s}));
    QCOMPARE(vfs->storagePlacesByType(StoragePlace::StorageTypeUsbDisk).size(), 2);
    QCOMPARE(childPaths(u"Storage devices"_s).size(), 1);
}

void ServiceFaultsTest::newsOfRecordsNeverSeen()
{
    const QStringList before = childPaths(u"_"_s) + childPaths(u"Computer"_s);
    // None of these may reach another place: an empty name is not the place above, and ".." leads
    // nowhere.
    for (const QString& name : {u"x"_s, QString(), u"."_s, u".."_s, u"../Home"_s, u"/"_s}) {
        for (const QString& news : {u"Updated"_s, u"Removed"_s}) {
            service->emitSignal(
                u"StoragePlacesManager"_s, u"storagePlace"_s + news,
                arguments(device(name, u"?"_s, 99, u"/elsewhere"_s)));
            service->emitSignal(
                u"NetworkPlacesManager"_s, u"networkPlace"_s + news,
                arguments({name, u"ftp://x"_s, u"/elsewhere"_s}));
        }
        service->emitSignal(
            u"FavouritePlacesManager"_s, u"favouritePlaceRemoved"_s,
            arguments({name, u"/elsewhere"_s}));
        service->emitSignal(
            u"SmbBrowser"_s, u"shareUpdated"_s, {name, name, name, u"/elsewhere"_s});
        service->emitSignal(u"SmbBrowser"_s, u"rescanHostFinished"_s, {name, name, true});
    }
    const QStringList told = log->takeAll(service);
    QCOMPARE(told.filter(u"deleted"_s), QStringList());
    // What VFS tells of unknown devices and bookmarks goes with an entry that is no place.
    const QStringList resets = told.filter(QRegularExpression(u"^reset "_s));
    QCOMPARE(resets.size(), 12);
    for (const QString& reset : resets) {
        const QString path = reset.mid(6).section(QLatin1Char('='), 0, 0);
        QVERIFY2(!vfs->placeBase()->hasPlace(path), qPrintable(path));
    }
    QCOMPARE(childPaths(u"_"_s) + childPaths(u"Computer"_s), before);
    QCOMPARE(treeLocalPath(u"Home"_s), QDir::homePath());
    QCOMPARE(treeLocalPath(u"Network"_s), QString());
}

void ServiceFaultsTest::oddNames_data()
{
    QTest::addColumn<QString>("name");
    QTest::newRow("slash") << u"a/b"_s;
    QTest::newRow("slashes") << u"//"_s;
    QTest::newRow("empty") << QString();
    QTest::newRow("dots") << u".."_s;
    QTest::newRow("dot") << u"."_s;
    QTest::newRow("blank") << u" "_s;
    QTest::newRow("scheme") << u"file:///etc"_s;
    QTest::newRow("new line") << u"a\nb"_s;
    QTest::newRow("long") << QString(65536, QLatin1Char('x'));
    QTest::newRow("composed") << u"\u00e9"_s;
    QTest::newRow("decomposed") << u"e\u0301"_s;
    QTest::newRow("right to left") << u"\u202ecod.exe"_s;
    QTest::newRow("beyond the base plane") << u"\U0001f4be"_s;
}

void ServiceFaultsTest::oddNames()
{
    QFETCH(QString, name);
    service->setValue(u"SmbBrowser.workgroups"_s, QJsonArray{name, u"WG"_s});
    service->setValue(u"SmbBrowser.hosts"_s, QJsonArray{name});
    service->setValue(u"SmbBrowser.shares"_s, QJsonObject{{name, name}});
    service->emitSignal(u"SmbBrowser"_s, u"rescanFinished"_s, {true});
    service->emitSignal(
        u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, arguments({name, u"/f"_s}));
    service->emitSignal(
        u"NetworkPlacesManager"_s, u"networkPlaceAdded"_s,
        arguments({name, u"ftp://x"_s, u"/n"_s}));
    service->emitSignal(
        u"StoragePlacesManager"_s, u"storagePlaceAdded"_s, arguments(device(name, name)));
    log->takeAll(service);
    // Each is a place under its name as it came, whatever that is.
    for (const QString& parent :
         {u"Samba"_s, u"Favourites"_s, u"Network"_s, u"Storage devices"_s}) {
        const QString path = parent + QLatin1Char('/') + name;
        QVERIFY2(childPaths(parent).contains(path), qPrintable(parent));
        const Entry entry = vfs->placeBase()->placeEntry(path);
        QCOMPARE(entry.path(), path);
        // Walks end.
        vfs->childs(entry);
        vfs->hasChilds(entry);
        vfs->pathEntryList(entry);
        vfs->getUrlForEntry(entry);
        vfs->isStoragePlaceRelativeEntry(entry);
        vfs->entry(path);
        vfs->normalizePath(path + u"/../x"_s);
        for (const Entry& child : vfs->childs(entry)) {
            vfs->childs(child);
            vfs->getUrlForEntry(child);
        }
    }
    QCOMPARE(childPaths(u"_"_s), QStringList({u"Favourites"_s, u"Computer"_s, u"Network"_s}));
    log->takeAll(service);
}

void ServiceFaultsTest::oddFavouritesCanBeRemoved()
{
    const QString name = u"e\u0301"_s;
    QCOMPARE(
        news(u"FavouritePlacesManager"_s, u"favouritePlaceRemoved"_s, arguments({name, u"/f"_s})),
        QStringList(u"deleted Favourites/%1=/f"_s.arg(name)));
    // The composed form is another name.
    QVERIFY(vfs->placeBase()->hasPlace(u"Favourites/\u00e9"_s));
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(ServiceFaultsTest)
#include "tst_servicefaults.moc"
