// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_PATHSET_H
#define VEYFM_PATHSET_H

#include <QHashFunctions>
#include <QString>

#include <vector>

namespace VeyFM {

/**
 * A set of paths of a size known beforehand, which only grows: an open hash table without an
 * allocation an element, and so quicker to fill than QSet.
 */
class PathSet
{
public:
    /// Room for @p capacity paths; to insert more of them than that is an error.
    explicit PathSet(int capacity)
        : m_seed(uint(qGlobalQHashSeed()))
    {
        size_t slots = 16;
        while (slots < size_t(capacity) * 2) {
            slots *= 2;
        }
        m_slots.resize(slots);
    }

    /// Whether @p path was not in the set before.
    bool insert(const QString& path)
    {
        const uint hash = qHash(path, m_seed);
        const size_t mask = m_slots.size() - 1;
        for (size_t i = hash & mask;; i = (i + 1) & mask) {
            Slot& slot = m_slots[i];
            if (!slot.used) {
                slot = {path, hash, true};
                return true;
            }
            if (slot.hash == hash && slot.path == path) {
                return false;
            }
        }
    }

private:
    struct Slot
    {
        QString path;
        uint hash = 0;
        bool used = false;
    };

    const uint m_seed;
    std::vector<Slot> m_slots;
};

} // namespace VeyFM

#endif
