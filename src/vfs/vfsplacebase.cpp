// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/vfsplacebase.h"

#include "core/copied.h"
#include "vfs/vfsplacebase_p.h"

#include <QObject>

#include <algorithm>
#include <iterator>

namespace VeyFM {

namespace {

using Node = VFSPlaceBasePrivate::Node;
using PlaceLocker = std::lock_guard<std::recursive_mutex>;
using ContainerLocker = std::lock_guard<std::mutex>;

// The path one level above, as a view into the path. Null where there is none.
QStringView parentPath(const QString& path)
{
    const int last = path.lastIndexOf(QLatin1Char('/'));
    return last < 0 ? QStringView() : QStringView(path).left(last);
}

auto holds(const Entry& entry)
{
    return [&entry](const auto& child) {
        return child.second->entry == entry;
    };
}

} // namespace

VFSPlaceBasePrivate::~VFSPlaceBasePrivate()
{
    // While the map still holds every place, so that no chain of places goes down in one
    // recursion, and no circle stays.
    for (const auto& [path, node] : placeNodes) {
        node->children.clear();
    }
}

Node VFSPlaceBasePrivate::node(const QString& path) const
{
    const auto found = placeNodes.find(path);
    return found == placeNodes.end() ? Node() : found->second;
}

Node VFSPlaceBasePrivate::node(const Entry& place) const
{
    return node(place.path());
}

bool VFSPlaceBasePrivate::containsPlace(const QString& path) const
{
    const ContainerLocker locker(containerLock);
    return placeNodes.find(path) != placeNodes.end();
}

bool VFSPlaceBasePrivate::isPending(const QString& path) const
{
    const ContainerLocker locker(containerLock);
    return pendingPlaces.find(path) != pendingPlaces.end();
}

void VFSPlaceBasePrivate::createIfPendingPlace(QStringView path) const
{
    if (pendingCount.load(std::memory_order_acquire) == 0) {
        return;
    }
    PendingPlace place;
    {
        const ContainerLocker locker(containerLock);
        const auto found = pendingPlaces.find(path);
        if (found == pendingPlaces.end()) {
            return;
        }
        // Taken out first: the slot, and whoever it calls, finds the place fired already.
        place = std::move(found->second);
        pendingPlaces.erase(found);
        pendingCount.store(pendingPlaces.size(), std::memory_order_release);
    }
    if (QObject* const receiver = place.receiver.data()) {
        QMetaObject::invokeMethod(
            receiver, place.slot.constData(), Qt::AutoConnection, Q_ARG(QString, place.path));
    }
}

bool VFSPlaceBasePrivate::link(const Entry& entry, const Node& place)
{
    Node child = node(entry);
    if (!child) {
        // No place: it belongs to this parent alone, and may do so several times.
        child = Node::create();
        child->entry = entry;
        child->index = &plainChildren;
        plainChildren.insert(entry.path(), child.data());
    }
    auto& parents = child->parents;
    // Parents that are gone count for nothing, and would only gather.
    const auto isGone = [](const ParentLink& link) {
        return link.parent.isNull();
    };
    parents.erase(std::remove_if(parents.begin(), parents.end(), isGone), parents.end());
    const auto isHere = [&place](const ParentLink& link) {
        return link.parent == place;
    };
    if (std::any_of(parents.cbegin(), parents.cend(), isHere)) {
        return false;
    }
    const quint64 number = place->nextNumber++;
    place->children.emplace_hint(place->children.end(), number, child);
    parents.push_back({place, number});
    return true;
}

VFSPlaceBase::VFSPlaceBase()
    : d(std::make_unique<VFSPlaceBasePrivate>())
{
}

VFSPlaceBase::~VFSPlaceBase() = default;

Entry VFSPlaceBase::createPlace(const QString& path, int type, const QString& localPath)
{
    const PlaceLocker locker(d->placeLock);
    if (const Node existing = d->node(path)) {
        return existing->entry;
    }
    const Node made = Node::create();
    made->entry = Entry(path, localPath, type);
    const ContainerLocker containerLocker(d->containerLock);
    d->placeNodes.emplace(path, made);
    return made->entry;
}

Entry VFSPlaceBase::createPlace(const Entry& entry)
{
    // The stored local path: to compute one would need VFS, which may be under construction.
    return createPlace(entry.m_path, entry.m_type, entry.m_localPath);
}

Entry VFSPlaceBase::createPendingPlace(
    const QString& path, int type, QObject* receiver, const char* slot)
{
    {
        const ContainerLocker locker(d->containerLock);
        d->pendingPlaces.insert_or_assign(
            path, VFSPlaceBasePrivate::PendingPlace{path, type, receiver, slot});
        d->pendingCount.store(d->pendingPlaces.size(), std::memory_order_release);
    }
    return createPlace(path, type, QString());
}

bool VFSPlaceBase::addEntryToPlace(const Entry& entry, const Entry& place)
{
    const PlaceLocker locker(d->placeLock);
    const Node parent = d->node(place);
    return parent && d->link(entry, parent);
}

EntryList VFSPlaceBase::addEntriesToPlace(const EntryList& entries, const Entry& place)
{
    const PlaceLocker locker(d->placeLock);
    EntryList linked;
    if (const Node parent = d->node(place)) {
        for (const Entry& entry : entries) {
            if (d->link(entry, parent)) {
                linked.append(entry);
            }
        }
    }
    return linked;
}

bool VFSPlaceBase::removeEntryFromPlace(const Entry& entry, const Entry& place)
{
    const PlaceLocker locker(d->placeLock);
    const Node parent = d->node(place);
    if (!parent) {
        return false;
    }
    auto& children = parent->children;
    const auto found = std::find_if(children.begin(), children.end(), holds(entry));
    if (found == children.end()) {
        return false;
    }
    const Node child = found->second;
    children.erase(found);
    auto& parents = child->parents;
    const auto link = std::find_if(parents.begin(), parents.end(), [&parent](const auto& other) {
        return other.parent == parent;
    });
    if (link != parents.end()) {
        parents.erase(link);
    }
    return true;
}

void VFSPlaceBase::clearPlace(const Entry& place)
{
    const PlaceLocker locker(d->placeLock);
    if (const Node node = d->node(place)) {
        // The children keep their link up, so that a place among them is refused here from now
        // on. That is how it stands.
        node->children.clear();
    }
}

bool VFSPlaceBase::destroyPlace(const Entry& place)
{
    const PlaceLocker locker(d->placeLock);
    const QString path = place.path();
    bool hadParent = false;
    if (const Node node = d->node(path)) {
        {
            const ContainerLocker containerLocker(d->containerLock);
            d->placeNodes.erase(path);
        }
        for (const auto& link : node->parents) {
            if (const Node parent = link.parent.toStrongRef()) {
                parent->children.erase(link.number);
                hadParent = true; // Of any living parent, even one that has been cleared.
            }
        }
    }
    const ContainerLocker containerLocker(d->containerLock);
    d->pendingPlaces.erase(path);
    d->pendingCount.store(d->pendingPlaces.size(), std::memory_order_release);
    return hadParent;
}

void VFSPlaceBase::setPlaceLocalPath(const Entry& place, const QString& localPath)
{
    const PlaceLocker locker(d->placeLock);
    if (const Node node = d->node(place)) {
        node->entry.m_localPath = localPath;
    }
}

Entry VFSPlaceBase::placeEntry(const QString& given) const
{
    const QString path = copied(given);
    const PlaceLocker locker(d->placeLock);
    if (const Node node = d->node(path)) {
        return node->entry;
    }
    const QStringView parent = parentPath(path);
    if (parent.isNull()) {
        return Entry();
    }
    d->createIfPendingPlace(parent);
    const Node node = d->node(path);
    return node ? node->entry : Entry();
}

bool VFSPlaceBase::hasPlace(const QString& given) const
{
    const QString path = copied(given);
    // Without placeLock: a view that asks must not wait for a fill in another thread.
    const QStringView parent = parentPath(path);
    if (!parent.isNull()) {
        d->createIfPendingPlace(parent);
    }
    return d->containsPlace(path);
}

bool VFSPlaceBase::hasPlace(const Entry& entry) const
{
    return hasPlace(entry.path());
}

EntryList VFSPlaceBase::childEntries(const Entry& place) const
{
    const PlaceLocker locker(d->placeLock);
    EntryList entries;
    if (!d->node(place)) {
        return entries;
    }
    const QString path = place.path();
    d->createIfPendingPlace(path);
    if (const Node node = d->node(path)) {
        entries.reserve(int(node->children.size()));
        for (const auto& [number, child] : node->children) {
            entries.append(child->entry);
        }
    }
    return entries;
}

bool VFSPlaceBase::hasChilds(const Entry& place) const
{
    const PlaceLocker locker(d->placeLock);
    const Node node = d->node(place);
    return node && (!node->children.empty() || d->isPending(place.path()));
}

bool VFSPlaceBase::placeHasChildEntry(const Entry& place, const Entry& givenChild) const
{
    const Entry child = copied(givenChild);
    const PlaceLocker locker(d->placeLock);
    if (!d->node(place)) {
        return false;
    }
    const QString path = place.path();
    d->createIfPendingPlace(path);
    const Node node = d->node(path);
    return node && std::any_of(node->children.cbegin(), node->children.cend(), holds(child));
}

int VFSPlaceBase::placeOrderIndex(const Entry& child, const Entry& parent)
{
    if (!child.isPlace() || !parent.isPlace() || parent.isNull()) {
        return 0;
    }
    const PlaceLocker locker(d->placeLock);
    const Node node = d->node(parent);
    if (!node) {
        return 0;
    }
    const auto& children = node->children;
    const auto found = std::find_if(children.cbegin(), children.cend(), holds(child));
    // A stranger and the first child are not told apart.
    return found == children.cend() ? 0 : int(std::distance(children.cbegin(), found));
}

} // namespace VeyFM
