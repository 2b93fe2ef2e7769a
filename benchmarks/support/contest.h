// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_CONTEST_H
#define VEYFM_BENCHMARKS_CONTEST_H

#include <benchmark/benchmark.h>

#include <functional>
#include <string>
#include <vector>

namespace Benchmarks {

/// CPU time of the whole process so far, in nanoseconds.
double cpuNow();

/// CPU time that @p work takes, in nanoseconds.
double cpuTime(const std::function<void()>& work);

/// CPU time of this thread so far, in nanoseconds.
double threadCpuNow();

/**
 * One row of the report: what a job costs beside its floor and the peers.
 *
 * The machine is shared, and its speed changes from one second to the next. So all candidates
 * take turns within one process, the ratios are computed round by round, and the report is the
 * median of them.
 */
class Contest
{
public:
    /// Does the job once and tells what it cost: nanoseconds, bytes or calls.
    using Candidate = std::function<double()>;

    explicit Contest(Candidate ours);

    /// What no implementation can do without. @p bound is the largest ratio that is good enough.
    Contest& floor(const std::string& name, double bound, Candidate candidate);

    /// What one would use instead.
    Contest& peer(const std::string& name, double bound, Candidate candidate);

    /// A bound for the cost itself, in place of a ratio.
    Contest& limit(double bound);

    /// How many operations one turn holds; costs are told for one.
    Contest& operations(double count);

    /// Takes as many rounds as @p state has iterations, and writes the row as its counters.
    void run(benchmark::State& state);

private:
    struct Entrant
    {
        std::string key; // "floor:<name>" or "peer:<name>"
        double bound;
        Candidate candidate;
        std::vector<double> costs;
    };

    std::vector<Entrant> m_entrants; // ours first
    double m_operations = 1;
    double m_limit = 0;
};

/// Registers a row of @p rounds repetitions.
void addRow(const std::string& name, int rounds, std::function<void(benchmark::State&)> row);

} // namespace Benchmarks

#endif
