// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/networkmountsmanagerproxy.h"
#include "service/networkplacesmanagerproxy.h"
#include "service/smbbrowserproxy.h"
#include "support/vfstest.h"

#include <QSettings>
#include <QSignalSpy>

using namespace VeyFM;

/// With the network switched off nothing of it is made, read or followed.
class NetworkDisabledTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void nothingIsMadeOrRead();
    void networkNewsAreNotReceived();
    void otherNewsAre();
    void cleanupTestCase();
};

void NetworkDisabledTest::initTestCase()
{
    QSettings settings(u"veylabs"_s, u"vey-fm-vfs"_s);
    settings.setValue(u"Network/Enabled"_s, false);
    settings.sync();
    QVERIFY(startVfs("{}"));
}

void NetworkDisabledTest::nothingIsMadeOrRead()
{
    QVERIFY(vfs->networkEntry().isNull());
    QVERIFY(vfs->sambaNetworkEntry().isNull());
    QCOMPARE(vfs->childs(vfs->placesEntry()).size(), 6);
    QCOMPARE(
        service->takeCalls(),
        QStringList(
            {u"Service.incrementProcessRef[]"_s, u"FavouritePlacesManager.favouritePlaces[]"_s}));
}

void NetworkDisabledTest::networkNewsAreNotReceived()
{
    QSignalSpy workgroups(vfs->smbBrowser(), &SmbBrowserProxy::workgroupsChanged);
    QSignalSpy mounts(vfs->networkMountsManager(), &NetworkMountsManagerProxy::mountAdded);
    QSignalSpy bookmarks(
        vfs->networkPlacesManager(), &NetworkPlacesManagerProxy::networkPlaceAdded);
    service->setValue(u"SmbBrowser.workgroups"_s, array(R"(["WG"])"));
    service->emitSignal(u"SmbBrowser"_s, u"rescanFinished"_s, {true});
    service->emitSignal(
        u"NetworkMountsManager"_s, u"mountAdded"_s, array(R"(["ftp://h", ["FTP/h", "/m", 4002]])"));
    service->emitSignal(
        u"NetworkPlacesManager"_s, u"networkPlaceAdded"_s,
        arguments({u"B"_s, u"ftp://b"_s, u""_s}));
    QCOMPARE(log->takeAll(service), QStringList());
    // The clients hear of it, VFS does not.
    QCOMPARE(workgroups.count(), 1);
    QCOMPARE(mounts.count(), 1);
    QCOMPARE(bookmarks.count(), 1);
    for (const QString& path : {u"Samba/WG"_s, u"/WG"_s, u"FTP/h"_s, u"/B"_s}) {
        QVERIFY(!vfs->placeBase()->hasPlace(path));
    }
}

void NetworkDisabledTest::otherNewsAre()
{
    QCOMPARE(
        news(u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, arguments({u"F"_s, u"/f"_s})),
        QStringList(u"created Favourites/F=/f"_s));
}

void NetworkDisabledTest::cleanupTestCase()
{
    QSettings(u"veylabs"_s, u"vey-fm-vfs"_s).remove(u"Network/Enabled"_s);
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(NetworkDisabledTest)
#include "tst_networkdisabled.moc"
