// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/storageplace.h"

#include "vfs/vfs.h"

namespace VeyFM {

StoragePlace::StoragePlace() = default;
StoragePlace::StoragePlace(const StoragePlace& other) = default;
StoragePlace::StoragePlace(StoragePlace&& other) noexcept = default;
StoragePlace::~StoragePlace() = default;
StoragePlace& StoragePlace::operator=(const StoragePlace& other) = default;
StoragePlace& StoragePlace::operator=(StoragePlace&& other) noexcept = default;

bool StoragePlace::operator==(const StoragePlace& other) const
{
    return m_udi == other.m_udi;
}

bool StoragePlace::operator<(const StoragePlace& other) const
{
    return m_udi < other.m_udi;
}

bool StoragePlace::isValid() const
{
    return !m_udi.isEmpty();
}

QString StoragePlace::name() const
{
    return VFS::ptr()->storageDevicesEntry().path() + QLatin1Char('/') + m_placeName;
}

QString StoragePlace::labelName() const
{
    return m_label.isEmpty() ? m_placeName : m_label;
}

bool StoragePlace::isEjectable() const
{
    return m_ejectable;
}

bool StoragePlace::isMounted() const
{
    return m_mounted;
}

bool StoragePlace::isMountable() const
{
    return m_mountable;
}

QString StoragePlace::mountPoint() const
{
    return m_mountPoint;
}

QString StoragePlace::iconName() const
{
    return m_iconName;
}

StoragePlace::Type StoragePlace::type() const
{
    return m_type;
}

QString StoragePlace::udi() const
{
    return m_udi;
}

QDBusArgument& StoragePlace::toDBusArgument(QDBusArgument& argument) const
{
    argument.beginStructure();
    // Not the order of the members.
    argument << m_mountPoint << m_mounted << m_mountable << m_ejectable;
    argument << m_placeName << m_label << m_iconName << m_udi << static_cast<int>(m_type);
    argument.endStructure();
    return argument;
}

const QDBusArgument& StoragePlace::fromDBusArgument(const QDBusArgument& argument)
{
    int type = StorageTypeNone;
    argument.beginStructure();
    argument >> m_mountPoint >> m_mounted >> m_mountable >> m_ejectable;
    argument >> m_placeName >> m_label >> m_iconName >> m_udi >> type;
    argument.endStructure();
    m_type = static_cast<Type>(type);
    return argument;
}

QDBusArgument& operator<<(QDBusArgument& argument, const StoragePlace& place)
{
    return place.toDBusArgument(argument);
}

const QDBusArgument& operator>>(const QDBusArgument& argument, StoragePlace& place)
{
    return place.fromDBusArgument(argument);
}

} // namespace VeyFM
