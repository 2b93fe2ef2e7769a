// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// From paths to places: searches that walk the store.

#include "vfs/vfsplacebase.h"
#include "vfs/vfsplacebase_p.h"

#include <QSet>
#include <QVector>

#include <algorithm>
#include <vector>

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

using Node = VFSPlaceBasePrivate::Node;
using PlaceLocker = std::lock_guard<std::recursive_mutex>;

QStringView withoutTrailingSlashes(QStringView path)
{
    while (path.endsWith(slash)) {
        path.chop(1);
    }
    return path;
}

QStringView withoutLeadingSlashes(QStringView path)
{
    while (path.startsWith(slash)) {
        path = path.mid(1);
    }
    return path;
}

// Whether the link leads to a parent that lives and still has the child.
Node parentOf(const VFSPlaceBasePrivate::ParentLink& link)
{
    const Node parent = link.parent.toStrongRef();
    const bool isChild = parent && parent->children.find(link.number) != parent->children.end();
    return isChild ? parent : Node();
}

bool isBelow(const Node& node, const Node& top)
{
    QVector<Node> above{node};
    QSet<const VFSPlaceBasePrivate::PlaceTreeNode*> seen{node.data()};
    for (int i = 0; i < above.size(); ++i) {
        const Node current = above.at(i);
        if (current == top) {
            return true;
        }
        for (const auto& link : current->parents) {
            const Node parent = parentOf(link);
            if (parent && !seen.contains(parent.data())) {
                seen.insert(parent.data());
                above.append(parent);
            }
        }
    }
    return false;
}

// The first place below another, level by level and earlier siblings first, that has the entry as
// a child. A node hangs below several others, and is looked at once.
Entry firstParent(const Entry& entry, const Node& top)
{
    QVector<const VFSPlaceBasePrivate::PlaceTreeNode*> queue{top.data()};
    QSet<const VFSPlaceBasePrivate::PlaceTreeNode*> queued{top.data()};
    for (int i = 0; i < queue.size(); ++i) {
        for (const auto& [number, child] : queue.at(i)->children) {
            if (child->entry == entry) {
                return queue.at(i)->entry;
            }
            if (!child->children.empty() && !queued.contains(child.data())) {
                queued.insert(child.data());
                queue.append(child.data());
            }
        }
    }
    return Entry();
}

} // namespace

std::vector<Node> VFSPlaceBasePrivate::parentsOf(const QString& path) const
{
    std::vector<Node> parents;
    const auto addParentsOf = [&parents](const PlaceTreeNode& child) {
        for (const auto& link : child.parents) {
            if (const Node parent = parentOf(link)) {
                parents.push_back(parent);
            }
        }
    };
    if (const Node place = node(path)) {
        addParentsOf(*place);
    }
    for (auto it = plainChildren.constFind(path);
         it != plainChildren.constEnd() && it.key() == path; ++it) {
        addParentsOf(*it.value());
    }
    return parents;
}

Entry VFSPlaceBase::checkAndGetParentPlace(const Entry& entry, const Entry& root) const
{
    const PlaceLocker locker(d->placeLock);
    const Node top = d->node(root);
    if (!top) {
        return Entry();
    }
    // Most entries have no parent here at all, and most of the others one, which asks for no walk
    // through the tree.
    std::vector<Node> parents = d->parentsOf(entry.path());
    const auto isElsewhere = [&top](const Node& parent) {
        return !isBelow(parent, top);
    };
    parents.erase(std::remove_if(parents.begin(), parents.end(), isElsewhere), parents.end());
    if (parents.size() > 1) {
        return firstParent(entry, top);
    }
    return parents.empty() ? Entry() : parents.front()->entry;
}

Entry VFSPlaceBase::dirPlaceEntry(const QString& localPath) const
{
    const PlaceLocker locker(d->placeLock);
    for (const auto& [path, node] : d->placeNodes) {
        if (node->entry.m_localPath == localPath) {
            return node->entry;
        }
    }
    return Entry();
}

Entry VFSPlaceBase::checkAndGetDirPlace(const QString& localPath) const
{
    return dirPlaceEntry(localPath);
}

QString VFSPlaceBase::placeRelatedPath(const QString& localPath) const
{
    const PlaceLocker locker(d->placeLock);
    const QStringView path = withoutTrailingSlashes(localPath);
    const Entry* best = nullptr;
    QStringView rest;
    for (const auto& [placePath, node] : d->placeNodes) {
        const QStringView local = withoutTrailingSlashes(node->entry.m_localPath);
        // The length of the best is taken as stored. So a place without a directory never
        // matches, nor does one whose directory is "/".
        if ((best ? best->m_localPath.size() : 0) >= local.size()) {
            continue;
        }
        if (path.startsWith(local) &&
            (path.size() == local.size() || path[local.size()] == slash)) {
            best = &node->entry;
            rest = path.mid(std::min(local.size() + 1, path.size()));
        }
    }
    if (!best || best->m_path.isEmpty()) {
        return localPath;
    }
    QString result = best->m_path;
    if (!result.endsWith(slash)) {
        result += slash;
    }
    return result.append(rest.data(), int(rest.size()));
}

bool VFSPlaceBase::isPathContainsPlace(const QString& path) const
{
    if (path.startsWith(slash)) {
        return false;
    }
    const PlaceLocker locker(d->placeLock);
    const int end = path.indexOf(slash);
    const QStringView first = end < 0 ? QStringView(path) : QStringView(path).left(end);
    return d->placeNodes.find(first) != d->placeNodes.end();
}

QStringList
VFSPlaceBase::exploreParentPlacesHistory(const QString& path, const QString& placePath) const
{
    const PlaceLocker locker(d->placeLock);
    const Node node = d->node(placePath);
    return node ? d->parentPlacesHistory(path, *node) : QStringList();
}

QStringList
VFSPlaceBasePrivate::parentPlacesHistory(QStringView path, const PlaceTreeNode& top) const
{
    struct Step
    {
        const PlaceTreeNode* node;
        Children::const_iterator next;
    };
    std::vector<Step> way;
    // What has been gone into with the path as it is now: a second time would find no more.
    QSet<const PlaceTreeNode*> seen;
    const auto enter = [&](const PlaceTreeNode& node) {
        if (!seen.contains(&node)) {
            seen.insert(&node);
            way.push_back({&node, node.children.cbegin()});
        }
    };

    QStringList history;
    Node lastMatch;
    enter(top);
    while (!way.empty()) {
        Step& step = way.back();
        if (step.next == step.node->children.cend()) {
            way.pop_back();
            continue;
        }
        const Node child = (step.next++)->second;
        const QString childPath = child->entry.path();
        // Plain text, not sections: "Home" also leads to "Homework/x". That is meant.
        if (!path.startsWith(childPath)) {
            if (!child->children.empty()) {
                enter(*child);
            }
            continue;
        }
        for (const Step& above : way) {
            history.append(above.node->entry.path());
        }
        const auto sizeBefore = path.size();
        path = withoutLeadingSlashes(path.mid(childPath.size()));
        if (path.isEmpty()) {
            return history;
        }
        // The first match counts, wherever it leads: there is no way back from it.
        way.clear();
        if (path.size() != sizeBefore) {
            seen.clear();
        }
        lastMatch = child;
        enter(*child);
    }
    if (lastMatch) {
        history.append(lastMatch->entry.path());
    }
    return history;
}

} // namespace VeyFM
