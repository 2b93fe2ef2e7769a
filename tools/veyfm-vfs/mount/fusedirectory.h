// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_FUSEDIRECTORY_H
#define VEYFM_TOOL_FUSEDIRECTORY_H

#include <QString>
#include <QStringList>
#include <QUrl>
#include <QVector>

#include <mutex>

namespace VeyFM {

namespace Host {
class MountInfo;
}

namespace Tool {

using Host::MountInfo;

/// The directory on which the jobs mount the root of an ftp or sftp URL.
QString fuseDirectory(const QUrl& url);

/// Whether the path lies on a FUSE mount that does not hold the root of all mounts, too. The mount
/// is not looked at.
bool isOnFuseMount(const QString& path, const MountInfo& kernel);

/// Why the file system of a directory is of no use, or empty. One that does not answer is given
/// up after so many seconds.
QString whyDead(const QString& directory, int seconds);

/// Whether it is certain that there is nothing at a path. Given up after so many seconds.
bool isMissing(const QString& path, int seconds);

/**
 * What a run may have left behind below the root of the mounts: directories that it made, and
 * mounts. What was there when the object was made is never touched, nor is a mount that no tool
 * makes. From any thread.
 */
class FuseTrace
{
public:
    /// Which of the new mounts are those of this run. Other programs mount there, too.
    enum Made {
        NoMounts,
        DeadMounts, ///< Those of tools that were ended.
        AllMounts,
    };

    /// For URLs of one scheme.
    explicit FuseTrace(const QString& scheme);

    /// From pause() to resume() the tool waits: what is mounted meanwhile is of others. What was
    /// mounted before may be its own, since sshfs mounts first and asks then.
    void pause();
    void resume();

    /// Unmounts and removes those of the directories that are new.
    void remove(const QStringList& directories, Made made) const;

private:
    bool isOfOthers(int mountId) const;
    bool isMadeHere(const QString& directory, Made made) const;

    const QString m_parent;
    QStringList m_parents; ///< Those that were not there.
    QStringList m_names;
    mutable std::mutex m_lock; ///< For what follows, which the kernel has numbers for.
    QVector<int> m_others;     ///< Mounts that this run has not made.
    QVector<int> m_atPause;    ///< All mounts, at its begin.
    bool m_isPaused = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
