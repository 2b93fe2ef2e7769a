// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/kernelwatches.h"

#include <QFile>

#include <sys/inotify.h>
#include <unistd.h>

namespace VeyFM {

namespace {

std::optional<QSet<int>> listedWatches(int fd)
{
    QFile info(QStringLiteral("/proc/self/fdinfo/%1").arg(fd));
    if (!info.open(QIODevice::ReadOnly)) {
        return std::nullopt;
    }
    QSet<int> watches;
    // A line a watch: "inotify wd:1f ino:...", in base 16.
    const QByteArray head("inotify wd:");
    for (QByteArray line = info.readLine(); !line.isEmpty(); line = info.readLine()) {
        if (line.startsWith(head)) {
            const int end = line.indexOf(' ', head.size());
            watches.insert(line.mid(head.size(), end - head.size()).toInt(nullptr, 16));
        }
    }
    if (info.error() != QFileDevice::NoError) {
        return std::nullopt;
    }
    return watches;
}

// Old kernels, and sandboxes that play one, have the file and list nothing in it.
bool isListingWatches()
{
    const int fd = inotify_init1(IN_CLOEXEC);
    const int watch = fd < 0 ? -1 : inotify_add_watch(fd, "/", IN_DELETE_SELF);
    const bool isListing = watch != -1 && listedWatches(fd).value_or(QSet<int>()).contains(watch);
    if (fd >= 0) {
        close(fd);
    }
    return isListing;
}

} // namespace

std::optional<QSet<int>> kernelWatches(int fd)
{
    const auto watches = listedWatches(fd);
    return watches && watches->isEmpty() && !isListingWatches() ? std::nullopt : watches;
}

} // namespace VeyFM
