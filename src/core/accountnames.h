// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_ACCOUNTNAMES_H
#define VEYFM_ACCOUNTNAMES_H

#include <QString>

namespace VeyFM {

/// Name of a numeric user in the user database, or empty.
QString userName(uint userId);

/// Name of a numeric group in the group database, or empty.
QString groupName(uint groupId);

} // namespace VeyFM

#endif
