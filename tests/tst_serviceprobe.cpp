// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"
#include "support/busmonitor.h"
#include "support/rerun.h"
#include "support/servicescene.h"
#include "support/vfsclient.h"

#include <QElapsedTimer>

#include <csignal>

using namespace VeyFM;

namespace {

constexpr char stoppedBusArgument[] = "--stopped-bus";

// A call that nobody answers takes 25 seconds, and a start has more than one of them.
constexpr qint64 muchLess = 15000;

const QStringList probe = {u"300"_s};
const QString noAnswer = u"service org.veylabs.vey-fm.vfs does not answer, going on without it\n"_s;

} // namespace

/// VFS::setServiceProbe(): processes that meet a service which hangs.
class ServiceProbeTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void stoppedService_data();
    void stoppedService();
    void awakesLater();
    void hangsAtItsStart();
    void diesAtItsStart();
    void notInstalled();
    void answersAndIsUsed();
    void nothingIsSentWithoutAProbe();
    void stoppedBus();
};

void ServiceProbeTest::stoppedService_data()
{
    QTest::addColumn<bool>("isInstalled");
    QTest::addColumn<QString>("message");
    QTest::newRow("activatable") << true << noAnswer;
    // It counts as missing in any case, and yet each interface would ask it.
    QTest::newRow("started by hand")
        << false << u"service org.veylabs.vey-fm.vfs is not installed\n"_s;
}

void ServiceProbeTest::stoppedService()
{
    QFETCH(const bool, isInstalled);
    QFETCH(const QString, message);
    PrivateBus bus;
    if (isInstalled) {
        bus.installFakeService();
    }
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    const QStringList command = bus.fakeServiceCommand();
    QProcess running;
    running.start(command.first(), command.mid(1));
    FakeServiceControl service(bus.address());
    QVERIFY(service.waitForService());
    service.stop();

    QElapsedTimer timer;
    timer.start();
    VfsClient client;
    QVERIFY(client.start(probe));
    client.send(u"childs Computer"_s);
    QVERIFY(client.waitFor(u"childs Home Desktop Trash Storage devices File System"_s));
    for (const QString& place : {u"Favourites"_s, u"Storage devices"_s, u"Samba"_s}) {
        client.send(u"childs "_s + place);
        QVERIFY(client.waitFor(u"childs"_s));
    }
    client.send(u"notify /"_s);
    QVERIFY(client.waitFor(u"notified"_s));
    QCOMPARE(client.quit(), 0);
    QVERIFY2(timer.elapsed() < muchLess, qPrintable(QString::number(timer.elapsed())));
    QCOMPARE(client.errorOutput(), message);

    service.resume();
    QCOMPARE(service.introspections(), QStringList());
    QCOMPARE(service.calls(), QStringList());
    service.exit();
    QTRY_COMPARE(running.state(), QProcess::NotRunning);
}

void ServiceProbeTest::awakesLater()
{
    ServiceScene service;
    QVERIFY2(service.start(), qPrintable(service.errorString()));
    service->stop();
    VfsClient client;
    QVERIFY(client.start(probe));
    service->resume();
    // As of a service that is installed later, nobody takes note.
    service->emitSignal(
        u"FavouritePlacesManager"_s, u"favouritePlaceAdded"_s, arguments({u"F"_s, u"/f"_s}));
    service->emitSignal(
        u"FileSystem"_s, u"notifyWatchersSignal"_s, array(R"([[["Home", "/", 2003]]])"));
    client.send(u"childs Favourites"_s);
    QVERIFY(client.waitFor(u"childs"_s));
    QCOMPARE(client.passed, QStringList());
    QCOMPARE(client.quit(), 0);
    QCOMPARE(service->calls(), QStringList());
    QCOMPARE(service->violations(), QStringList());
}

void ServiceProbeTest::hangsAtItsStart()
{
    PrivateBus bus;
    bus.installFakeService({}, {u"--hang"_s});
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    QElapsedTimer timer;
    timer.start();
    VfsClient client;
    QVERIFY(client.start(probe));
    client.send(u"childs Samba"_s);
    QVERIFY(client.waitFor(u"childs"_s));
    QCOMPARE(client.quit(), 0);
    QVERIFY2(timer.elapsed() < muchLess, qPrintable(QString::number(timer.elapsed())));
    QCOMPARE(client.errorOutput(), noAnswer);
}

