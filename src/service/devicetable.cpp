// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/devicetable.h"

#include <QHashFunctions>

#include <algorithm>

namespace VeyFM {

void DeviceTable::Index::reset(int count)
{
    size_t buckets = 16;
    while (buckets < size_t(count)) {
        buckets *= 2;
    }
    m_heads.assign(buckets, -1);
    m_next.assign(size_t(count), -1);
}

void DeviceTable::Index::add(const QList<StoragePlace>& places, int position)
{
    if (size_t(position) >= m_next.size()) {
        m_next.resize(size_t(position) + 1, -1);
    }
    int& head = m_heads[bucket(places.at(position).*key)];
    m_next[size_t(position)] = head;
    head = position;
}

void DeviceTable::Index::remove(const QList<StoragePlace>& places, int position)
{
    int* link = &m_heads[bucket(places.at(position).*key)];
    while (*link != position) {
        link = &m_next[size_t(*link)];
    }
    *link = m_next[size_t(position)];
}

std::vector<int>
DeviceTable::Index::positions(const QList<StoragePlace>& places, const QString& text) const
{
    std::vector<int> found;
    if (!m_heads.empty()) {
        for (int i = m_heads[bucket(text)]; i >= 0; i = m_next[size_t(i)]) {
            if (places.at(i).*key == text) {
                found.push_back(i);
            }
        }
    }
    return found;
}

size_t DeviceTable::Index::bucket(const QString& text) const
{
    return qHash(text, uint(qGlobalQHashSeed())) & (m_heads.size() - 1);
}

void DeviceTable::assign(const QList<StoragePlace>& places)
{
    m_places = places;
    m_isHole.assign(size_t(places.size()), false);
    m_holes = 0;
    reindex();
}

void DeviceTable::append(const StoragePlace& place)
{
    beforeChange();
    const int position = m_places.size();
    m_places.append(place);
    m_isHole.push_back(false);
    if (m_byUdi.isFull(m_places.size())) {
        reindex();
        return;
    }
    m_byUdi.add(m_places, position);
    m_byPlaceName.add(m_places, position);
}

void DeviceTable::removeAll(const QString& udi)
{
    beforeChange();
    for (const int position : m_byUdi.positions(m_places, udi)) {
        m_byUdi.remove(m_places, position);
        m_byPlaceName.remove(m_places, position);
        m_places[position] = StoragePlace();
        m_isHole[size_t(position)] = true;
        ++m_holes;
    }
    if (m_holes > m_places.size() / 2) {
        compact();
    }
}

StoragePlace DeviceTable::replace(const StoragePlace& place)
{
    const int position = first(m_byUdi, place.m_udi);
    const StoragePlace previous = placeAt(position);
    if (position >= 0) {
        beforeChange();
        m_byPlaceName.remove(m_places, position);
        m_places[position] = place;
        m_byPlaceName.add(m_places, position);
    }
    return previous;
}

StoragePlace DeviceTable::withUdi(const QString& udi) const
{
    return placeAt(first(m_byUdi, udi));
}

StoragePlace DeviceTable::withPlaceName(const QString& placeName) const
{
    return placeAt(first(m_byPlaceName, placeName));
}

QList<StoragePlace> DeviceTable::list(bool isForOthers)
{
    if (m_holes > 0) {
        compact();
    }
    m_isShared = m_isShared || isForOthers;
    return m_places;
}

// -1 if there is none.
int DeviceTable::first(const Index& index, const QString& text) const
{
    const std::vector<int> positions = index.positions(m_places, text);
    const auto least = std::min_element(positions.begin(), positions.end());
    return least == positions.end() ? -1 : *least;
}

StoragePlace DeviceTable::placeAt(int position) const
{
    return position < 0 ? StoragePlace() : m_places.at(position);
}

// What other threads were given is never changed in place: Qt finds out that it is shared no
// longer in a way that does not order their last look before the change.
void DeviceTable::beforeChange()
{
    if (m_isShared) {
        m_places = QList<StoragePlace>(m_places.cbegin(), m_places.cend());
        m_isShared = false;
    }
}

void DeviceTable::compact()
{
    QList<StoragePlace> places;
    places.reserve(m_places.size() - m_holes);
    for (int i = 0; i < m_places.size(); ++i) {
        if (!m_isHole[size_t(i)]) {
            places.append(m_places.at(i));
        }
    }
    m_isShared = false;
    assign(places);
}

void DeviceTable::reindex()
{
    m_byUdi.reset(m_places.size());
    m_byPlaceName.reset(m_places.size());
    for (int i = 0; i < m_places.size(); ++i) {
        if (!m_isHole[size_t(i)]) {
            m_byUdi.add(m_places, i);
            m_byPlaceName.add(m_places, i);
        }
    }
}

} // namespace VeyFM
