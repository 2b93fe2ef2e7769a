// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/busmonitor.h"
#include "support/privatebus.h"
#include "support/servicescene.h"
#include "support/vfsclient.h"

using namespace VeyFM;

/// What stands between a process and a service: none installed, one that dies at its start, one
/// that runs and can't be started.
class ServiceActivationTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void notInstalled();
    void diesAtItsStart();
    void runningButNotActivatable();
};

void ServiceActivationTest::notInstalled()
{
    PrivateBus bus;
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    BusMonitor monitor;
    QVERIFY(monitor.start(bus.address()));
    VfsClient client;
    QVERIFY(client.start());
    QCOMPARE(client.quit(), 0);
    QCOMPARE(client.errorOutput().trimmed(), u"service org.veylabs.vey-fm.vfs is not installed"_s);
    // A call of ours, behind all that the client has sent.
    QProcess::execute(
        u"dbus-send"_s, {u"--bus="_s + bus.address(), u"--dest=org.freedesktop.DBus"_s, u"/"_s,
                         u"org.veylabs.Test.Mark"_s});
    QVERIFY(monitor.waitFor(u"Mark"_s));
    // It is not started, and gets no reference, neither given nor taken.
    QCOMPARE(
        monitor.calls(
            {u"ListActivatableNames"_s, u"StartServiceByName"_s, u"incrementProcessRef"_s,
             u"decrementProcessRef"_s}),
        QStringList(u"/org/freedesktop/DBus ListActivatableNames"_s));
}

void ServiceActivationTest::diesAtItsStart()
{
    PrivateBus bus;
    bus.installFakeService({}, {u"--die"_s});
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    VfsClient client;
    QVERIFY(client.start());
    client.send(u"childs _"_s);
    QVERIFY(client.waitFor(u"childs Favourites Computer Network"_s));
    client.send(u"childs Samba"_s);
    QVERIFY(client.waitFor(u"childs"_s));
    QCOMPARE(client.quit(), 0);
    // It is installed, so there is nothing to say.
    QCOMPARE(client.errorOutput(), QString());
}

void ServiceActivationTest::runningButNotActivatable()
{
    PrivateBus bus;
    const QStringList command = bus.fakeServiceCommand();
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    QProcess running;
    running.start(command.first(), command.mid(1));
    FakeServiceControl service(bus.address());
    QVERIFY(service.waitForService());
    VfsClient client;
    QVERIFY(client.start());
    QCOMPARE(client.errorOutput().trimmed(), u"service org.veylabs.vey-fm.vfs is not installed"_s);
    // It counts as missing: no reference. The calls of the clients reach it all the same.
    QVERIFY(!service.calls().contains(u"Service.incrementProcessRef[]"_s));
    QCOMPARE(client.quit(), 0);
    QVERIFY(!service.calls().contains(u"Service.decrementProcessRef[]"_s));
    running.terminate();
    QVERIFY(running.waitForFinished());
}

QTEST_GUILESS_MAIN(ServiceActivationTest)
#include "tst_serviceactivation.moc"
