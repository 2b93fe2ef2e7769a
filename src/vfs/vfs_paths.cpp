// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/localbytes.h"
#include "core/urlparsing.h"
#include "vfs/vfs_p.h"

#include <QDir>
#include <QFileInfo>
#include <QSet>
#include <QUrl>

#include <algorithm>
#include <cstdlib>

#include <sys/stat.h>

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

bool hasScheme(const QString& text)
{
    return !UrlParsing::scheme(text).isEmpty();
}

// The local path of a "file" URL that has no host, or an invalid one: that of
// QUrl::fromUserInput(), which also tries the text as a host and path, without a scheme.
QString pathOfFileUrl(const QString& text)
{
    const QString input = text.trimmed();
    const QString asHttp = QLatin1String("http://") + input;
    if (!UrlParsing::hasOverlongHost(input) && !UrlParsing::hasOverlongHost(asHttp)) {
        return QUrl::fromUserInput(input).path(QUrl::FullyDecoded);
    }
    const QUrl url = UrlParsing::url(input);
    const QUrl http = UrlParsing::url(asHttp);
    if (url.isValid() && http.port() == -1) {
        return url.path(QUrl::FullyDecoded);
    }
    return http.isValid() ? http.path(QUrl::FullyDecoded) : QString();
}

// The type of what lies at a local path. Neither a dangling link nor a device has one.
int typeOnDisk(const QString& localPath)
{
    const LocalBytes bytes(localPath);
    struct stat status;
    if (!bytes.isUsable() || ::lstat(bytes.data(), &status) != 0) {
        return TypeNone;
    }
    const bool isLink = S_ISLNK(status.st_mode);
    if (isLink && ::stat(bytes.data(), &status) != 0) {
        return TypeNone;
    }
    if (S_ISDIR(status.st_mode)) {
        return isLink ? TypeDirLink : TypeDir;
    }
    if (S_ISREG(status.st_mode)) {
        return isLink ? TypeFileLink : TypeFile;
    }
    return TypeNone;
}

// Whether a path is absolute and has no empty, "." or ".." section and no slash at its end.
bool isNormalAbsolute(const QString& path)
{
    if (!path.startsWith(slash)) {
        return false;
    }
    const ushort* unit = path.utf16();
    const ushort* const end = unit + path.size();
    for (; unit != end; ++unit) {
        if (*unit != '/') {
            continue;
        }
        const ushort* next = unit + 1;
        if (next != end && *next == '.') {
            ++next;
            if (next != end && *next == '.') {
                ++next;
            }
        }
        if (next == end || *next == '/') {
            return false;
        }
    }
    return true;
}

QStringList sections(const QString& path)
{
    return path.split(slash, Qt::SkipEmptyParts);
}

// Follows a chain of links from a target on. Empty when it ends in a cycle or not at a directory.
QString linkedDirectory(const QString& link)
{
    QSet<QString> visited{link};
    QFileInfo target(QFileInfo(link).symLinkTarget());
    while (target.isSymLink() && !visited.contains(target.filePath())) {
        visited.insert(target.filePath());
        target.setFile(target.symLinkTarget());
    }
    const QString path = target.filePath();
    return visited.contains(path) || !target.isDir() ? QString() : path;
}

} // namespace

Entry VFS::entry(const QString& given) const
{
    Q_D(const VFS);
    const QString path = copied(given);
    // The usual path, which every rule below would leave as it is.
    if (isNormalAbsolute(path)) {
        return d->entryFromNormalPath(path);
    }
    if (path == QLatin1String(".")) {
        return d->entryFromRelativePath(QDir::currentPath());
    }
    if (path.startsWith(QLatin1String("./"))) {
        return d->entryFromRelativePath(QDir::currentPath() + path.mid(1));
    }
    if (hasScheme(path)) {
        return d->entryFromSchemePath(path);
    }
    const QString clean = VFSPrivate::cleanPath(path);
    if (clean.isEmpty()) {
        return Entry();
    }
    if (clean.startsWith(slash)) {
        return clean.size() == 1 ? d->fileSystemEntry : d->entryFromRelativePath(clean);
    }
    // A place wins over a file of its name in the working directory.
    if (!d->placeBase.isPathContainsPlace(clean)) {
        return d->entryFromRelativePath(QDir::currentPath() + slash + clean);
    }
    const Entry place = d->placeBase.placeEntry(clean);
    return place.isNull() ? d->entryFromRelativePath(clean) : place;
}

