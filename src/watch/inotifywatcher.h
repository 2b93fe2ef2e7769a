// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_INOTIFYWATCHER_H
#define VEYFM_INOTIFYWATCHER_H

#include "veyfmvfs_export.h"

#include <QObject>
#include <QString>

#include <memory>

namespace VeyFM {

class InotifyWatcherPrivate;

/**
 * Watches local paths through one inotify instance of its own and reports what the kernel tells
 * as signals about paths. It knows nothing of entries or places.
 *
 * Paths are compared as plain text, as they were given: "/a" and "/a/" are two paths. References
 * are not counted: a path is watched or not. A directory is watched without its subdirectories.
 *
 * A symbolic link is watched as a link, and its target with it: what happens inside the target is
 * reported under the path of the target first, then again under the path of each link. When a
 * link is deleted the verdict is held back for 500 milliseconds at most, so that a link which is
 * replaced is reported as changed rather than as deleted and created.
 *
 * If the kernel grants no inotify instance, the watcher stays usable and does nothing. Events
 * that the kernel drops because its queue is full are lost without notice. The ends of watches are
 * not: after an overflow the watches that the kernel no longer has are dropped, and
 * pathUnregistered() tells of each. That takes `/proc`, and some milliseconds for a thousand
 * watches.
 *
 * Not thread-safe: everything happens on the thread of the object, which needs a running event
 * loop. Signals are emitted synchronously from there. A connected slot may add and remove paths
 * and may delete the watcher. It may also run an event loop, a dialog's say: whatever is reported
 * there comes in the order in which it happened, with the rest of what was being reported first.
 * Only of the signal at hand, slots that are connected behind that one hear when it returns.
 */
class VEYFMVFS_EXPORT InotifyWatcher : public QObject
{
    Q_OBJECT

public:
    /// Watches nothing yet.
    explicit InotifyWatcher(QObject* parent = nullptr);

    /// Ends all watches. pathUnregistered() is not emitted.
    ~InotifyWatcher() override;

    /**
     * Watches @p path, and the target as well if it is a symbolic link.
     *
     * @return true if a new watch was registered. False if the path is empty, holds a NUL or is
     * watched already, if there is no inotify instance, or if the kernel refuses (no such path,
     * no permission, watch limit reached). Also false for a link whose target can't be watched;
     * the link itself is watched then nevertheless.
     */
    bool addPath(const QString& path);

    /// The same as removePath(path, true).
    bool removePath(const QString& path);

    /**
     * Forgets @p path. A path to which watched links point stays watched for their sake. The
     * target of a removed link stays watched under its own path, even if no other link needs it.
     *
     * @param removeWatch false leaves the kernel's watch alone, for when the kernel has dropped
     * it already.
     * @return false if there is no inotify instance, or if the kernel refuses, in which case the
     * path stays registered. True otherwise, also if the path was not watched.
     */
    bool removePath(const QString& path, bool removeWatch);

    /**
     * Ends all watches and forgets all links. The verdict on links that were deleted just before
     * still comes.
     *
     * @return false if the kernel refused to end one of the watches; those paths stay registered.
     */
    bool clear();

    /// Whether @p path is watched, as itself or as the target of a watched link.
    bool isPathRegistered(const QString& path) const;

    /// Whether @p path is a watched symbolic link whose target is watched too.
    bool isSymlinkRegistered(const QString& path) const;

    /**
     * Emits a signal again for each watched link to @p path, with the path of the link in place
     * of @p path. Links that wait for the verdict on their deletion are passed over.
     *
     * @param signal the bare name of one of the signals with two arguments, "pathChanged" say.
     */
    void notifySymlinks(const char* signal, const QString& path, const QString& fileName);

Q_SIGNALS:
    /// The kernel no longer watches @p path, as a rule because it is gone. Not emitted by
    /// removePath() and clear().
    void pathUnregistered(const QString& path);

    /// The child @p fileName appeared in the directory @p path.
    void pathCreated(const QString& path, const QString& fileName);

    /// The child @p fileName of @p path went away, or @p path itself if @p fileName is empty.
    void pathDeleted(const QString& path, const QString& fileName);

    /**
     * The child @p fileName of @p path, or @p path itself if @p fileName is empty, was written
     * and closed, or is a link that was replaced or whose target went away.
     */
    void pathChanged(const QString& path, const QString& fileName);

    /// Metadata of the child @p fileName of @p path, or of @p path itself, changed.
    void pathAttributesChanged(const QString& path, const QString& fileName);

private Q_SLOTS:
    void processInotifyMessages();
    void notifyDeletedSymlinks();

private:
    const std::unique_ptr<InotifyWatcherPrivate> d;
};

} // namespace VeyFM

#endif
