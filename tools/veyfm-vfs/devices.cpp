// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "devices.h"

#include "vfs/vfs.h"

#include <algorithm>
#include <iterator>

namespace VeyFM {
namespace Tool {

namespace {

constexpr const char* typeNames[] = {"none",      "floppy-drive", "cdrom-drive",
                                     "usb-disk",  "hard-disk",    "storage-5",
                                     "storage-6", "storage-7",    "storage-8"};

} // namespace

QList<Device> allDevices()
{
    const VFS& vfs = *VFS::ptr();
    const int prefix = vfs.storageDevicesEntry().path().size() + 1;
    QList<Device> devices;
    for (int type = 0; type < int(std::size(typeNames)); ++type) {
        const QList<StoragePlace> places = vfs.storagePlacesByType(StoragePlace::Type(type));
        for (const StoragePlace& place : places) {
            devices.append({place, place.name().mid(prefix)});
        }
    }
    return devices;
}

Device findDevice(const QList<Device>& devices, const QString& text)
{
    const QString path = VFS::ptr()->entry(text).path();
    const auto first = [&devices](const auto& fits) {
        const auto found = std::find_if(devices.begin(), devices.end(), fits);
        return found == devices.end() ? Device() : *found;
    };
    Device device = first([&](const Device& each) {
        const QString its = each.place.name();
        return its == text || (!path.isEmpty() && its == path);
    });
    if (!device.place.isValid()) {
        device = first([&](const Device& each) { return each.name == text; });
    }
    if (!device.place.isValid()) {
        device = first([&](const Device& each) { return each.place.udi() == text; });
    }
    return device;
}

Entry entryOf(const Device& device)
{
    // Not by the path as a text: a name with dots or slashes would be tidied up.
    const EntryList places = VFS::ptr()->childs(VFS::ptr()->storageDevicesEntry());
    const QString path = device.place.name();
    const auto found = std::find_if(
        places.begin(), places.end(), [&path](const Entry& entry) { return entry.path() == path; });
    return found == places.end() ? Entry() : *found;
}

QString deviceTypeName(StoragePlace::Type type)
{
    const bool known = type >= 0 && size_t(type) < std::size(typeNames);
    return QLatin1String(known ? typeNames[type] : "unknown");
}

QString stateOf(const StoragePlace& place)
{
    if (place.isMounted()) {
        return QStringLiteral("mounted");
    }
    return place.isMountable() ? QStringLiteral("mountable") : QStringLiteral("not-mountable");
}

} // namespace Tool
} // namespace VeyFM