Entry VFSPrivate::entryFromSchemePath(const QString& path) const
{
    const QString scheme = UrlParsing::scheme(path);
    if (scheme == QLatin1String("file") && UrlParsing::url(path).host().isEmpty()) {
        return entryFromRelativePath(pathOfFileUrl(path));
    }
    if (scheme == QLatin1String("vey-fm")) {
        // Written with no slash behind the colon. These six words are the same in every
        // language; any other place goes by its own, translated path.
        const QString place = UrlParsing::url(path).path(QUrl::FullyDecoded);
        if (place == QLatin1String("Computer")) {
            return computerEntry;
        }
        if (place == QLatin1String("Home")) {
            return homeEntry;
        }
        if (place == QLatin1String("Trash")) {
            return trashEntry;
        }
        if (place == QLatin1String("Desktop")) {
            return desktopEntry;
        }
        if (place == QLatin1String("Documents")) {
            return documentsEntry;
        }
        if (place == QLatin1String("FileSystem")) {
            return fileSystemEntry;
        }
        return placeBase.placeEntry(place);
    }
    if (scheme == QLatin1String("mailto") || scheme == QLatin1String("http") ||
        scheme == QLatin1String("qthelp")) {
        return Entry(path, QString(), TypeCustomUrl);
    }
    if (scheme == QLatin1String("ftp") || scheme == QLatin1String("sftp")) {
        return Entry(path, QString(), TypeFuseUrl);
    }
    // "smb" too: Samba entries come from the tree alone.
    return Entry();
}

Entry VFSPrivate::entryFromRelativePath(const QString& path) const
{
    const QString normalized = q->normalizePath(path);
    return normalized.isEmpty() ? Entry() : entryFromNormalPath(normalized);
}

Entry VFSPrivate::entryFromNormalPath(const QString& path) const
{
    const Entry place = placeBase.placeEntry(path);
    if (!place.isNull()) {
        return place;
    }
    const QString local = resolveLocalPath(path);
    if (local.isEmpty()) {
        return Entry();
    }
    return Entry(path, local, typeOnDisk(local));
}

QString VFS::normalizePath(const QString& given) const
{
    Q_D(const VFS);
    const QString path = copied(given);
    if (hasScheme(path) || path == slash) {
        return path;
    }
    const QString cut = path.startsWith(slash) ? path : d->removeExcessivePathPlaces(path);
    const bool absolute = cut.startsWith(slash);
    if (isNormalAbsolute(cut)) {
        return cut;
    }

    QString result;
    const auto parts = cut.splitRef(slash, Qt::SkipEmptyParts);
    for (const QStringRef& part : parts) {
        if (part == QLatin1String(".")) {
            continue;
        }
        if (part != QLatin1String("..")) {
            if (absolute || !result.isEmpty()) {
                result += slash;
            }
            result += part;
            continue;
        }
        const Entry place = d->placeBase.placeEntry(result);
        if (!place.isNull()) {
            const Entry parent = d->placeBase.checkAndGetParentPlace(place, d->rootEntry);
            if (!parent.isNull()) {
                result = parent.path();
                continue;
            }
        }
        const int last = result.lastIndexOf(slash);
        if (last < 0) {
            continue; // The walk can't rise above a lone name.
        }
        result.truncate(last);
        if (result.isEmpty()) {
            // Above a top-level directory the notation of the file system is left for that of
            // the tree, and stays so: "/usr/../etc" is "File System/etc".
            result = d->placeBase.dirPlaceEntry(QString(slash)).path();
        }
    }
    return result;
}

QString VFSPrivate::removeExcessivePathPlaces(const QString& path) const
{
    if (path.startsWith(slash) || hasScheme(path)) {
        return path;
    }
    const QStringList parts = sections(path);
    QString lastPlace;
    int first = 0;
    // A section that has a following place is dropped, but a composite key must stay whole.
    while (parts.size() - first >= 2 && placeBase.hasPlace(parts[first]) &&
           !placeBase.hasPlace(parts[first] + slash + parts[first + 1])) {
        lastPlace = parts[first++];
    }
    // A lone place that is left, and hangs below the last one dropped, is that place itself:
    // "Computer/Home" is Home, while "Home/Desktop" stays a directory below Home.
    if (first > 0 && first == parts.size() - 1) {
        const Entry place = placeBase.placeEntry(parts.last());
        if (!place.isNull() &&
            placeBase.placeHasChildEntry(placeBase.placeEntry(lastPlace), place)) {
            return parts.last();
        }
    }
    const QString rest = cleanPath(QStringList(parts.mid(first)).join(slash));
    if (lastPlace.isEmpty()) {
        return rest;
    }
    if (lastPlace == fileSystemEntry.path()) {
        return slash + rest;
    }
    return rest.isEmpty() ? lastPlace : lastPlace + slash + rest;
}

