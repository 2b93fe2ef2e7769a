// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/networkplace.h"

#include "core/liststream.h"

namespace VeyFM {

NetworkPlace::NetworkPlace(const QString& name, const QString& url, const QString& localPath)
    : m_name(name)
    , m_url(url)
    , m_localPath(localPath)
{
}

bool NetworkPlace::operator==(const NetworkPlace& other) const
{
    return m_name == other.m_name;
}

bool NetworkPlace::isNull() const
{
    return m_name.isEmpty();
}

QString NetworkPlace::name() const
{
    return m_name;
}

QString NetworkPlace::url() const
{
    return m_url;
}

QString NetworkPlace::localPath() const
{
    return m_localPath;
}

void NetworkPlace::setLocalPath(const QString& localPath)
{
    m_localPath = localPath;
}

QDBusArgument& NetworkPlace::toDBusArgument(QDBusArgument& argument) const
{
    argument.beginStructure();
    argument << m_name << m_url << m_localPath;
    argument.endStructure();
    return argument;
}

const QDBusArgument& NetworkPlace::fromDBusArgument(const QDBusArgument& argument)
{
    argument.beginStructure();
    argument >> m_name >> m_url >> m_localPath;
    argument.endStructure();
    return argument;
}

QDBusArgument& operator<<(QDBusArgument& argument, const NetworkPlace& place)
{
    return place.toDBusArgument(argument);
}

const QDBusArgument& operator>>(const QDBusArgument& argument, NetworkPlace& place)
{
    return place.fromDBusArgument(argument);
}

QDataStream& operator<<(QDataStream& stream, const NetworkPlace& place)
{
    return stream << place.name() << place.url() << place.localPath();
}

QDataStream& operator>>(QDataStream& stream, NetworkPlace& place)
{
    return stream >> place.m_name >> place.m_url >> place.m_localPath;
}

QDataStream& operator>>(QDataStream& stream, NetworkPlaceList& places)
{
    return readList(stream, places);
}

} // namespace VeyFM
