// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/vfs_p.h"

#include <QDir>
#include <QFileInfo>

#include <algorithm>

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

} // namespace

bool VFS::isEntryExists(const Entry& given) const
{
    Q_D(const VFS);
    const Entry entry = copied(given);
    if (entry.isPlace()) {
        return d->placeBase.hasPlace(entry);
    }
    return entry.exists() || entry.m_path.startsWith(QLatin1String("mailto:")) ||
           entry.m_path.startsWith(QLatin1String("vey-fm:"));
}

Entry VFS::child(const Entry& givenEntry, const QString& givenName) const
{
    const Entry entry = copied(givenEntry);
    const QString name = copied(givenName);
    return this->entry(d_func()->resolveChildPath(entry, name));
}

Entry VFS::parent(const Entry& given, const Entry& root) const
{
    Q_D(const VFS);
    const Entry entry = copied(given);
    const Entry parentPlace = d->placeBase.checkAndGetParentPlace(entry, root);
    if (!parentPlace.isNull()) {
        return parentPlace;
    }
    if (entry.isPlace()) {
        return Entry();
    }
    const QString local = entry.localPath();
    const int last = local.lastIndexOf(slash);
    if (local.isEmpty() || local == slash || last < 0) {
        return Entry();
    }
    if (last == 0) {
        return d->fileSystemEntry;
    }
    const QString parentLocal = local.left(last);
    if (!QDir(parentLocal).exists()) {
        return Entry();
    }
    const QString tail = local.mid(last);
    QString parentPath = entry.m_path;
    // A path that does not hold the tail loses its last character: -1 counts from the end.
    parentPath.remove(parentPath.lastIndexOf(tail), tail.size());
    const Entry place = d->placeBase.placeEntry(parentPath);
    if (!place.isNull()) {
        return place;
    }
    // The path is asked, not the local path, so that below a place this is about a relative name
    // and as a rule says no.
    const bool isLink = QFileInfo(parentPath).isSymLink();
    return Entry(parentPath, parentLocal, isLink ? TypeDirLink : TypeDir);
}

Entry VFS::parent(const Entry& entry) const
{
    return parent(entry, d_func()->rootEntry);
}

bool VFS::hasParent(const Entry& entry) const
{
    return !parent(entry).isNull();
}

EntryList VFS::pathEntryList(const Entry& entry, const Entry& givenRoot) const
{
    const Entry root = copied(givenRoot);
    EntryList chain;
    for (Entry current = entry; !current.isNull(); current = parent(current, root)) {
        chain.append(current);
    }
    std::reverse(chain.begin(), chain.end());
    return chain;
}

EntryList VFS::pathEntryList(const Entry& entry) const
{
    return pathEntryList(entry, d_func()->rootEntry);
}

QStringList VFS::fileSystemEntryPathList(const Entry& root) const
{
    Q_D(const VFS);
    return root == d->rootEntry ? QStringList{d->computerEntry.m_path} : QStringList();
}

QStringList VFS::exploreParentPlacesHistory(const QString& path, const Entry& root) const
{
    Q_D(const VFS);
    if (d->placeBase.isPathContainsPlace(path)) {
        QStringList history = d->placeBase.exploreParentPlacesHistory(path, root.m_path);
        if (!history.isEmpty() && history.first() == root.m_path) {
            history.removeFirst();
        }
        return history;
    }
    if (path.startsWith(slash)) {
        return fileSystemEntryPathList(root) << d->fileSystemEntry.m_path;
    }
    return QStringList();
}

QStringList VFS::exploreParentPlacesHistory(const QString& path) const
{
    return exploreParentPlacesHistory(path, d_func()->rootEntry);
}

Entry VFS::symLinkTargetEntry(const Entry& given) const
{
    const Entry entry = copied(given);
    QString target = entry.symLinkTarget();
    if (!target.startsWith(slash)) {
        target = entry.localPath() + slash + target;
    }
    const Entry result = this->entry(target);
    return isPlaceRelativeEntry(entry) ? placeRelatedEntry(result) : result;
}

Entry VFS::placeRelatedEntry(const Entry& given) const
{
    Q_D(const VFS);
    const Entry entry = copied(given);
    const QString local = entry.isPlace() ? QString() : entry.localPath();
    if (local.isEmpty()) {
        return entry;
    }
    return d->entryFromRelativePath(d->placeBase.placeRelatedPath(local));
}

bool VFS::isPlaceRelativeEntry(const Entry& entry) const
{
    // By the letter the root place counts too: it is a place, and neither of the two.
    for (Entry current = entry; !current.isNull(); current = parent(current)) {
        if (current.isPlace() && !current.isFileSystemRootPlace() && !current.isComputerPlace()) {
            return true;
        }
    }
    return false;
}

bool VFS::isStoragePlaceRelativeEntry(const Entry& entry) const
{
    for (Entry current = entry; !current.isNull(); current = parent(current)) {
        if (current.isStoragePlace()) {
            return true;
        }
    }
    return false;
}

bool VFS::hasStoragePlaceRelativeEntries(const EntryList& given) const
{
    const EntryList entries = copied(given);
    return std::any_of(entries.begin(), entries.end(), [this](const Entry& entry) {
        return isStoragePlaceRelativeEntry(entry);
    });
}

bool VFS::isEntryInNetwork(const Entry& entry) const
{
    Q_D(const VFS);
    // A test of text, with no slash behind the prefix. With the network switched off the
    // prefixes are empty, and everything is in the network.
    for (const Entry* place :
         {&d->sambaNetworkEntry, &d->ftpNetworkEntry, &d->sftpNetworkEntry, &d->networkEntry}) {
        if (entry.m_path.startsWith(place->m_path)) {
            return true;
        }
    }
    return false;
}

bool VFS::hasNetworkRelativeEntries(const EntryList& entries) const
{
    return std::any_of(entries.begin(), entries.end(), [this](const Entry& entry) {
        return isEntryInNetwork(entry);
    });
}

bool VFS::isSupportedFileArchive(const Entry& entry) const
{
    Q_UNUSED(entry)
    return false;
}

} // namespace VeyFM
