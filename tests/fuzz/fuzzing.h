// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FUZZING_H
#define VEYFM_FUZZING_H

#include <QString>

#include <cstddef>
#include <cstdint>

/**
 * What the fuzz targets share. fuzzing.cpp defines LLVMFuzzerInitialize(), which gives the process
 * an empty home of its own and no session bus; a target defines LLVMFuzzerTestOneInput().
 */
namespace Fuzzing {

/// Ends the process, with the message, where @p holds is false: the fuzzer keeps the input.
void require(bool holds, const char* what);

/**
 * The text of an input. As a rule it is UTF-8. Behind a first byte of 0xFF, which no UTF-8 has,
 * stand UTF-16 code units in the order of the machine: any of them, lone surrogates too.
 */
QString text(const std::uint8_t* data, std::size_t size);

} // namespace Fuzzing

#endif
