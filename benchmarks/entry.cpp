// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// A path to what lies there: VFS::entry() beside stat(2), QFileInfo and GIO.

#include "support/contest.h"
#include "support/directories.h"
#include "support/gio.h"
#include "support/options.h"

#include "vfs/vfs.h"

#include <QFileInfo>
#include <QVector>

#include <dirent.h>
#include <sys/stat.h>

namespace Benchmarks {

namespace {

// The same facts that the type of an entry tells.
int qtKind(const QString& path)
{
    const QFileInfo info(path);
    const int kind = info.isDir() ? 1 : info.isFile() ? 2 : 0;
    return info.isSymLink() ? -kind : kind;
}

} // namespace

void registerRows(const Options& options)
{
    const int entries = options.size(100000);
    addRow(
        "entry(path), " + std::to_string(entries) + " paths", options.rounds(11),
        [entries](benchmark::State& state) {
            const FlatDirectory directory(scratchDirectory().toLocal8Bit(), entries);
            QVector<QByteArray> bytes;
            QVector<QString> paths;
            const auto list = VeyFM::VFS::ptr()->childs(
                VeyFM::VFS::ptr()->entry(QString::fromLocal8Bit(directory.path())));
            for (const VeyFM::Entry& entry : list) {
                // Texts of their own, as they come from a user: not shared with the listing.
                bytes.append(entry.path().toLocal8Bit());
                paths.append(QString::fromLocal8Bit(bytes.last()));
            }
            const auto forEach = [](const auto& texts, auto work) {
                return cpuTime([&] {
                    for (const auto& text : texts) {
                        benchmark::DoNotOptimize(work(text));
                    }
                });
            };
            Contest contest([&] {
                return forEach(paths, [vfs = VeyFM::VFS::ptr()](const QString& path) {
                    return vfs->entry(path).type();
                });
            });
            contest.operations(entries);
            contest.floor("stat", 1.3, [&] {
                return forEach(bytes, [](const QByteArray& path) {
                    struct stat status;
                    return ::stat(path.constData(), &status);
                });
            });
            contest.peer("QFileInfo", 0.9, [&] { return forEach(paths, qtKind); });
#ifdef VEYFM_HAVE_GIO
            contest.peer("GIO", 0.6, [&] { return forEach(bytes, gioKind); });
#endif
            contest.run(state);
        });
}

} // namespace Benchmarks
