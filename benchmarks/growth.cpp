// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// What one operation costs where there is ten or a thousand times as much of something.

#include "support/contest.h"
#include "support/entries.h"
#include "support/options.h"

#include "service/networkmountsmanagerproxy.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <memory>

namespace Benchmarks {

namespace {

using Work = std::function<void(const QString& url)>;

// A host of letters that a parser puts into order one by one.
QString longUrl(int letters)
{
    const QString marks = QString::fromUtf8("\xCC\x81\xCC\x96");
    return QStringLiteral("sftp://user@") + marks.repeated(letters / 2) + QStringLiteral("/path");
}

void addUrlRow(const std::string& name, const Options& options, int times, const Work& work)
{
    const int letters = options.size(16000);
    addRow(
        name + ", host of " + std::to_string(letters) + " letters", options.rounds(51),
        [=](benchmark::State& state) {
            const auto costOf = [=](int length) {
                return [url = longUrl(length), times, work] {
                    return cpuTime([&] {
                        for (int i = 0; i < times; ++i) {
                            work(url);
                        }
                    });
                };
            };
            Contest contest(costOf(letters));
            contest.operations(times);
            contest.floor("a tenth of them", 15, costOf(letters / 10));
            contest.run(state);
        });
}

std::shared_ptr<VeyFM::VFSPlaceBase> manyPlaces(int count)
{
    auto places = std::make_shared<VeyFM::VFSPlaceBase>();
    const VeyFM::Entry root = places->createPlace(QStringLiteral("_"), 1000, QString());
    for (int i = 0; i < count; ++i) {
        const QString name = QString::number(i);
        places->addEntryToPlace(places->createPlace(name, 2005, u'/' + name), root);
    }
    return places;
}

} // namespace

void registerRows(const Options& options)
{
    VeyFM::VFS* const vfs = VeyFM::VFS::ptr();
    addUrlRow("createEntryForUrl()", options, 20, [vfs](const QString& url) {
        benchmark::DoNotOptimize(vfs->createEntryForUrl(url, QStringLiteral("/mnt")));
    });
    addUrlRow("urlsFromEntries()", options, 20, [vfs](const QString& url) {
        benchmark::DoNotOptimize(vfs->urlsFromEntries(vfs->entry(url)));
    });
    const VeyFM::Entry mount =
        vfs->createEntryForUrl(QStringLiteral("sftp://host/"), QStringLiteral("/mnt"));
    addUrlRow("mountAdded()", options, 20, [vfs, mount](const QString& url) {
        Q_EMIT vfs->networkMountsManager()->mountAdded(url, mount);
    });

    const int count = options.size(10000);
    addRow(
        "parent of a plain file, " + std::to_string(count) + " places", options.rounds(51),
        [count](benchmark::State& state) {
            const VeyFM::Entry file = entriesOf({QStringLiteral("/home/user/some/file")}).first();
            const VeyFM::Entry root = manyPlaces(0)->placeEntry(QStringLiteral("_"));
            constexpr int times = 1000;
            const auto costOf = [=](int size) {
                return [places = manyPlaces(size), file, root] {
                    return cpuTime([&] {
                        for (int i = 0; i < times; ++i) {
                            benchmark::DoNotOptimize(places->checkAndGetParentPlace(file, root));
                        }
                    });
                };
            };
            Contest contest(costOf(count));
            contest.operations(times);
            contest.floor("10 places", 2, costOf(10));
            contest.run(state);
        });
}

} // namespace Benchmarks
