// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any text to VFS::entry(), and the entry to what goes on with it.

#include "fuzzing.h"

#include "vfs/vfs.h"

#include <QFileInfo>

using namespace VeyFM;
using Fuzzing::require;

namespace {

void checkOnDisk(const Entry& entry)
{
    const QString local = entry.localPath();
    require(local.startsWith(QLatin1Char('/')), "what is no place and no URL has a local path");
    const QFileInfo info(local);
    const bool link = info.isSymLink();
    int type = TypeNone;
    if (info.isDir()) {
        type = link ? TypeDirLink : TypeDir;
    } else if (info.isFile()) {
        type = link ? TypeFileLink : TypeFile;
    }
    require(entry.type() == type, "the type is that of the disk");

    // Not the path: "File System/etc" comes back as "/etc", and "Computer/Desktop" as the place.
    const Entry again = VFS::ptr()->entry(entry.path());
    require(again.localPath() == local, "the path of an entry leads to the same file");
    require(again.type() == type || again.isPlace(), "the path of an entry leads to the same type");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const VFS* vfs = VFS::ptr();
    const QString text = Fuzzing::text(data, size);

    const Entry entry = vfs->entry(text);
    require(vfs->localPath(text) == entry.localPath(), "both ways to the local path agree");
    if (entry.isNull()) {
        require(entry.localPath().isEmpty(), "a null entry has no local path");
        require(entry.type() == TypeNone, "a null entry has no type");
        require(vfs->parent(entry).isNull(), "a null entry has no parent");
    } else if (entry.isCustomUrl() || entry.isFuseUrl()) {
        require(entry.path() == text, "a URL is carried as it came");
        require(entry.localPath().isEmpty(), "a URL has no local path");
    } else if (entry.isPlace()) {
        require(vfs->entry(entry.path()) == entry, "the path of a place leads to the place");
    } else {
        checkOnDisk(entry);
    }

    const EntryList chain = vfs->pathEntryList(entry);
    require(chain.isEmpty() == entry.isNull(), "an entry ends its chain of parents");
    require(chain.isEmpty() || chain.last() == entry, "an entry ends its chain of parents");
    require(vfs->urlsFromEntries({entry}).size() <= 1, "an entry has one URL or none");

    vfs->isPlaceRelativeEntry(entry);
    vfs->isEntryExists(entry);
    vfs->hasChilds(entry);
    vfs->getUrlForEntry(entry);
    vfs->createEntryForUrl(text, QString());
    vfs->placeRelatedEntry(entry);
    vfs->symLinkTargetEntry(entry);
    vfs->exploreParentPlacesHistory(text);
    vfs->child(vfs->homeEntry(), text);
    vfs->child(entry, text);
    return 0;
}
