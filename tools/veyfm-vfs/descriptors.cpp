// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "descriptors.h"

#include <cstdlib>

#include <fcntl.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

void openStandardDescriptors()
{
    for (int descriptor = STDIN_FILENO; descriptor <= STDERR_FILENO; ++descriptor) {
        const bool isOpen = ::fcntl(descriptor, F_GETFD) != -1;
        // It gets this very number, as those below are open.
        if (!isOpen && ::open("/dev/null", O_RDWR) != descriptor) {
            std::abort();
        }
    }
}

} // namespace Tool
} // namespace VeyFM
