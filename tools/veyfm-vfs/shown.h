// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SHOWN_H
#define VEYFM_TOOL_SHOWN_H

#include <QJsonObject>
#include <QString>

namespace VeyFM {
namespace Tool {

// All that the program prints goes through one of these, so that no password of a URL is seen.

/**
 * A text without the passwords of the URLs in it, be they valid or not. A URL is what has "://";
 * all else stays as it is, such as the name of a file with a colon and an "@".
 */
QString shownText(const QString& text);

/// The same for what was typed, or is the path of an entry, and thus may be a URL without the "//".
QString shownLocation(const QString& text);

/// A line of JSON, without its end.
QByteArray shownJson(const QJsonObject& object);

} // namespace Tool
} // namespace VeyFM

#endif
