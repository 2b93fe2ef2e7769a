// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_CLIENTRECORDS_H
#define VEYFM_TESTS_CLIENTRECORDS_H

// What a client that is generated from the introspection files has to include.
#include "core/entrylist.h"
#include "core/favouriteplace.h"
#include "core/networkplace.h"
#include "core/storagedeviceinfo.h"
#include "core/storageplace.h"
#include "core/stringmap.h"

#endif
