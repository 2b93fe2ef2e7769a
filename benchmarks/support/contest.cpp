// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/contest.h"

#include <algorithm>

#include <time.h>

namespace Benchmarks {

namespace {

double median(std::vector<double> values)
{
    const auto middle = values.begin() + std::ptrdiff_t(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

double nanoseconds(clockid_t clock)
{
    timespec now{};
    clock_gettime(clock, &now);
    return double(now.tv_sec) * 1e9 + double(now.tv_nsec);
}

} // namespace

double cpuNow()
{
    return nanoseconds(CLOCK_PROCESS_CPUTIME_ID);
}

double threadCpuNow()
{
    return nanoseconds(CLOCK_THREAD_CPUTIME_ID);
}

double cpuTime(const std::function<void()>& work)
{
    const double start = cpuNow();
    work();
    return cpuNow() - start;
}

Contest::Contest(Candidate ours)
{
    m_entrants.push_back({"ours", 0, std::move(ours), {}});
}

Contest& Contest::floor(const std::string& name, double bound, Candidate candidate)
{
    m_entrants.push_back({"floor:" + name, bound, std::move(candidate), {}});
    return *this;
}

Contest& Contest::peer(const std::string& name, double bound, Candidate candidate)
{
    m_entrants.push_back({"peer:" + name, bound, std::move(candidate), {}});
    return *this;
}

Contest& Contest::limit(double bound)
{
    m_limit = bound;
    return *this;
}

Contest& Contest::operations(double count)
{
    m_operations = count;
    return *this;
}

void Contest::run(benchmark::State& state)
{
    // The first round pays for cold caches and fresh memory, and does not count.
    for (Entrant& entrant : m_entrants) {
        entrant.candidate();
    }
    size_t first = 0;
    for (auto _ : state) {
        // Everyone goes first in turn: what one leaves in the caches, the next one finds.
        for (size_t i = 0; i < m_entrants.size(); ++i) {
            Entrant& entrant = m_entrants[(first + i) % m_entrants.size()];
            entrant.costs.push_back(entrant.candidate());
        }
        ++first;
        state.SetIterationTime(m_entrants.front().costs.back() * 1e-9);
    }

    const std::vector<double>& ours = m_entrants.front().costs;
    state.counters["ours"] = median(ours) / m_operations;
    if (m_limit > 0) {
        state.counters["limit"] = m_limit;
    }
    for (size_t i = 1; i < m_entrants.size(); ++i) {
        const Entrant& entrant = m_entrants[i];
        std::vector<double> ratios(ours.size());
        std::transform(
            ours.begin(), ours.end(), entrant.costs.begin(), ratios.begin(), std::divides<>());
        state.counters[entrant.key + ":cost"] = median(entrant.costs) / m_operations;
        state.counters[entrant.key + ":ratio"] = median(ratios);
        state.counters[entrant.key + ":bound"] = entrant.bound;
    }
}

void addRow(const std::string& name, int rounds, std::function<void(benchmark::State&)> row)
{
    benchmark::RegisterBenchmark(name.c_str(), std::move(row))->Iterations(rounds)->UseManualTime();
}

} // namespace Benchmarks