QString VFSPrivate::resolveLocalPath(const QString& path) const
{
    if (path.isEmpty() || path.startsWith(slash)) {
        return path;
    }
    const QString cut = removeExcessivePathPlaces(path);
    if (cut.startsWith(slash)) {
        return cut;
    }
    const QStringList parts = sections(cut);
    if (parts.isEmpty()) {
        return QString();
    }
    Entry place = placeBase.placeEntry(parts.first());
    if (place.isNull()) {
        return QString();
    }
    int next = 1;
    for (; next < parts.size(); ++next) {
        const Entry deeper = placeBase.placeEntry(place.path() + slash + parts[next]);
        if (deeper.isNull()) {
            break;
        }
        place = deeper;
    }
    // A service may send a mount whose type is no place type. To compute its local path would
    // lead back here.
    QString result = place.isPlace() ? localPathOf(place) : place.m_localPath;
    if (result.isEmpty()) {
        return QString();
    }
    for (; next < parts.size(); ++next) {
        result += slash;
        result += parts[next];
    }
    return result;
}

QString VFSPrivate::localPathOf(const Entry& entry) const
{
    return !entry.m_localPath.isEmpty() && !entry.isStoragePlace() ? entry.m_localPath
                                                                   : q->localPath(entry);
}

QString VFS::localPath(const QString& path) const
{
    Q_D(const VFS);
    return d->localPathOf(entry(path));
}

QString VFS::localPath(const Entry& given) const
{
    Q_D(const VFS);
    const Entry entry = copied(given);
    const QString scheme = UrlParsing::scheme(entry.m_path);
    if (!scheme.isEmpty()) {
        return scheme == QLatin1String("file") ? pathOfFileUrl(entry.m_path) : QString();
    }
    if (!entry.isPlace()) {
        return d->resolveLocalPath(entry.m_path);
    }
    if (entry.isStoragePlace()) {
        return storagePlace(entry).mountPoint();
    }
    if (entry.isSambaSharePlace() || entry.isFavouriteNetworkPlace()) {
        // What the tree knows now, not what the entry was given once.
        return d->placeBase.placeEntry(entry.m_path).m_localPath;
    }
    // The stored path also decides whether the other implicit places are directories at all. To
    // ask isDirPlace() about one that has none would ask for its local path again, without end.
    const bool mayBeDirectory =
        (entry.m_type >= 2000 && entry.m_type <= 2999) || entry.isImplicitDirPlace();
    return mayBeDirectory ? entry.m_localPath : QString();
}

QString VFSPrivate::resolveChildPath(const Entry& entry, const QString& name) const
{
    if (!entry.isStoragePlace() && !entry.isDir() && !entry.isDirPlace() &&
        !entry.isArchiveFileMountPoint()) {
        return QString();
    }
    // Here the File System place of the tree is turned back into "/".
    const QString parent = entry.m_path == fileSystemEntry.m_path ? QString() : entry.m_path;
    return cleanPath(parent + slash + name);
}

QString VFSPrivate::cleanPath(const QString& path)
{
    if (path.isEmpty()) {
        return QString();
    }
    // Only what follows a slash is looked at: a leading "./" and a trailing "/." stay.
    const auto excess = [&path](int i) {
        int j = i;
        while (true) {
            if (j < path.size() && path[j] == slash) {
                ++j;
            } else if (j + 1 < path.size() && path[j] == QLatin1Char('.') && path[j + 1] == slash) {
                j += 2;
            } else {
                return j - i;
            }
        }
    };
    int i = path.indexOf(slash) + 1;
    while (i > 0 && excess(i) == 0) {
        i = path.indexOf(slash, i) + 1;
    }
    if (i == 0) {
        return path;
    }
    QString result;
    result.reserve(path.size());
    result += path.leftRef(i);
    while (i < path.size()) {
        if (path[i - 1] == slash) {
            i += excess(i);
        }
        int end = path.indexOf(slash, i) + 1;
        end = end == 0 ? path.size() : end;
        result += path.midRef(i, end - i);
        i = end;
    }
    return result;
}

QString VFSPrivate::realPath(const QString& path)
{
    const LocalBytes bytes(path);
    if (!bytes.isUsable()) {
        return QString();
    }
    const std::unique_ptr<char, decltype(&std::free)> resolved(
        ::realpath(bytes.data(), nullptr), &std::free);
    return resolved ? QString::fromLocal8Bit(resolved.get()) : QString();
}

QString VFSPrivate::canonicalizedPath(const QString& path, const QString& stopPath)
{
    const QString absolute = QFileInfo(path).absoluteFilePath();
    if (absolute.isEmpty() || absolute == slash || stopPath == slash) {
        return absolute;
    }
    const QStringList parts = sections(absolute);
    QString result;
    for (int i = 0; i < parts.size(); ++i) {
        result += slash + parts[i];
        if (result == stopPath) {
            for (++i; i < parts.size(); ++i) {
                result += slash + parts[i];
            }
            return result;
        }
        if (i == parts.size() - 1) {
            break; // The entry itself is not examined, only the way to it.
        }
        const QFileInfo info(result);
        if (info.isSymLink()) {
            result = linkedDirectory(result);
            if (result.isEmpty()) {
                return QString();
            }
        } else if (!info.isDir()) {
            return QString();
        }
    }
    return result;
}

} // namespace VeyFM
