// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SSHCONFIG_H
#define VEYFM_TOOL_SSHCONFIG_H

#include <QString>

namespace VeyFM {
namespace Tool {

/// Whether ssh, told to go to a host as a user (who may be empty), goes to one that it calls by
/// @p name: its configuration may have another name for it, or a key under another name.
bool isSshNameOf(const QString& name, const QString& user, const QString& host);

} // namespace Tool
} // namespace VeyFM

#endif
