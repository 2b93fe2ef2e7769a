// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/servicesignals.h"
#include "vfs/standardpaths.h"
#include "vfs/vfs_p.h"

#include <QDir>

namespace VeyFM {

VFSPrivate::VFSPrivate(VFS* vfs)
    : q(vfs)
    , entryWatcher(vfs)
{
}

VFSPrivate::~VFSPrivate() = default;

void VFSPrivate::initialize()
{
    const QString none;
    // A place is called what its user reads. The root alone, which no user is meant to see, has
    // one name everywhere.
    rootEntry = placeBase.createPlace(QStringLiteral("_"), TypePlace, none);
    placesEntry = placeBase.createPlace(VFS::tr("Places"), TypePlace, none);
    computerEntry = placeBase.createPlace(VFS::tr("Computer"), TypeComputerPlace, none);
    favouritesEntry = placeBase.createPlace(VFS::tr("Favourites"), TypeFavouritesPlace, none);
    storageDevicesEntry = placeBase.createPendingPlace(
        VFS::tr("Storage devices"), TypeStorageDevicesPlace, q, "_q_createStoragePlaces");
    desktopEntry = placeBase.createPlace(
        VFS::tr("Desktop"), TypeDesktopDirPlace, StandardPaths::desktopDirPath());
    trashEntry =
        placeBase.createPlace(VFS::tr("Trash"), TypeTrashDirPlace, StandardPaths::trashDirPath());
    homeEntry = placeBase.createPlace(VFS::tr("Home"), TypeHomeDirPlace, QDir::homePath());
    fileSystemEntry = placeBase.createPlace(
        VFS::tr("File System"), TypeFileSystemRootPlace, StandardPaths::fileSystemRootPath());

    for (const Entry& entry : {favouritesEntry, computerEntry}) {
        addEntryToPlace(entry, rootEntry, false);
    }
    for (const Entry& entry :
         {homeEntry, desktopEntry, trashEntry, storageDevicesEntry, fileSystemEntry}) {
        addEntryToPlace(entry, computerEntry, false);
    }
    if (favouritePlacesManager) {
        const QList<FavouritePlace> favourites = favouritePlacesManager->favouritePlaces();
        for (const FavouritePlace& place : favourites) {
            addFavouritePlace(place, false);
        }
        follow(
            favouritePlacesManager, &FavouritePlacesManagerProxy::favouritePlaceAdded,
            &VFSPrivate::_q_favouritePlaceAdded);
        follow(
            favouritePlacesManager, &FavouritePlacesManagerProxy::favouritePlaceRemoved,
            &VFSPrivate::_q_favouritePlaceRemoved);
    }
    if (const auto fileSystem = fileSystemInterface.toStrongRef()) {
        followService(
            *fileSystem, SIGNAL(notifyWatchersSignal(VeyFM::EntryList)), q,
            SLOT(_q_serviceNotifyWatchers(VeyFM::EntryList)));
    }
    for (const Entry& entry :
         {favouritesEntry, homeEntry, desktopEntry, trashEntry, fileSystemEntry,
          storageDevicesEntry}) {
        addEntryToPlace(entry, placesEntry, false);
    }

    initializeNetwork();

    // An ordinary directory, not a place: there is none while the user has no such directory.
    documentsEntry = q->entry(StandardPaths::documentsDirPath());
}

} // namespace VeyFM
