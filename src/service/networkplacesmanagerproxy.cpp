// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/networkplacesmanagerproxy.h"

#include "service/servicecall.h"
#include "service/servicelist.h"
#include "service/servicesignals.h"

namespace VeyFM {

class NetworkPlacesManagerProxyPrivate
{
public:
    NetworkPlacesManagerProxyPrivate(QWeakPointer<QDBusInterface> serviceInterface, QObject* proxy)
        : interface(std::move(serviceInterface))
        , networkPlaces(proxy, "slotRead")
    {
    }

    const QWeakPointer<QDBusInterface> interface;
    ServiceList<NetworkPlace> networkPlaces;
};

NetworkPlacesManagerProxy::NetworkPlacesManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , d(std::make_unique<NetworkPlacesManagerProxyPrivate>(std::move(interface), this))
{
    if (const auto alive = d->interface.toStrongRef()) {
        followService(
            *alive, SIGNAL(networkPlaceAdded(VeyFM::NetworkPlace)), this,
            SLOT(slotNetworkPlaceAdded(VeyFM::NetworkPlace)));
        followService(
            *alive, SIGNAL(networkPlaceRemoved(VeyFM::NetworkPlace)), this,
            SLOT(slotNetworkPlaceRemoved(VeyFM::NetworkPlace)));
        followService(
            *alive, SIGNAL(networkPlaceUpdated(VeyFM::NetworkPlace)), this,
            SLOT(slotNetworkPlaceUpdated(VeyFM::NetworkPlace)));
    }
}

NetworkPlacesManagerProxy::~NetworkPlacesManagerProxy() = default;

QList<NetworkPlace> NetworkPlacesManagerProxy::networkPlaces()
{
    return d->networkPlaces.get([this] {
        return readFromService<QList<NetworkPlace>>(d->interface, QStringLiteral("networkPlaces"));
    });
}

void NetworkPlacesManagerProxy::slotRead()
{
    networkPlaces();
}

bool NetworkPlacesManagerProxy::addNetworkPlace(const NetworkPlace& place)
{
    return readFromService<bool>(d->interface, QStringLiteral("addNetworkPlace"), place);
}

void NetworkPlacesManagerProxy::removeNetworkPlace(const NetworkPlace& place)
{
    tellService(d->interface, QStringLiteral("removeNetworkPlace"), place);
}

void NetworkPlacesManagerProxy::updateNetworkPlace(const NetworkPlace& place)
{
    tellService(d->interface, QStringLiteral("updateNetworkPlace"), place);
}

void NetworkPlacesManagerProxy::slotNetworkPlaceAdded(const NetworkPlace& place)
{
    d->networkPlaces.patch([&place](auto& places) { places.append(place); });
    Q_EMIT networkPlaceAdded(place);
}

void NetworkPlacesManagerProxy::slotNetworkPlaceRemoved(const NetworkPlace& place)
{
    // By name: every bookmark of that name goes, whatever its URL.
    d->networkPlaces.patch([&place](auto& places) { places.removeAll(place); });
    Q_EMIT networkPlaceRemoved(place);
}

void NetworkPlacesManagerProxy::slotNetworkPlaceUpdated(const NetworkPlace& place)
{
    d->networkPlaces.patch([&place](auto& places) {
        // Found by name, so a bookmark can't be renamed in this way.
        const int index = places.indexOf(place);
        if (index >= 0) {
            places[index] = place;
        }
    });
    Q_EMIT networkPlaceUpdated(place);
}

} // namespace VeyFM
