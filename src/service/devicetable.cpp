// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/devicetable.h"

#include <algorithm>

namespace VeyFM {

void DeviceTable::assign(const QList<StoragePlace>& places)
{
    *this = DeviceTable();
    for (const StoragePlace& place : places) {
        append(place);
    }
    m_list = places;
    m_isListed = true;
}

void DeviceTable::append(const StoragePlace& place)
{
    const quint64 number = m_nextNumber++;
    m_places.emplace_hint(m_places.end(), number, place);
    m_byUdi.insert(place.m_udi, number);
    m_byPlaceName.insert(place.m_placeName, number);
    changed();
}

void DeviceTable::removeAll(const QString& udi)
{
    const QList<quint64> numbers = m_byUdi.values(udi);
    m_byUdi.remove(udi);
    for (const quint64 number : numbers) {
        const auto found = m_places.find(number);
        m_byPlaceName.remove(found->second.m_placeName, number);
        m_places.erase(found);
        changed();
    }
}

StoragePlace DeviceTable::replace(const StoragePlace& place)
{
    const auto found = first(m_byUdi, place.m_udi);
    if (found == m_places.cend()) {
        return StoragePlace();
    }
    const StoragePlace previous = found->second;
    m_byPlaceName.remove(previous.m_placeName, found->first);
    m_byPlaceName.insert(place.m_placeName, found->first);
    m_places[found->first] = place;
    changed();
    return previous;
}

StoragePlace DeviceTable::withUdi(const QString& udi) const
{
    const auto found = first(m_byUdi, udi);
    return found == m_places.cend() ? StoragePlace() : found->second;
}

StoragePlace DeviceTable::withPlaceName(const QString& placeName) const
{
    const auto found = first(m_byPlaceName, placeName);
    return found == m_places.cend() ? StoragePlace() : found->second;
}

QList<StoragePlace> DeviceTable::list(bool isForOthers)
{
    Q_UNUSED(isForOthers)
    if (!m_isListed) {
        QList<StoragePlace> places;
        places.reserve(int(m_places.size()));
        for (const auto& [number, place] : m_places) {
            places.append(place);
        }
        m_list = places;
        m_isListed = true;
    }
    return m_list;
}

DeviceTable::Places::const_iterator DeviceTable::first(const Index& index, const QString& key) const
{
    auto number = index.constFind(key);
    if (number == index.constEnd()) {
        return m_places.cend();
    }
    quint64 least = number.value();
    for (; number != index.constEnd() && number.key() == key; ++number) {
        least = std::min(least, number.value());
    }
    return m_places.find(least);
}

void DeviceTable::changed()
{
    m_list.clear();
    m_isListed = false;
}

} // namespace VeyFM
