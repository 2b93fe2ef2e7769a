// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/vfs_p.h"

namespace VeyFM {

void VFS::notifyWatchers(const Entry& entry)
{
    directNotifyWatchers(EntryList(entry), true);
}

void VFS::notifyWatchers(const EntryList& entries)
{
    directNotifyWatchers(entries, true);
}

void VFS::directNotifyWatchers(const EntryList& given, bool anyWay)
{
    Q_D(VFS);
    const EntryList entries = copied(given);
    for (const Entry& entry : entries) {
        d->entryWatcher.entryChangedNotify(entry, anyWay);
    }
}

void VFS::notifyAllWatchers(const EntryList& entries)
{
    Q_D(VFS);
    // The views of this process are refreshed by the service's echo, never directly.
    if (const auto fileSystem = d->fileSystemInterface.toStrongRef()) {
        fileSystem->call(
            QDBus::NoBlock, QStringLiteral("notifyWatchers"), QVariant::fromValue(entries));
    }
}

void VFSPrivate::_q_serviceNotifyWatchers(const EntryList& entries)
{
    news.tell([this, entries] {
        for (const Entry& entry : entries) {
            news.then([this, entry] { entryWatcher.entryChangedNotify(entry, true); });
        }
    });
}

bool VFSPrivate::addEntryToPlace(const Entry& entry, const Entry& place, bool notify)
{
    const bool linked = placeBase.addEntryToPlace(entry, place);
    if (linked && notify) {
        news.then([this, entry] { entryWatcher.notifyEntryCreated(entry); });
    }
    return linked;
}

EntryList VFSPrivate::addEntriesToPlace(const EntryList& entries, const Entry& place, bool notify)
{
    const EntryList linked = placeBase.addEntriesToPlace(entries, place);
    if (notify) {
        for (const Entry& entry : linked) {
            news.then([this, entry] { entryWatcher.notifyEntryCreated(entry); });
        }
    }
    return linked;
}

void VFSPrivate::destroyPlace(const Entry& place)
{
    if (placeBase.destroyPlace(place)) {
        entryWatcher.notifyEntryDeleted(place);
    }
}

void VFSPrivate::destroyPlaceLater(const Entry& place)
{
    news.then([this, place] { destroyPlace(place); });
}

} // namespace VeyFM
