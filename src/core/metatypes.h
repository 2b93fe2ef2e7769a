// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_METATYPES_H
#define VEYFM_METATYPES_H

namespace VeyFM {

/**
 * Registers the types that cross the session bus or data streams, under the names by which they
 * are looked up there. The caller sees to it that this runs once, before any bus traffic.
 */
void registerMetaTypes();

} // namespace VeyFM

#endif
