// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/serviceprobe.h"
#include "vfs/vfs_p.h"

#include <QDBusConnection>
#include <QDebug>

namespace VeyFM {

namespace {

// Where the service offers its interfaces, all on its one bus name.
struct ServiceObject
{
    const char* path;
    const char* interface;
};

constexpr ServiceObject processReference = {"/", "org.veylabs.FileManager.Service"};
constexpr ServiceObject fileSystem = {"/", "org.veylabs.FileManager.FileSystem"};
constexpr ServiceObject storagePlaces = {
    "/StoragePlacesManager", "org.veylabs.FileManager.StoragePlacesManager"};
constexpr ServiceObject favouritePlaces = {
    "/FavouritePlacesManager", "org.veylabs.FileManager.FavouritePlacesManager"};
constexpr ServiceObject smbBrowsing = {"/SmbBrowser", "org.veylabs.FileManager.SmbBrowser"};
constexpr ServiceObject networkMounts = {
    "/NetworkMountsManager", "org.veylabs.FileManager.NetworkMountsManager"};
constexpr ServiceObject networkPlaces = {
    "/NetworkPlacesManager", "org.veylabs.FileManager.NetworkPlacesManager"};
constexpr ServiceObject fuseMounts = {
    "/FuseMountsManager", "org.veylabs.FileManager.FuseMountsManager"};

} // namespace

void VFS::setServiceProbe(int milliseconds)
{
    ServiceProbe::setMilliseconds(milliseconds);
}

void VFSPrivate::initService()
{
    serviceName = QStringLiteral("org.veylabs.vey-fm.vfs");

    bool isSilent = false;
    // The bus daemon's interface does not tell: it is there without a connection too.
    if (!QDBusConnection::sessionBus().isConnected()) {
        qCritical().noquote() << QObject::tr(
                                     "can't connect to DBus service %1, perhaps usage 'dbus-launch "
                                     "<program>' can solve this problem")
                                     .arg(serviceName);
    } else if (!ServiceProbe::activatableNames().contains(serviceName)) {
        // One that runs all the same counts as missing, and can hang all the same.
        qCritical().noquote() << QObject::tr("service %1 is not installed").arg(serviceName);
        isSilent = !ServiceProbe::passes(serviceName);
    } else if (ServiceProbe::start(serviceName)) {
        serviceInterface = std::make_unique<QDBusInterface>(
            serviceName, QLatin1String(processReference.path),
            QLatin1String(processReference.interface), QDBusConnection::sessionBus());
        serviceInterface->call(QDBus::Block, QStringLiteral("incrementProcessRef"));
    } else {
        qCritical().noquote()
            << QObject::tr("service %1 does not answer, going on without it").arg(serviceName);
        isSilent = true;
    }

    // The proxies exist whatever has happened, and have nothing to tell without a service. Of one
    // that does not answer they get no interfaces, since making them would ask it.
    const auto make = [this, isSilent](const ServiceObject& object) {
        return isSilent
                   ? QSharedPointer<QDBusInterface>()
                   : createInterface(QLatin1String(object.path), QLatin1String(object.interface));
    };
    fileSystemInterface = make(fileSystem);
    storagePlacesManager = std::make_unique<StoragePlacesManagerProxy>(make(storagePlaces), q);
    favouritePlacesManager =
        std::make_unique<FavouritePlacesManagerProxy>(make(favouritePlaces), q);
    smbBrowser = std::make_unique<SmbBrowserProxy>(make(smbBrowsing), q);
    networkMountsManager = std::make_unique<NetworkMountsManagerProxy>(make(networkMounts), q);
    networkPlacesManager = std::make_unique<NetworkPlacesManagerProxy>(make(networkPlaces), q);
    fuseMountsManager = std::make_unique<FuseMountsManagerProxy>(make(fuseMounts), q);
}

QSharedPointer<QDBusInterface>
VFSPrivate::createInterface(const QString& path, const QString& interface)
{
    const auto made = QSharedPointer<QDBusInterface>::create(
        serviceName, path, interface, QDBusConnection::sessionBus());
    interfaces.append(made);
    return made;
}

void VFSPrivate::initializeNetwork()
{
    if (!settings.isNetworkEnabled()) {
        return;
    }
    const QString none;
    networkEntry = placeBase.createPlace(VFS::tr("Network"), TypeNetworkPlace, none);
    sambaNetworkEntry = placeBase.createPendingPlace(
        VFS::tr("Samba"), TypeSambaNetworkPlace, q, "_q_createSambaWorkgroups");
    // These two have no parent until something of their kind is mounted.
    ftpNetworkEntry = placeBase.createPlace(VFS::tr("FTP"), TypeFtpNetworkPlace, none);
    sftpNetworkEntry = placeBase.createPlace(VFS::tr("SFTP"), TypeSFtpNetworkPlace, none);

    addEntryToPlace(networkEntry, rootEntry, false);
    addEntryToPlace(sambaNetworkEntry, networkEntry, false);
    addEntryToPlace(networkEntry, placesEntry, false);

    if (networkMountsManager) {
        news.tell([this] { addNetworkMounts(networkMountsManager->mounts(), true); });
        follow(
            networkMountsManager, &NetworkMountsManagerProxy::mountAdded,
            &VFSPrivate::_q_fuseMountAdded);
    }
    if (smbBrowser) {
        follow(
            smbBrowser, &SmbBrowserProxy::workgroupsChanged, &VFSPrivate::_q_smbWorkgroupsChanged);
        follow(smbBrowser, &SmbBrowserProxy::workgroupUpdated, &VFSPrivate::_q_smbWorkgroupUpdated);
        follow(smbBrowser, &SmbBrowserProxy::hostUpdated, &VFSPrivate::_q_smbHostUpdated);
        follow(smbBrowser, &SmbBrowserProxy::shareUpdated, &VFSPrivate::_q_smbShareUpdated);
    }
    if (networkPlacesManager) {
        news.tell([this] {
            const QList<NetworkPlace> bookmarks = networkPlacesManager->networkPlaces();
            for (const NetworkPlace& place : bookmarks) {
                addNetworkPlace(place, false);
            }
        });
        follow(
            networkPlacesManager, &NetworkPlacesManagerProxy::networkPlaceAdded,
            &VFSPrivate::_q_networkPlaceAdded);
        follow(
            networkPlacesManager, &NetworkPlacesManagerProxy::networkPlaceRemoved,
            &VFSPrivate::_q_networkPlaceRemoved);
        follow(
            networkPlacesManager, &NetworkPlacesManagerProxy::networkPlaceUpdated,
            &VFSPrivate::_q_networkPlaceUpdated);
    }
}

void VFSPrivate::releaseService()
{
    if (serviceInterface) {
        if (serviceInterface->isValid()) {
            serviceInterface->call(QDBus::Block, QStringLiteral("decrementProcessRef"));
        }
        serviceInterface.reset();
    }
    interfaces.clear();
}

} // namespace VeyFM
