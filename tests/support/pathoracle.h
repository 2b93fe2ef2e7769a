// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_PATHORACLE_H
#define VEYFM_TESTS_PATHORACLE_H

#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QDir>
#include <QFileInfo>
#include <QRandomGenerator>
#include <QStringList>
#include <QUrl>

/**
 * Path resolution once more, step by step and with no thought of speed: every text goes through
 * QUrl, every section through the tree, every file through QFileInfo. The library has to give the
 * same answers by its shorter ways.
 */
namespace PathOracle {

inline bool startsWithSlash(const QString& path)
{
    return path.startsWith(QLatin1Char('/'));
}

inline bool hasScheme(const QString& path)
{
    return !QUrl(path).scheme().isEmpty();
}

inline QStringList sections(const QString& path)
{
    return path.split(QLatin1Char('/'), Qt::SkipEmptyParts);
}

inline QString cleanPath(const QString& path)
{
    QString result;
    int i = 0;
    while (i < path.size()) {
        const QChar character = path[i++];
        result += character;
        if (character != QLatin1Char('/')) {
            continue;
        }
        bool skipped = true;
        while (skipped) {
            skipped = false;
            while (i < path.size() && path[i] == QLatin1Char('/')) {
                ++i;
            }
            if (path.midRef(i, 2) == QLatin1String("./")) {
                i += 2;
                skipped = true;
            }
        }
    }
    return result;
}

inline QString removeExcessivePathPlaces(const QString& path)
{
    const VeyFM::VFSPlaceBase* tree = VeyFM::VFS::ptr()->placeBase();
    if (hasScheme(path) || startsWithSlash(path)) {
        return path;
    }
    QStringList parts = sections(path);
    QString lastPlace;
    while (parts.size() >= 2) {
        if (!tree->hasPlace(parts[0]) || tree->hasPlace(parts[0] + QLatin1Char('/') + parts[1])) {
            break;
        }
        lastPlace = parts.takeFirst();
    }
    if (parts.size() == 1 && !lastPlace.isEmpty() && tree->hasPlace(parts[0])) {
        const auto children = tree->childEntries(tree->placeEntry(lastPlace));
        if (children.contains(tree->placeEntry(parts[0]))) {
            return parts[0];
        }
    }
    const QString rest = cleanPath(parts.join(QLatin1Char('/')));
    QString prefix;
    if (!lastPlace.isEmpty()) {
        if (lastPlace == VeyFM::VFS::ptr()->fileSystemEntry().path()) {
            prefix = QLatin1Char('/');
        } else {
            prefix = rest.isEmpty() ? lastPlace : lastPlace + QLatin1Char('/');
        }
    }
    return prefix + rest;
}

inline QString normalizePath(QString path)
{
    const VeyFM::VFSPlaceBase* tree = VeyFM::VFS::ptr()->placeBase();
    if (hasScheme(path) || path == QLatin1String("/")) {
        return path;
    }
    if (!startsWithSlash(path)) {
        path = removeExcessivePathPlaces(path);
    }
    const bool absolute = startsWithSlash(path);
    QString result;
    for (const QString& section : sections(path)) {
        if (section == QLatin1String(".")) {
            continue;
        }
        if (section == QLatin1String("..")) {
            const VeyFM::Entry place = tree->placeEntry(result);
            if (!place.isNull()) {
                const VeyFM::Entry parent =
                    tree->checkAndGetParentPlace(place, VeyFM::VFS::ptr()->rootEntry());
                if (!parent.isNull()) {
                    result = parent.path();
                    continue;
                }
            }
            if (result.contains(QLatin1Char('/'))) {
                result = result.left(result.lastIndexOf(QLatin1Char('/')));
                if (result.isEmpty()) {
                    result = tree->dirPlaceEntry(QStringLiteral("/")).path();
                }
            }
            continue;
        }
        if (!absolute && result.isEmpty()) {
            result = section;
        } else {
            result += QLatin1Char('/') + section;
        }
    }
    return result;
}

inline QString resolveLocalPath(const QString& path)
{
    const VeyFM::VFSPlaceBase* tree = VeyFM::VFS::ptr()->placeBase();
    if (path.isEmpty() || startsWithSlash(path)) {
        return path;
    }
    const QString cut = removeExcessivePathPlaces(path);
    if (startsWithSlash(cut)) {
        return cut;
    }
    QStringList parts = sections(cut);
    if (parts.isEmpty()) {
        return QString();
    }
    VeyFM::Entry place = tree->placeEntry(parts.takeFirst());
    if (place.isNull()) {
        return QString();
    }
    while (!parts.isEmpty()) {
        const VeyFM::Entry next = tree->placeEntry(place.path() + QLatin1Char('/') + parts.first());
        if (next.isNull()) {
            break;
        }
        place = next;
        parts.removeFirst();
    }
    QString base = place.localPath();
    if (base.isEmpty()) {
        return QString();
    }
    for (const QString& part : qAsConst(parts)) {
        base += QLatin1Char('/') + part;
    }
    return base;
}

/// What an entry says of itself, to be compared as a whole.
struct Answer
{
    QString path;
    QString localPath;
    int type = 0;

