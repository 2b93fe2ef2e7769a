// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/watchtable.h"

#include <algorithm>

namespace VeyFM {

bool WatchTable::contains(const QString& path) const
{
    return m_descriptors.contains(path);
}

int WatchTable::descriptor(const QString& path) const
{
    return m_descriptors.value(path, -1);
}

QString WatchTable::firstPath(int descriptor) const
{
    const auto paths = m_paths.constFind(descriptor);
    return paths == m_paths.constEnd() ? QString() : paths->first;
}

QList<int> WatchTable::descriptors() const
{
    return m_paths.keys();
}

QVector<WatchTable::Watch> WatchTable::without(const QSet<int>& descriptors) const
{
    QVector<Watch> watches;
    for (auto it = m_descriptors.cbegin(); it != m_descriptors.cend(); ++it) {
        if (!descriptors.contains(it.value())) {
            watches.append({it.key(), it.value()});
        }
    }
    std::sort(watches.begin(), watches.end(), [](const Watch& left, const Watch& right) {
        return left.path < right.path;
    });
    return watches;
}

void WatchTable::insert(const QString& path, int descriptor)
{
    const int count = m_descriptors.size();
    int& stored = m_descriptors[path];
    const bool overwritten = m_descriptors.size() == count;
    if (overwritten && stored == descriptor) {
        return;
    }
    if (overwritten) {
        removeFromIndex(path, stored);
    }
    stored = descriptor;
    addToIndex(path, descriptor);
}

void WatchTable::remove(const QString& path)
{
    const auto watch = m_descriptors.find(path);
    if (watch == m_descriptors.end()) {
        return;
    }
    removeFromIndex(path, *watch);
    m_descriptors.erase(watch);
}

void WatchTable::addToIndex(const QString& path, int descriptor)
{
    Paths& paths = m_paths[descriptor];
    if (paths.first.isEmpty()) {
        paths.first = path;
        return;
    }
    QString other = path;
    if (other < paths.first) {
        qSwap(other, paths.first);
    }
    QStringList& others = paths.others;
    others.insert(std::lower_bound(others.begin(), others.end(), other), other);
}

void WatchTable::removeFromIndex(const QString& path, int descriptor)
{
    const auto paths = m_paths.find(descriptor);
    QStringList& others = paths->others;
    if (path != paths->first) {
        others.erase(std::lower_bound(others.begin(), others.end(), path));
    } else if (!others.isEmpty()) {
        paths->first = others.takeFirst();
    } else {
        m_paths.erase(paths);
    }
}

} // namespace VeyFM
