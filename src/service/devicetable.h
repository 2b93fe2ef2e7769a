// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_DEVICETABLE_H
#define VEYFM_DEVICETABLE_H

#include "core/storageplace.h"

#include <QList>
#include <QMultiHash>
#include <QString>

#include <map>

namespace VeyFM {

/**
 * The records of storage devices in the order in which they came, found by their identifier and
 * by their name in the tree without a walk. Several records may have one of these in common; the
 * first of them counts.
 */
class DeviceTable
{
public:
    void assign(const QList<StoragePlace>& places);

    void append(const StoragePlace& place);

    /// Takes out every record of that identifier.
    void removeAll(const QString& udi);

    /// Overwrites the first record of the same identifier and gives what stood there: a default
    /// record, and no change, where there is none.
    StoragePlace replace(const StoragePlace& place);

    /// The first record, or a default one. @{
    StoragePlace withUdi(const QString& udi) const;
    StoragePlace withPlaceName(const QString& placeName) const;
    /// @}

    /// All records. What was given is never changed, and so may go to other threads.
    QList<StoragePlace> list(bool isForOthers);

    template <typename Patch>
    void change(Patch patch)
    {
        patch(*this);
    }

private:
    // As a rule one record has a key. What many have in common is found by a walk through them.
    using Index = QMultiHash<QString, quint64>;
    using Places = std::map<quint64, StoragePlace>;

    Places::const_iterator first(const Index& index, const QString& key) const;
    void changed();

    Places m_places; // by a number of their own, which never comes again
    quint64 m_nextNumber = 0;
    Index m_byUdi;
    Index m_byPlaceName;
    QList<StoragePlace> m_list; // made when asked for
    bool m_isListed = true;
};

} // namespace VeyFM

#endif
