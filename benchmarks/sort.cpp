// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// EntryList::sort() beside std::stable_sort of the paths.

#include "support/contest.h"
#include "support/entries.h"
#include "support/options.h"

#include <algorithm>

namespace Benchmarks {

void registerRows(const Options& options)
{
    for (const int full : {100000, 1000000}) {
        const int count = options.size(full);
        const std::string name = "sort, " + std::to_string(count) + " paths";
        addRow(name, options.rounds(full == 100000 ? 15 : 5), [=](benchmark::State& state) {
            const QStringList texts = shuffled(manyPaths(0, count));
            const VeyFM::EntryList entries = entriesOf(texts);
            // Vectors and lists of the texts' own, in the order in which they were allocated.
            const std::vector<QString> paths = [&] {
                std::vector<QString> result;
                for (const QString& text : texts) {
                    result.push_back(QString(text.constData(), text.size()));
                }
                return result;
            }();
            Contest contest([&] {
                VeyFM::EntryList list = entries;
                list.detach();
                return cpuTime([&] { list.sort(true); });
            });
            contest.operations(count);
            contest.peer("std::stable_sort", full == 100000 ? 0.85 : 0.6, [&] {
                std::vector<QString> list = paths;
                return cpuTime([&] { std::stable_sort(list.begin(), list.end()); });
            });
            contest.run(state);
        });
    }
}

} // namespace Benchmarks
