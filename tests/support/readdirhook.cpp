// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/readdirhook.h"

#include <dlfcn.h>

namespace {

ReaddirHook::Hook currentHook;
ReaddirHook::Ending currentEnding = ReaddirHook::AsOnDisk;

dirent* readRecord(DIR* stream)
{
    using Readdir = dirent* (*)(DIR*);
    static const auto next = reinterpret_cast<Readdir>(::dlsym(RTLD_NEXT, "readdir"));
    dirent* record = next(stream);
    if (!record && currentEnding == ReaddirHook::Endless) {
        ::rewinddir(stream);
        record = next(stream);
    }
    if (currentHook) {
        currentHook(record);
    }
    return record;
}

} // namespace

void ReaddirHook::set(const Hook& hook, Ending ending)
{
    currentHook = hook;
    currentEnding = ending;
}

void ReaddirHook::clear()
{
    set(Hook());
}

extern "C" {

__attribute__((visibility("default"))) dirent* readdir(DIR* stream)
{
    return readRecord(stream);
}

} // extern "C"
