// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any text to VFS::entry() and VFS::normalizePath(), and what they lead to. The sanitizers judge.

#include "vfs/vfs.h"

#include <QCoreApplication>

#include <cstddef>
#include <cstdint>

using namespace VeyFM;

extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv)
{
    static QCoreApplication app(*argc, *argv);
    VFS::initialize();
    VFS::ptr();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const VFS* vfs = VFS::ptr();
    const QString text =
        QString::fromUtf8(reinterpret_cast<const char*>(data), static_cast<int>(size));

    const Entry entry = vfs->entry(text);
    vfs->normalizePath(text);
    vfs->parent(entry);
    vfs->pathEntryList(entry);
    vfs->urlsFromEntries({entry});
    return 0;
}
