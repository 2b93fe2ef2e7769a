// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "jobs/job.h"
#include "service/favouriteplacesmanagerproxy.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "service/networkplacesmanagerproxy.h"
#include "service/smbbrowserproxy.h"
#include "service/storageplacesmanagerproxy.h"
#include "support/vfslog.h"

#include <QSignalSpy>

using namespace VeyFM;

/// The library against a service without Qt: every record in both directions.
class PythonPeerTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void startUp();
    void storage();
    void favourites();
    void bookmarks();
    void mounts();
    void samba();
    void notify();
    void jobs();

private:
    QDBusMessage test(const QString& method, const QVariantList& arguments = {})
    {
        QDBusMessage call = QDBusMessage::createMethodCall(
            ServiceScene::name(), u"/Test"_s, u"org.veylabs.Test.Python"_s, method);
        call.setArguments(arguments);
        return QDBusConnection::sessionBus().call(call);
    }

    // The calls since the last question, with the types of their arguments.
    QStringList seen()
    {
        return test(u"Seen"_s).arguments().value(0).toStringList();
    }

    // Has the service send a signal, and waits for the proxy's.
    QVariantList emitted(const QObject& proxy, const char* proxySignal, const QString& name)
    {
        QSignalSpy spy(&proxy, proxySignal);
        test(u"Emit"_s, {name});
        return spy.isEmpty() && !spy.wait() ? QVariantList() : QVariantList(spy.first());
    }

    QSharedPointer<QDBusInterface> interface(const QString& name)
    {
        return QSharedPointer<QDBusInterface>::create(
            ServiceScene::name(), QLatin1Char('/') + name, u"org.veylabs.FileManager."_s + name,
            QDBusConnection::sessionBus());
    }

    PrivateBus m_bus;
};

void PythonPeerTest::initTestCase()
{
    m_bus.installService(
        {u"/usr/bin/python3"_s, QStringLiteral(VEYFM_PYTHON_SERVICE),
         QStringLiteral(VEYFM_CONTRACT)});
    QVERIFY2(m_bus.start(), qPrintable(m_bus.errorString()));
    VFS::initialize();
    const QDBusReply<void> started =
        QDBusConnection::sessionBus().interface()->startService(ServiceScene::name());
    // Debian: python3-dbus and python3-gi.
    QVERIFY2(started.isValid(), qPrintable(started.error().message()));
    VFS::ptr();
}

void PythonPeerTest::startUp()
{
    QCOMPARE(
        seen(), QStringList(
                    {u"incrementProcessRef()"_s, u"favouritePlaces()"_s, u"mounts()"_s,
                     u"networkPlaces()"_s}));
    QCOMPARE(
        VFS::ptr()->childs(VFS::ptr()->networkEntry()).paths(),
        QStringList({u"Samba"_s, u"FTP"_s, u"Network/Büro"_s}));
}

void PythonPeerTest::storage()
{
    const auto live = interface(u"StoragePlacesManager"_s);
    StoragePlacesManagerProxy proxy(live);
    const StoragePlace place = proxy.availableStoragePlaces().value(0);
    const auto check = [](const StoragePlace& record) {
        QCOMPARE(record.mountPoint(), u"/media/x"_s);
        QVERIFY(record.isMounted() && !record.isMountable() && record.isEjectable());
        QCOMPARE(record.name(), u"Storage devices/sdx"_s);
        QCOMPARE(record.labelName(), u"Lâbel"_s);
        QCOMPARE(record.iconName(), u"icon"_s);
        QCOMPARE(record.udi(), u"udi-x"_s);
        QCOMPARE(record.type(), StoragePlace::StorageTypeUsbDisk);
    };
    check(place);
    const StorageDeviceInfo info = proxy.storageDeviceInfo(place);
    QCOMPARE(info.text4, u"4"_s);
    QCOMPARE(info.text5, u"5"_s);
    QCOMPARE(info.text10, u"10"_s);
    QVERIFY(info.flag1 && info.flag2 && !info.localFlag);
    QCOMPARE(info.number1, Q_UINT64_C(0x8000000000000001));
    QCOMPARE(info.number2, Q_UINT64_C(2));
    QCOMPARE(info.number3, Q_UINT64_C(3));
    QCOMPARE(info.number4, Q_UINT64_C(4));
    QCOMPARE(info.number5, Q_UINT64_C(0xffffffffffffffff));
    QCOMPARE(
        seen(), QStringList(
                    {u"availableStoragePlaces()"_s,
                     u"storageDeviceInfo((s:/media/x, b:true, b:false, b:true, s:sdx, s:Lâbel, "
                     "s:icon, s:udi-x, i:3))"_s}));
    check(emitted(proxy, SIGNAL(storagePlaceAdded(VeyFM::StoragePlace)), u"storagePlaceAdded"_s)
              .value(0)
              .value<StoragePlace>());
    check(emitted(
              proxy, SIGNAL(storagePlaceUpdated(VeyFM::StoragePlace, VeyFM::StoragePlace)),
              u"storagePlaceUpdated"_s)
              .value(0)
              .value<StoragePlace>());
    check(emitted(proxy, SIGNAL(storagePlaceRemoved(VeyFM::StoragePlace)), u"storagePlaceRemoved"_s)
              .value(0)
              .value<StoragePlace>());
}

