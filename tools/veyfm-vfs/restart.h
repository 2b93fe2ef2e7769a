// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_RESTART_H
#define VEYFM_TOOL_RESTART_H

namespace VeyFM {
namespace Tool {

/**
 * A thread that waits for an answer over the bus can't be had back, so where the file manager
 * service hangs the program begins again, as the same process, and leaves the service out.
 */
namespace Restart {

/// To be called in main(), before threads are started.
void prepare(char* argv[]);

/// Begins again, from any thread. Comes back only where that does not work.
void withoutService();

/// Whether this is the second beginning.
bool wasDone();

} // namespace Restart
} // namespace Tool
} // namespace VeyFM

#endif
