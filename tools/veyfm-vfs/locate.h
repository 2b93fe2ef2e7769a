// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_LOCATE_H
#define VEYFM_TOOL_LOCATE_H

#include "core/entry.h"

#include <QString>

namespace VeyFM {
namespace Tool {

/// An entry, or the reason why there is none.
struct Located
{
    Entry entry;
    QString why; ///< Empty exactly when the entry can be used.
};

/// Any text to its entry, whether that exists or not.
Located resolveText(const QString& text);

/// As resolveText(), for what is there: a place, something on the disk, or a URL.
Located locate(const QString& text);

/// Why the directory of an entry can't be read; empty when it can, or when it has none.
QString whyUnreadable(const Entry& entry);

} // namespace Tool
} // namespace VeyFM

#endif
