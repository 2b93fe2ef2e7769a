// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/readdirhook.h"

#include <cerrno>

#include <dlfcn.h>

namespace {

ReaddirHook::Hook currentHook;
ReaddirHook::Ending currentEnding = ReaddirHook::AsOnDisk;
ReaddirHook::Failure currentFailure;

// Whether the call fails, with errno set.
bool fails(ReaddirHook::Call call)
{
    const int error = currentFailure ? currentFailure(call) : 0;
    if (error != 0) {
        errno = error;
    }
    return error != 0;
}

dirent* readRecord(DIR* stream)
{
    using Readdir = dirent* (*)(DIR*);
    static const auto next = reinterpret_cast<Readdir>(::dlsym(RTLD_NEXT, "readdir"));
    if (fails(ReaddirHook::Read)) {
        return nullptr;
    }
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

DIR* openStream(const char* path)
{
    using Opendir = DIR* (*)(const char*);
    static const auto open = reinterpret_cast<Opendir>(::dlsym(RTLD_NEXT, "opendir"));
    return fails(ReaddirHook::Open) ? nullptr : open(path);
}

} // namespace

void ReaddirHook::set(const Hook& hook, Ending ending)
{
    currentHook = hook;
    currentEnding = ending;
}

void ReaddirHook::setFailure(const Failure& failure)
{
    currentFailure = failure;
}

void ReaddirHook::clear()
{
    set(Hook());
    setFailure(Failure());
}

extern "C" {

__attribute__((visibility("default"))) dirent* readdir(DIR* stream)
{
    return readRecord(stream);
}

__attribute__((visibility("default"))) DIR* opendir(const char* path)
{
    return openStream(path);
}

} // extern "C"
