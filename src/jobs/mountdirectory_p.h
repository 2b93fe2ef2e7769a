// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTDIRECTORY_P_H
#define VEYFM_MOUNTDIRECTORY_P_H

#include <QString>

namespace VeyFM {

/**
 * Makes the directory of a mount, and those above it that are missing, with the mode 0700 whatever
 * the umask: others have no business in what a server shows one user.
 *
 * False where a link or the directory of another user is in its place, on which nothing must be
 * mounted. What is mounted there already may be of anybody: its owner is one of the server. True
 * in all other cases, also where nothing could be made, which the tool will tell.
 */
bool makeMountDirectory(const QString& path);

} // namespace VeyFM

#endif
