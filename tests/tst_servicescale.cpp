// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/smbbrowserproxy.h"
#include "support/vfstest.h"

#include <QElapsedTimer>

using namespace VeyFM;

namespace {

QJsonObject shares(int first, int last)
{
    QJsonObject result;
    for (int i = first; i < last; ++i) {
        result.insert(u"share%1"_s.arg(i, 5, 10, QLatin1Char('0')), QString());
    }
    return result;
}

// Far more than any of this takes, even under a sanitizer on a loaded machine, and far less than
// what grows with the square of the number would.
constexpr qint64 patience = 60000;

} // namespace

/// Many records: nothing may grow with the square of their number.
class ServiceScaleTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void fiftyThousandShares();
    void rescanOfManyShares();
    void manyHostsComeAndGo();
    void tenThousandDevices();
    void burstOfUpdates();
};

void ServiceScaleTest::initTestCase()
{
    const QByteArray script = R"({"values": {
        "SmbBrowser.workgroups": ["WG"], "SmbBrowser.hosts": ["h"]}})";
    QVERIFY(startVfs(script));
    service->setValue(u"SmbBrowser.shares"_s, shares(0, 50000));
}

void ServiceScaleTest::fiftyThousandShares()
{
    vfs->childs(vfs->sambaNetworkEntry());
    vfs->childs(vfs->entry(u"Samba/WG"_s));
    QElapsedTimer timer;
    timer.start();
    const EntryList entries = vfs->childs(vfs->entry(u"Samba/WG/h"_s));
    QCOMPARE(entries.size(), 50000);
    QCOMPARE(vfs->parent(entries.last()).path(), u"Samba/WG/h"_s);
    QCOMPARE(vfs->entry(entries.last().path()), entries.last());
    QVERIFY2(timer.elapsed() < patience, qPrintable(QString::number(timer.elapsed())));
    log->take();
}

void ServiceScaleTest::rescanOfManyShares()
{
    service->setValue(u"SmbBrowser.shares"_s, shares(25000, 75000));
    QElapsedTimer timer;
    timer.start();
    QCOMPARE(
        news(u"SmbBrowser"_s, u"rescanHostFinished"_s, array(R"(["h", "WG", true])")).size(),
        25000);
    QVERIFY2(timer.elapsed() < patience, qPrintable(QString::number(timer.elapsed())));
    QCOMPARE(vfs->smbBrowser()->shares(u"h"_s, u"WG"_s).size(), 50000);
    // Removed shares stay in the tree.
    QCOMPARE(childPaths(u"Samba/WG/h"_s).size(), 75000);
}

void ServiceScaleTest::manyHostsComeAndGo()
{
    // Last first, so that what goes is looked for from the wrong end.
    QJsonArray hosts;
    for (int i = 10000; i > 0; --i) {
        hosts.append(u"host%1"_s.arg(i, 5, 10, QLatin1Char('0')));
    }
    service->setValue(u"SmbBrowser.hosts"_s, hosts);
    QElapsedTimer timer;
    timer.start();
    const QString finished = u"rescanWorkgroupFinished"_s;
    QCOMPARE(news(u"SmbBrowser"_s, finished, array(R"(["WG", true])")).size(), 10001);
    service->setValue(u"SmbBrowser.hosts"_s, QJsonArray());
    QCOMPARE(news(u"SmbBrowser"_s, finished, array(R"(["WG", true])")).size(), 10000);
    QVERIFY2(timer.elapsed() < patience, qPrintable(QString::number(timer.elapsed())));
    QVERIFY(childPaths(u"Samba/WG"_s).isEmpty());
}

void ServiceScaleTest::tenThousandDevices()
{
    QJsonArray devices;
    for (int i = 0; i < 10000; ++i) {
        devices.append(device(u"sd%1"_s.arg(i), u"udi%1"_s.arg(i)));
    }
    service->setValue(u"StoragePlacesManager.availableStoragePlaces"_s, devices);
    QElapsedTimer timer;
    timer.start();
    const EntryList entries = vfs->childs(vfs->storageDevicesEntry());
    QCOMPARE(entries.size(), 10000);
    // Each question of this kind walks the list of records.
    for (int i = 0; i < entries.size(); i += 10) {
        QVERIFY(entries.at(i).isPurePlace());
    }
    QVERIFY2(timer.elapsed() < patience, qPrintable(QString::number(timer.elapsed())));
    log->take();
}

void ServiceScaleTest::burstOfUpdates()
{
    QJsonArray burst;
    for (int i = 0; i < 10000; ++i) {
        burst.append(QJsonArray{
            u"StoragePlacesManager"_s, u"storagePlaceUpdated"_s,
            arguments(device(u"sd%1"_s.arg(i), u"udi%1"_s.arg(i), 3, u"/media/%1"_s.arg(i)))});
    }
    QJsonObject rule;
    rule.insert(u"signals"_s, burst);
    service->setRules(u"SmbBrowser.smbNetworkLocalPath"_s, {rule});
    QElapsedTimer timer;
    timer.start();
    vfs->smbBrowser()->smbNetworkLocalPath();
    // A change of the mount state and a reset each.
    QCOMPARE(log->takeAll(service).size(), 20000);
    QVERIFY2(timer.elapsed() < patience, qPrintable(QString::number(timer.elapsed())));
    QCOMPARE(vfs->entry(u"Storage devices/sd9999"_s).localPath(), u"/media/9999"_s);
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(ServiceScaleTest)
#include "tst_servicescale.moc"
