// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_STORAGEDEVICEINFO_H
#define VEYFM_STORAGEDEVICEINFO_H

#include "veyfmvfs_export.h"

#include <QDBusArgument>
#include <QMetaType>
#include <QString>

namespace VeyFM {

/**
 * The details of a storage device. The library only carries them: what each member means is
 * between the file manager service and the user interface. A default record is the answer to a
 * failed call.
 */
struct StorageDeviceInfo
{
    /// What the service sent at this position. @{
    QString text1;
    QString text2;
    QString text3;
    QString text4;
    bool flag1 = false;
    QString text5;
    QString text6;
    QString text7;
    QString text8;
    QString text9;
    QString text10;
    quint64 number1 = 0;
    quint64 number2 = 0;
    bool flag2 = false;
    quint64 number3 = 0;
    quint64 number4 = 0;
    /// @}
    bool localFlag = false; ///< Goes with copies and does not cross the bus.
    quint64 number5 = 0;    ///< What the service sent at the last position.
};

/**
 * One structure with the D-Bus signature `(ssssbssssssttbttt)`: every member in order, localFlag
 * aside, which reading leaves untouched. @{
 */
VEYFMVFS_EXPORT QDBusArgument& operator<<(QDBusArgument& argument, const StorageDeviceInfo& info);
VEYFMVFS_EXPORT const QDBusArgument&
operator>>(const QDBusArgument& argument, StorageDeviceInfo& info);
/// @}

} // namespace VeyFM

Q_DECLARE_TYPEINFO(VeyFM::StorageDeviceInfo, Q_MOVABLE_TYPE);
Q_DECLARE_METATYPE(VeyFM::StorageDeviceInfo)

#endif
