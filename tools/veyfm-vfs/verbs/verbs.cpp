// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "verbs/verbs.h"

#include <algorithm>
#include <numeric>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int farthest = 2;

/// How many letters have to be put in, taken out, replaced or swapped with the next one.
int editDistance(const QString& left, const QString& right)
{
    if (left.size() > right.size() + farthest) {
        return left.size(); // At least; nobody cares how far.
    }
    const int width = right.size() + 1;
    QVector<int> rows((left.size() + 1) * width);
    const auto at = [&rows, width](int i, int j) -> int& {
        return rows[i * width + j];
    };
    std::iota(rows.begin(), rows.begin() + width, 0);
    for (int i = 1; i <= left.size(); ++i) {
        at(i, 0) = i;
        for (int j = 1; j <= right.size(); ++j) {
            const int replaced = at(i - 1, j - 1) + (left.at(i - 1) == right.at(j - 1) ? 0 : 1);
            at(i, j) = std::min({replaced, at(i - 1, j) + 1, at(i, j - 1) + 1});
            const bool isSwapped = i > 1 && j > 1 && left.at(i - 1) == right.at(j - 2) &&
                                   left.at(i - 2) == right.at(j - 1);
            if (isSwapped) {
                at(i, j) = std::min(at(i, j), at(i - 2, j - 2) + 1);
            }
        }
    }
    return at(left.size(), right.size());
}

} // namespace

const QVector<Verb>& verbs()
{
    static const QVector<Verb> all = {
        listVerb(),    treeVerb(),     infoVerb(),    monitorVerb(), parentVerb(),   resolveVerb(),
        storageVerb(), bookmarkVerb(), networkVerb(), mountVerb(),   unmountVerb(),  mountsVerb(),
        updateVerb(),  notifyVerb(),   statusVerb(),  helpVerb(),    completeVerb(),
    };
    return all;
}

QString whyNoVerb(const QString& word, const QVector<Verb>& verbs)
{
    QString best;
    int least = farthest + 1;
    for (const Verb& verb : verbs) {
        const int distance = editDistance(word.toLower(), verb.word());
        // Of a short word nothing would be left.
        if (!verb.hidden && distance < least && distance < word.size()) {
            best = verb.word();
            least = distance;
        }
    }
    const QString why = QStringLiteral("no such command");
    return best.isEmpty() ? why : why + QStringLiteral(": did you mean '%1'?").arg(best);
}

const Verb* findVerb(const QString& word, const QVector<Verb>& verbs)
{
    for (const Verb& verb : verbs) {
        if (verb.word() == word || (!word.isEmpty() && verb.otherName == word)) {
            return &verb;
        }
    }
    return nullptr;
}

} // namespace Tool
} // namespace VeyFM