void ServiceProbeTest::diesAtItsStart()
{
    PrivateBus bus;
    bus.installFakeService({}, {u"--die"_s});
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    VfsClient client;
    QVERIFY(client.start({u"10000"_s}));
    QCOMPARE(client.quit(), 0);
    // Nobody owns the name, so nobody is late.
    QCOMPARE(client.errorOutput(), QString());
}

void ServiceProbeTest::notInstalled()
{
    PrivateBus bus;
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    VfsClient client;
    QVERIFY(client.start({u"10000"_s}));
    QCOMPARE(client.quit(), 0);
    QCOMPARE(client.errorOutput(), u"service org.veylabs.vey-fm.vfs is not installed\n"_s);
}

void ServiceProbeTest::answersAndIsUsed()
{
    PrivateBus bus;
    bus.installFakeService();
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    BusMonitor monitor;
    QVERIFY(monitor.start(bus.address()));
    VfsClient client;
    QVERIFY(client.start({u"10000"_s}));
    QCOMPARE(client.quit(), 0);
    QCOMPARE(client.errorOutput(), QString());
    QVERIFY(monitor.waitFor(u"decrementProcessRef"_s));
    // It has to be started before it can be asked, and before anything else is.
    const QStringList expected = {
        u"/org/freedesktop/DBus ListActivatableNames"_s,
        u"/org/freedesktop/DBus StartServiceByName"_s,
        u"/ Ping"_s,
        u"/ Introspect"_s,
        u"/ incrementProcessRef"_s,
        u"/ decrementProcessRef"_s};
    const QStringList calls = monitor.calls(
        {u"ListActivatableNames"_s, u"StartServiceByName"_s, u"Ping"_s, u"Introspect"_s,
         u"incrementProcessRef"_s, u"decrementProcessRef"_s});
    QCOMPARE(calls.mid(0, 5), expected.mid(0, 5));
    QCOMPARE(calls.last(), expected.last());
    QCOMPARE(calls.count(u"/ Ping"_s), 1);
}

void ServiceProbeTest::nothingIsSentWithoutAProbe()
{
    PrivateBus bus;
    bus.installFakeService();
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    BusMonitor monitor;
    QVERIFY(monitor.start(bus.address()));
    for (const QStringList& arguments :
         {QStringList(), QStringList(u"0"_s), QStringList(u"-1"_s)}) {
        VfsClient client;
        QVERIFY(client.start(arguments));
        QCOMPARE(client.quit(), 0);
        QVERIFY(monitor.waitFor(u"decrementProcessRef"_s));
    }
    QCOMPARE(monitor.calls({u"Ping"_s}), QStringList());
}

void ServiceProbeTest::stoppedBus()
{
    QVERIFY(rerunPasses(stoppedBusArgument));
}

/// A bus that hangs itself, as soon as this process is connected.
class StoppedBusTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void treeStands();
};

void StoppedBusTest::treeStands()
{
    PrivateBus bus;
    bus.installFakeService();
    QVERIFY2(bus.start(), qPrintable(bus.errorString()));
    QVERIFY(QDBusConnection::sessionBus().isConnected());
    ::kill(pid_t(bus.processId()), SIGSTOP);
    VFS::initialize();
    VFS::setServiceProbe(300);
    QElapsedTimer timer;
    timer.start();
    VFS* const vfs = VFS::ptr();
    const bool isEmpty = vfs->childs(vfs->storageDevicesEntry()).isEmpty();
    vfs->addFavouritePlace(FavouritePlace(u"F"_s, u"/f"_s));
    const qint64 elapsed = timer.elapsed();
    ::kill(pid_t(bus.processId()), SIGCONT);
    QVERIFY2(elapsed < muchLess, qPrintable(QString::number(elapsed)));
    QVERIFY(isEmpty);
}

int main(int argc, char** argv)
{
    QCoreApplication application(argc, argv);
    if (isRerun(argc, argv, stoppedBusArgument)) {
        return runTests<StoppedBusTest>(argv);
    }
    ServiceProbeTest test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_serviceprobe.moc"
