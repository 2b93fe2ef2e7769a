// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_NETWORKPLACESMANAGERPROXY_H
#define VEYFM_NETWORKPLACESMANAGERPROXY_H

#include "core/networkplace.h"
#include "veyfmvfs_export.h"

#include <QList>
#include <QObject>
#include <QWeakPointer>

#include <memory>

class QDBusInterface;

namespace VeyFM {

class NetworkPlacesManagerProxyPrivate;

/**
 * The network bookmarks as the service holds them: a list that is read once and patched by the
 * service's signals, with the rules of FavouritePlacesManagerProxy.
 *
 * Any thread may call it. From a thread other than that of the object a list that was not read yet
 * is empty, and is read by the event loop of the object later. What asks the service blocks the
 * thread that calls it for one exchange. The signals are emitted in the thread of the object,
 * and in that one alone.
 */
class VEYFMVFS_EXPORT NetworkPlacesManagerProxy : public QObject
{
    Q_OBJECT

public:
    /// The interface is not kept alive; once it has expired, lists are empty and calls do nothing.
    explicit NetworkPlacesManagerProxy(
        QWeakPointer<QDBusInterface> interface, QObject* parent = nullptr);
    ~NetworkPlacesManagerProxy() override;

    /// All bookmarks, in the service's order.
    QList<NetworkPlace> networkPlaces();

    /**
     * Asks the service for a new bookmark and returns its answer, false where it gave none. The
     * list still lacks the bookmark when this returns: it comes with the service's signal.
     */
    bool addNetworkPlace(const NetworkPlace& place);

    /// Asks the service; a failure is not told. @{
    void removeNetworkPlace(const NetworkPlace& place);
    void updateNetworkPlace(const NetworkPlace& place);
    /// @}

Q_SIGNALS:
    /// The service's news, after the list has been patched. An update comes with the new record
    /// alone, and also for a bookmark that is not in the list. @{
    void networkPlaceAdded(VeyFM::NetworkPlace place);
    void networkPlaceRemoved(VeyFM::NetworkPlace place);
    void networkPlaceUpdated(VeyFM::NetworkPlace place);
    /// @}

private Q_SLOTS:
    void slotRead();
    void slotNetworkPlaceAdded(const VeyFM::NetworkPlace& place);
    void slotNetworkPlaceRemoved(const VeyFM::NetworkPlace& place);
    void slotNetworkPlaceUpdated(const VeyFM::NetworkPlace& place);

private:
    const std::unique_ptr<NetworkPlacesManagerProxyPrivate> d;
};

} // namespace VeyFM

#endif