void PythonPeerTest::favourites()
{
    const auto live = interface(u"FavouritePlacesManager"_s);
    FavouritePlacesManagerProxy proxy(live);
    QCOMPARE(proxy.favouritePlaces().value(0).name(), u"Fäv"_s);
    QCOMPARE(proxy.favouritePlaces().value(0).localPath, u"/fav"_s);
    seen();
    proxy.addFavouritePlace(FavouritePlace(u"ü"_s, u"/ü"_s));
    proxy.removeFavouritePlace(FavouritePlace(u"ü"_s, u"/ü"_s));
    QCOMPARE(
        seen(),
        QStringList({u"addFavouritePlace((s:ü, s:/ü))"_s, u"removeFavouritePlace((s:ü, s:/ü))"_s}));
    QCOMPARE(
        emitted(proxy, SIGNAL(favouritePlaceAdded(VeyFM::FavouritePlace)), u"favouritePlaceAdded"_s)
            .value(0)
            .value<FavouritePlace>()
            .localPath,
        u"/new"_s);
    QCOMPARE(
        emitted(
            proxy, SIGNAL(favouritePlaceRemoved(VeyFM::FavouritePlace)), u"favouritePlaceRemoved"_s)
            .value(0)
            .value<FavouritePlace>()
            .name(),
        u"New"_s);
}

void PythonPeerTest::bookmarks()
{
    const auto live = interface(u"NetworkPlacesManager"_s);
    NetworkPlacesManagerProxy proxy(live);
    const NetworkPlace place = proxy.networkPlaces().value(0);
    QCOMPARE(place.name(), u"Büro"_s);
    QCOMPARE(place.url(), u"sftp://büro"_s);
    QCOMPARE(place.localPath(), u"/mnt/b"_s);
    seen();
    QVERIFY(proxy.addNetworkPlace(place));
    proxy.removeNetworkPlace(place);
    proxy.updateNetworkPlace(place);
    const QString record = u"((s:Büro, s:sftp://büro, s:/mnt/b))"_s;
    QCOMPARE(
        seen(), QStringList(
                    {u"addNetworkPlace"_s + record, u"removeNetworkPlace"_s + record,
                     u"updateNetworkPlace"_s + record}));
    for (const char* name : {"networkPlaceAdded", "networkPlaceRemoved", "networkPlaceUpdated"}) {
        const QByteArray signature = QByteArray("2") + name + "(VeyFM::NetworkPlace)";
        const auto told =
            emitted(proxy, signature, QLatin1String(name)).value(0).value<NetworkPlace>();
        QCOMPARE(told.url(), u"ftp://new"_s);
    }
}

void PythonPeerTest::mounts()
{
    const auto network = interface(u"NetworkMountsManager"_s);
    const auto fuse = interface(u"FuseMountsManager"_s);
    NetworkMountsManagerProxy networkProxy(network);
    FuseMountsManagerProxy fuseProxy(fuse);
    const Entry entry = networkProxy.mounts().value(u"ftp://höst"_s);
    QCOMPARE(entry.path(), u"FTP/höst"_s);
    QCOMPARE(entry.localPath(), u"/mnt/ö"_s);
    QCOMPARE(entry.type(), int(TypeFtpSharePlace));
    QCOMPARE(fuseProxy.mounts().value(u"ftp://höst"_s), u"/mnt/ö"_s);
    seen();
    networkProxy.addMount(u"u"_s, entry);
    fuseProxy.addMount(u"u"_s, u"/l"_s);
    QCOMPARE(
        seen(),
        QStringList(
            {u"addMount(s:u, (s:FTP/höst, s:/mnt/ö, i:4002))"_s, u"addMount(s:u, s:/l)"_s}));
    const QVariantList told =
        emitted(networkProxy, SIGNAL(mountAdded(QString, VeyFM::Entry)), u"mountAdded"_s);
    QCOMPARE(told.value(0).toString(), u"ftp://höst"_s);
    QCOMPARE(told.value(1).value<Entry>().localPath(), u"/mnt/ö"_s);
}

