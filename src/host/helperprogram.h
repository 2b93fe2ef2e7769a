// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_HELPERPROGRAM_H
#define VEYFM_HOST_HELPERPROGRAM_H

#include <QString>

namespace VeyFM {
namespace Host {

/// The program that mounts, by its absolute path: that which was installed with this library, or
/// that of the same build. An installed tree may be moved.
QString mountHelperProgram();

} // namespace Host
} // namespace VeyFM

#endif
