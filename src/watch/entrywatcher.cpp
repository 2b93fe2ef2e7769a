// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/entrywatcher.h"

#include "core/copied.h"
#include "core/newsqueue.h"
#include "vfs/vfs.h"
#include "watch/inotifywatcher.h"

#include <QFileInfo>
#include <QMap>
#include <QSet>

#include <algorithm>

namespace VeyFM {

class EntryWatcherPrivate
{
public:
    using Signal = void (EntryWatcher::*)(Entry);

    explicit EntryWatcherPrivate(EntryWatcher* watcher)
        : q(watcher)
        , inotifyWatcher(new InotifyWatcher(watcher))
    {
    }

    void notifyPath(Signal signal, const QString& path, const QString& fileName);
    void notifyEntry(Signal signal, const Entry& entry, const QString& fileName);

    EntryWatcher* const q;
    InotifyWatcher* const inotifyWatcher; // a child of the watcher
    // By local path, the entries that stand for it. Only a path that a place-based entry needs
    // has a key; an ordinary entry is known to the kernel alone.
    QMap<QString, QSet<Entry>> watchedEntries;
    bool disabled = false;
    NewsQueue news; // of the kernel
};

EntryWatcher::EntryWatcher(QObject* parent)
    : QObject(parent)
    , d(std::make_unique<EntryWatcherPrivate>(this))
{
    connect(
        d->inotifyWatcher, &InotifyWatcher::pathUnregistered, this, &EntryWatcher::unregisterPath);
    connect(d->inotifyWatcher, &InotifyWatcher::pathCreated, this, &EntryWatcher::slotPathCreated);
    connect(d->inotifyWatcher, &InotifyWatcher::pathDeleted, this, &EntryWatcher::slotPathDeleted);
    connect(d->inotifyWatcher, &InotifyWatcher::pathChanged, this, &EntryWatcher::slotPathChanged);
    connect(
        d->inotifyWatcher, &InotifyWatcher::pathAttributesChanged, this,
        &EntryWatcher::slotPathAttributesChanged);
}

EntryWatcher::~EntryWatcher() = default;

void EntryWatcher::addEntry(const Entry& given)
{
    const Entry entry = copied(given);
    const QString local = entry.localPath();
    if (!isRefreshable(local)) {
        return;
    }
    // Of a path that it did not watch before, the watcher has just found out whether it is a link.
    const bool isLink = d->inotifyWatcher->addPath(local)
                            ? d->inotifyWatcher->isSymlinkRegistered(local)
                            : QFileInfo(local).isSymLink();
    if (isLink) {
        // That a link is deleted or replaced shows in the directory that holds it.
        d->inotifyWatcher->addPath(QFileInfo(local).absolutePath());
    }
    if (entry.isPlaceBased()) {
        d->watchedEntries[local].insert(entry);
    }
    // A path with a key goes by both its names: as the place and as the plain directory.
    if (d->watchedEntries.contains(local)) {
        const Entry plain = VFS::ptr()->entry(local);
        // Looked up afterwards, since that may have called a slot of the host.
        const auto found = d->watchedEntries.find(local);
        if (found != d->watchedEntries.end()) {
            found->insert(plain);
        }
    }
}

void EntryWatcher::removeEntry(const Entry& given)
{
    const Entry entry = copied(given);
    const QString local = entry.localPath();
    const auto entries = d->watchedEntries.find(local);
    if (entries == d->watchedEntries.end()) {
        d->inotifyWatcher->removePath(local);
        return;
    }
    entries->remove(entry);
    if (entries->size() == 1 && !entries->cbegin()->isPlaceBased()) {
        // What is left is the plain twin. The kernel's watch outlives the key, and what it
        // reports takes the road of plain directories from now on. That is meant.
        d->watchedEntries.erase(entries);
    } else if (entries->isEmpty()) {
        d->watchedEntries.erase(entries);
        d->inotifyWatcher->removePath(local);
    }
}

void EntryWatcher::clear()
{
    d->inotifyWatcher->clear();
    d->watchedEntries.clear();
}

void EntryWatcher::setDisabled(bool disabled)
{
    d->disabled = disabled;
}

bool EntryWatcher::isRefreshable(const QString& path) const
{
    const QLatin1String excluded[] = {
        QLatin1String("/proc"), QLatin1String("/dev"), QLatin1String("/sys"),
        QLatin1String("/var")};
    return std::none_of(std::begin(excluded), std::end(excluded), [&path](QLatin1String prefix) {
        return path.startsWith(prefix);
    });
}

void EntryWatcher::notifyEntryCreated(const Entry& entry)
{
    Q_EMIT entryCreated(entry);
}

void EntryWatcher::notifyEntryDeleted(const Entry& entry)
{
    Q_EMIT entryDeleted(entry);
}

void EntryWatcher::notifyEntryChanged(const Entry& entry)
{
    Q_EMIT entryChanged(entry);
}

void EntryWatcher::entryChangedNotify(Entry entry, bool anyWay)
{
    if (d->disabled) {
        return;
    }
    if (anyWay) {
        Q_EMIT entryReset(entry);
        return;
    }
    const QString local = entry.localPath();
    // The look-up leaves an empty set behind where there was none.
    if (!d->inotifyWatcher->isPathRegistered(local) && !d->watchedEntries[local].contains(entry)) {
        return;
    }
    if (isRefreshable(local)) {
        Q_EMIT entryReset(entry);
    }
}

void EntryWatcher::unregisterPath(QString path)
{
    d->watchedEntries.remove(path);
}

void EntryWatcher::slotPathCreated(QString path, QString fileName)
{
    d->notifyPath(&EntryWatcher::entryCreated, path, fileName);
}

void EntryWatcher::slotPathDeleted(QString path, QString fileName)
{
    d->notifyPath(&EntryWatcher::entryDeleted, path, fileName);
}

void EntryWatcher::slotPathChanged(QString path, QString fileName)
{
    d->notifyPath(&EntryWatcher::entryChanged, path, fileName);
}

void EntryWatcher::slotPathAttributesChanged(QString path, QString fileName)
{
    d->notifyPath(&EntryWatcher::entryAttributesChanged, path, fileName);
}

void EntryWatcherPrivate::notifyPath(Signal signal, const QString& path, const QString& fileName)
{
    if (disabled) {
        return;
    }
    news.tell([this, signal, path, fileName] {
        const auto found = watchedEntries.constFind(path);
        if (found == watchedEntries.constEnd()) {
            const Entry current = VFS::ptr()->entry(path + QLatin1Char('/') + fileName);
            // Here the entry is asked and below the disk, and the two differ: a link to a file, or
            // a dangling one, is reset only where the path has a key.
            const bool isReset = signal == &EntryWatcher::entryChanged && current.isDirLink();
            Q_EMIT(q->*(isReset ? &EntryWatcher::entryReset : signal))(current);
            return;
        }
        for (const Entry& entry : *found) {
            news.then([this, signal, entry, fileName] { notifyEntry(signal, entry, fileName); });
        }
    });
}

void EntryWatcherPrivate::notifyEntry(Signal signal, const Entry& entry, const QString& fileName)
{
    Entry current = entry;
    if (!fileName.isEmpty()) {
        current = VFS::ptr()->child(entry, fileName);
    } else if (signal == &EntryWatcher::entryDeleted && current.isDirPlace()) {
        // A place does not die with its directory.
        Q_EMIT q->entryChanged(current);
        return;
    }
    const bool isReset =
        signal == &EntryWatcher::entryChanged && QFileInfo(current.localPath()).isSymLink();
    Q_EMIT(q->*(isReset ? &EntryWatcher::entryReset : signal))(current);
}

} // namespace VeyFM
