// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_WORKER_H
#define VEYFM_MOUNT_WORKER_H

namespace VeyFM {
namespace Mount {

/// The half of the program that mounts, by the library's jobs, and may block as long as it likes:
/// the supervisor at the other end of the socket can end it. Ends the process.
[[noreturn]] void runWorker(int socket, int& argc, char** argv);

} // namespace Mount
} // namespace VeyFM

#endif
