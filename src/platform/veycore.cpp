// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "veycore.h"

#include <QDir>
#include <QFile>
#include <QStandardPaths>

#include <mutex>
#include <set>
#include <string>

namespace {

QString userDirectory(QStandardPaths::StandardLocation location, QLatin1String fallback)
{
    const QString path = QStandardPaths::writableLocation(location);
    return QDir::isAbsolutePath(path) ? path : QDir::homePath() + fallback;
}

// Cleaned, since a doubled slash would keep the path from being recognised as a prefix of others. A
// setting may hold one, and a home directory of "/" makes one.
const char* keepForEver(const QString& path)
{
    static std::mutex mutex;
    // Never destroyed: callers may still look at a path when statics are.
    static auto& paths = *new std::set<std::string>;

    const std::string text = QFile::encodeName(QDir::cleanPath(path)).toStdString();
    const std::lock_guard<std::mutex> lock(mutex);
    return paths.insert(text).first->c_str();
}

} // namespace

const char* GetVeyDir(_VeyDir dir)
{
    switch (dir) {
    case VeyDirDesktop:
        return keepForEver(
            userDirectory(QStandardPaths::DesktopLocation, QLatin1String("/Desktop")));
    case VeyDirDocuments:
        return keepForEver(
            userDirectory(QStandardPaths::DocumentsLocation, QLatin1String("/Documents")));
    case VeyDirTrash:
        return keepForEver(
            userDirectory(QStandardPaths::GenericDataLocation, QLatin1String("/.local/share")) +
            QLatin1String("/Trash/files"));
    }
    return nullptr;
}

const char* GetOrganization()
{
    return "veylabs";
}
