// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_DIRECTORIES_H
#define VEYFM_BENCHMARKS_DIRECTORIES_H

#include <QByteArray>
#include <QTemporaryDir>

#include <memory>

namespace Benchmarks {

/// The word for the file system that holds a path: "tmpfs", "ext4", or its number.
QByteArray fileSystemOf(const QByteArray& path);

/**
 * A flat directory of empty files, of which one in twenty is a symbolic link, by turns to a file
 * and to a directory. It goes away with the object.
 */
class FlatDirectory
{
public:
    /// @param names adds this many characters to each name.
    FlatDirectory(const QByteArray& parent, int entries, int padding = 0);
    ~FlatDirectory();

    /// The directory with the entries, and the one above, which holds nothing else. @{
    QByteArray path() const;
    QByteArray parent() const;
    /// @}

    int entries() const;
    int links() const;

private:
    std::unique_ptr<QTemporaryDir> m_parent;
    QByteArray m_path;
    int m_entries;
};

} // namespace Benchmarks

#endif
