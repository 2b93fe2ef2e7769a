// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_ENTRYWATCHER_H
#define VEYFM_ENTRYWATCHER_H

#include "core/entry.h"
#include "veyfmvfs_export.h"

#include <QObject>

#include <memory>

namespace VeyFM {

class EntryWatcherPrivate;

/**
 * Tells what happens to entries: the one of VFS::entryWatcher() carries the news of the kernel
 * about directories that a host asked for with addEntry(), the news about places, and resets.
 *
 * There is no reference count: two clients that watch one plain directory share one watch, and
 * the first removeEntry() ends it for both.
 *
 * Nothing reports failure. An entry that can't be watched gives no news, and an event that the
 * kernel's queue had no room for is lost.
 *
 * To be used in the thread of VFS, where the signals are emitted too. A slot may add and remove
 * entries, and run an event loop: newer news of the kernel that arrive in there come behind all
 * that is left of the older ones. A slot may delete a watcher that its host has made.
 */
class VEYFMVFS_EXPORT EntryWatcher : public QObject
{
    Q_OBJECT

public:
    /// Watches nothing yet. VFS has one; a host needs no other.
    explicit EntryWatcher(QObject* parent = nullptr);
    ~EntryWatcher() override;

    /**
     * Watches the directory or file of an entry, and the directory of a link. An entry below a
     * place keeps its identity: news come for it and for the same directory by its path.
     * Nothing below the trees that isRefreshable() excludes is watched.
     */
    void addEntry(const Entry& entry);

    /// Ends what addEntry() began, for every client of a plain directory.
    void removeEntry(const Entry& entry);

    /// Ends all watches.
    void clear();

    /**
     * While disabled, events and resets are dropped, not queued; watches stay. What places report
     * through the notifyEntry functions goes out all the same.
     */
    void setDisabled(bool disabled);

    /**
     * False for local paths that begin with "/proc", "/dev", "/sys" or "/var": trees that change
     * all the time. A test of text, so "/variable" is excluded as well.
     */
    bool isRefreshable(const QString& path) const;

    /// Emit the signal of the same name, disabled or not. @{
    void notifyEntryCreated(const Entry& entry);
    void notifyEntryDeleted(const Entry& entry);
    void notifyEntryChanged(const Entry& entry);
    /// @}

Q_SIGNALS:
    void entryCreated(Entry entry);           ///< @p entry appeared.
    void entryDeleted(Entry entry);           ///< @p entry went away.
    void entryChanged(Entry entry);           ///< The content of @p entry changed.
    void entryAttributesChanged(Entry entry); ///< Metadata of @p entry changed.
    void entryReset(Entry entry);             ///< @p entry is to be read again from scratch.

protected Q_SLOTS:
    /// Emits entryReset(), when enabled; without @p anyWay only for what somebody watches.
    void entryChangedNotify(Entry entry, bool anyWay = false);
    /// Forgets a local path whose watch the kernel ended.
    void unregisterPath(QString path);
    /// News of the kernel about @p fileName in a watched @p path, or about the path itself. @{
    void slotPathCreated(QString path, QString fileName);
    void slotPathDeleted(QString path, QString fileName);
    void slotPathChanged(QString path, QString fileName);
    void slotPathAttributesChanged(QString path, QString fileName);
    /// @}

private:
    const std::unique_ptr<EntryWatcherPrivate> d;
};

} // namespace VeyFM

#endif
