// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/favouriteplacesmanagerproxy.h"

#include "service/servicecall.h"
#include "service/servicesignals.h"

namespace VeyFM {

FavouritePlacesManagerProxy::FavouritePlacesManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , m_interface(std::move(interface))
{
    if (const auto alive = m_interface.toStrongRef()) {
        followService(
            *alive, SIGNAL(favouritePlaceAdded(VeyFM::FavouritePlace)), this,
            SLOT(slotFavouritePlaceAdded(VeyFM::FavouritePlace)));
        followService(
            *alive, SIGNAL(favouritePlaceRemoved(VeyFM::FavouritePlace)), this,
            SLOT(slotFavouritePlaceRemoved(VeyFM::FavouritePlace)));
    }
}

FavouritePlacesManagerProxy::~FavouritePlacesManagerProxy() = default;

QList<FavouritePlace> FavouritePlacesManagerProxy::favouritePlaces()
{
    if (!m_favouritePlacesLoaded) {
        m_favouritePlaces =
            readFromService<QList<FavouritePlace>>(m_interface, QStringLiteral("favouritePlaces"));
        // After a failed read too: what is not there now will be told by signals.
        m_favouritePlacesLoaded = true;
    }
    return m_favouritePlaces;
}

void FavouritePlacesManagerProxy::addFavouritePlace(const FavouritePlace& place)
{
    tellService(m_interface, QStringLiteral("addFavouritePlace"), place);
}

void FavouritePlacesManagerProxy::removeFavouritePlace(const FavouritePlace& place)
{
    tellService(m_interface, QStringLiteral("removeFavouritePlace"), place);
}

void FavouritePlacesManagerProxy::slotFavouritePlaceAdded(const FavouritePlace& place)
{
    if (m_favouritePlacesLoaded) {
        m_favouritePlaces.append(place);
    }
    Q_EMIT favouritePlaceAdded(place);
}

void FavouritePlacesManagerProxy::slotFavouritePlaceRemoved(const FavouritePlace& place)
{
    if (m_favouritePlacesLoaded) {
        // By directory: every bookmark of it goes, whatever its name.
        m_favouritePlaces.removeAll(place);
    }
    Q_EMIT favouritePlaceRemoved(place);
}

} // namespace VeyFM
