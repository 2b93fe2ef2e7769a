// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_BROWSE_H
#define VEYFM_TOOL_BROWSE_H

#include "verb.h"

namespace VeyFM {
namespace Tool {

/// The verbs of "network" that are about the Samba network.
QVector<Verb> browseVerbs();

} // namespace Tool
} // namespace VeyFM

#endif