    Answer() = default;
    Answer(const QString& p, const QString& l, int t)
        : path(p)
        , localPath(l)
        , type(t)
    {
    }
    explicit Answer(const VeyFM::Entry& entry)
        : path(entry.path())
        , localPath(entry.isNull() ? QString() : entry.localPath())
        , type(entry.type())
    {
    }
    bool operator==(const Answer& other) const
    {
        return path == other.path && localPath == other.localPath && type == other.type;
    }
};

inline char* toString(const Answer& answer)
{
    const QString all = QStringLiteral("\"%1\" at \"%2\" of type %3")
                            .arg(answer.path, answer.localPath)
                            .arg(answer.type);
    return qstrdup(all.toUtf8().constData());
}

inline Answer relativeEntry(const QString& path)
{
    const QString normalized = normalizePath(path);
    if (normalized.isEmpty()) {
        return Answer();
    }
    const VeyFM::Entry place = VeyFM::VFS::ptr()->placeBase()->placeEntry(normalized);
    if (!place.isNull()) {
        return Answer(place);
    }
    const QString local = resolveLocalPath(normalized);
    if (local.isEmpty()) {
        return Answer();
    }
    const QFileInfo info(local);
    int type = 0;
    if (info.isDir()) {
        type = info.isSymLink() ? 10004 : 10001;
    } else if (info.isFile()) {
        type = info.isSymLink() ? 10003 : 10000;
    }
    return Answer(normalized, local, type);
}

/// VFS::entry() for texts without a scheme.
inline Answer entry(const QString& path)
{
    const VeyFM::VFSPlaceBase* tree = VeyFM::VFS::ptr()->placeBase();
    if (path == QLatin1String(".")) {
        return relativeEntry(QDir::currentPath());
    }
    if (path.startsWith(QLatin1String("./"))) {
        return relativeEntry(QDir::currentPath() + path.mid(1));
    }
    const QString clean = cleanPath(path);
    if (clean.isEmpty()) {
        return Answer();
    }
    if (!startsWithSlash(clean) && !tree->isPathContainsPlace(clean)) {
        return relativeEntry(QDir::currentPath() + QLatin1Char('/') + clean);
    }
    if (startsWithSlash(clean)) {
        return clean.size() == 1 ? Answer(VeyFM::VFS::ptr()->fileSystemEntry())
                                 : relativeEntry(clean);
    }
    const VeyFM::Entry place = tree->placeEntry(clean);
    return place.isNull() ? relativeEntry(clean) : Answer(place);
}

/// A text of some sections out of the given ones, joined by slashes, also doubled ones and none.
inline QString randomPath(QRandomGenerator* random, const QStringList& words)
{
    QString result = random->bounded(3) == 0 ? QStringLiteral("/") : QString();
    const int count = random->bounded(9);
    for (int i = 0; i < count; ++i) {
        result += words[random->bounded(words.size())];
        if (i + 1 < count || random->bounded(4) == 0) {
            result += QStringLiteral("//").left(random->bounded(6) == 0 ? 2 : 1);
        }
    }
    return result;
}

} // namespace PathOracle

#endif
