// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any bytes to the stream form of FavouritePlaceList.

#include "recordstream.h"

#include "core/favouriteplace.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    readRecords<VeyFM::FavouritePlaceList>(data, size);
    return 0;
}
