// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/mountpaths.h"

namespace VeyFM {

namespace {

bool isHomeRelative(const QString& path)
{
    return path.startsWith(QLatin1String("/~"));
}

} // namespace

QString MountPaths::mountRootUrl(const QUrl& url)
{
    const QString root = url.toString(QUrl::RemovePath | QUrl::StripTrailingSlash);
    const bool homeRelative = isHomeRelative(url.path(QUrl::FullyDecoded));
    return root + (homeRelative ? QLatin1String("/~/") : QLatin1String("/"));
}

QString MountPaths::mountRootRelativePath(const QUrl& url)
{
    const QString path = url.path(QUrl::FullyDecoded);
    return isHomeRelative(path) ? path.mid(2) : path;
}

} // namespace VeyFM
