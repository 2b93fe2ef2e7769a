// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/networkplacesmanagerproxy.h"

#include "service/servicecall.h"
#include "service/servicesignals.h"

namespace VeyFM {

NetworkPlacesManagerProxy::NetworkPlacesManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , m_interface(std::move(interface))
{
    if (const auto alive = m_interface.toStrongRef()) {
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
    if (!m_networkPlacesLoaded) {
        m_networkPlaces =
            readFromService<QList<NetworkPlace>>(m_interface, QStringLiteral("networkPlaces"));
        // After a failed read too: what is not there now will be told by signals.
        m_networkPlacesLoaded = true;
    }
    return m_networkPlaces;
}

bool NetworkPlacesManagerProxy::addNetworkPlace(const NetworkPlace& place)
{
    return readFromService<bool>(m_interface, QStringLiteral("addNetworkPlace"), place);
}

void NetworkPlacesManagerProxy::removeNetworkPlace(const NetworkPlace& place)
{
    tellService(m_interface, QStringLiteral("removeNetworkPlace"), place);
}

void NetworkPlacesManagerProxy::updateNetworkPlace(const NetworkPlace& place)
{
    tellService(m_interface, QStringLiteral("updateNetworkPlace"), place);
}

void NetworkPlacesManagerProxy::slotNetworkPlaceAdded(const NetworkPlace& place)
{
    if (m_networkPlacesLoaded) {
        m_networkPlaces.append(place);
    }
    Q_EMIT networkPlaceAdded(place);
}

void NetworkPlacesManagerProxy::slotNetworkPlaceRemoved(const NetworkPlace& place)
{
    if (m_networkPlacesLoaded) {
        // By name: every bookmark of that name goes, whatever its URL.
        m_networkPlaces.removeAll(place);
    }
    Q_EMIT networkPlaceRemoved(place);
}

void NetworkPlacesManagerProxy::slotNetworkPlaceUpdated(const NetworkPlace& place)
{
    if (m_networkPlacesLoaded) {
        // Found by name, so a bookmark can't be renamed in this way.
        const int index = m_networkPlaces.indexOf(place);
        if (index >= 0) {
            m_networkPlaces[index] = place;
        }
    }
    Q_EMIT networkPlaceUpdated(place);
}

} // namespace VeyFM
