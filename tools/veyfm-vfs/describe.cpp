// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "describe.h"

#include "vfs/vfs.h"

#include <QDateTime>

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

} // namespace

QString typeName(int type)
{
    const auto* const found =
        std::find_if(std::begin(typeNames), std::end(typeNames), [type](const TypeName& known) {
            return known.type == type;
        });
    return QLatin1String(found == std::end(typeNames) ? "unknown" : found->name);
}

QString shownName(const Entry& entry)
{
    return entry.lastPathSection();
}

QJsonObject toJson(const Entry& entry)
{
    return {
        {QStringLiteral("name"), shownName(entry)},
        {QStringLiteral("path"), entry.path()},
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

QUrl urlOf(const Entry& entry)
{
    const QList<QUrl> urls = VFS::ptr()->urlsFromEntries(entry);
    return urls.isEmpty() ? QUrl() : urls.constFirst();
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
