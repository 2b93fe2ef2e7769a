// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_MOUNTHOLDERS_H
#define VEYFM_HOST_MOUNTHOLDERS_H

#include <QString>
#include <QStringList>

namespace VeyFM {
namespace Host {

/**
 * The processes that keep a mount from going: that work in it, or have a file of it open, such as
 * "less (4711)". Those of other users are not seen. The directory is named as the kernel does, and
 * not looked at. A process that is stuck in the kernel may hold this up.
 */
QStringList mountHolders(const QString& directory);

} // namespace Host
} // namespace VeyFM

#endif
