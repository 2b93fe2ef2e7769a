// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/favouriteplace.h"

#include "core/liststream.h"

namespace VeyFM {

FavouritePlace::FavouritePlace(const QString& name, const QString& localPath)
    : m_name(name)
    , localPath(localPath)
{
}

bool FavouritePlace::operator==(const FavouritePlace& other) const
{
    return localPath == other.localPath;
}

bool FavouritePlace::operator<(const FavouritePlace& other) const
{
    return localPath < other.localPath;
}

QString FavouritePlace::name() const
{
    return m_name;
}

QDBusArgument& FavouritePlace::toDBusArgument(QDBusArgument& argument) const
{
    argument.beginStructure();
    argument << m_name << localPath;
    argument.endStructure();
    return argument;
}

const QDBusArgument& FavouritePlace::fromDBusArgument(const QDBusArgument& argument)
{
    argument.beginStructure();
    argument >> m_name >> localPath;
    argument.endStructure();
    return argument;
}

QDBusArgument& operator<<(QDBusArgument& argument, const FavouritePlace& place)
{
    return place.toDBusArgument(argument);
}

const QDBusArgument& operator>>(const QDBusArgument& argument, FavouritePlace& place)
{
    return place.fromDBusArgument(argument);
}

QDataStream& operator<<(QDataStream& stream, const FavouritePlace& place)
{
    return stream << place.name() << place.localPath;
}

QDataStream& operator>>(QDataStream& stream, FavouritePlace& place)
{
    return stream >> place.m_name >> place.localPath;
}

QDataStream& operator>>(QDataStream& stream, FavouritePlaceList& places)
{
    return readList(stream, places);
}

} // namespace VeyFM
