// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_TERMINAL_H
#define VEYFM_TOOL_TERMINAL_H

#include "core/entry.h"

#include <QString>

namespace VeyFM {
namespace Tool {

/**
 * The text with backslashes, control characters and the characters that turn the direction of
 * writing or break lines as `\n`, `\t`, ... or the octal numbers of their bytes. No two texts
 * look alike behind it.
 */
QString escaped(const QString& text);

/// Columns that the text takes on a terminal. Without control characters.
int displayWidth(const QString& text);

/// The text as far as so many columns hold it.
QString cutToWidth(const QString& text, int columns);

/// Columns of the terminal: the variable COLUMNS, the terminal of standard output, or 80.
int terminalWidth();

/// Columns of the terminal that a descriptor stands for as they are now, or 80.
int terminalWidth(int descriptor);

/// Whether the encoding of the locale is UTF-8.
bool isUtf8Locale();

/// Whether output to a terminal should have colours: by NO_COLOR and TERM.
bool environmentWantsColour();

/// The parameters of the SGR sequence for an entry, empty for none. Looks at the disk for links.
QByteArray colourOf(const Entry& entry);

/// The name in the colour, or as it is for an empty one.
QByteArray coloured(const QByteArray& name, const QByteArray& colour);

} // namespace Tool
} // namespace VeyFM

#endif