void PythonPeerTest::samba()
{
    const auto live = interface(u"SmbBrowser"_s);
    SmbBrowserProxy proxy(live);
    QCOMPARE(proxy.workgroups(), QStringList(u"WÖRK"_s));
    QCOMPARE(proxy.hosts(u"WÖRK"_s), QStringList(u"höst"_s));
    QCOMPARE(proxy.shares(u"höst"_s, u"WÖRK"_s).value(u"shäre"_s), u"/mnt/share"_s);
    QCOMPARE(proxy.shares(u"höst"_s, u"WÖRK"_s).size(), 2);
    QCOMPARE(proxy.smbNetworkLocalPath(), u"/mnt"_s);
    QCOMPARE(proxy.shareLocalPath(u"s"_s, u"h"_s, u"w"_s, QString()), u"/mnt/share"_s);
    proxy.rescan();
    proxy.rescanWorkgroup(u"WÖRK"_s);
    proxy.rescanHost(u"höst"_s, u"WÖRK"_s);
    QCOMPARE(
        seen(),
        QStringList(
            {u"workgroups()"_s, u"hosts(s:WÖRK)"_s, u"shares(s:höst, s:WÖRK)"_s,
             u"smbNetworkLocalPath()"_s, u"shareLocalPath(s:s, s:h, s:w, s:)"_s, u"rescan()"_s,
             u"rescanWorkgroup(s:WÖRK)"_s, u"rescanHost(s:höst, s:WÖRK)"_s}));
    QSignalSpy same(&proxy, &SmbBrowserProxy::workgroupsNotChanged);
    test(u"Emit"_s, {u"rescanFinished"_s});
    QVERIFY(!same.isEmpty() || same.wait());
    QCOMPARE(
        emitted(proxy, SIGNAL(workgroupNotUpdated(QString)), u"rescanWorkgroupFinished"_s),
        QVariantList{u"WÖRK"_s});
    QCOMPARE(
        emitted(proxy, SIGNAL(hostNotUpdated(QString, QString)), u"rescanHostFinished"_s),
        QVariantList({u"höst"_s, u"WÖRK"_s}));
    QCOMPARE(
        emitted(proxy, SIGNAL(shareUpdated(QString, QString, QString, QString)), u"shareUpdated"_s),
        QVariantList({u"shäre"_s, u"höst"_s, u"WÖRK"_s, u"/mnt/new"_s}));
}

void PythonPeerTest::notify()
{
    VFS* const vfs = VFS::ptr();
    VfsLog log;
    EntryList entries(vfs->rootEntry());
    entries.append(vfs->fileSystemEntry());
    vfs->notifyAllWatchers(entries);
    QCOMPARE(
        seen(),
        QStringList(u"notifyWatchers([(s:_, s:, i:1000), (s:File System, s:/, i:2000)])"_s));
    log.take();
    QSignalSpy resets(vfs->entryWatcher(), &EntryWatcher::entryReset);
    test(u"Emit"_s, {u"notifyWatchersSignal"_s});
    QTRY_COMPARE(resets.count(), 2);
    QCOMPARE(log.take(), QStringList({u"reset FTP/höst=/mnt/ö"_s, u"reset _"_s}));
}

void PythonPeerTest::jobs()
{
    VFS* const vfs = VFS::ptr();
    QCOMPARE(vfs->childs(vfs->storageDevicesEntry()).size(), 1);
    const Entry entry = vfs->entry(u"Storage devices/sdx"_s);
    seen();
    for (Job* const job : {vfs->mount(entry), vfs->unmount(entry), vfs->eject(entry)}) {
        job->exec();
        QCOMPARE(job->error(), 0);
    }
    const QStringList calls = seen();
    QCOMPARE(calls.size(), 3);
    QVERIFY(calls.at(0).startsWith(u"mountStoragePlace((s:/media/x, b:true"_s));
    QVERIFY(calls.at(1).startsWith(u"unmountStoragePlace((s:/media/x, b:true"_s));
    QVERIFY(calls.at(2).startsWith(u"ejectStoragePlaceDevice((s:/media/x, b:true"_s));
}

QTEST_GUILESS_MAIN(PythonPeerTest)
#include "tst_pythonpeer.moc"
