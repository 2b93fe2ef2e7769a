// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_WATCHTABLE_H
#define VEYFM_WATCHTABLE_H

#include <QHash>
#include <QList>
#include <QSet>
#include <QString>
#include <QStringList>
#include <QVector>

namespace VeyFM {

/**
 * Watched paths and their kernel watch descriptors, looked up in either direction without a walk.
 *
 * The kernel gives one descriptor per inode, so two spellings of a path, or two hard links, share
 * one. Such a descriptor stands for the first of its paths in ascending order.
 */
class WatchTable
{
public:
    bool contains(const QString& path) const;

    /// The descriptor of @p path, -1 if it is not watched.
    int descriptor(const QString& path) const;

    /// The first path of @p descriptor in ascending order, a null string if there is none.
    QString firstPath(int descriptor) const;

    /// Every descriptor in use, once each, in no particular order.
    QList<int> descriptors() const;

    struct Watch
    {
        QString path;
        int descriptor;
    };

    /// The watches whose descriptor is not among those given, in ascending order of their paths.
    QVector<Watch> without(const QSet<int>& descriptors) const;

    /// Records a watch. A descriptor that @p path had before is forgotten.
    void insert(const QString& path, int descriptor);

    void remove(const QString& path);

private:
    // Nearly every descriptor has one path, which is kept where the look-up of an event ends.
    struct Paths
    {
        QString first;
        QStringList others; // behind the first, ascending
    };

    void addToIndex(const QString& path, int descriptor);
    void removeFromIndex(const QString& path, int descriptor);

    QHash<QString, int> m_descriptors;
    QHash<int, Paths> m_paths; // the exact reverse
};

} // namespace VeyFM

#endif
