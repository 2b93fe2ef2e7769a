// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "describe.h"

#include "shown.h"
#include "vfs/vfs.h"

#include <QDateTime>
#include <QUrl>

#include <algorithm>

namespace VeyFM {
namespace Tool {

namespace {

struct TypeName
{
    int type;
    const char* name;
};

constexpr TypeName typeNames[] = {
    {TypeNone, "none"},
    {TypePlace, "place"},
    {TypeComputerPlace, "computer"},
    {TypeNetworkPlace, "network"},
    {TypeStorageDevicesPlace, "storage-devices"},
    {TypeFavouritesPlace, "favourites"},
    {TypeSambaNetworkPlace, "samba-network"},
    {TypeSambaWorkgroupPlace, "samba-workgroup"},
    {TypeSambaServerPlace, "samba-server"},
    {TypeFtpNetworkPlace, "ftp-network"},
    {TypeSFtpNetworkPlace, "sftp-network"},
    {TypeFileSystemRootPlace, "file-system-root"},
    {TypeHomeDirPlace, "home"},
    {TypeTrashDirPlace, "trash"},
    {TypeDesktopDirPlace, "desktop"},
    {TypeMyDocumentsDirPlace, "documents"},
    {TypeFavouritePlace, "favourite"},
    {TypeUsbDiskStoragePlace, "usb-disk"},
    {TypeCdromDriveStoragePlace, "cdrom-drive"},
    {TypeFloppyDriveStoragePlace, "floppy-drive"},
    {TypeHardDiskDriveStoragePlace, "hard-disk"},
    {TypeStoragePlace5, "storage-5"},
    {TypeStoragePlace6, "storage-6"},
    {TypeStoragePlace7, "storage-7"},
    {TypeStoragePlace8, "storage-8"},
    {TypeFavouriteNetworkPlace, "network-bookmark"},
    {TypeSambaSharePlace, "samba-share"},
    {TypeFtpSharePlace, "ftp-share"},
    {TypeSFtpSharePlace, "sftp-share"},
    {TypeFile, "file"},
    {TypeDir, "directory"},
    {TypeFileLink, "file-link"},
    {TypeDirLink, "directory-link"},
    {TypeArchiveFileMountPoint, "archive-mount-point"},
    {TypeCustomUrl, "custom-url"},
    {TypeFuseUrl, "fuse-url"},
};

bool isUrl(const Entry& entry)
{
    return entry.isCustomUrl() || entry.isFuseUrl();
}

/// What the library makes of a URL, be it a broken one, it makes of one without the password too.
Entry withoutPassword(const Entry& entry)
{
    return isUrl(entry) ? VFS::ptr()->entry(shownLocation(entry.path())) : entry;
}

} // namespace

QString typeName(int type)
{
    const auto* const found =
        std::find_if(std::begin(typeNames), std::end(typeNames), [type](const TypeName& known) {
            return known.type == type;
        });
    return QLatin1String(found == std::end(typeNames) ? "unknown" : found->name);
}

QString shownPath(const Entry& entry)
{
    return isUrl(entry) ? shownLocation(entry.path()) : entry.path();
}

QString shownName(const Entry& entry)
{
    return isUrl(entry) ? shownPath(entry).section(QLatin1Char('/'), -1) : entry.lastPathSection();
}

QJsonObject toJson(const Entry& entry)
{
    return {
        {QStringLiteral("name"), shownName(entry)},
        {QStringLiteral("path"), shownPath(entry)},
        {QStringLiteral("localPath"), textOrNull(entry.localPath())},
        {QStringLiteral("type"), entry.type()},
        {QStringLiteral("typeName"), typeName(entry.type())},
    };
}

QString isoTime(qint64 seconds)
{
    if (seconds == -1) {
        return QString();
    }
    const QDateTime local = QDateTime::fromSecsSinceEpoch(seconds);
    return local.toOffsetFromUtc(local.offsetFromUtc()).toString(Qt::ISODate);
}

QString urlOf(const Entry& entry)
{
    const QList<QUrl> urls = VFS::ptr()->urlsFromEntries(withoutPassword(entry));
    return urls.isEmpty() ? QString()
                          : shownLocation(urls.constFirst().toString(QUrl::FullyEncoded));
}

QString networkUrlOf(const Entry& entry)
{
    return shownLocation(VFS::ptr()->getUrlForEntry(withoutPassword(entry)));
}

QJsonValue textOrNull(const QString& text)
{
    return text.isEmpty() ? QJsonValue(QJsonValue::Null) : QJsonValue(text);
}

bool opensOnFirstLook(const Entry& entry)
{
    return entry.isStorageDevicesPlace() || entry.isSambaNetworkPlace() ||
           entry.isSambaWorkgroupPlace() || entry.isSambaServerPlace();
}

bool hasDirectory(const Entry& entry)
{
    return entry.isDir() || entry.isDirPlace() || entry.isArchiveFileMountPoint();
}

} // namespace Tool
} // namespace VeyFM
