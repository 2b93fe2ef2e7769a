// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_ENDING_H
#define VEYFM_TOOL_ENDING_H

namespace VeyFM {
namespace Tool {

/**
 * To be called first in main(). A program that has caught a signal, to tidy up or to say that it
 * was interrupted, then dies of that signal all the same, behind the destructors of static objects.
 * A shell ends its loop only for a program that died of Ctrl-C, whatever the exit code.
 */
void dieOfCaughtSignals();

/// Says that a signal was caught; the first one counts. From its handler.
void noteCaughtSignal(int number);

/// Ends the program now, without any destructor: of the signal that was caught, else with the
/// code. From any thread.
[[noreturn]] void endAtOnce(int exitCode);

} // namespace Tool
} // namespace VeyFM

#endif
