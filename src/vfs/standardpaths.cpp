// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/standardpaths.h"

#include <QUrl>

#include <memory>
#include <netdb.h>
#include <veycore.h>

namespace VeyFM {

namespace {

// By number, since the platform's header may name the directories as it likes.
constexpr int DesktopDir = 6;
constexpr int DocumentsDir = 7;
constexpr int TrashDir = 8;

QString platformDir(int dir)
{
    return QString::fromLocal8Bit(GetVeyDir(static_cast<_VeyDir>(dir)));
}

} // namespace

QString StandardPaths::fileSystemRootPath()
{
    return QStringLiteral("/");
}

QString StandardPaths::trashDirPath()
{
    return platformDir(TrashDir);
}

QString StandardPaths::desktopDirPath()
{
    return platformDir(DesktopDir);
}

QString StandardPaths::documentsDirPath()
{
    return platformDir(DocumentsDir);
}

QString StandardPaths::toCanonicalHostName(const QString& host)
{
    const QByteArray ace = QUrl::toAce(host);
    if (ace.isEmpty()) {
        return host;
    }

    // No family and no socket type: the name alone counts, whatever addresses there are.
    addrinfo hints = {};
    hints.ai_flags = AI_CANONNAME;
    addrinfo* found = nullptr;
    if (getaddrinfo(ace.constData(), nullptr, &hints, &found) != 0 || !found) {
        return host;
    }
    const std::unique_ptr<addrinfo, decltype(&freeaddrinfo)> results(found, &freeaddrinfo);

    // Only the first result carries the name.
    const QString name = QString::fromLocal8Bit(found->ai_canonname);
    return name.isEmpty() ? host : name;
}

} // namespace VeyFM
