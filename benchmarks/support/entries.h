// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_ENTRIES_H
#define VEYFM_BENCHMARKS_ENTRIES_H

#include "core/entrylist.h"

#include <QStringList>

namespace Benchmarks {

/// File entries of these paths, each with texts of its own.
VeyFM::EntryList entriesOf(const QStringList& paths);

/// @p count paths of about 45 characters in directories of 1000 files each.
QStringList manyPaths(int first, int count);

/// The same texts in an order of no pattern, the same one each time.
QStringList shuffled(QStringList paths);

} // namespace Benchmarks

#endif
