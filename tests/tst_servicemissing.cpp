// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "core/storageplace.h"
#include "jobs/job.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "service/networkplacesmanagerproxy.h"
#include "service/smbbrowserproxy.h"
#include "support/servicescene.h"
#include "watch/entrywatcher.h"

#include <QSignalSpy>
#include <QTest>

using namespace VeyFM;

namespace {

QStringList messages;

void keepMessage(QtMsgType type, const QMessageLogContext& context, const QString& text)
{
    messages << QString::number(type) + QLatin1Char(' ') + QLatin1String(context.category) +
                    QLatin1Char(' ') + text;
}

} // namespace

/// A session without a bus: one line says so, and the built-in tree stands.
class ServiceMissingTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void oneMessage();
    void proxiesAreThereAndEmpty();
    void treeStands();
    void changesAreDropped();
    void jobsEnd();
    void notifyReachesNobody();
    void nothingElseWasSaid();
};

void ServiceMissingTest::initTestCase()
{
    VFS::initialize();
    const QtMessageHandler handler = qInstallMessageHandler(keepMessage);
    VFS::ptr();
    qInstallMessageHandler(handler);
    QVERIFY(!QDBusConnection::sessionBus().isConnected());
}

void ServiceMissingTest::oneMessage()
{
    // At critical level, as plain text: without quotes around it.
    const QString expected =
        u"2 default can't connect to DBus service org.veylabs.vey-fm.vfs, perhaps usage "
        "'dbus-launch <program>' can solve this problem"_s;
    QCOMPARE(messages, QStringList(expected));
    messages.clear();
    qInstallMessageHandler(keepMessage);
}

void ServiceMissingTest::proxiesAreThereAndEmpty()
{
    VFS* const vfs = VFS::ptr();
    QVERIFY(vfs->smbBrowser());
    QVERIFY(vfs->networkMountsManager());
    QVERIFY(vfs->networkPlacesManager());
    QVERIFY(vfs->fuseMountsManager());
    QVERIFY(vfs->smbBrowser()->workgroups().isEmpty());
    QVERIFY(vfs->smbBrowser()->smbNetworkLocalPath().isEmpty());
    QVERIFY(vfs->networkMountsManager()->mounts().isEmpty());
    QVERIFY(vfs->networkPlacesManager()->networkPlaces().isEmpty());
    QVERIFY(vfs->fuseMountsManager()->mounts().isEmpty());
    QVERIFY(vfs->storagePlacesByType(StoragePlace::StorageTypeUsbDisk).isEmpty());
    QVERIFY(vfs->storageDeviceInfo(StoragePlace()).text1.isEmpty());
}

void ServiceMissingTest::treeStands()
{
    VFS* const vfs = VFS::ptr();
    QCOMPARE(
        vfs->childs(vfs->rootEntry()).paths(),
        QStringList({u"Favourites"_s, u"Computer"_s, u"Network"_s}));
    QCOMPARE(
        vfs->childs(vfs->computerEntry()).paths(),
        QStringList({u"Home"_s, u"Desktop"_s, u"Trash"_s, u"Storage devices"_s, u"File System"_s}));
    QVERIFY(vfs->childs(vfs->favouritesEntry()).isEmpty());
    QCOMPARE(vfs->childs(vfs->networkEntry()).paths(), QStringList(u"Samba"_s));
    QSignalSpy started(vfs, &VFS::longTimeOperationStarted);
    QSignalSpy finished(vfs, &VFS::longTimeOperationFinished);
    QVERIFY(vfs->childs(vfs->storageDevicesEntry()).isEmpty());
    QVERIFY(vfs->childs(vfs->sambaNetworkEntry()).isEmpty());
    QCOMPARE(started.count(), 2);
    QCOMPARE(finished.count(), 2);
}

void ServiceMissingTest::changesAreDropped()
{
    VFS* const vfs = VFS::ptr();
    const FavouritePlace favourite(u"F"_s, u"/tmp"_s);
    vfs->addFavouritePlace(favourite);
    QVERIFY(!vfs->hasFavouritePlace(favourite));
    vfs->removeFavouritePlace(favourite);
    const NetworkPlace bookmark(u"B"_s, u"ftp://b"_s, QString());
    QVERIFY(!vfs->networkPlacesManager()->addNetworkPlace(bookmark));
    vfs->fuseMountsManager()->addMount(u"ftp://b"_s, u"/m"_s);
    vfs->networkMountsManager()->addMount(u"ftp://b"_s, vfs->homeEntry());
    vfs->smbBrowser()->rescan();
    QVERIFY(vfs->smbBrowser()->workgroups().isEmpty());
}

void ServiceMissingTest::jobsEnd()
{
    VFS* const vfs = VFS::ptr();
    const std::unique_ptr<Job> job(vfs->mount(vfs->homeEntry()));
    job->setDeleteOnFinish(false);
    job->exec();
    QCOMPARE(job->error(), 1);
    QCOMPARE(job->errorString(), u"This type of point cannot be mounted"_s);
}

void ServiceMissingTest::notifyReachesNobody()
{
    VFS* const vfs = VFS::ptr();
    QSignalSpy resets(vfs->entryWatcher(), &EntryWatcher::entryReset);
    vfs->notifyAllWatchers(EntryList(vfs->homeEntry()));
    QCoreApplication::processEvents();
    QVERIFY(resets.isEmpty());
    vfs->notifyWatchers(vfs->homeEntry());
    QCOMPARE(resets.count(), 1);
}

void ServiceMissingTest::nothingElseWasSaid()
{
    qInstallMessageHandler(nullptr);
    QCOMPARE(messages, QStringList());
}

QTEST_GUILESS_MAIN(ServiceMissingTest)
#include "tst_servicemissing.moc"
