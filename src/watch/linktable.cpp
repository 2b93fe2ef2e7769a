// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/linktable.h"

namespace VeyFM {

bool LinkTable::isEmpty() const
{
    return m_links.isEmpty();
}

bool LinkTable::isTarget(const QString& path) const
{
    return m_links.contains(path);
}

bool LinkTable::contains(const QString& path) const
{
    return path.isEmpty() ? !m_requested.isEmpty() : m_targets.contains(path);
}

QSet<QString> LinkTable::links(const QString& target) const
{
    return m_links.value(target);
}

void LinkTable::addLink(const QString& link, const QString& target)
{
    m_links[target].insert(link);
    m_targets.insert(link, target);
}

void LinkTable::request(const QString& target)
{
    if (isTarget(target)) {
        m_requested.insert(target);
    }
}

void LinkTable::forget(const QString& path)
{
    m_requested.remove(path);
    const auto target = m_targets.find(path);
    if (target == m_targets.end()) {
        return;
    }
    const auto links = m_links.find(*target);
    links->remove(path);
    if (links->isEmpty()) {
        m_requested.remove(*target);
        m_links.erase(links);
    }
    m_targets.erase(target);
}

void LinkTable::clear()
{
    m_links.clear();
    m_targets.clear();
    m_requested.clear();
}

} // namespace VeyFM
