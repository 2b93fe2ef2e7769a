// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Memory of a listing, an entry: VFS::childs() beside GIO.

#include "support/contest.h"
#include "support/cost.h"
#include "support/directories.h"
#include "support/gio.h"
#include "support/options.h"

#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <cstdio>
#include <cstdlib>

#include <sys/wait.h>
#include <unistd.h>

namespace Benchmarks {

namespace {

constexpr int pathLength = 45;

// What stays allocated for as long as the result of the work lives. A process of its own each
// time: allocators keep what was freed, and a second run would find it there.
template <typename Work>
double bytesOf(Work work)
{
    int ends[2];
    if (pipe(ends) != 0) {
        return 0;
    }
    const pid_t child = fork();
    if (child == 0) {
        const double before = bytesInUse();
        const auto result = work();
        const double bytes = bytesInUse() - before;
        _exit(write(ends[1], &bytes, sizeof(bytes)) == ssize_t(sizeof(bytes)) ? 0 : 1);
    }
    close(ends[1]);
    double bytes = 0;
    if (read(ends[0], &bytes, sizeof(bytes)) != ssize_t(sizeof(bytes))) {
        std::fprintf(stderr, "no figure from the process that measures\n");
        std::exit(1);
    }
    close(ends[0]);
    waitpid(child, nullptr, 0);
    return bytes;
}

void runRow(
    benchmark::State& state, const FlatDirectory& directory, const VeyFM::Entry& entry,
    double limit, double ofGio)
{
    Contest contest([&] { return bytesOf([&] { return VeyFM::VFS::ptr()->childs(entry); }); });
    contest.operations(directory.entries()).limit(limit);
#ifdef VEYFM_HAVE_GIO
    contest.peer("GIO", ofGio, [&] {
        return bytesOf([&] { return gioListingWithFiles(directory.path()); });
    });
#endif
    contest.run(state);
}

} // namespace

void registerRows(const Options& options)
{
    const int entries = options.size(100000);
    auto directory = std::make_shared<std::unique_ptr<FlatDirectory>>();
    const auto needed = [=]() -> const FlatDirectory& {
        if (!*directory) {
            const FlatDirectory probe("/tmp", 1);
            const int padding =
                pathLength - probe.path().size() - int(sizeof("/file-0000000.txt")) + 1;
            *directory = std::make_unique<FlatDirectory>("/tmp", entries, std::max(0, padding));
        }
        return **directory;
    };
    addRow("memory, path and localPath equal", options.rounds(3), [=](benchmark::State& state) {
        const FlatDirectory& flat = needed();
        const QString path = QString::fromLocal8Bit(flat.path());
        runRow(state, flat, VeyFM::VFS::ptr()->entry(path), 210, 0.55);
    });
    addRow("memory, path and localPath differ", options.rounds(3), [=](benchmark::State& state) {
        const FlatDirectory& flat = needed();
        VeyFM::VFS* const vfs = VeyFM::VFS::ptr();
        // As long as the local path is.
        const QString name(flat.parent().size(), u'p');
        vfs->placeBase()->createPlace(
            name, VeyFM::TypeFavouritePlace, QString::fromLocal8Bit(flat.parent()));
        runRow(state, flat, vfs->entry(name + QStringLiteral("/flat")), 300, 0.8);
        directory->reset();
    });
}

} // namespace Benchmarks
