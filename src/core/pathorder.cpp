// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/pathorder.h"

#include <algorithm>

namespace VeyFM {

namespace {

constexpr qsizetype unitsPerKey = 4;

struct Item
{
    quint64 key; // The next four code units, the first one on top, zero behind the end.
    int index;
    int left; // Code units from the current depth on, at most unitsPerKey + 1.
};

// A run of items that are equal up to depth.
struct Run
{
    size_t begin;
    size_t end;
    qsizetype depth;
};

class Sorter
{
public:
    Sorter(const std::vector<QStringView>& texts, bool ascending)
        : m_texts(texts)
        , m_ascending(ascending)
        , m_items(texts.size())
    {
        for (size_t i = 0; i < m_items.size(); ++i) {
            m_items[i].index = int(i);
        }
    }

    std::vector<int> sorted()
    {
        m_runs.push_back({0, m_items.size(), 0});
        // A stack of our own: texts that share a very long prefix must not cost stack frames.
        while (!m_runs.empty()) {
            const Run run = m_runs.back();
            m_runs.pop_back();
            sortRun(run);
        }
        std::vector<int> order(m_items.size());
        std::transform(m_items.begin(), m_items.end(), order.begin(), [](const Item& item) {
            return item.index;
        });
        return order;
    }

private:
    void sortRun(Run run)
    {
        if (run.end - run.begin < 2) {
            return;
        }
        run.depth = commonPrefix(run);
        loadKeys(run);
        const auto first = m_items.begin() + qptrdiff(run.begin);
        const auto last = m_items.begin() + qptrdiff(run.end);
        if (m_ascending) {
            std::stable_sort(first, last, [](const Item& a, const Item& b) {
                return a.key < b.key || (a.key == b.key && a.left < b.left);
            });
        } else {
            std::stable_sort(first, last, [](const Item& a, const Item& b) {
                return b.key < a.key || (a.key == b.key && b.left < a.left);
            });
        }
        // What is longer than the key and equal in it is undecided yet. Items that ended inside
        // the key are settled: of two with one key the shorter is a prefix of the longer.
        for (size_t begin = run.begin; begin < run.end;) {
            size_t end = begin + 1;
            while (end < run.end && m_items[end].key == m_items[begin].key &&
                   m_items[end].left == m_items[begin].left) {
                ++end;
            }
            if (m_items[begin].left > unitsPerKey) {
                m_runs.push_back({begin, end, run.depth + unitsPerKey});
            }
            begin = end;
        }
    }

    // Where the first difference lies. It only has to look at what the run's first text shares
    // with each of the others.
    qsizetype commonPrefix(const Run& run) const
    {
        const QStringView first = text(run.begin);
        qsizetype common = first.size();
        for (size_t i = run.begin + 1; i < run.end && common > run.depth; ++i) {
            const QStringView other = text(i);
            common = std::min(common, other.size());
            const auto mismatch = std::mismatch(
                first.utf16() + run.depth, first.utf16() + common, other.utf16() + run.depth);
            common = mismatch.first - first.utf16();
        }
        return common;
    }

    void loadKeys(const Run& run)
    {
        for (size_t i = run.begin; i < run.end; ++i) {
            const QStringView rest = text(i).mid(run.depth);
            const qsizetype used = std::min(rest.size(), unitsPerKey);
            quint64 key = 0;
            for (qsizetype unit = 0; unit < used; ++unit) {
                key |= quint64(rest.utf16()[unit]) << (16 * (unitsPerKey - 1 - unit));
            }
            m_items[i].key = key;
            m_items[i].left = int(std::min(rest.size(), unitsPerKey + 1));
        }
    }

    QStringView text(size_t item) const
    {
        return m_texts[size_t(m_items[item].index)];
    }

    const std::vector<QStringView>& m_texts;
    const bool m_ascending;
    std::vector<Item> m_items;
    std::vector<Run> m_runs;
};

} // namespace

std::vector<int> stableOrder(const std::vector<QStringView>& texts, bool ascending)
{
    return Sorter(texts, ascending).sorted();
}

} // namespace VeyFM
