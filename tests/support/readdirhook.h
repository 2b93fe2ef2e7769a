// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_READDIRHOOK_H
#define VEYFM_TESTS_READDIRHOOK_H

#include <functional>

#include <dirent.h>

/**
 * Stands between the library and opendir(3) and readdir(3) in a test that is linked with
 * readdirhook.cpp: the program's own functions come before those of the C library. So a test can
 * bring about at will what a disk does rarely: records of unknown kind, a directory without end,
 * an error, a stop at a certain record.
 */
namespace ReaddirHook {

/// Gets each record, null behind the last one. It may change the record.
using Hook = std::function<void(dirent*)>;

enum Ending {
    AsOnDisk,
    Endless ///< Behind the last record the directory begins anew.
};

enum Call { Open, Read };

/// Asked before each call: the number of the error with which it fails, or 0.
using Failure = std::function<int(Call)>;

/// Not while a directory is being read. @{
void set(const Hook& hook, Ending ending = AsOnDisk);
void setFailure(const Failure& failure);
void clear();
/// @}

/// As file systems do that do not keep the kind of an entry with its name.
inline void hideKind(dirent* record)
{
    if (record) {
        record->d_type = DT_UNKNOWN;
    }
}

} // namespace ReaddirHook

#endif
