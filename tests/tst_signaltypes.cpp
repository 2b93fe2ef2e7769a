// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Connections by the text of a signal, which are queued or lead to another thread, know the types
// of its arguments by the names in that text.

#include "jobs/checksmbshareauthjob.h"
#include "jobs/mountftpurljob.h"
#include "jobs/mountfuseentryjob.h"
#include "jobs/mountsftpurljob.h"
#include "jobs/mountsmburljob.h"
#include "jobs/mounturljob.h"
#include "jobs/storageplacejob.h"
#include "jobs/updatenetworkplacejob.h"
#include "jobs/updatesmbentryjob.h"
#include "jobs/vfsstoragejob.h"
#include "service/favouriteplacesmanagerproxy.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "service/networkplacesmanagerproxy.h"
#include "service/smbbrowserproxy.h"
#include "service/storageplacesmanagerproxy.h"
#include "support/vfstest.h"
#include "watch/inotifywatcher.h"

#include <QDirIterator>
#include <QMetaMethod>
#include <QRegularExpression>
#include <QThread>

using namespace VeyFM;

namespace {

const QMetaObject* const publicClasses[] = {
    &CheckSmbShareAuthJob::staticMetaObject,
    &EntryWatcher::staticMetaObject,
    &FavouritePlacesManagerProxy::staticMetaObject,
    &FuseMountsManagerProxy::staticMetaObject,
    &InotifyWatcher::staticMetaObject,
    &Job::staticMetaObject,
    &MountFtpURLJob::staticMetaObject,
    &MountFuseEntryJob::staticMetaObject,
    &MountSFtpURLJob::staticMetaObject,
    &MountSmbURLJob::staticMetaObject,
    &MountURLJob::staticMetaObject,
    &NetworkMountsManagerProxy::staticMetaObject,
    &NetworkPlacesManagerProxy::staticMetaObject,
    &SmbBrowserProxy::staticMetaObject,
    &StoragePlaceEjectJob::staticMetaObject,
    &StoragePlaceJob::staticMetaObject,
    &StoragePlaceMountJob::staticMetaObject,
    &StoragePlacesManagerProxy::staticMetaObject,
    &StoragePlaceUnmountJob::staticMetaObject,
    &UpdateNetworkPlaceJob::staticMetaObject,
    &UpdateSmbEntryJob::staticMetaObject,
    &VFS::staticMetaObject,
    &VFSStorageEjectJob::staticMetaObject,
    &VFSStorageJob::staticMetaObject,
    &VFSStorageMountJob::staticMetaObject,
    &VFSStorageUnmountJob::staticMetaObject,
};

} // namespace

/// Takes what comes by queued connections.
class Receiver : public QObject
{
    Q_OBJECT

public Q_SLOTS:
    // Spelled as hosts within the namespace do.
    void deviceRemoved(StoragePlace place)
    {
        take(u"removed "_s + place.udi());
    }
    void bookmarkAdded(NetworkPlace place, Entry entry)
    {
        take(u"added "_s + place.name() + u' ' + entry.path());
    }
    void jobFinished(Job* job)
    {
        take(u"finished %1"_s.arg(job->error()));
    }

public:
    int count() const
    {
        return m_count.loadAcquire();
    }

    // After the thread has ended.
    QStringList taken;

private:
    void take(const QString& line)
    {
        taken << line;
        m_count.fetchAndAddRelease(1);
    }

    QAtomicInt m_count;
};

class SignalTypesTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void everyClassIsLookedAt();
    void everyTypeOfASignalHasItsName();
    void queuedByText();
    void toAnotherThreadByText();

private:
    void connectByText(Receiver& receiver, Job& job, Qt::ConnectionType type);
    void tellAll(Job& job);
};

void SignalTypesTest::initTestCase()
{
    QVERIFY(startVfs("{}"));
    vfs->childs(vfs->storageDevicesEntry());
}

