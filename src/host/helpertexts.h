// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_HELPERTEXTS_H
#define VEYFM_HOST_HELPERTEXTS_H

namespace VeyFM {
namespace Host {

/// Why an SFTP mount failed, in the words of veyfm-mount; veyfm-vfs has more to say to that. @{
constexpr char endedBeforePassword[] = "the connection ended before a password was asked for";
constexpr char endedByServer[] = "the server ended the connection";
/// @}

} // namespace Host
} // namespace VeyFM

#endif
