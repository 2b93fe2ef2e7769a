// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "verbs/verbs.h"

namespace VeyFM {
namespace Tool {

const QVector<Verb>& verbs()
{
    static const QVector<Verb> all = {
        listVerb(),    treeVerb(),     infoVerb(),    monitorVerb(),  parentVerb(), resolveVerb(),
        storageVerb(), bookmarkVerb(), networkVerb(), mountVerb(),    mountsVerb(), updateVerb(),
        notifyVerb(),  statusVerb(),   helpVerb(),    completeVerb(),
    };
    return all;
}

const Verb* findVerb(const QString& word, const QVector<Verb>& verbs)
{
    for (const Verb& verb : verbs) {
        if (verb.word() == word) {
            return &verb;
        }
    }
    return nullptr;
}

} // namespace Tool
} // namespace VeyFM
