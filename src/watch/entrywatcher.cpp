// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/entrywatcher.h"

#include "vfs/vfs.h"
#include "watch/inotifywatcher.h"

#include <QFileInfo>

#include <algorithm>

namespace VeyFM {

EntryWatcher::EntryWatcher(QObject* parent)
    : QObject(parent)
    , m_inotifyWatcher(new InotifyWatcher(this))
{
    connect(
        m_inotifyWatcher, &InotifyWatcher::pathUnregistered, this, &EntryWatcher::unregisterPath);
    connect(m_inotifyWatcher, &InotifyWatcher::pathCreated, this, &EntryWatcher::slotPathCreated);
    connect(m_inotifyWatcher, &InotifyWatcher::pathDeleted, this, &EntryWatcher::slotPathDeleted);
    connect(m_inotifyWatcher, &InotifyWatcher::pathChanged, this, &EntryWatcher::slotPathChanged);
    connect(
        m_inotifyWatcher, &InotifyWatcher::pathAttributesChanged, this,
        &EntryWatcher::slotPathAttributesChanged);
}

EntryWatcher::~EntryWatcher() = default;

void EntryWatcher::addEntry(const Entry& entry)
{
    const QString local = entry.localPath();
    if (!isRefreshable(local)) {
        return;
    }
    // Of a path that it did not watch before, the watcher has just found out whether it is a link.
    const bool isLink = m_inotifyWatcher->addPath(local)
                            ? m_inotifyWatcher->isSymlinkRegistered(local)
                            : QFileInfo(local).isSymLink();
    if (isLink) {
        // That a link is deleted or replaced shows in the directory that holds it.
        m_inotifyWatcher->addPath(QFileInfo(local).absolutePath());
    }
    if (entry.isPlaceBased()) {
        m_watchedEntries[local].insert(entry);
    }
    // A path with a key goes by both its names: as the place and as the plain directory.
    const auto found = m_watchedEntries.find(local);
    if (found != m_watchedEntries.end()) {
        found->insert(VFS::ptr()->entry(local));
    }
}

void EntryWatcher::removeEntry(const Entry& entry)
{
    const QString local = entry.localPath();
    const auto entries = m_watchedEntries.find(local);
    if (entries == m_watchedEntries.end()) {
        m_inotifyWatcher->removePath(local);
        return;
    }
    entries->remove(entry);
    if (entries->size() == 1 && !entries->cbegin()->isPlaceBased()) {
        // What is left is the plain twin. The kernel's watch outlives the key, and what it
        // reports takes the road of plain directories from now on. That is meant.
        m_watchedEntries.erase(entries);
    } else if (entries->isEmpty()) {
        m_watchedEntries.erase(entries);
        m_inotifyWatcher->removePath(local);
    }
}

void EntryWatcher::clear()
{
    m_inotifyWatcher->clear();
    m_watchedEntries.clear();
}

void EntryWatcher::setDisabled(bool disabled)
{
    m_disabled = disabled;
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
    if (m_disabled) {
        return;
    }
    if (anyWay) {
        Q_EMIT entryReset(entry);
        return;
    }
    const QString local = entry.localPath();
    // The look-up leaves an empty set behind where there was none.
    if (!m_inotifyWatcher->isPathRegistered(local) && !m_watchedEntries[local].contains(entry)) {
        return;
    }
    if (isRefreshable(local)) {
        Q_EMIT entryReset(entry);
    }
}

void EntryWatcher::unregisterPath(QString path)
{
    m_watchedEntries.remove(path);
}

void EntryWatcher::slotPathCreated(QString path, QString fileName)
{
    notifyPath(&EntryWatcher::entryCreated, path, fileName);
}

void EntryWatcher::slotPathDeleted(QString path, QString fileName)
{
    notifyPath(&EntryWatcher::entryDeleted, path, fileName);
}

void EntryWatcher::slotPathChanged(QString path, QString fileName)
{
    notifyPath(&EntryWatcher::entryChanged, path, fileName);
}

void EntryWatcher::slotPathAttributesChanged(QString path, QString fileName)
{
    notifyPath(&EntryWatcher::entryAttributesChanged, path, fileName);
}

void EntryWatcher::notifyPath(Signal signal, const QString& path, const QString& fileName)
{
    if (m_disabled) {
        return;
    }
    const auto found = m_watchedEntries.constFind(path);
    if (found == m_watchedEntries.constEnd()) {
        const Entry current = VFS::ptr()->entry(path + QLatin1Char('/') + fileName);
        // Here the entry is asked and below the disk, and the two differ: a link to a file, or a
        // dangling one, is reset only where the path has a key.
        const bool isReset = signal == &EntryWatcher::entryChanged && current.isDirLink();
        Q_EMIT(this->*(isReset ? &EntryWatcher::entryReset : signal))(current);
        return;
    }
    // A copy, since slots may add and remove entries.
    const QSet<Entry> entries = *found;
    for (const Entry& entry : entries) {
        Entry current = entry;
        if (!fileName.isEmpty()) {
            current = VFS::ptr()->child(entry, fileName);
        } else if (signal == &EntryWatcher::entryDeleted && current.isDirPlace()) {
            // A place does not die with its directory.
            Q_EMIT entryChanged(current);
            continue;
        }
        const bool isReset =
            signal == &EntryWatcher::entryChanged && QFileInfo(current.localPath()).isSymLink();
        Q_EMIT(this->*(isReset ? &EntryWatcher::entryReset : signal))(current);
    }
}

} // namespace VeyFM
