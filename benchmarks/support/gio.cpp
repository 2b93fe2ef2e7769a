// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/gio.h"

namespace Benchmarks {

namespace {

constexpr const char* nameAndKind =
    G_FILE_ATTRIBUTE_STANDARD_NAME "," G_FILE_ATTRIBUTE_STANDARD_TYPE;

// A name is bytes. To show it as our texts can be shown takes another attribute.
constexpr const char* nameToShowAndKind = G_FILE_ATTRIBUTE_STANDARD_NAME
    "," G_FILE_ATTRIBUTE_STANDARD_DISPLAY_NAME "," G_FILE_ATTRIBUTE_STANDARD_TYPE;

template <typename Take>
void enumerate(const QByteArray& path, const char* attributes, Take take)
{
    const GioObject<GFile> directory(g_file_new_for_path(path.constData()));
    // Links are followed, as ours are: their kind tells where they lead.
    const GioObject<GFileEnumerator> enumerator(g_file_enumerate_children(
        directory.get(), attributes, G_FILE_QUERY_INFO_NONE, nullptr, nullptr));
    while (GFileInfo* info = g_file_enumerator_next_file(enumerator.get(), nullptr, nullptr)) {
        take(enumerator.get(), GioObject<GFileInfo>(info));
    }
}

} // namespace

int gioDirectories(const QByteArray& path)
{
    int directories = 0;
    enumerate(path, nameAndKind, [&directories](GFileEnumerator*, GioObject<GFileInfo> info) {
        directories += g_file_info_get_name(info.get()) != nullptr &&
                       g_file_info_get_file_type(info.get()) == G_FILE_TYPE_DIRECTORY;
    });
    return directories;
}

std::vector<GioChild> gioListingWithFiles(const QByteArray& path)
{
    std::vector<GioChild> result;
    enumerate(
        path, nameToShowAndKind, [&result](GFileEnumerator* enumerator, GioObject<GFileInfo> info) {
            GioObject<GFile> file(g_file_enumerator_get_child(enumerator, info.get()));
            result.push_back({std::move(file), std::move(info)});
        });
    return result;
}

GFileType gioKind(const QByteArray& path)
{
    const GioObject<GFile> file(g_file_new_for_path(path.constData()));
    const GioObject<GFileInfo> info(
        g_file_query_info(file.get(), nameAndKind, G_FILE_QUERY_INFO_NONE, nullptr, nullptr));
    return info ? g_file_info_get_file_type(info.get()) : G_FILE_TYPE_UNKNOWN;
}

GioObject<GFileMonitor> gioMonitor(const QByteArray& path)
{
    const GioObject<GFile> file(g_file_new_for_path(path.constData()));
    return GioObject<GFileMonitor>(
        g_file_monitor_directory(file.get(), G_FILE_MONITOR_NONE, nullptr, nullptr));
}

} // namespace Benchmarks
