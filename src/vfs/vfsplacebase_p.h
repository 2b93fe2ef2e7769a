// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFSPLACEBASE_P_H
#define VEYFM_VFSPLACEBASE_P_H

#include "core/entrylist.h"

#include <QByteArray>
#include <QList>
#include <QPointer>
#include <QSharedPointer>
#include <QStringView>
#include <QWeakPointer>

#include <map>
#include <mutex>

namespace VeyFM {

/**
 * The store behind VFSPlaceBase.
 *
 * placeLock is held for the whole of an operation, and is recursive: the slot that fills a
 * pending place runs inside the operation that looked, and comes back. It may take as long as a
 * call to the service. hasPlace() and the arming of a pending place therefore do without it, and
 * containerLock guards the two maps themselves: for the length of one look-up or change, never
 * across a call out and never around placeLock. Whoever changes placeNodes holds both.
 */
class VFSPlaceBasePrivate
{
public:
    struct PlaceTreeNode
    {
        Entry entry;
        // Weak, so that a child keeps no parent alive.
        QList<QWeakPointer<PlaceTreeNode>> parents;
        QList<QSharedPointer<PlaceTreeNode>> children;
    };
    using Node = QSharedPointer<PlaceTreeNode>;

    struct PendingPlace
    {
        QString path;
        int type;
        QPointer<QObject> receiver;
        QByteArray slot;
    };

    // Looked up by views as well, so that the path one level above need not be copied.
    template<typename Value>
    using ByPath = std::map<QString, Value, std::less<>>;

    /// The node of a place, or null. With placeLock held.
    Node node(const QString& path) const;
    Node node(const Entry& place) const;

    /// The place of a path or null, in the eyes of one who does not hold placeLock.
    bool containsPlace(const QString& path) const;

    bool isPending(const QString& path) const;
    void createIfPendingPlace(QStringView path) const;
    bool link(const Entry& entry, const Node& place);
    QStringList parentPlacesHistory(QString path, const PlaceTreeNode& node) const;

    mutable std::recursive_mutex placeLock;
    mutable std::mutex containerLock;
    ByPath<Node> placeNodes;
    // Look-ups that are const take from it.
    mutable ByPath<PendingPlace> pendingPlaces;
};

} // namespace VeyFM

#endif
