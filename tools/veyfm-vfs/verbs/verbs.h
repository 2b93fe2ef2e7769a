// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_VERBS_H
#define VEYFM_TOOL_VERBS_H

#include "verb.h"

namespace VeyFM {
namespace Tool {

/// All verbs, in the order of the help.
const QVector<Verb>& verbs();

/// That there is no verb of this name, and which one may have been meant.
QString whyNoVerb(const QString& word, const QVector<Verb>& verbs = verbs());

/// The verb among @p verbs that the word names, or null.
const Verb* findVerb(const QString& word, const QVector<Verb>& verbs = verbs());

/// One function a verb, each in the file of its name. @{
Verb bookmarkVerb();
Verb completeVerb();
Verb helpVerb();
Verb infoVerb();
Verb listVerb();
Verb monitorVerb();
Verb mountVerb();
Verb mountsVerb();
Verb networkVerb();
Verb notifyVerb();
Verb parentVerb();
Verb resolveVerb();
Verb statusVerb();
Verb storageVerb();
Verb treeVerb();
Verb unmountVerb();
Verb updateVerb();
/// @}

} // namespace Tool
} // namespace VeyFM

#endif
