// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_MOUNTLOCK_H
#define VEYFM_HOST_MOUNTLOCK_H

#include <QString>

namespace VeyFM {
namespace Host {

/**
 * The one lock of a mount directory. Who mounts there or unmounts holds it, so that nobody else of
 * the user does at the same time.
 *
 * It is an advisory lock on a file that is never removed, in the user's runtime directory, or,
 * where there is none, in a hidden directory below the root of the mounts. It goes with the
 * process: a program that was killed leaves nobody waiting.
 */
class MountLock
{
public:
    MountLock() = default;
    ~MountLock();

    /**
     * Opens the lock of a directory below @p mountRoot, whether that exists or not, and takes
     * nothing. False, and why(), where that can't be done. The descriptor is not inherited by
     * programs.
     */
    bool open(const QString& directory, const QString& mountRoot);

    /// Whether the lock is held now. Never waits.
    bool tryLock();

    /// Gives the lock back.
    void close();

    bool isOpen() const;

    /// Why open() failed.
    QString why() const;

private:
    Q_DISABLE_COPY(MountLock)

    int m_file = -1;
    QString m_why;
};

} // namespace Host
} // namespace VeyFM

#endif
