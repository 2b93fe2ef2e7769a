// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/metatypes.h"

#include "core/entrylist.h"
#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "core/storagedeviceinfo.h"
#include "core/storageplace.h"
#include "core/stringmap.h"

#include <QDBusMetaType>

namespace VeyFM {

namespace {

template <typename T>
void registerForBus(const char* name)
{
    qRegisterMetaType<T>(name);
    qDBusRegisterMetaType<T>();
}

} // namespace

void registerMetaTypes()
{
    // Signals and slots within the namespace spell these names bare, and a queued connection that
    // is made by their text finds a type by nothing else.
    qRegisterMetaType<Entry>("Entry");
    qRegisterMetaType<EntryList>("EntryList");
    qRegisterMetaType<StringMap>("StringMap");
    qRegisterMetaType<FavouritePlace>("FavouritePlace");
    qRegisterMetaType<NetworkPlace>("NetworkPlace");
    qRegisterMetaType<StoragePlace>("StoragePlace");

    // A record comes before the list of it, whose signature is made from that of the record.
    registerForBus<Entry>("VeyFM::Entry");
    registerForBus<EntryList>("VeyFM::EntryList");
    registerForBus<StringMap>("VeyFM::StringMap");
    registerForBus<StringEntryMap>("VeyFM::StringEntryMap");
    registerForBus<FavouritePlace>("VeyFM::FavouritePlace");
    registerForBus<FavouritePlaceList>("VeyFM::FavouritePlaceList");
    registerForBus<NetworkPlace>("VeyFM::NetworkPlace");
    registerForBus<NetworkPlaceList>("VeyFM::NetworkPlaceList");
    registerForBus<StoragePlace>("VeyFM::StoragePlace");
    registerForBus<StoragePlaceList>("VeyFM::StoragePlaceList");
    registerForBus<StorageDeviceInfo>("VeyFM::StorageDeviceInfo");

    // Storage and the string maps have no stream form.
    qRegisterMetaTypeStreamOperators<Entry>("VeyFM::Entry");
    qRegisterMetaTypeStreamOperators<FavouritePlace>("VeyFM::FavouritePlace");
    qRegisterMetaTypeStreamOperators<FavouritePlaceList>("VeyFM::FavouritePlaceList");
    qRegisterMetaTypeStreamOperators<NetworkPlace>("VeyFM::NetworkPlace");
    qRegisterMetaTypeStreamOperators<NetworkPlaceList>("VeyFM::NetworkPlaceList");
}

} // namespace VeyFM
