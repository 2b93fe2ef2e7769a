// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_VERBS_H
#define VEYFM_TOOL_VERBS_H

#include "verb.h"

namespace VeyFM {
namespace Tool {

/// All verbs, in the order of the help.
const QVector<Verb>& verbs();

/// The verb of that name, or null.
const Verb* findVerb(const QString& name);

/// One function a verb, each in the file of its name. @{
Verb completeVerb();
Verb helpVerb();
Verb infoVerb();
Verb listVerb();
Verb monitorVerb();
Verb parentVerb();
Verb resolveVerb();
Verb treeVerb();
/// @}

} // namespace Tool
} // namespace VeyFM

#endif
