// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FAVOURITEPLACESMANAGERPROXY_H
#define VEYFM_FAVOURITEPLACESMANAGERPROXY_H

#include "core/favouriteplace.h"
#include "veyfmvfs_export.h"

#include <QList>
#include <QObject>
#include <QWeakPointer>

#include <memory>

class QDBusInterface;

namespace VeyFM {

class FavouritePlacesManagerProxyPrivate;

/**
 * The favourite bookmarks as the service holds them.
 *
 * The list is read at the first call and kept from then on: the service's signals patch it, and
 * nothing else does. A first read that failed stays as an empty list. A change that is asked for
 * here shows in the list only when its signal has come back.
 *
 * Any thread may call it. From a thread other than that of the object a list that was not read yet
 * is empty, and is read by the event loop of the object later. What asks the service blocks the
 * thread that calls it for one exchange. The signals are emitted in the thread of the object,
 * and in that one alone.
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
    void slotRead();
    void slotFavouritePlaceAdded(const VeyFM::FavouritePlace& place);
    void slotFavouritePlaceRemoved(const VeyFM::FavouritePlace& place);

private:
    const std::unique_ptr<FavouritePlacesManagerProxyPrivate> d;
};

} // namespace VeyFM

#endif