void SignalTypesTest::everyClassIsLookedAt()
{
    QStringList looked;
    for (const QMetaObject* const metaObject : publicClasses) {
        looked << QString::fromLatin1(metaObject->className()).section(u"::"_s, -1);
    }
    const QRegularExpression declaration(
        u"^class VEYFMVFS_EXPORT (\\w+)[^;{]*\\{\\s*Q_OBJECT$"_s,
        QRegularExpression::MultilineOption);
    QStringList declared;
    QDirIterator headers(
        QString::fromLocal8Bit(VEYFM_SOURCES), {u"*.h"_s}, QDir::Files,
        QDirIterator::Subdirectories);
    while (headers.hasNext()) {
        QFile header(headers.next());
        QVERIFY(header.open(QIODevice::ReadOnly));
        auto matches = declaration.globalMatch(QString::fromUtf8(header.readAll()));
        while (matches.hasNext()) {
            declared << matches.next().captured(1);
        }
    }
    looked.sort();
    declared.sort();
    QCOMPARE(looked, declared);
}

void SignalTypesTest::everyTypeOfASignalHasItsName()
{
    int count = 0;
    for (const QMetaObject* const metaObject : publicClasses) {
        for (int i = metaObject->methodOffset(); i < metaObject->methodCount(); ++i) {
            const QMetaMethod method = metaObject->method(i);
            if (method.methodType() != QMetaMethod::Signal) {
                continue;
            }
            const QList<QByteArray> types = method.parameterTypes();
            for (const QByteArray& type : types) {
                QVERIFY2(
                    QMetaType::type(type.constData()) != QMetaType::UnknownType,
                    metaObject->className() + QByteArray("::") + method.methodSignature());
                ++count;
            }
        }
    }
    QVERIFY(count > 40);
}

void SignalTypesTest::connectByText(Receiver& receiver, Job& job, Qt::ConnectionType type)
{
    QVERIFY(connect(
        vfs, SIGNAL(storagePlaceRemoved(StoragePlace)), &receiver,
        SLOT(deviceRemoved(StoragePlace)), type));
    QVERIFY(connect(
        vfs, SIGNAL(networkPlaceAdded(NetworkPlace, Entry)), &receiver,
        SLOT(bookmarkAdded(NetworkPlace, Entry)), type));
    QVERIFY(connect(&job, SIGNAL(finished(Job*)), &receiver, SLOT(jobFinished(Job*)), type));
}

void SignalTypesTest::tellAll(Job& job)
{
    job.setDeleteOnFinish(false);
    job.start();
    news(u"StoragePlacesManager"_s, u"storagePlaceRemoved"_s, arguments(device(u"sda"_s, u"A"_s)));
    news(
        u"NetworkPlacesManager"_s, u"networkPlaceAdded"_s,
        arguments({u"B"_s, u"ftp://b"_s, u""_s}));
    news(
        u"NetworkPlacesManager"_s, u"networkPlaceRemoved"_s,
        arguments({u"B"_s, u"ftp://b"_s, u""_s}));
}

void SignalTypesTest::queuedByText()
{
    Receiver receiver;
    VFSStorageMountJob job(vfs->homeEntry(), nullptr);
    connectByText(receiver, job, Qt::QueuedConnection);
    tellAll(job);
    QTRY_COMPARE(receiver.count(), 3);
    QCOMPARE(
        receiver.taken, QStringList({u"finished 1"_s, u"removed A"_s, u"added B Network/B"_s}));
}

void SignalTypesTest::toAnotherThreadByText()
{
    QThread thread;
    Receiver receiver;
    receiver.moveToThread(&thread);
    VFSStorageMountJob job(vfs->homeEntry(), nullptr);
    connectByText(receiver, job, Qt::AutoConnection);
    thread.start();
    tellAll(job);
    QTRY_COMPARE(receiver.count(), 3);
    thread.quit();
    QVERIFY(thread.wait());
    QCOMPARE(
        receiver.taken, QStringList({u"finished 1"_s, u"removed A"_s, u"added B Network/B"_s}));
}

QTEST_GUILESS_MAIN(SignalTypesTest)
#include "tst_signaltypes.moc"
