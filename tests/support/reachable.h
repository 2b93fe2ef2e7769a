// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_REACHABLE_H
#define VEYFM_TESTS_REACHABLE_H

#include <QByteArray>

/**
 * Lets every user in to a path below closed folders, such as the home of who built it: each of them
 * gets an open folder with the same content mounted over it. A path that ends with a slash is such
 * a folder itself.
 *
 * For root in a private mount namespace, which the change ends with. False, with errno, where that
 * can't be done.
 */
bool makeReachable(const QByteArray& path);

#endif
