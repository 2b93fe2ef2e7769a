// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entry.h"

#include "core/accountnames.h"
#include "core/copied.h"
#include "core/localbytes.h"
#include "vfs/vfs.h"

#include <QDBusArgument>
#include <QDataStream>
#include <QDebug>
#include <QFileInfo>
#include <QHashFunctions>

#include <sys/stat.h>

namespace VeyFM {

namespace {

bool isBetween(int type, int first, int last)
{
    return type >= first && type <= last;
}

QString behindLastSlash(const QString& text)
{
    return text.mid(text.lastIndexOf(QLatin1Char('/')) + 1);
}

// Facts of the link itself, not of its target.
bool linkStatus(const QString& localPath, struct stat* status)
{
    const LocalBytes bytes(localPath);
    return bytes.isUsable() && ::lstat(bytes.data(), status) == 0;
}

// What a file that can't be examined is said to belong to: -2 as unsigned, and not the -1 that
// Qt uses. Views compare with it.
constexpr uint unknownId = 0xFFFFFFFEu;

} // namespace

Entry::Entry(const QString& path, const QString& localPath, int type)
    : m_path(path)
    , m_localPath(localPath)
    , m_type(type)
{
}

bool Entry::operator<(const Entry& other) const
{
    return m_path < other.m_path;
}

bool Entry::operator>(const Entry& other) const
{
    return other.m_path < m_path;
}

bool Entry::operator==(const Entry& other) const
{
    return m_path == other.m_path;
}

bool Entry::operator!=(const Entry& other) const
{
    return m_path != other.m_path;
}

bool Entry::isNull() const
{
    return m_path.isEmpty();
}

bool Entry::isSimilar(const Entry& given) const
{
    const Entry other = copied(given);
    const QString own = localPath();
    return !own.isEmpty() && own == other.localPath();
}

QString Entry::path() const
{
    return m_path;
}

QString Entry::localPath() const
{
    if (!m_localPath.isEmpty() && !isStoragePlace()) {
        return m_localPath;
    }
    return VFS::ptr()->localPath(*this);
}

QString Entry::localPathWithScheme() const
{
    const QString local = localPath();
    return local.isEmpty() ? QString() : QLatin1String("file://") + local;
}

QString Entry::fileName() const
{
    return behindLastSlash(localPath());
}

QString Entry::lastPathSection() const
{
    return behindLastSlash(m_path);
}

int Entry::type() const
{
    return m_type;
}

bool Entry::isRoot() const
{
    // The stored text only: an entry that still has to ask for its local path is not the root.
    return m_localPath == QLatin1String("/");
}

bool Entry::isHidden() const
{
    return fileName().startsWith(QLatin1Char('.'));
}

bool Entry::isOnDesktop() const
{
    QString desktop = VFS::ptr()->desktopEntry().localPath();
    if (!desktop.endsWith(QLatin1Char('/'))) {
        desktop += QLatin1Char('/');
    }
    return localPath().startsWith(desktop);
}

// clang-format off
bool Entry::isComputerPlace() const { return m_type == TypeComputerPlace; }
bool Entry::isNetworkPlace() const { return m_type == TypeNetworkPlace; }
bool Entry::isStorageDevicesPlace() const { return m_type == TypeStorageDevicesPlace; }
bool Entry::isFavouritesPlace() const { return m_type == TypeFavouritesPlace; }
bool Entry::isSambaNetworkPlace() const { return m_type == TypeSambaNetworkPlace; }
bool Entry::isSambaWorkgroupPlace() const { return m_type == TypeSambaWorkgroupPlace; }
bool Entry::isSambaServerPlace() const { return m_type == TypeSambaServerPlace; }
bool Entry::isFtpNetworkPlace() const { return m_type == TypeFtpNetworkPlace; }
bool Entry::isSFtpNetworkPlace() const { return m_type == TypeSFtpNetworkPlace; }
bool Entry::isFileSystemRootPlace() const { return m_type == TypeFileSystemRootPlace; }
bool Entry::isHomeDirPlace() const { return m_type == TypeHomeDirPlace; }
bool Entry::isTrashDirPlace() const { return m_type == TypeTrashDirPlace; }
bool Entry::isDesktopDirPlace() const { return m_type == TypeDesktopDirPlace; }
bool Entry::isMyDocumentsDirPlace() const { return m_type == TypeMyDocumentsDirPlace; }
bool Entry::isFavouritePlace() const { return m_type == TypeFavouritePlace; }
bool Entry::isUsbDiskStoragePlace() const { return m_type == TypeUsbDiskStoragePlace; }
bool Entry::isCdromDriveStoragePlace() const { return m_type == TypeCdromDriveStoragePlace; }
bool Entry::isFloppyDriveStoragePlace() const { return m_type == TypeFloppyDriveStoragePlace; }
bool Entry::isHardDiskDriveStoragePlace() const { return m_type == TypeHardDiskDriveStoragePlace; }
bool Entry::isFavouriteNetworkPlace() const { return m_type == TypeFavouriteNetworkPlace; }
bool Entry::isSambaSharePlace() const { return m_type == TypeSambaSharePlace; }
bool Entry::isFtpSharePlace() const { return m_type == TypeFtpSharePlace; }
bool Entry::isSFtpSharePlace() const { return m_type == TypeSFtpSharePlace; }
bool Entry::isFileLink() const { return m_type == TypeFileLink; }
bool Entry::isDirLink() const { return m_type == TypeDirLink; }
bool Entry::isArchiveFileMountPoint() const { return m_type == TypeArchiveFileMountPoint; }
bool Entry::isCustomUrl() const { return m_type == TypeCustomUrl; }
bool Entry::isFuseUrl() const { return m_type == TypeFuseUrl; }

bool Entry::isPlace() const { return isBetween(m_type, 1000, 9999); }
bool Entry::isStoragePlace() const { return isBetween(m_type, 3500, 3999); }
bool Entry::isImplicitDirPlace() const { return isBetween(m_type, 3500, 4499); }
bool Entry::isFile() const { return m_type == TypeFile || m_type == TypeFileLink; }
bool Entry::isDir() const { return m_type == TypeDir || m_type == TypeDirLink; }
bool Entry::isSymLink() const { return m_type == TypeFileLink || m_type == TypeDirLink; }
// clang-format on

bool Entry::isDirPlace() const
{
    return isBetween(m_type, 2000, 2999) || (isImplicitDirPlace() && !localPath().isEmpty());
}

bool Entry::isPurePlace() const
{
    return isBetween(m_type, 1000, 1999) || (isImplicitDirPlace() && localPath().isEmpty());
}

bool Entry::isSambaPlace() const
{
    return isSambaNetworkPlace() || isSambaWorkgroupPlace() || isSambaServerPlace() ||
           isSambaSharePlace();
}

bool Entry::isPlaceBased() const
{
    return !m_path.startsWith(QLatin1Char('/'));
}

bool Entry::exists() const
{
    return QFileInfo::exists(localPath());
}

bool Entry::isExists() const
{
    return VFS::ptr()->isEntryExists(*this);
}

QString Entry::absoluteFilePath() const
{
    return QFileInfo(localPath()).absoluteFilePath();
}

QString Entry::symLinkTarget() const
{
    return QFileInfo(localPath()).symLinkTarget();
}

bool Entry::isReadable() const
{
    return QFileInfo(localPath()).isReadable();
}

bool Entry::isWritable() const
{
    return QFileInfo(localPath()).isWritable();
}

bool Entry::isExecutable() const
{
    const Entry self = copied(*this);
    if (self.isPurePlace() || (self.isImplicitDirPlace() && self.localPath().isEmpty())) {
        return true;
    }
    return QFileInfo(self.localPath()).isExecutable();
}

qint64 Entry::lastModified() const
{
    struct stat status;
    return linkStatus(localPath(), &status) ? qint64(status.st_mtime) : -1;
}

qint64 Entry::lastStatusChange() const
{
    struct stat status;
    return linkStatus(localPath(), &status) ? qint64(status.st_ctime) : -1;
}

qint64 Entry::fileSize() const
{
    struct stat status;
    return linkStatus(localPath(), &status) ? qint64(status.st_size) : 0;
}

uint Entry::ownerId() const
{
    struct stat status;
    return linkStatus(localPath(), &status) ? status.st_uid : unknownId;
}

uint Entry::groupId() const
{
    struct stat status;
    return linkStatus(localPath(), &status) ? status.st_gid : unknownId;
}

QString Entry::owner() const
{
    return userName(ownerId());
}

QString Entry::group() const
{
    return groupName(groupId());
}

void Entry::toDBusArgument(QDBusArgument& argument) const
{
    argument.beginStructure();
    argument << m_path << m_localPath << m_type;
    argument.endStructure();
}

void Entry::fromDBusArgument(const QDBusArgument& argument)
{
    argument.beginStructure();
    argument >> m_path >> m_localPath >> m_type;
    argument.endStructure();
}

void Entry::toDataStream(QDataStream& stream) const
{
    stream << m_path << m_localPath << m_type;
}

void Entry::fromDataStream(QDataStream& stream)
{
    stream >> m_path >> m_localPath >> m_type;
}

uint qHash(const Entry& entry, uint seed)
{
    return ::qHash(entry.path(), seed);
}

QDBusArgument& operator<<(QDBusArgument& argument, const Entry& entry)
{
    entry.toDBusArgument(argument);
    return argument;
}

const QDBusArgument& operator>>(const QDBusArgument& argument, Entry& entry)
{
    entry.fromDBusArgument(argument);
    return argument;
}

QDataStream& operator<<(QDataStream& stream, const Entry& entry)
{
    entry.toDataStream(stream);
    return stream;
}

QDataStream& operator>>(QDataStream& stream, Entry& entry)
{
    entry.fromDataStream(stream);
    return stream;
}

QDebug operator<<(QDebug debug, const Entry& entry)
{
    debug.nospace() << "VeyFM::Entry(" << entry.path() << ", " << entry.localPath() << ')';
    return debug.space();
}

} // namespace VeyFM
