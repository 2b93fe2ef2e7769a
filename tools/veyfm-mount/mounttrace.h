// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_MOUNTTRACE_H
#define VEYFM_MOUNT_MOUNTTRACE_H

#include <QString>
#include <QStringList>
#include <QVector>

namespace VeyFM {
namespace Mount {

/**
 * What was there before something is mounted on a directory, and so what is to be taken back: the
 * mounts, the directory, and those above it up to the root of all mounts. Whoever has the trace
 * holds the lock of the directory.
 */
class MountTrace
{
public:
    MountTrace(const QString& directory, const QString& mountRoot);

    QString directory() const;

    /// Whether there is a mount that was not there.
    bool hasNewMount() const;

    /**
     * Takes back what is new. To be called when all tools have ended: a mount that still answers
     * then is served by another program, and stays.
     */
    void remove() const;

private:
    QVector<int> newMounts() const;

    const QString m_directory;
    const QString m_kernelPath;
    QVector<int> m_mounts; ///< By the kernel's numbers.
    QStringList m_missing; ///< Directories that were not there, the innermost first.
};

} // namespace Mount
} // namespace VeyFM

#endif
