// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_STORAGEPLACE_H
#define VEYFM_STORAGEPLACE_H

#include "veyfmvfs_export.h"

#include <QDBusArgument>
#include <QList>
#include <QMetaType>
#include <QString>

namespace VeyFM {

/**
 * One storage device or volume that the file manager service knows of.
 *
 * Its identity is udi(): comparison and order look at nothing else, so two records without one
 * are equal although both are invalid.
 *
 * There are no setters: a record gets its values from the bus and by assignment. Distinct copies
 * may be used in distinct threads, name() aside.
 */
class VEYFMVFS_EXPORT StoragePlace
{
public:
    /**
     * The kinds of device. The numbers cross the bus, and their order is deliberately not that
     * of the storage places among the entry types. A number out of range is kept as it came, and
     * no place is made for it.
     */
    enum Type : qint32 {
        StorageTypeNone = 0,          ///< No place is made.
        StorageTypeFloppyDrive = 1,   ///< TypeFloppyDriveStoragePlace.
        StorageTypeCdromDrive = 2,    ///< TypeCdromDriveStoragePlace.
        StorageTypeUsbDisk = 3,       ///< TypeUsbDiskStoragePlace.
        StorageTypeHardDiskDrive = 4, ///< TypeHardDiskDriveStoragePlace.
        StorageType5 = 5,             ///< TypeStoragePlace5.
        StorageType6 = 6,             ///< TypeStoragePlace6.
        StorageType7 = 7,             ///< TypeStoragePlace7.
        StorageType8 = 8              ///< TypeStoragePlace8.
    };

    /// All texts null, type 0, nothing set but isMountable().
    StoragePlace();
    virtual ~StoragePlace();

    /// Copies are independent records of one device. @{
    StoragePlace(const StoragePlace& other);
    StoragePlace(StoragePlace&& other) noexcept;
    StoragePlace& operator=(const StoragePlace& other);
    StoragePlace& operator=(StoragePlace&& other) noexcept;
    /// @}

    /// By udi() alone, as QString compares: by UTF-16 code units, case sensitive. @{
    bool operator==(const StoragePlace& other) const;
    bool operator<(const StoragePlace& other) const;
    /// @}

    /// Whether udi() is not empty.
    bool isValid() const;

    /**
     * The address in the place tree: the path of VFS::storageDevicesEntry(), a `/` and the name
     * of the device there. Computed at each call, so it needs VFS::ptr(). For a text to show,
     * see labelName().
     */
    QString name() const;

    /// The text for the user: the label of the volume, or the last section of name() without one.
    QString labelName() const;

    bool isEjectable() const; ///< Whether the medium can be ejected.
    bool isMounted() const;   ///< Whether the device is mounted.
    bool isMountable() const; ///< Whether it can be mounted; true in a default record.

    QString mountPoint() const; ///< The directory on which the device is mounted, or empty.
    QString iconName() const;   ///< The name of its icon in the icon theme, or empty.
    Type type() const;          ///< One of Type, or any other number that the service sent.
    QString udi() const;        ///< The unique device identifier that the service gives.

    /**
     * Writes one structure with the D-Bus signature `(sbbbssssi)`: mount point, mounted,
     * mountable, ejectable, name in the tree, label, icon, identifier, type.
     */
    QDBusArgument& toDBusArgument(QDBusArgument& argument) const;
    /// Reads what toDBusArgument() writes.
    const QDBusArgument& fromDBusArgument(const QDBusArgument& argument);

private:
    friend class DeviceTable;
    friend class VFS;
    friend class VFSPrivate;

    QString m_mountPoint;
    QString m_reservedText; // Goes with copies and stays here otherwise: reading leaves it alone.
    bool m_ejectable = false;
    bool m_mounted = false;
    bool m_mountable = true;
    QString m_placeName;
    QString m_label;
    QString m_iconName;
    QString m_udi;
    Type m_type = StorageTypeNone;
};

/// In the order of the service.
using StoragePlaceList = QList<StoragePlace>;

/// StoragePlace::toDBusArgument() and StoragePlace::fromDBusArgument(). @{
VEYFMVFS_EXPORT QDBusArgument& operator<<(QDBusArgument& argument, const StoragePlace& place);
VEYFMVFS_EXPORT const QDBusArgument& operator>>(const QDBusArgument& argument, StoragePlace& place);
/// @}

} // namespace VeyFM

Q_DECLARE_TYPEINFO(VeyFM::StoragePlace, Q_MOVABLE_TYPE);
Q_DECLARE_METATYPE(VeyFM::StoragePlace)
Q_DECLARE_METATYPE(VeyFM::StoragePlaceList)

#endif
