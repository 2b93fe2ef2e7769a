// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_DEVICES_H
#define VEYFM_TOOL_DEVICES_H

#include "core/entry.h"
#include "core/storageplace.h"

#include <QList>
#include <QString>

namespace VeyFM {
namespace Tool {

/// A storage device of the service, and its name without the place that holds it.
struct Device
{
    StoragePlace place;
    QString name;
};

/// All devices whose type is known, type by type. Asks the service at the first call, and does
/// not open the place of the devices.
QList<Device> allDevices();

/// The device that @p text names: by its place path in any notation, its name there, or its
/// identifier. Not valid where there is none.
Device findDevice(const QList<Device>& devices, const QString& text);

/// The entry of a device, which opens the place of the devices; null for one that has no place.
Entry entryOf(const Device& device);

/// A word for the type, such as "usb-disk".
QString deviceTypeName(StoragePlace::Type type);

/// "mounted", "mountable" or "not-mountable".
QString stateOf(const StoragePlace& place);

} // namespace Tool
} // namespace VeyFM

#endif
