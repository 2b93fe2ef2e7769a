// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Adding and removing watches: EntryWatcher beside bare inotify, QFileSystemWatcher and GIO.

#include "support/contest.h"
#include "support/gio.h"
#include "support/options.h"
#include "support/watchtree.h"

#include "vfs/vfs.h"
#include "watch/entrywatcher.h"

#include <QFileSystemWatcher>

#include <sys/inotify.h>
#include <unistd.h>

namespace Benchmarks {

namespace {

struct Costs
{
    double adding;
    double removing;
};

Costs ourCosts(const QVector<VeyFM::Entry>& entries)
{
    VeyFM::EntryWatcher watcher;
    Costs costs{};
    costs.adding = cpuTime([&] {
        for (const VeyFM::Entry& entry : entries) {
            watcher.addEntry(entry);
        }
    });
    costs.removing = cpuTime([&] {
        for (const VeyFM::Entry& entry : entries) {
            watcher.removeEntry(entry);
        }
    });
    return costs;
}

Costs bareCosts(const WatchTree& tree)
{
    constexpr uint32_t mask = IN_ATTRIB | IN_CLOSE_WRITE | IN_MOVE | IN_CREATE | IN_DELETE |
                              IN_DELETE_SELF | IN_MOVE_SELF | IN_DONT_FOLLOW | IN_EXCL_UNLINK;
    const int fd = inotify_init1(IN_CLOEXEC);
    std::vector<int> descriptors(size_t(tree.size()));
    Costs costs{};
    costs.adding = cpuTime([&] {
        for (int i = 0; i < tree.size(); ++i) {
            descriptors[size_t(i)] = inotify_add_watch(fd, tree.path(i).constData(), mask);
        }
    });
    costs.removing = cpuTime([&] {
        for (const int descriptor : descriptors) {
            inotify_rm_watch(fd, descriptor);
        }
    });
    close(fd);
    return costs;
}

Costs qtCosts(const QStringList& paths)
{
    QFileSystemWatcher watcher;
    Costs costs{};
    costs.adding = cpuTime([&] {
        for (const QString& path : paths) {
            watcher.addPath(path);
        }
    });
    costs.removing = cpuTime([&] {
        for (const QString& path : paths) {
            watcher.removePath(path);
        }
    });
    return costs;
}

#ifdef VEYFM_HAVE_GIO
Costs gioCosts(const WatchTree& tree)
{
    std::vector<GioObject<GFileMonitor>> monitors;
    Costs costs{};
    costs.adding = cpuTime([&] {
        for (int i = 0; i < tree.size(); ++i) {
            monitors.push_back(gioMonitor(tree.path(i)));
        }
    });
    costs.removing = cpuTime([&] { monitors.clear(); });
    return costs;
}
#endif

void runRow(benchmark::State& state, int directories, double Costs::*part, double bound)
{
    const WatchTree tree(directories);
    const QStringList paths = tree.paths();
    QVector<VeyFM::Entry> entries;
    for (const QString& path : paths) {
        entries.append(VeyFM::VFS::ptr()->entry(path));
    }
    Contest contest([&] { return ourCosts(entries).*part; });
    contest.operations(directories);
    contest.floor("inotify", bound, [&] { return bareCosts(tree).*part; });
    contest.peer("QFileSystemWatcher", 1, [&] { return qtCosts(paths).*part; });
#ifdef VEYFM_HAVE_GIO
    contest.peer("GFileMonitor", 1, [&] { return gioCosts(tree).*part; });
#endif
    contest.run(state);
}

void runGrowthRow(benchmark::State& state, const Options& options, double Costs::*part)
{
    const auto entriesOf = [](const WatchTree& tree) {
        QVector<VeyFM::Entry> entries;
        for (const QString& path : tree.paths()) {
            entries.append(VeyFM::VFS::ptr()->entry(path));
        }
        return entries;
    };
    const WatchTree many(options.size(20000));
    const WatchTree few(options.size(1000));
    const auto manyEntries = entriesOf(many);
    const auto fewEntries = entriesOf(few);
    // By the cost of one watch, and beside that of the kernel, which grows a little too.
    Contest contest([&] { return ourCosts(manyEntries).*part / (bareCosts(many).*part); });
    contest.floor("1000 directories", 1.25, [&] {
        return ourCosts(fewEntries).*part / (bareCosts(few).*part);
    });
    contest.run(state);
}

} // namespace

void registerRows(const Options& options)
{
    for (const int full : {1000, 20000}) {
        const int directories = options.size(full);
        const std::string suffix = ", " + std::to_string(directories) + " directories";
        const int rounds = options.rounds(full == 1000 ? 25 : 5);
        addRow("adding a watch" + suffix, rounds, [=](benchmark::State& state) {
            runRow(state, directories, &Costs::adding, 1.8);
        });
        addRow("removing a watch" + suffix, rounds, [=](benchmark::State& state) {
            runRow(state, directories, &Costs::removing, 1.6);
        });
    }
    addRow("adding, growth from 1000 to 20000", options.rounds(7), [=](benchmark::State& state) {
        runGrowthRow(state, options, &Costs::adding);
    });
    addRow("removing, growth from 1000 to 20000", options.rounds(7), [=](benchmark::State& state) {
        runGrowthRow(state, options, &Costs::removing);
    });
}

} // namespace Benchmarks
