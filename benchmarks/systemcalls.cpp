// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// How often VFS::childs() and VFS::entry() go to the kernel.

#include "support/systemcalls.h"
#include "support/contest.h"
#include "support/directories.h"
#include "support/options.h"

#include "vfs/vfs.h"

#include <sys/syscall.h>

namespace Benchmarks {

namespace {

using Count = std::function<double(const std::map<long, int>&)>;

void runRow(
    benchmark::State& state, double limit, double operations, std::function<void()> work,
    Count count)
{
    if (!systemCallsOf([] {})) {
        state.SkipWithError("system calls can't be traced here");
        return;
    }
    Contest contest([&] { return count(systemCallsOf(work).value()); });
    contest.operations(operations).limit(limit).run(state);
}

double all(const std::map<long, int>& calls)
{
    double sum = 0;
    for (const auto& [number, count] : calls) {
        sum += count;
    }
    return sum;
}

// Without what reads the records, and what the allocator needs.
double allButRecordsAndMemory(const std::map<long, int>& calls)
{
    double sum = 0;
    for (const auto& [number, count] : calls) {
        switch (number) {
        case SYS_getdents64:
        case SYS_brk:
        case SYS_mmap:
        case SYS_munmap:
        case SYS_mremap:
            break;
        default:
            sum += count;
        }
    }
    return sum;
}

} // namespace

void registerRows(const Options& options)
{
    const int entries = options.size(20000);
    const auto flat = std::make_shared<FlatDirectory>(scratchDirectory().toLocal8Bit(), entries);
    const auto path = [flat](const char* name) {
        return QString::fromLocal8Bit(flat->path() + name);
    };
    const auto entryOf = [](const QString& text) {
        return [text] {
            VeyFM::VFS::ptr()->entry(text);
        };
    };

    // To open, look at, and close the directory takes three more, however large it is.
    addRow("system calls of childs, a link", 1, [=](benchmark::State& state) {
        const VeyFM::Entry entry = VeyFM::VFS::ptr()->entry(path(""));
        runRow(
            state, 1, flat->links(), [=] { VeyFM::VFS::ptr()->childs(entry); },
            [](const auto& calls) { return allButRecordsAndMemory(calls) - 3; });
    });
    addRow("system calls of childs, no link", 1, [=](benchmark::State& state) {
        const VeyFM::Entry entry = VeyFM::VFS::ptr()->entry(path(""));
        const auto withoutLinks = [=] {
            VeyFM::VFS::ptr()->childs(entry, VeyFM::VFS::SkipSymLinks);
        };
        runRow(state, 3, 1, withoutLinks, allButRecordsAndMemory);
    });
    addRow("system calls of entry(path), a file", 1, [=](benchmark::State& state) {
        runRow(state, 1, 1, entryOf(path("/file-0000000.txt")), all);
    });
    addRow("system calls of entry(path), a link", 1, [=](benchmark::State& state) {
        runRow(state, 2, 1, entryOf(path("/file-0000019.txt")), all);
    });
}

} // namespace Benchmarks
