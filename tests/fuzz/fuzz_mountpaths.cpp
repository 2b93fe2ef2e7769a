// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any URL to MountPaths.

#include "fuzzing.h"

#include "core/mountpaths.h"

using Fuzzing::require;
using VeyFM::MountPaths;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QUrl url(Fuzzing::text(data, size));
    const QString path = url.path(QUrl::FullyDecoded);
    const bool homeRelative = path.startsWith(QLatin1String("/~"));

    const QString root = MountPaths::mountRootUrl(url);
    const QString bare = url.toString(QUrl::RemovePath | QUrl::StripTrailingSlash);
    require(root.startsWith(bare), "the root begins with the URL without its path");
    require(
        root.mid(bare.size()) == QLatin1String(homeRelative ? "/~/" : "/"),
        "behind it stands where the mount begins");

    const QString relative = MountPaths::mountRootRelativePath(url);
    require(relative == (homeRelative ? path.mid(2) : path), "the path is cut, and no more");

    // Another path of the same half is of the same mount.
    QUrl sibling(url);
    sibling.setPath(homeRelative ? QStringLiteral("/~/x") : QStringLiteral("/x"));
    if (sibling.isValid() && url.isValid() && path.startsWith(QLatin1Char('/'))) {
        require(MountPaths::mountRootUrl(sibling) == root, "the mount is that of its neighbour");
    }
    return 0;
}
