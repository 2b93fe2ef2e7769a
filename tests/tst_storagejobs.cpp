// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/storageplacejob.h"
#include "jobs/vfsstoragejob.h"
#include "service/storageplacesmanagerproxy.h"
#include "support/vfstest.h"

#include <QPointer>
#include <QSignalSpy>
#include <QTranslator>

using namespace VeyFM;

namespace {

/// Gives each text back with the class that raised it.
class ContextTranslator : public QTranslator
{
public:
    bool isEmpty() const override
    {
        return false;
    }

    QString translate(const char* context, const char* text, const char*, int) const override
    {
        return QLatin1String(context) + u": "_s + QLatin1String(text);
    }
};

QString outcome(Job* job)
{
    job->exec();
    return QString::number(job->error()) + QLatin1Char(' ') + job->errorString();
}

// Plain functions: a compiler that checks for undefined behaviour stumbles over pointers to
// members.
struct Factory
{
    Job* (*make)(const Entry&);
};

Job* mountJob(const Entry& entry)
{
    return VFS::ptr()->mount(entry);
}

Job* unmountJob(const Entry& entry)
{
    return VFS::ptr()->unmount(entry);
}

Job* ejectJob(const Entry& entry)
{
    return VFS::ptr()->eject(entry);
}

} // namespace

Q_DECLARE_METATYPE(Factory)

/// Mounting, unmounting and ejecting: what is sent, and what a reply becomes.
class StorageJobsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void kinds_data();
    void kinds();
    void refusedEntry_data();
    void refusedEntry();
    void replies_data();
    void replies();
    void unknownDeviceSendsADefaultRecord();
    void jobsAreHandedOverUnstarted();
    void stateIsTheServicesToRefuse();
    void goneInterface();
    void withoutAManager();
    void pendingCallKeepsItsInterface();
    void textsBelongToTheirClasses();
    void serviceDiesMeanwhile();
};

void StorageJobsTest::initTestCase()
{
    QVERIFY(startVfs("{}"));
    service->setValue(
        u"StoragePlacesManager.availableStoragePlaces"_s,
        QJsonArray{device(u"sda"_s, u"A"_s, 4, u"/a"_s), device(u"sdb"_s, u"B"_s, 3)});
    QCOMPARE(vfs->childs(vfs->storageDevicesEntry()).size(), 2);
    log->take();
    service->takeCalls();
}

void StorageJobsTest::kinds_data()
{
    QTest::addColumn<Factory>("factory");
    QTest::addColumn<QString>("method");
    QTest::newRow("mount") << Factory{mountJob} << u"mountStoragePlace"_s;
    QTest::newRow("unmount") << Factory{unmountJob} << u"unmountStoragePlace"_s;
    QTest::newRow("eject") << Factory{ejectJob} << u"ejectStoragePlaceDevice"_s;
}

void StorageJobsTest::kinds()
{
    QFETCH(Factory, factory);
    QFETCH(QString, method);
    // False in a good reply is success.
    const QString result = outcome(factory.make(vfs->entry(u"Storage devices/sdb"_s)));
    QCOMPARE(result, u"0 "_s);
    QCOMPARE(
        service->takeCalls(),
        QStringList(
            u"StoragePlacesManager.%1[[\"\",false,true,false,\"sdb\",\"\",\"\",\"B\",3]]"_s.arg(
                method)));
}

void StorageJobsTest::refusedEntry_data()
{
    QTest::addColumn<Factory>("factory");
    QTest::addColumn<QString>("text");
    QTest::newRow("mount") << Factory{mountJob} << u"1 This type of point cannot be mounted"_s;
    QTest::newRow("unmount") << Factory{unmountJob}
                             << u"1 This type of point cannot be unmounted"_s;
    QTest::newRow("eject") << Factory{ejectJob} << u"1 This type of point cannot be ejected"_s;
}

void StorageJobsTest::refusedEntry()
{
    QFETCH(Factory, factory);
    QFETCH(QString, text);
    for (const Entry& entry : {vfs->entry(u"/etc/passwd"_s), vfs->homeEntry(), Entry()}) {
        QCOMPARE(outcome(factory.make(entry)), text);
        // Before start() returns.
        Job* const job = factory.make(entry);
        QSignalSpy finished(job, &Job::finished);
        job->start();
        QCOMPARE(finished.count(), 1);
    }
    QCOMPARE(service->takeCalls(), QStringList());
}

void StorageJobsTest::replies_data()
{
    QTest::addColumn<QByteArray>("rule");
    QTest::addColumn<int>("code");
    QTest::addColumn<QString>("text");
    QTest::newRow("true") << QByteArray(R"([{"value": true}])") << 0 << QString();
    QTest::newRow("false") << QByteArray(R"([{"value": false}])") << 0 << QString();
    QTest::newRow("late") << QByteArray(R"([{"delay": 20}])") << 0 << QString();
    QTest::newRow("error") << QByteArray(R"([{"error": "Device is busy: \"ünits\""}])") << 2
                           << u"Device is busy: \"ünits\""_s;
    QTest::newRow("error without text") << QByteArray(R"([{"error": ""}])") << 2 << u""_s;
    QTest::newRow("nothing") << QByteArray(R"([{"empty": true}])") << 2 << QString();
    QTest::newRow("another type") << QByteArray(R"([{"wrong": true}])") << 2 << QString();
    QTest::newRow("a boolean and more")
        << QByteArray(R"([{"value": true, "extra": true}])") << 2 << QString();
}

