// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_WATCHTREE_H
#define VEYFM_BENCHMARKS_WATCHTREE_H

#include <QByteArray>
#include <QStringList>
#include <QVector>

namespace Benchmarks {

/// Empty directories to watch, and a way to let something happen in one after another.
class WatchTree
{
public:
    explicit WatchTree(int directories);

    int size() const;
    const QByteArray& path(int index) const;
    QStringList paths() const;

    /// Links a file into the next directory, or removes it again: one event for who watches.
    void makeEvent();

private:
    QByteArray m_file; // above the directories, where nobody watches
    QVector<QByteArray> m_paths;
    int m_current = 0;
    bool m_fileExists = false;
};

} // namespace Benchmarks

#endif
