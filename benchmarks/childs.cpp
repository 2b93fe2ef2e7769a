// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Listing a flat directory: VFS::childs() beside getdents64(2), QDirIterator and GIO.

#include "support/contest.h"
#include "support/directories.h"
#include "support/gio.h"
#include "support/options.h"

#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QDirIterator>
#include <QVector>

#include <dirent.h>
#include <fcntl.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace Benchmarks {

namespace {

// Reads all records with the buffer size of readdir(3), and counts them.
int bareListing(const QByteArray& path)
{
    alignas(dirent64) char buffer[32768];
    const int directory = open(path.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    int count = 0;
    for (;;) {
        const long size = syscall(SYS_getdents64, directory, buffer, sizeof(buffer));
        if (size <= 0) {
            break;
        }
        for (long offset = 0; offset < size; ++count) {
            offset += reinterpret_cast<const dirent64*>(buffer + offset)->d_reclen;
        }
    }
    close(directory);
    return count;
}

// Path and kind of each, links told apart, as one would ask Qt for them.
int qtListing(const QString& path)
{
    int directories = 0;
    QDirIterator iterator(
        path, QDir::AllEntries | QDir::Hidden | QDir::System | QDir::NoDotAndDotDot);
    while (iterator.hasNext()) {
        const QString child = iterator.next();
        const QFileInfo info = iterator.fileInfo();
        benchmark::DoNotOptimize(child.size() + int(info.isSymLink()));
        directories += info.isDir();
    }
    return directories;
}

// To list, and to let go of the list again: the peers hand out one child at a time, and do both in
// turn.
template <typename List>
double costOf(List list)
{
    return cpuTime([&] { benchmark::DoNotOptimize(list()); });
}

void runRow(
    benchmark::State& state, const FlatDirectory& directory, const VeyFM::Entry& entry,
    double floorBound)
{
    const QByteArray bytes = directory.path();
    const QString path = QString::fromLocal8Bit(bytes);
    if (VeyFM::VFS::ptr()->childs(entry).size() != directory.entries()) {
        state.SkipWithError("the listing is not complete");
        return;
    }
    Contest contest([&entry] { return costOf([&] { return VeyFM::VFS::ptr()->childs(entry); }); });
    contest.operations(directory.entries());
    contest.floor(
        "getdents64", floorBound, [&] { return costOf([&] { return bareListing(bytes); }); });
    contest.peer("QDirIterator", 0.55, [&] { return costOf([&] { return qtListing(path); }); });
#ifdef VEYFM_HAVE_GIO
    contest.peer("GIO", 0.5, [&] { return costOf([&] { return gioDirectories(bytes); }); });
#endif
    contest.run(state);
}

void addRows(const QByteArray& parent, int entries, int rounds)
{
    const QByteArray fileSystem = fileSystemOf(parent);
    const double bound = fileSystem == "tmpfs" ? 1.8 : 2.1;
    const std::string suffix = std::to_string(entries) + " entries on " + fileSystem.toStdString();
    // Made when the first of the two rows needs it, gone with the last.
    auto directory = std::make_shared<std::shared_ptr<FlatDirectory>>();
    const auto needed = [directory, parent, entries] {
        if (!*directory) {
            *directory = std::make_shared<FlatDirectory>(parent, entries);
        }
        return *directory;
    };
    addRow("childs, " + suffix, rounds, [=](benchmark::State& state) {
        const auto flat = needed();
        runRow(state, *flat, VeyFM::VFS::ptr()->entry(QString::fromLocal8Bit(flat->path())), bound);
    });
    addRow("childs below a place, " + suffix, rounds, [=](benchmark::State& state) {
        const auto flat = needed();
        directory->reset();
        VeyFM::VFS* const vfs = VeyFM::VFS::ptr();
        const VeyFM::Entry place = vfs->placeBase()->createPlace(
            QStringLiteral("Benchmark"), VeyFM::TypeFavouritePlace,
            QString::fromLocal8Bit(flat->parent()));
        runRow(state, *flat, vfs->entry(QStringLiteral("Benchmark/flat")), bound + 0.3);
        vfs->placeBase()->destroyPlace(place);
    });
}

} // namespace

void registerRows(const Options& options)
{
    QList<QByteArray> parents{scratchDirectory().toLocal8Bit()};
    if (fileSystemOf("/dev/shm") != fileSystemOf(parents.first())) {
        parents.prepend("/dev/shm");
    }
    for (const QByteArray& parent : qAsConst(parents)) {
        addRows(parent, options.size(100000), options.rounds(15));
        addRows(parent, options.size(1000000), options.rounds(5));
    }
}

} // namespace Benchmarks
