// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFSPLACEBASE_P_H
#define VEYFM_VFSPLACEBASE_P_H

#include "core/entrylist.h"

#include <QByteArray>
#include <QMultiHash>
#include <QPointer>
#include <QSharedPointer>
#include <QString>
#include <QStringView>
#include <QWeakPointer>

#include <atomic>
#include <map>
#include <mutex>
#include <vector>

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
    struct PlaceTreeNode;
    using Node = QSharedPointer<PlaceTreeNode>;
    /// Children by ascending number, which is the order in which they were added. A link is found
    /// by its number, so that a place with many siblings goes as quickly as one with few.
    using Children = std::map<quint64, Node>;

    struct ParentLink
    {
        // Weak, so that a child keeps no parent alive.
        QWeakPointer<PlaceTreeNode> parent;
        quint64 number;
    };

    /// The children that are no places, by their paths. Each goes with the link to its parent.
    using PlainChildren = QMultiHash<QString, const PlaceTreeNode*>;

    struct PlaceTreeNode
    {
        PlaceTreeNode() = default;
        PlaceTreeNode(const PlaceTreeNode&) = delete;
        PlaceTreeNode& operator=(const PlaceTreeNode&) = delete;
        ~PlaceTreeNode()
        {
            if (index) {
                index->remove(entry.path(), this);
            }
        }

        Entry entry;
        PlainChildren* index = nullptr; // of a child that is no place
        std::vector<ParentLink> parents;
        Children children;
        // Never used again, so that the link of a child that was dropped finds no other child.
        quint64 nextNumber = 0;
    };

    struct PendingPlace
    {
        QString path;
        int type;
        QPointer<QObject> receiver;
        QByteArray slot;
    };

    /// QString's order, by code units. Transparent, so that the path one level above need not be
    /// copied, and in line as far as the first unit, which tells an absolute path from a place.
    struct PathLess
    {
        using is_transparent = void;
        bool operator()(QStringView left, QStringView right) const
        {
            if (left.isEmpty() || right.isEmpty()) {
                return left.size() < right.size();
            }
            const ushort first = left.front().unicode();
            const ushort other = right.front().unicode();
            return first != other ? first < other : left.compare(right) < 0;
        }
    };

    template <typename Value>
    using ByPath = std::map<QString, Value, PathLess>;

    ~VFSPlaceBasePrivate();

    /// The node of a place, or null. With placeLock held.
    Node node(const QString& path) const;
    Node node(const Entry& place) const;

    /// The place of a path or null, in the eyes of one who does not hold placeLock.
    bool containsPlace(const QString& path) const;

    bool isPending(const QString& path) const;
    void createIfPendingPlace(QStringView path) const;
    bool link(const Entry& entry, const Node& place);
    std::vector<Node> parentsOf(const QString& path) const;
    QStringList parentPlacesHistory(QStringView path, const PlaceTreeNode& top) const;

    mutable std::recursive_mutex placeLock;
    mutable std::mutex containerLock;
    PlainChildren plainChildren; // Outlives the nodes.
    ByPath<Node> placeNodes;
    // Look-ups that are const take from it.
    mutable ByPath<PendingPlace> pendingPlaces;
    // Its size, for a look without a lock.
    mutable std::atomic<std::size_t> pendingCount{0};
};

} // namespace VeyFM

#endif
