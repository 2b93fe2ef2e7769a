// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/favouriteplacesmanagerproxy.h"

#include "service/servicecall.h"
#include "service/servicelist.h"
#include "service/servicesignals.h"

namespace VeyFM {

class FavouritePlacesManagerProxyPrivate
{
public:
    FavouritePlacesManagerProxyPrivate(
        QWeakPointer<QDBusInterface> serviceInterface, QObject* proxy)
        : interface(std::move(serviceInterface))
        , favouritePlaces(proxy, "slotRead")
    {
    }

    const QWeakPointer<QDBusInterface> interface;
    ServiceList<FavouritePlace> favouritePlaces;
};

FavouritePlacesManagerProxy::FavouritePlacesManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , d(std::make_unique<FavouritePlacesManagerProxyPrivate>(std::move(interface), this))
{
    if (const auto alive = d->interface.toStrongRef()) {
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
    return d->favouritePlaces.get([this] {
        return readFromService<QList<FavouritePlace>>(
            d->interface, QStringLiteral("favouritePlaces"));
    });
}

void FavouritePlacesManagerProxy::slotRead()
{
    favouritePlaces();
}

void FavouritePlacesManagerProxy::addFavouritePlace(const FavouritePlace& place)
{
    tellService(d->interface, QStringLiteral("addFavouritePlace"), place);
}

void FavouritePlacesManagerProxy::removeFavouritePlace(const FavouritePlace& place)
{
    tellService(d->interface, QStringLiteral("removeFavouritePlace"), place);
}

void FavouritePlacesManagerProxy::slotFavouritePlaceAdded(const FavouritePlace& place)
{
    d->favouritePlaces.patch([&place](auto& places) { places.append(place); });
    Q_EMIT favouritePlaceAdded(place);
}

void FavouritePlacesManagerProxy::slotFavouritePlaceRemoved(const FavouritePlace& place)
{
    // By directory: every bookmark of it goes, whatever its name.
    d->favouritePlaces.patch([&place](auto& places) { places.removeAll(place); });
    Q_EMIT favouritePlaceRemoved(place);
}

} // namespace VeyFM
