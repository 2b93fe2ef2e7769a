// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_MOUNTINFO_H
#define VEYFM_HOST_MOUNTINFO_H

#include <QByteArray>
#include <QString>
#include <QVector>

namespace VeyFM {
namespace Host {

/// A mount as the kernel lists it.
struct KernelMount
{
    QString directory; ///< Absolute, and without links.
    QString type;      ///< The file system, such as "ext4" or "fuse.sshfs".
    QString source;    ///< What the program that mounted it says, such as "user@host:/".
    int id = 0;        ///< No other mount has it as long as this one stands.

    bool isFuse() const;
};

/**
 * What is mounted, without a look at the mounts themselves: one whose server has gone makes every
 * look at it hang.
 *
 * Directories are compared as texts, after kernelPath().
 */
class MountInfo
{
public:
    /// The mounts that this process sees.
    static MountInfo read();

    /// Mounts from the text of a mountinfo file, as proc(5) describes it. Lines that are none are
    /// passed over.
    explicit MountInfo(const QByteArray& text);

    /// Why read() came back with nothing, or empty.
    QString why() const;

    /// In the order of the kernel: of two at one directory the later hides the earlier.
    QVector<KernelMount> mounts() const;

    /// Whether something is mounted on exactly this directory.
    bool isMountPoint(const QString& directory) const;

private:
    QVector<KernelMount> m_mounts;
    QString m_why;
};

/**
 * The directory as the kernel names it: tidied up and, where it lies below @p root, without links
 * from the top down to the directory of its scheme, or to where there is nothing yet. Nothing below
 * that is looked at, since it may be a mount.
 */
QString kernelPath(const QString& directory, const QString& root);

} // namespace Host
} // namespace VeyFM

#endif
