// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_NETWORKPLACE_H
#define VEYFM_NETWORKPLACE_H

#include "veyfmvfs_export.h"

#include <QDBusArgument>
#include <QDataStream>
#include <QList>
#include <QMetaType>
#include <QString>

namespace VeyFM {

/**
 * A user's bookmark of a network resource, as the file manager service keeps it.
 *
 * Its identity is the name: comparison looks at name() alone, so QList::removeAll() removes every
 * bookmark of that name whatever its URL.
 *
 * A plain value; distinct copies may be used in distinct threads.
 */
class VEYFMVFS_EXPORT NetworkPlace
{
public:
    /// All three texts null.
    NetworkPlace() = default;
    /// The three texts, taken as they are.
    NetworkPlace(const QString& name, const QString& url, const QString& localPath);

    /// By name() alone, case sensitive.
    bool operator==(const NetworkPlace& other) const;

    /// Whether name() is empty. A record with a URL and no name is null.
    bool isNull() const;

    /// The name of the bookmark.
    QString name() const;

    /// The URL of the resource, with its scheme: smb, ftp or sftp.
    QString url() const;

    /// The directory on which the resource is mounted, empty while it is not. @{
    QString localPath() const;
    void setLocalPath(const QString& localPath);
    /// @}

    /// Writes name, URL and directory as one structure with the D-Bus signature `(sss)`.
    QDBusArgument& toDBusArgument(QDBusArgument& argument) const;
    /// Reads what toDBusArgument() writes.
    const QDBusArgument& fromDBusArgument(const QDBusArgument& argument);

private:
    friend VEYFMVFS_EXPORT QDataStream& operator>>(QDataStream& stream, NetworkPlace& place);

    QString m_name;
    QString m_url;
    QString m_localPath;
};

/// In the order of the service.
using NetworkPlaceList = QList<NetworkPlace>;

/// NetworkPlace::toDBusArgument() and NetworkPlace::fromDBusArgument(). @{
VEYFMVFS_EXPORT QDBusArgument& operator<<(QDBusArgument& argument, const NetworkPlace& place);
VEYFMVFS_EXPORT const QDBusArgument& operator>>(const QDBusArgument& argument, NetworkPlace& place);
/// @}

/**
 * Name, URL and directory as three QString, with no header and no version. A stream that ends
 * early leaves a readable record and its own status. @{
 */
VEYFMVFS_EXPORT QDataStream& operator<<(QDataStream& stream, const NetworkPlace& place);
VEYFMVFS_EXPORT QDataStream& operator>>(QDataStream& stream, NetworkPlace& place);
/// @}

/**
 * Reads the form that Qt's own operator writes for a list. Unlike Qt's reader it allocates no
 * more than the stream has data for, whatever number of elements it announces.
 */
VEYFMVFS_EXPORT QDataStream& operator>>(QDataStream& stream, NetworkPlaceList& places);

} // namespace VeyFM

Q_DECLARE_TYPEINFO(VeyFM::NetworkPlace, Q_MOVABLE_TYPE);
Q_DECLARE_METATYPE(VeyFM::NetworkPlace)
Q_DECLARE_METATYPE(VeyFM::NetworkPlaceList)

#endif
