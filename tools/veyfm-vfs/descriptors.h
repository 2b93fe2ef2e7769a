// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_DESCRIPTORS_H
#define VEYFM_TOOL_DESCRIPTORS_H

namespace VeyFM {
namespace Tool {

/**
 * To be called in main() before anything opens a file. Standard descriptors that are closed are
 * opened on /dev/null: else the next file takes the number, and what is meant for standard output
 * goes into the connection to the bus, say.
 */
void openStandardDescriptors();

} // namespace Tool
} // namespace VeyFM

#endif
