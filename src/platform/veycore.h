// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYCORE_H
#define VEYCORE_H

/**
 * @file
 * Stand-in for the platform library `libveycore`: where the user's directories are, and under
 * whose name settings are kept.
 */

/**
 * The directories of the user. Any int is a value of this type; only those named here are known
 * to GetVeyDir().
 */
enum _VeyDir : int {
    VeyDirDesktop = 6,   ///< What lies on the desktop.
    VeyDirDocuments = 7, ///< The user's documents.
    VeyDirTrash = 8      ///< The files in the trash, without the records of where they came from.
};

extern "C" {

/**
 * The absolute path of a directory of the user, NUL-terminated, in the local 8-bit encoding. The
 * directory need not exist, and is not created.
 *
 * Desktop and documents are those of `user-dirs.dirs` in the XDG configuration directory, or
 * `Desktop` and `Documents` in the home directory; the trash is `Trash/files` in the XDG data
 * directory. A setting that is no absolute path does not count. `HOME`, `XDG_CONFIG_HOME`,
 * `XDG_DATA_HOME` and the file are looked at in each call.
 *
 * The text belongs to this library, and is neither changed nor freed while the process lives:
 * each distinct path is kept once. May be called from any thread.
 *
 * @return A null pointer for a directory that is not known.
 */
const char* GetVeyDir(_VeyDir dir);

/**
 * The name of the organisation under which settings are kept, NUL-terminated. The text is never
 * freed. May be called from any thread.
 */
const char* GetOrganization();
}

#endif
