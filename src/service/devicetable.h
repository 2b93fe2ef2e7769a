// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_DEVICETABLE_H
#define VEYFM_DEVICETABLE_H

#include "core/storageplace.h"

#include <QList>
#include <QString>

#include <vector>

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

    /// All records. What goes to another thread is never changed.
    QList<StoragePlace> list(bool isForOthers);

    template <typename Patch>
    void change(Patch patch)
    {
        patch(*this);
    }

private:
    /// Which positions may hold a key: chains of those whose keys fall into one bucket, in a few
    /// bytes a record.
    class Index
    {
    public:
        explicit Index(QString StoragePlace::*key)
            : key(key)
        {
        }

        bool isFull(int count) const
        {
            return size_t(count) > m_heads.size();
        }

        /// Room for positions below @p count.
        void reset(int count);
        void add(const QList<StoragePlace>& places, int position);
        void remove(const QList<StoragePlace>& places, int position);

        /// The positions of a key, in no particular order.
        std::vector<int> positions(const QList<StoragePlace>& places, const QString& text) const;

        QString StoragePlace::*const key;

    private:
        size_t bucket(const QString& text) const;

        std::vector<int> m_heads; // -1 ends a chain
        std::vector<int> m_next;
    };

    int first(const Index& index, const QString& text) const;
    StoragePlace placeAt(int position) const;
    void beforeChange();
    void compact();
    void reindex();

    QList<StoragePlace> m_places;
    std::vector<bool> m_isHole; // what was taken out stays as a hole until the list is asked for
    int m_holes = 0;
    Index m_byUdi{&StoragePlace::m_udi};
    Index m_byPlaceName{&StoragePlace::m_placeName};
    bool m_isShared = false; // with other threads
};

} // namespace VeyFM

#endif
