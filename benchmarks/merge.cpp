// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// EntryList::mergeWith() beside the same by a QSet of paths.

#include "support/contest.h"
#include "support/entries.h"
#include "support/options.h"

#include <QSet>

namespace Benchmarks {

namespace {

QStringList mergedBySet(QStringList* paths, const QStringList& other)
{
    QSet<QString> known(paths->cbegin(), paths->cend());
    for (const QString& path : other) {
        const int count = known.size();
        known.insert(path);
        if (known.size() != count) {
            paths->append(path);
        }
    }
    return *paths;
}

} // namespace

void registerRows(const Options& options)
{
    const int count = options.size(20000);
    const std::string name =
        "mergeWith, " + std::to_string(count) + " and " + std::to_string(count) + ", half in both";
    addRow(name, options.rounds(101), [=](benchmark::State& state) {
        const QStringList left = shuffled(manyPaths(0, count));
        const QStringList right = shuffled(manyPaths(count / 2, count));
        const VeyFM::EntryList leftEntries = entriesOf(left);
        const VeyFM::EntryList rightEntries = entriesOf(right);
        const auto copiesOf = [](const QStringList& texts) {
            QStringList result;
            for (const QString& text : texts) {
                result.append(QString(text.constData(), text.size()));
            }
            return result;
        };
        const QStringList leftPaths = copiesOf(left);
        const QStringList rightPaths = copiesOf(right);
        Contest contest([&] {
            VeyFM::EntryList list = leftEntries;
            return cpuTime([&] { benchmark::DoNotOptimize(list.mergeWith(rightEntries)); });
        });
        contest.operations(2 * count);
        contest.peer("QSet", 1.15, [&] {
            QStringList list = leftPaths;
            return cpuTime([&] { benchmark::DoNotOptimize(mergedBySet(&list, rightPaths)); });
        });
        contest.run(state);
    });
}

} // namespace Benchmarks
