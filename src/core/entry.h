// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_ENTRY_H
#define VEYFM_ENTRY_H

#include "veyfmvfs_export.h"

#include <QMetaType>
#include <QString>

class QDBusArgument;
class QDataStream;
class QDebug;

namespace VeyFM {

/**
 * The kinds of entry. The numbers are divided into blocks on which the range predicates of Entry
 * rest, and they cross the session bus and data streams, so they never change. 10002 is a hole
 * that no entry carries.
 */
enum EntryType {
    TypeNone = 0, ///< Null entry, or something that is neither a file nor a directory.

    TypePlace = 1000,               ///< The root place and the "Places" place.
    TypeComputerPlace = 1001,       ///< "Computer".
    TypeNetworkPlace = 1002,        ///< "Network".
    TypeStorageDevicesPlace = 1003, ///< "Storage devices".
    TypeFavouritesPlace = 1004,     ///< "Favourites".
    TypeSambaNetworkPlace = 1005,   ///< "Samba".
    TypeSambaWorkgroupPlace = 1006, ///< One Samba workgroup.
    TypeSambaServerPlace = 1007,    ///< One Samba host.
    TypeFtpNetworkPlace = 1008,     ///< "FTP".
    TypeSFtpNetworkPlace = 1009,    ///< "SFTP".

    TypeFileSystemRootPlace = 2000, ///< "File System".
    TypeHomeDirPlace = 2001,        ///< "Home".
    TypeTrashDirPlace = 2002,       ///< "Trash".
    TypeDesktopDirPlace = 2003,     ///< "Desktop".
    TypeMyDocumentsDirPlace = 2004, ///< Reserved: the documents entry is an ordinary directory.
    TypeFavouritePlace = 2005,      ///< One favourite bookmark.

    TypeUsbDiskStoragePlace = 3500,       ///< StoragePlace::StorageTypeUsbDisk.
    TypeCdromDriveStoragePlace = 3501,    ///< StoragePlace::StorageTypeCdromDrive.
    TypeFloppyDriveStoragePlace = 3502,   ///< StoragePlace::StorageTypeFloppyDrive.
    TypeHardDiskDriveStoragePlace = 3503, ///< StoragePlace::StorageTypeHardDiskDrive.
    TypeStoragePlace5 = 3504,             ///< StoragePlace::StorageType5.
    TypeStoragePlace6 = 3505,             ///< StoragePlace::StorageType6.
    TypeStoragePlace7 = 3506,             ///< StoragePlace::StorageType7.
    TypeStoragePlace8 = 3507,             ///< StoragePlace::StorageType8.

    TypeFavouriteNetworkPlace = 4000, ///< One network bookmark of the user.
    TypeSambaSharePlace = 4001,       ///< One Samba share.
    TypeFtpSharePlace = 4002,         ///< One mounted FTP resource.
    TypeSFtpSharePlace = 4003,        ///< One mounted SFTP resource.

    TypeFile = 10000,     ///< A file, or anything else in a directory that is not a directory.
    TypeDir = 10001,      ///< A directory.
    TypeFileLink = 10003, ///< A symbolic link to a non-directory, or a dangling one of a listing.
    TypeDirLink = 10004,  ///< A symbolic link that ends at a directory.

    TypeArchiveFileMountPoint = 20000, ///< Mount point of an archive file.
    TypeCustomUrl = 30000,             ///< A "mailto", "http" or "qthelp" URL.
    TypeFuseUrl = 30100                ///< An "ftp" or "sftp" URL that is not mounted yet.
};

/**
 * One object of the virtual file system: a place of the tree, a file or directory on the disk, a
 * mount point, or a URL that is only carried.
 *
 * An entry is a small value of two shared strings and a number. It holds no handle and caches
 * nothing: every question about the file system is asked afresh at the moment of the call.
 *
 * Its identity is path(): comparison, order and hash look at nothing else. isSimilar() is the one
 * comparison by location.
 *
 * Distinct copies may be used in distinct threads. Operations that need VFS::ptr() (everything
 * that mentions localPath()) follow the rules of VFS.
 */
class VEYFMVFS_EXPORT Entry
{
public:
    /// A null entry: both strings null, type 0.
    Entry() = default;

    /// By path() alone, as QString orders: by UTF-16 code units, case sensitive. @{
    bool operator<(const Entry& other) const;
    bool operator>(const Entry& other) const;
    bool operator==(const Entry& other) const;
    bool operator!=(const Entry& other) const;
    /// @}

    /// True exactly when path() is empty, whatever the local path and the type.
    bool isNull() const;

    /**
     * True when both entries have a non-empty localPath() and the two are equal as strings.
     * The local path of @p other is not computed when this entry has none.
     */
    bool isSimilar(const Entry& other) const;

    /**
     * The identity. For a place its key in the tree, for a file below a place that place's path,
     * a `/` and the relative name, for any other file its absolute path, for a URL its text.
     */
    QString path() const;

    /**
     * The directory or file on the disk, empty when there is none.
     *
     * The stored path where there is one. An entry without one, and every storage place (which
     * may be mounted or unmounted at any time), asks VFS::localPath() at each call.
     */
    QString localPath() const;

    /// localPath() behind "file://", with no escaping; empty when localPath() is.
    QString localPathWithScheme() const;

    /// The text of localPath() behind its last `/`, or all of it when it has none.
    QString fileName() const;

    /// The text of path() behind its last `/`, or all of it when it has none.
    QString lastPathSection() const;

    /// One of EntryType, or any other number that a service or a stream handed in.
    int type() const;

    /// Whether the stored local path is "/"; localPath() is not computed.
    bool isRoot() const;

