// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_LINKTABLE_H
#define VEYFM_LINKTABLE_H

#include <QHash>
#include <QSet>
#include <QString>

namespace VeyFM {

/**
 * Which watched symbolic links point to which target. A target is in the table for as long as
 * one link points to it. A link has one target, but may be the target of other links.
 */
class LinkTable
{
public:
    bool isEmpty() const;

    bool isTarget(const QString& path) const;

    /**
     * Whether @p path is a link of the table. The empty path stands for a client's own request:
     * it counts as a link if any target is requested.
     */
    bool contains(const QString& path) const;

    /// The links to @p target, in no particular order.
    QSet<QString> links(const QString& target) const;

    void addLink(const QString& link, const QString& target);

    /// Notes that a client asked for @p target itself too. Does nothing for other paths.
    void request(const QString& target);

    /**
     * Withdraws a request for @p path, and its link. A target that has no links left goes, and a
     * request for that target with it.
     */
    void forget(const QString& path);

    void clear();

private:
    QHash<QString, QSet<QString>> m_links; // by target, without empty sets
    QHash<QString, QString> m_targets;     // by link, the exact reverse
    QSet<QString> m_requested;             // a subset of the targets
};

} // namespace VeyFM

#endif
