// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// A program with the library on a session bus. It does one job, and writes what that cost to its
// standard output: CPU time of this process in nanoseconds, or bytes.
//
//   bench_service_vfs start FAVOURITES   the first VFS::ptr(), with that many bookmarks
//   bench_service_vfs mark FAVOURITES    the same, and a call of GetId when the tree stands
//   bench_service_vfs shares COUNT       opening a host
//   bench_service_vfs burst COUNT        the news of a service that changes devices
//   bench_service_vfs removals COUNT     the news of a service that takes devices out
//   bench_service_vfs device-dirs COUNT  asking each device whether it is mounted
//   bench_service_vfs share-bytes COUNT  memory of the shares of a host
//   bench_service_vfs device-bytes COUNT memory of the storage devices

#include "service/smbbrowserproxy.h"
#include "support/cost.h"

#include "service/smbbrowserproxy.h"
#include "vfs/vfs.h"
#include "watch/entrywatcher.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusConnectionInterface>

#include <cstdio>

using namespace VeyFM;

namespace {

Entry openedHost()
{
    VFS* const vfs = VFS::ptr();
    vfs->childs(vfs->sambaNetworkEntry());
    vfs->childs(vfs->entry(QStringLiteral("Samba/WG")));
    return vfs->entry(QStringLiteral("Samba/WG/host"));
}

int figure(bool isDone, double cost)
{
    std::printf("%f\n", cost);
    return isDone ? 0 : 1;
}

int start(int favourites)
{
    VFS* const vfs = VFS::ptr();
    return vfs->childs(vfs->favouritesEntry()).size() == favourites ? 0 : 1;
}

int mark(int favourites)
{
    VFS::ptr();
    QDBusConnection::sessionBus().interface()->call(QStringLiteral("GetId"));
    return start(favourites);
}

int shares(int count)
{
    const Entry host = openedHost();
    const double before = Benchmarks::processCpu();
    const int found = VFS::ptr()->childs(host).size();
    return figure(found == count, Benchmarks::processCpu() - before);
}

int burst(int count)
{
    VFS* const vfs = VFS::ptr();
    vfs->childs(vfs->storageDevicesEntry());
    int arrived = 0;
    QObject::connect(vfs->entryWatcher(), &EntryWatcher::entryReset, vfs, [&] { ++arrived; });
    const double before = Benchmarks::processCpu();
    vfs->smbBrowser()->smbNetworkLocalPath();
    while (arrived < count) {
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
    const double cost = Benchmarks::processCpu() - before;
    const Entry first = vfs->entry(QStringLiteral("Storage devices/sd0"));
    return figure(first.localPath().startsWith(u'/'), cost);
}

int removals(int count)
{
    VFS* const vfs = VFS::ptr();
    vfs->childs(vfs->storageDevicesEntry());
    int gone = 0;
    QObject::connect(vfs->entryWatcher(), &EntryWatcher::entryDeleted, vfs, [&] { ++gone; });
    const double before = Benchmarks::processCpu();
    vfs->smbBrowser()->smbNetworkLocalPath();
    while (gone < count) {
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
    const double cost = Benchmarks::processCpu() - before;
    return figure(vfs->childs(vfs->storageDevicesEntry()).isEmpty(), cost);
}

int deviceDirs(int count)
{
    VFS* const vfs = VFS::ptr();
    const EntryList devices = vfs->childs(vfs->storageDevicesEntry());
    const double before = Benchmarks::processCpu();
    int mounted = 0;
    for (const Entry& device : devices) {
        mounted += device.isDirPlace() ? 1 : 0;
    }
    const double cost = Benchmarks::processCpu() - before;
    return figure(devices.size() == count && mounted == 0, cost);
}

int bytesOf(const Entry& parent, int count)
{
    QCoreApplication::processEvents();
    const double before = Benchmarks::bytesInUse();
    const int found = VFS::ptr()->childs(parent).size();
    QCoreApplication::processEvents();
    return figure(found == count, Benchmarks::bytesInUse() - before);
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication application(argc, argv);
    if (argc != 3) {
        return 2;
    }
    VFS::initialize();
    const QByteArray job = argv[1];
    const int count = QByteArray(argv[2]).toInt();
    if (job == "start") {
        return start(count);
    }
    if (job == "mark") {
        return mark(count);
    }
    if (job == "shares") {
        return shares(count);
    }
    if (job == "burst") {
        return burst(count);
    }
    if (job == "removals") {
        return removals(count);
    }
    if (job == "device-dirs") {
        return deviceDirs(count);
    }
    if (job == "share-bytes") {
        return bytesOf(openedHost(), count);
    }
    if (job == "device-bytes") {
        return bytesOf(VFS::ptr()->storageDevicesEntry(), count);
    }
    return 2;
}
