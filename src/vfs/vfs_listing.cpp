// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/directoryreader.h"
#include "vfs/vfs_p.h"

#include <QDir>
#include <QFileInfo>
#include <QSet>

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>

namespace VeyFM {

namespace {

bool isListable(const Entry& entry)
{
    return entry.isDir() || entry.isDirPlace() || entry.isArchiveFileMountPoint();
}

// What a record does not tell: what can be opened as a directory is one.
bool opensAsDirectory(const QByteArray& path)
{
    return DirectoryReader(path).isOpen();
}

// Where a chain of links ends, link by link, which finds the end also where the kernel gives up:
// behind forty links.
bool chainEndsAtDirectory(const QString& link)
{
    QFileInfo info(link);
    QSet<QString> visited{info.absoluteFilePath()};
    QString target = info.symLinkTarget();
    info.setFile(target);
    while (info.isSymLink() && !visited.contains(target)) {
        visited.insert(target);
        target = info.symLinkTarget();
        info.setFile(target);
    }
    return info.isDir();
}

// Appends to prefix a name of plain ASCII, which needs no codec. Null for any other name.
QString joinedAscii(const QString& prefix, const char* name, int length)
{
    QString result(prefix.size() + length, Qt::Uninitialized);
    QChar* out = result.data();
    std::memcpy(out, prefix.constData(), size_t(prefix.size()) * sizeof(QChar));
    out += prefix.size();
    uchar all = 0;
    for (int i = 0; i < length; ++i) {
        const auto byte = uchar(name[i]);
        all |= byte;
        out[i] = QChar(ushort(byte));
    }
    return all < 0x80 ? result : QString();
}

} // namespace

EntryList VFS::childs(const Entry& entry, EntryChildFilters filter) const
{
    QByteArrayList leftOut;
    return childsAndLeftOut(entry, filter, &leftOut);
}

EntryList
VFS::childsAndLeftOut(const Entry& given, EntryChildFilters filter, QByteArrayList* leftOut) const
{
    leftOut->clear();
    Q_D(const VFS);
    const Entry entry = copied(given);
    EntryList children;
    if (entry.isPlace() && d->placeBase.hasPlace(entry)) {
        children += d->placeBase.childEntries(entry);
    }
    const QString local = entry.localPath();
    if (local.isEmpty() || !isListable(entry)) {
        return children;
    }
    if (!d->appendDirectory(entry, local, filter, &children, leftOut)) {
        return EntryList();
    }
    if (filter.testFlag(WithExtraChildren)) {
        children += d->extraChildren.value(entry);
    }
    return children;
}

// False if the listing was cancelled.
bool VFSPrivate::appendDirectory(
    const Entry& entry, const QString& localPath, VFS::EntryChildFilters filter,
    EntryList* children, QByteArrayList* leftOut) const
{
    QByteArray directory = localPath.toLocal8Bit();
    if (!directory.endsWith('/')) {
        directory += '/';
    }
    DirectoryReader reader(directory);
    if (!reader.isOpen()) {
        return true;
    }
    const bool skipSymLinks = filter.testFlag(VFS::SkipSymLinks);
    const QString localPrefix = QString::fromLocal8Bit(directory);
    // Cleaned once for the whole directory: a name has no slash, so cleaning each child's path
    // would change nothing behind the prefix.
    const QString pathPrefix = resolveChildPath(entry, QString());
    const bool samePrefix = pathPrefix == localPrefix;

    while (const dirent* record = reader.next()) {
        const char* const name = record->d_name;
        const auto kind = record->d_type;
        // The dots come before the stop flag, so an empty directory leaves a pending stop alone.
        if ((kind == DT_DIR || kind == DT_UNKNOWN) && DirectoryReader::isDots(name)) {
            continue;
        }
        if (stopFlag.loadRelaxed() == 1 && stopFlag.testAndSetOrdered(1, 0)) {
            // A cancelled listing abandons its stream. That is how it stands.
            reader.abandon();
            return false;
        }
        // A link that is left out still takes a pending stop.
        if (skipSymLinks && kind == DT_LNK) {
            continue;
        }

        const auto length = int(std::strlen(name));
        QString path = joinedAscii(pathPrefix, name, length);
        QString local;
        bool isValidName = true;
        if (!path.isNull()) {
            local = samePrefix ? path : joinedAscii(localPrefix, name, length);
        } else {
            // Behind a slash: the decoder drops a byte order mark from the head of a text, and as
            // part of a path, which a name always is, the mark is a character like others.
            const QByteArray bytes = '/' + QByteArray::fromRawData(name, length);
            const QString withSlash = QString::fromLocal8Bit(bytes);
            const QString decoded = withSlash.mid(1);
            isValidName = withSlash.toLocal8Bit() == bytes;
            if (!isValidName && kind != DT_LNK) {
                leftOut->append(name);
                continue;
            }
            path = pathPrefix + decoded;
            if (isValidName) {
                local = samePrefix ? path : localPrefix + decoded;
            } else {
                // Decoded as a whole, as whoever is handed the path will do.
                local = QString::fromLocal8Bit(directory + name);
            }
        }

        int type = TypeFile;
        if (kind == DT_DIR || (kind == DT_UNKNOWN && opensAsDirectory(directory + name))) {
            type = TypeDir;
        } else if (kind == DT_LNK) {
            struct stat status;
            bool isDirectory = false;
            if (isValidName && ::fstatat(reader.descriptor(), name, &status, 0) == 0) {
                isDirectory = S_ISDIR(status.st_mode);
            } else if (!isValidName || errno == ELOOP) {
                isDirectory = chainEndsAtDirectory(local);
            }
            type = isDirectory ? TypeDirLink : TypeFileLink;
        }

        // Filled in place: a copy would count the references of both texts up and down again.
        children->append(Entry());
        Entry& child = children->last();
        child.m_path.swap(path);
        child.m_localPath.swap(local);
        child.m_type = type;
    }
    return true;
}

void VFS::stopGettingChilds()
{
    Q_D(VFS);
    d->stopFlag.fetchAndStoreOrdered(1);
}

bool VFS::containsDirsOrPlaces(const Entry& given) const
{
    Q_D(const VFS);
    const Entry entry = copied(given);
    if (entry.isPlace() && d->placeBase.hasChilds(entry)) {
        return true;
    }
    const QByteArray directory = entry.localPath().toLocal8Bit();
    if (directory.isEmpty() || !isListable(entry)) {
        return false;
    }
    DirectoryReader reader(directory);
    while (const dirent* record = reader.next()) {
        const auto kind = record->d_type;
        if ((kind != DT_DIR && kind != DT_UNKNOWN) || DirectoryReader::isDots(record->d_name)) {
            continue;
        }
        if (kind == DT_DIR || opensAsDirectory(directory + '/' + record->d_name)) {
            return true;
        }
    }
    return false;
}

bool VFS::hasChilds(const Entry& given) const
{
    Q_D(const VFS);
    const Entry entry = copied(given);
    if (entry.isPlace() && d->placeBase.hasChilds(entry)) {
        return true;
    }
    if (!isListable(entry)) {
        return false;
    }
    // QDir counts "." and "..": an empty directory that can be read has children by this test,
    // and one that can't be read has none. To meet one of the two settles it.
    const QString local = entry.localPath();
    if (!local.isEmpty()) {
        DirectoryReader reader(local.toLocal8Bit());
        while (const dirent* record = reader.next()) {
            if (DirectoryReader::isDots(record->d_name)) {
                return true;
            }
        }
    }
    return !local.contains(QChar(QChar::Null)) && QDir(local).count() != 0;
}

} // namespace VeyFM