    /// Whether fileName() begins with a dot.
    bool isHidden() const;

    /// Whether localPath() lies below the desktop directory. That directory itself does not.
    bool isOnDesktop() const;

    /// Exact comparisons of type(). @{
    bool isComputerPlace() const;
    bool isNetworkPlace() const;
    bool isStorageDevicesPlace() const;
    bool isFavouritesPlace() const;
    bool isSambaNetworkPlace() const;
    bool isSambaWorkgroupPlace() const;
    bool isSambaServerPlace() const;
    bool isFtpNetworkPlace() const;
    bool isSFtpNetworkPlace() const;
    bool isFileSystemRootPlace() const;
    bool isHomeDirPlace() const;
    bool isTrashDirPlace() const;
    bool isDesktopDirPlace() const;
    bool isMyDocumentsDirPlace() const;
    bool isFavouritePlace() const;
    bool isUsbDiskStoragePlace() const;
    bool isCdromDriveStoragePlace() const;
    bool isFloppyDriveStoragePlace() const;
    bool isHardDiskDriveStoragePlace() const;
    bool isFavouriteNetworkPlace() const;
    bool isSambaSharePlace() const;
    bool isFtpSharePlace() const;
    bool isSFtpSharePlace() const;
    bool isFileLink() const;
    bool isDirLink() const;
    bool isArchiveFileMountPoint() const;
    bool isCustomUrl() const;
    bool isFuseUrl() const;
    /// @}

    /// Any place of the tree: types 1000 to 9999.
    bool isPlace() const;

    /// A storage device: types 3500 to 3999.
    bool isStoragePlace() const;

    /// A place that is a directory only while it has a local path: types 3500 to 4499.
    bool isImplicitDirPlace() const;

    /**
     * A place with a directory: types 2000 to 2999, or isImplicitDirPlace() with a non-empty
     * localPath(). The answer follows the mount state each time it is asked.
     */
    bool isDirPlace() const;

    /// A place without a directory: types 1000 to 1999, or an implicit one with no localPath().
    bool isPurePlace() const;

    bool isFile() const;    ///< A file or a link to one.
    bool isDir() const;     ///< A directory or a link to one.
    bool isSymLink() const; ///< A link of either kind.

    /// The Samba place, a workgroup, a host or a share.
    bool isSambaPlace() const;

    /// Whether path() does not begin with `/`. A URL counts as place based.
    bool isPlaceBased() const;

    /// Whether something exists at localPath(); a dangling link does not.
    bool exists() const;

    /// VFS::isEntryExists(): as exists(), with knowledge of places and URLs.
    bool isExists() const;

    QString absoluteFilePath() const; ///< QFileInfo::absoluteFilePath() of localPath().
    QString symLinkTarget() const;    ///< The link's target as QFileInfo tells it, or empty.
    bool isReadable() const;          ///< Whether this process may read it.
    bool isWritable() const;          ///< Whether this process may write it.

    /// As QFileInfo tells; a place without a directory can always be entered and says true.
    bool isExecutable() const;

    /**
     * Facts of lstat(2) on localPath(): a symbolic link answers for itself, not for its target.
     * @{
     */
    qint64 lastModified() const;     ///< Seconds since the epoch, or -1.
    qint64 lastStatusChange() const; ///< Seconds since the epoch, or -1.
    qint64 fileSize() const;         ///< Bytes, or 0.
    uint ownerId() const;            ///< Numeric user, or 0xFFFFFFFE.
    uint groupId() const;            ///< Numeric group, or 0xFFFFFFFE.
    /// @}

    /// Name of ownerId() in the user database, or empty.
    QString owner() const;

    /// Name of groupId() in the group database, or empty.
    QString group() const;

    /// Writes the stored fields as one structure with the D-Bus signature `(ssi)`.
    void toDBusArgument(QDBusArgument& argument) const;
    /// Reads what toDBusArgument() writes.
    void fromDBusArgument(const QDBusArgument& argument);

    /// Writes the stored fields as two QString and a qint32, with no header and no version.
    void toDataStream(QDataStream& stream) const;
    /// Reads what toDataStream() writes. A stream that ends early leaves its own status.
    void fromDataStream(QDataStream& stream);

private:
    friend class VFS;
    friend class VFSPrivate;
    friend class VFSPlaceBase;

    Entry(const QString& path, const QString& localPath, int type);

    QString m_path;
    QString m_localPath;
    qint32 m_type = TypeNone;
};

/// qHash() of Entry::path(), so that equal entries hash alike.
VEYFMVFS_EXPORT uint qHash(const Entry& entry, uint seed = 0);

/// D-Bus form `(ssi)`: path, local path as stored, type. @{
VEYFMVFS_EXPORT QDBusArgument& operator<<(QDBusArgument& argument, const Entry& entry);
VEYFMVFS_EXPORT const QDBusArgument& operator>>(const QDBusArgument& argument, Entry& entry);
/// @}

/// The same three in a data stream. Reading too little shows in the status of the stream. @{
VEYFMVFS_EXPORT QDataStream& operator<<(QDataStream& stream, const Entry& entry);
VEYFMVFS_EXPORT QDataStream& operator>>(QDataStream& stream, Entry& entry);
/// @}

/// Prints `VeyFM::Entry("path", "localPath")`. It computes localPath(), so it may reach VFS.
VEYFMVFS_EXPORT QDebug operator<<(QDebug debug, const Entry& entry);

} // namespace VeyFM

Q_DECLARE_TYPEINFO(VeyFM::Entry, Q_MOVABLE_TYPE);
Q_DECLARE_METATYPE(VeyFM::Entry)

#endif
