// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_URLPARSING_H
#define VEYFM_URLPARSING_H

#include <QString>
#include <QUrl>

namespace VeyFM {

/**
 * What QUrl makes of a text, found in time that grows with its length. QUrl itself puts every
 * host into another form to look at it, which takes the square of that time for one of many
 * letters that are not ASCII.
 */
namespace UrlParsing {

/// QUrl(text).scheme().
QString scheme(const QString& text);

/**
 * Whether a URL's host is so long that it is none, in the eyes of QUrl too. There are others that
 * are too long, which QUrl finds out soon.
 */
bool hasOverlongHost(const QString& text);

/// QUrl(text), in tolerant mode.
QUrl url(const QString& text);

} // namespace UrlParsing
} // namespace VeyFM

#endif
