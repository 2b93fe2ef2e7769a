// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FAVOURITEPLACE_H
#define VEYFM_FAVOURITEPLACE_H

#include "veyfmvfs_export.h"

#include <QDBusArgument>
#include <QDataStream>
#include <QList>
#include <QMetaType>
#include <QString>

namespace VeyFM {

/**
 * A user's bookmark of a local directory, as the file manager service keeps it.
 *
 * Its identity is the directory: comparison and order look at localPath alone, so two bookmarks
 * of one directory under different names are equal, and QList::removeAll() removes both.
 *
 * A plain value; distinct copies may be used in distinct threads.
 */
class VEYFMVFS_EXPORT FavouritePlace
{
public:
    /// Both texts null.
    FavouritePlace() = default;
    /// A bookmark of the directory @p localPath, shown as @p name. Both are taken as they are.
    FavouritePlace(const QString& name, const QString& localPath);

    /// By localPath alone, as QString compares: by UTF-16 code units, case sensitive. @{
    bool operator==(const FavouritePlace& other) const;
    bool operator<(const FavouritePlace& other) const;
    /// @}

    /// The text shown to the user.
    QString name() const;

    /// Writes name and directory as one structure with the D-Bus signature `(ss)`.
    QDBusArgument& toDBusArgument(QDBusArgument& argument) const;
    /// Reads what toDBusArgument() writes.
    const QDBusArgument& fromDBusArgument(const QDBusArgument& argument);

private:
    friend VEYFMVFS_EXPORT QDataStream& operator>>(QDataStream& stream, FavouritePlace& place);

    QString m_name;

public:
    /// The directory that the bookmark points at. There is no accessor beside it.
    QString localPath;
};

/// In the order of the service.
using FavouritePlaceList = QList<FavouritePlace>;

/// FavouritePlace::toDBusArgument() and FavouritePlace::fromDBusArgument(). @{
VEYFMVFS_EXPORT QDBusArgument& operator<<(QDBusArgument& argument, const FavouritePlace& place);
VEYFMVFS_EXPORT const QDBusArgument&
operator>>(const QDBusArgument& argument, FavouritePlace& place);
/// @}

/**
 * Name and directory as two QString, with no header and no version. A stream that ends early
 * leaves a readable record and its own status. @{
 */
VEYFMVFS_EXPORT QDataStream& operator<<(QDataStream& stream, const FavouritePlace& place);
VEYFMVFS_EXPORT QDataStream& operator>>(QDataStream& stream, FavouritePlace& place);
/// @}

/**
 * Reads the form that Qt's own operator writes for a list. Unlike Qt's reader it allocates no
 * more than the stream has data for, whatever number of elements it announces.
 */
VEYFMVFS_EXPORT QDataStream& operator>>(QDataStream& stream, FavouritePlaceList& places);

} // namespace VeyFM

Q_DECLARE_TYPEINFO(VeyFM::FavouritePlace, Q_MOVABLE_TYPE);
Q_DECLARE_METATYPE(VeyFM::FavouritePlace)
Q_DECLARE_METATYPE(VeyFM::FavouritePlaceList)

#endif
