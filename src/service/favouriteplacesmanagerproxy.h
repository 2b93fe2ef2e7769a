// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FAVOURITEPLACESMANAGERPROXY_H
#define VEYFM_FAVOURITEPLACESMANAGERPROXY_H

#include "core/favouriteplace.h"
#include "veyfmvfs_export.h"

#include <QList>
#include <QObject>
#include <QWeakPointer>

class QDBusInterface;

namespace VeyFM {

/**
 * The favourite bookmarks as the service holds them.
 *
 * The list is read at the first call and kept from then on: the service's signals patch it, and
 * nothing else does. A first read that failed stays as an empty list. A change that is asked for
 * here shows in the list only when its signal has come back.
 *
 * To be used in the thread that owns the object. Calls block for one exchange with the service.
 */
class VEYFMVFS_EXPORT FavouritePlacesManagerProxy : public QObject
{
    Q_OBJECT

public:
    /// The interface is not kept alive; once it has expired, lists are empty and calls do nothing.
    explicit FavouritePlacesManagerProxy(
        QWeakPointer<QDBusInterface> interface, QObject* parent = nullptr);
    ~FavouritePlacesManagerProxy() override;

    /// All bookmarks, in the service's order.
    QList<FavouritePlace> favouritePlaces();

    /// Asks the service; a failure is not told. @{
    void addFavouritePlace(const FavouritePlace& place);
    void removeFavouritePlace(const FavouritePlace& place);
    /// @}

Q_SIGNALS:
    /// The service's news, after the list has been patched. @{
    void favouritePlaceAdded(VeyFM::FavouritePlace place);
    void favouritePlaceRemoved(VeyFM::FavouritePlace place);
    /// @}

private Q_SLOTS:
    void slotFavouritePlaceAdded(const VeyFM::FavouritePlace& place);
    void slotFavouritePlaceRemoved(const VeyFM::FavouritePlace& place);

private:
    const QWeakPointer<QDBusInterface> m_interface;
    QList<FavouritePlace> m_favouritePlaces;
    bool m_favouritePlacesLoaded = false;
};

} // namespace VeyFM

#endif
