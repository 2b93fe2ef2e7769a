// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_KERNELWATCHES_H
#define VEYFM_KERNELWATCHES_H

#include <QSet>

#include <optional>

namespace VeyFM {

/**
 * The watch descriptors that the kernel holds for an inotify instance of this process, as of one
 * moment. Nothing where it does not tell: without /proc, say.
 *
 * It asks about the descriptor and never about a path, so that a dead network mount among the
 * watches is not touched.
 */
std::optional<QSet<int>> kernelWatches(int fd);

} // namespace VeyFM

#endif
