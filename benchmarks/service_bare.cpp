// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// What a program without the place tree does for the same: it knows the records, calls the service
// with QtDBus, and keeps what it got. Its standard output is as that of bench_service_vfs.
//
//   bench_service_bare shares COUNT      the call that reads the shares of a host
//   bench_service_bare burst COUNT       the news of a service that changes devices
//   bench_service_bare share-bytes COUNT memory of the list of shares
//   bench_service_bare device-bytes COUNT memory of the list of devices

#include "core/storageplace.h"
#include "core/stringmap.h"
#include "support/cost.h"

#include "vfs/vfs.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusInterface>
#include <QDBusReply>

#include <cstdio>
#include <memory>
#include <vector>

using namespace VeyFM;

namespace {

const QString service = QStringLiteral("org.veylabs.vey-fm.vfs");

std::unique_ptr<QDBusInterface> interface(const char* path, const char* name)
{
    return std::make_unique<QDBusInterface>(
        service, QLatin1String(path),
        QStringLiteral("org.veylabs.FileManager.") + QLatin1String(name),
        QDBusConnection::sessionBus());
}

int figure(bool isDone, double cost)
{
    std::printf("%f\n", cost);
    return isDone ? 0 : 1;
}

StringMap sharesOf(QDBusInterface& browser)
{
    const QDBusReply<StringMap> reply =
        browser.call(QStringLiteral("shares"), QStringLiteral("host"), QStringLiteral("WG"));
    return reply.value();
}

int shares(int count)
{
    const auto browser = interface("/SmbBrowser", "SmbBrowser");
    const double before = Benchmarks::processCpu();
    const int found = sharesOf(*browser).size();
    return figure(found == count, Benchmarks::processCpu() - before);
}

class Receiver : public QObject
{
    Q_OBJECT

public:
    int arrived = 0;
    StoragePlace last;

public Q_SLOTS:
    void update(const VeyFM::StoragePlace& place)
    {
        ++arrived;
        last = place;
    }
};

int burst(int count)
{
    const auto browser = interface("/SmbBrowser", "SmbBrowser");
    const auto storage = interface("/StoragePlacesManager", "StoragePlacesManager");
    Receiver receiver;
    QObject::connect(
        storage.get(), SIGNAL(storagePlaceUpdated(VeyFM::StoragePlace)), &receiver,
        SLOT(update(VeyFM::StoragePlace)));
    const double before = Benchmarks::processCpu();
    browser->call(QStringLiteral("smbNetworkLocalPath"));
    while (receiver.arrived < count) {
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
    return figure(receiver.last.isMounted(), Benchmarks::processCpu() - before);
}

// What stays allocated for a list that was read from the service.
template <typename Read>
int bytesOf(Read read, int count)
{
    QCoreApplication::processEvents();
    const double before = Benchmarks::bytesInUse();
    const auto list = read();
    QCoreApplication::processEvents();
    return figure(list.size() == count, Benchmarks::bytesInUse() - before);
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication application(argc, argv);
    if (argc != 3) {
        return 2;
    }
    const QByteArray job = argv[1];
    const int count = QByteArray(argv[2]).toInt();
    VFS::initialize(); // The records are known to QtDBus from here on.
    if (job == "shares") {
        return shares(count);
    }
    if (job == "burst") {
        return burst(count);
    }
    if (job == "share-bytes") {
        const auto browser = interface("/SmbBrowser", "SmbBrowser");
        return bytesOf([&] { return sharesOf(*browser); }, count);
    }
    if (job == "device-bytes") {
        const auto storage = interface("/StoragePlacesManager", "StoragePlacesManager");
        return bytesOf(
            [&] {
                const QDBusReply<QList<StoragePlace>> reply =
                    storage->call(QStringLiteral("availableStoragePlaces"));
                return reply.value();
            },
            count);
    }
    return 2;
}

#include "service_bare.moc"
