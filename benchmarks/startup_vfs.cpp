// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// A program that starts and makes the first call of VFS::ptr().

#include "vfs/vfs.h"

#include <QCoreApplication>

int main(int argc, char** argv)
{
    const QCoreApplication application(argc, argv);
    VeyFM::VFS::initialize();
    return VeyFM::VFS::ptr()->rootEntry().isNull() ? 1 : 0;
}
