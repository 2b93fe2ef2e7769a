// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// A program that starts, follows the service and makes the calls by which the tree is made, all by
// hand: it keeps nothing of what it gets.
//
//   bench_startup_calls [mark]    with a call of GetId behind them

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDBusInterface>
#include <QDBusMessage>
#include <QDBusReply>

#include <map>
#include <memory>

namespace {

const QString service = QStringLiteral("org.veylabs.vey-fm.vfs");

std::unique_ptr<QDBusInterface> interface(const QByteArray& path, const char* name)
{
    return std::make_unique<QDBusInterface>(
        service, QString::fromLatin1(path),
        QStringLiteral("org.veylabs.FileManager.") + QLatin1String(name),
        QDBusConnection::sessionBus());
}

// In the order in which the library makes them. An object and its interface share a name.
const struct
{
    const char* name;
    std::initializer_list<const char*> signalNames;
} objects[] = {
    {"StoragePlacesManager", {"storagePlaceUpdated", "storagePlaceAdded", "storagePlaceRemoved"}},
    {"FavouritePlacesManager", {"favouritePlaceAdded", "favouritePlaceRemoved"}},
    {"SmbBrowser",
     {"rescanFinished", "rescanWorkgroupFinished", "rescanHostFinished", "shareUpdated"}},
    {"NetworkMountsManager", {"mountAdded"}},
    {"NetworkPlacesManager", {"networkPlaceAdded", "networkPlaceRemoved", "networkPlaceUpdated"}},
    {"FuseMountsManager", {}},
};

class Receiver : public QObject
{
    Q_OBJECT

public Q_SLOTS:
    void take(const QDBusMessage& message)
    {
        Q_UNUSED(message)
    }
};

void follow(const QDBusInterface& interface, const char* signalName, Receiver* receiver)
{
    if (!interface.isValid()) {
        return; // Nobody can follow what has told of no signals.
    }
    QDBusConnection::sessionBus().connect(
        interface.service(), interface.path(), interface.interface(), QLatin1String(signalName),
        receiver, SLOT(take(QDBusMessage)));
}

} // namespace

int main(int argc, char** argv)
{
    const QCoreApplication application(argc, argv);
    QDBusConnectionInterface* const daemon = QDBusConnection::sessionBus().interface();
    const QDBusReply<QStringList> activatable =
        daemon->call(QStringLiteral("ListActivatableNames"));
    if (!activatable.isValid()) {
        return 1;
    }
    std::unique_ptr<QDBusInterface> reference;
    if (activatable.value().contains(service)) {
        daemon->startService(service);
        reference = interface("/", "Service");
        reference->call(QStringLiteral("incrementProcessRef"));
    }
    const auto fileSystem = interface("/", "FileSystem");
    Receiver receiver;
    std::map<QByteArray, std::unique_ptr<QDBusInterface>> made;
    for (const auto& object : objects) {
        auto& place = made[object.name];
        place = interface(QByteArray("/") + object.name, object.name);
        for (const char* const name : object.signalNames) {
            follow(*place, name, &receiver);
        }
    }
    made["FavouritePlacesManager"]->call(QStringLiteral("favouritePlaces"));
    follow(*fileSystem, "notifyWatchersSignal", &receiver);
    made["NetworkMountsManager"]->call(QStringLiteral("mounts"));
    made["NetworkPlacesManager"]->call(QStringLiteral("networkPlaces"));
    if (argc > 1) {
        daemon->call(QStringLiteral("GetId"));
    }
    if (reference) {
        reference->call(QStringLiteral("decrementProcessRef"));
    }
    return 0;
}

#include "startup_calls.moc"
