// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_PATHORDER_H
#define VEYFM_PATHORDER_H

#include <QStringView>

#include <vector>

namespace VeyFM {

/**
 * The stable order of texts by UTF-16 code units: result[i] is the index of the text that belongs
 * at position i. Texts that are equal keep their order in both directions.
 *
 * Paths of one directory share a long prefix, so the texts are compared four code units at a
 * time, packed into a number, and only behind what all texts of a run have in common.
 */
std::vector<int> stableOrder(const std::vector<QStringView>& texts, bool ascending);

} // namespace VeyFM

#endif
