// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_COPIED_H
#define VEYFM_COPIED_H

namespace VeyFM {

/**
 * A copy of what was given by reference, for whoever may tell the host of something before being
 * done with it: a slot may change or destroy the original. To look at places may be enough for
 * that, since it may fill one.
 */
template <typename Value>
Value copied(const Value& given)
{
    return given;
}

} // namespace VeyFM

#endif