void StorageJobsTest::replies()
{
    QFETCH(QByteArray, rule);
    QFETCH(int, code);
    QFETCH(QString, text);
    service->setRules(u"StoragePlacesManager.mountStoragePlace"_s, array(rule));
    QPointer<Job> job(vfs->mount(vfs->entry(u"Storage devices/sda"_s)));
    QSignalSpy finished(job, &Job::finished);
    job->exec();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(job->error(), code);
    if (code == 0 || !text.isNull()) {
        QCOMPARE(job->errorString(), text);
    } else {
        QVERIFY(!job->errorString().isEmpty());
    }
    QTRY_VERIFY(!job);
    service->takeCalls();
}

void StorageJobsTest::unknownDeviceSendsADefaultRecord()
{
    // A place with a storage type and no device behind it, as a mount of that type makes.
    news(
        u"NetworkMountsManager"_s, u"mountAdded"_s,
        array(R"(["ftp://ghost", ["FTP/ghost", "/m", 3500]])"));
    service->takeCalls();
    service->setRules(
        u"StoragePlacesManager.ejectStoragePlaceDevice"_s, array(R"([{"error": "which one?"}])"));
    QCOMPARE(outcome(vfs->eject(vfs->entry(u"FTP/ghost"_s))), u"2 which one?"_s);
    QCOMPARE(
        service->takeCalls(), QStringList(u"StoragePlacesManager.ejectStoragePlaceDevice"
                                          "[[\"\",false,true,false,\"\",\"\",\"\",\"\",0]]"_s));
}

void StorageJobsTest::jobsAreHandedOverUnstarted()
{
    const std::unique_ptr<Job> job(vfs->mount(vfs->entry(u"Storage devices/sda"_s)));
    QVERIFY(qobject_cast<VFSStorageMountJob*>(job.get()));
    QCOMPARE(job->parent(), static_cast<QObject*>(vfs));
    QVERIFY(job->isDeleteOnFinish());
    QCOMPARE(service->takeCalls(), QStringList());
}

void StorageJobsTest::stateIsTheServicesToRefuse()
{
    // A mounted device is mounted again, a fixed one ejected.
    QCOMPARE(outcome(vfs->mount(vfs->entry(u"Storage devices/sda"_s))), u"0 "_s);
    QCOMPARE(outcome(vfs->eject(vfs->entry(u"Storage devices/sda"_s))), u"0 "_s);
    QCOMPARE(service->takeCalls().size(), 2);
}

void StorageJobsTest::goneInterface()
{
    auto interface = service.interface(u"StoragePlacesManager"_s);
    StoragePlacesManagerProxy proxy(interface);
    interface.clear();
    const std::unique_ptr<Job> inner(proxy.mountStoragePlace(StoragePlace()));
    inner->setDeleteOnFinish(false);
    QSignalSpy finished(inner.get(), &Job::finished);
    inner->start();
    QCOMPARE(finished.count(), 1);
    QCOMPARE(inner->error(), 1);
    QCOMPARE(inner->errorString(), u"Can't get service interface"_s);
    // And passed on as it is.
    auto* const outer = new VFSStorageUnmountJob(vfs->entry(u"Storage devices/sda"_s), &proxy);
    QCOMPARE(outcome(outer), u"1 Can't get service interface"_s);
    QCOMPARE(service->takeCalls(), QStringList());
}

void StorageJobsTest::withoutAManager()
{
    auto* const job = new VFSStorageMountJob(vfs->entry(u"Storage devices/sda"_s), nullptr);
    job->exec();
    QCOMPARE(job->error(), 1);
    QVERIFY(!job->errorString().isEmpty());
}

void StorageJobsTest::pendingCallKeepsItsInterface()
{
    service->setRules(
        u"StoragePlacesManager.mountStoragePlace"_s, array(R"([{"delay": 50, "value": true}])"));
    auto interface = service.interface(u"StoragePlacesManager"_s);
    const QWeakPointer<QDBusInterface> held = interface;
    StoragePlacesManagerProxy proxy(interface);
    QPointer<Job> job(proxy.mountStoragePlace(StoragePlace()));
    interface.clear();
    QVERIFY(!held.isNull());
    QSignalSpy finished(job, &Job::finished);
    job->start();
    QVERIFY(finished.wait());
    QTRY_VERIFY(!job);
    QVERIFY(held.isNull());
}

void StorageJobsTest::textsBelongToTheirClasses()
{
    ContextTranslator translator;
    QVERIFY(QCoreApplication::installTranslator(&translator));
    StoragePlacesManagerProxy proxy(QWeakPointer<QDBusInterface>{});
    const QString gone = u"Can't get service interface"_s;
    QCOMPARE(
        outcome(proxy.mountStoragePlace(StoragePlace())),
        u"1 VeyFM::StoragePlaceMountJob: "_s + gone);
    QCOMPARE(
        outcome(proxy.unmountStoragePlace(StoragePlace())),
        u"1 VeyFM::StoragePlaceUnmountJob: "_s + gone);
    QCOMPARE(
        outcome(proxy.ejectStoragePlaceDevice(StoragePlace())),
        u"1 VeyFM::StoragePlaceEjectJob: "_s + gone);
    QCOMPARE(
        outcome(vfs->eject(Entry())),
        u"1 VeyFM::VFSStorageEjectJob: This type of point cannot be ejected"_s);
    QCoreApplication::removeTranslator(&translator);
}

void StorageJobsTest::serviceDiesMeanwhile()
{
    QCOMPARE(service->violations(), QStringList());
    service->setRules(u"StoragePlacesManager.mountStoragePlace"_s, array(R"([{"exit": 1}])"));
    Job* const job = vfs->mount(vfs->entry(u"Storage devices/sda"_s));
    job->exec();
    QCOMPARE(job->error(), 2);
    QVERIFY(!job->errorString().isEmpty());
}

QTEST_GUILESS_MAIN(StorageJobsTest)
#include "tst_storagejobs.moc"
