// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any text to VFS::normalizePath().

#include "fuzzing.h"

#include "vfs/vfs.h"

#include <QUrl>

using Fuzzing::require;
using VeyFM::VFS;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const VFS* vfs = VFS::ptr();
    const QLatin1Char slash('/');
    const QString text = Fuzzing::text(data, size);

    const QString once = vfs->normalizePath(text);
    if (text == slash || !QUrl(text).scheme().isEmpty()) {
        require(once == text, "the root and URLs are left alone");
        return 0;
    }

    if (!once.isEmpty()) {
        const QStringList sections = once.mid(once.startsWith(slash) ? 1 : 0).split(slash);
        for (const QString& section : sections) {
            require(!section.isEmpty(), "no section is empty");
            require(section != QLatin1String("."), "no section is a dot");
            require(section != QLatin1String(".."), "no section is a pair of dots");
        }
    }
    // A step up can only bring in the name of one place, and the longest is "Storage devices".
    require(once.size() <= text.size() + 15, "the result is no longer than its text and a place");

    // Once is not enough: "/usr/../etc" gives "File System/etc", and that gives "/etc".
    const QString twice = vfs->normalizePath(once);
    require(twice == once || !once.startsWith(slash), "an absolute result is final");
    require(vfs->normalizePath(twice) == twice, "the second result is final");
    return 0;
}
