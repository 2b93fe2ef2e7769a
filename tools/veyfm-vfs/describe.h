// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_DESCRIBE_H
#define VEYFM_TOOL_DESCRIBE_H

#include "core/entry.h"

#include <QJsonObject>
#include <QString>

namespace VeyFM {
namespace Tool {

/// A word for a type number, such as "directory" or "samba-share"; "unknown" for what has none.
QString typeName(int type);

/// The path, without the password of one that is a URL.
QString shownPath(const Entry& entry);

/// The last section of that: what a listing shows.
QString shownName(const Entry& entry);

/// What the entry itself holds: name, path, localPath, type, typeName. No look at the disk.
QJsonObject toJson(const Entry& entry);

/// Seconds since the epoch as local time with its offset in ISO 8601; empty for -1.
QString isoTime(qint64 seconds);

/// The URL that leads back to the entry; empty when its directory has gone. Without a password.
QString urlOf(const Entry& entry);

/// The URL of what is mounted there, or empty. Without a password.
QString networkUrlOf(const Entry& entry);

/// The text, or null for an empty one.
QJsonValue textOrNull(const QString& text);

/// Whether the entry is a place whose children are made when somebody first looks. That is
/// slow, and asks the service.
bool opensOnFirstLook(const Entry& entry);

/// Whether its children may include the content of a directory.
bool hasDirectory(const Entry& entry);

} // namespace Tool
} // namespace VeyFM

#endif
