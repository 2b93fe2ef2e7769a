// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SMBLEVELDELTA_H
#define VEYFM_SMBLEVELDELTA_H

#include "core/stringmap.h"

#include <QMap>
#include <QSet>
#include <QStringList>

namespace VeyFM {

/**
 * Brings a level of names up to date with a fresh list, and tells what came and what went.
 *
 * A name in both stays untouched, with all that lies below it. A level that was never read takes
 * the list as it is: everything is reported as added, in the order of the list.
 */
template <typename Record>
void updateStringMap(
    QMap<QString, Record>& map, const QStringList& fresh, bool& loaded, QStringList& added,
    QStringList& removed)
{
    if (!loaded) {
        map.clear();
        for (const QString& name : fresh) {
            map.insert(name, Record());
        }
        added += fresh;
        loaded = true;
        return;
    }
    const QSet<QString> names(fresh.begin(), fresh.end());
    for (auto it = map.begin(); it != map.end();) {
        if (names.contains(it.key())) {
            ++it;
        } else {
            removed.append(it.key());
            it = map.erase(it);
        }
    }
    for (const QString& name : fresh) {
        if (!map.contains(name)) {
            map.insert(name, Record());
            added.append(name);
        }
    }
}

/**
 * The same for shares and their local paths. A share whose path differs keeps the old one and is
 * in neither delta: paths change by an update of their own.
 */
inline void updateStringMap(
    StringMap& map, const StringMap& fresh, bool& loaded, StringMap& added, StringMap& removed)
{
    if (!loaded) {
        map = fresh;
        added = fresh;
        loaded = true;
        return;
    }
    for (auto it = map.begin(); it != map.end();) {
        if (fresh.contains(it.key())) {
            ++it;
        } else {
            removed.insert(it.key(), it.value());
            it = map.erase(it);
        }
    }
    for (auto it = fresh.cbegin(); it != fresh.cend(); ++it) {
        if (!map.contains(it.key())) {
            map.insert(it.key(), it.value());
            added.insert(it.key(), it.value());
        }
    }
}

} // namespace VeyFM

#endif
