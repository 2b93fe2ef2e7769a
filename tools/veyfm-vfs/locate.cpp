// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "locate.h"

#include "report.h"
#include "vfs/vfs.h"

#include <QUrl>

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

QString whyMeaningless(const QString& text)
{
    if (text.isEmpty()) {
        return QStringLiteral("an empty name");
    }
    if (text.contains(QChar(QChar::ReplacementCharacter))) {
        return QStringLiteral("not a valid name in the encoding of the locale");
    }
    const QString scheme = QUrl(text).scheme();
    if (scheme == QLatin1String("vey-fm")) {
        return QStringLiteral("no place has this URL");
    }
    if (scheme == QLatin1String("file")) {
        return QStringLiteral("not a file on this computer");
    }
    if (!scheme.isEmpty()) {
        return QStringLiteral("no URLs with the scheme '%1' here; a file of this name is ./%2")
            .arg(scheme, text);
    }
    return QStringLiteral("no such place, path or URL");
}

/// 0 when there is something at the local path, a dangling link too.
int errorOf(const QString& localPath)
{
    if (localPath.isEmpty() || localPath.contains(QChar(QChar::Null))) {
        return ENOENT;
    }
    struct stat status = {};
    return ::lstat(localPath.toLocal8Bit().constData(), &status) == 0 ? 0 : errno;
}

} // namespace

Located resolveText(const QString& text)
{
    Located result = {VFS::ptr()->entry(text), QString()};
    if (result.entry.isNull()) {
        result.why = whyMeaningless(text);
    }
    return result;
}

Located locate(const QString& text)
{
    Located result = resolveText(text);
    const Entry& entry = result.entry;
    if (!result.why.isEmpty() || entry.isPlace() || entry.isCustomUrl() || entry.isFuseUrl()) {
        return result;
    }
    const int error = errorOf(entry.localPath());
    if (error == ENOENT && text.contains(QChar(QChar::ReplacementCharacter))) {
        result.why = whyMeaningless(text);
    } else if (error != 0) {
        result.why = systemReason(error);
    }
    return result;
}

QString whyUnreadable(const Entry& entry)
{
    if (entry.isFuseUrl()) {
        return QStringLiteral("not mounted");
    }
    if (entry.isPurePlace()) {
        return QString();
    }
    if (entry.localPath().isEmpty()) {
        return systemReason(ENOTDIR);
    }
    // Tells more than the type does: of a file, of a dangling link, of a cycle of links.
    const int descriptor =
        ::open(entry.localPath().toLocal8Bit().constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (descriptor < 0) {
        return systemReason(errno);
    }
    ::close(descriptor);
    return QString();
}

} // namespace Tool
} // namespace VeyFM
