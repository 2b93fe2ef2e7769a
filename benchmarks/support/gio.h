// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_GIO_H
#define VEYFM_BENCHMARKS_GIO_H

#ifdef VEYFM_HAVE_GIO

#include <gio/gio.h>

#include <QByteArray>

#include <memory>
#include <vector>

namespace Benchmarks {

struct Unref
{
    void operator()(gpointer object) const
    {
        g_object_unref(object);
    }
};

template <typename T>
using GioObject = std::unique_ptr<T, Unref>;

/// What a GIO program keeps of a child: where it is, what it is called, and its kind.
struct GioChild
{
    GioObject<GFile> file;
    GioObject<GFileInfo> info;
};

/// Reads all children of a directory by name and kind, and counts the directories.
int gioDirectories(const QByteArray& path);

/// The children, each with a GFile and a name to show: what an entry holds.
std::vector<GioChild> gioListingWithFiles(const QByteArray& path);

/// The kind of what lies at a path, links followed.
GFileType gioKind(const QByteArray& path);

/// A monitor of a directory.
GioObject<GFileMonitor> gioMonitor(const QByteArray& path);

} // namespace Benchmarks

#endif

#endif
