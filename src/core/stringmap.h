// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_STRINGMAP_H
#define VEYFM_STRINGMAP_H

#include "core/entry.h"
#include "veyfmvfs_export.h"

#include <QMap>
#include <QMetaType>
#include <QString>

namespace VeyFM {

/**
 * A map of texts, in ascending order of its keys: share name to local path, or URL to local path.
 * It is a class so that it has a registered name of its own. Its D-Bus form is `a{ss}`, by the
 * map operators of QtDBus.
 */
class VEYFMVFS_EXPORT StringMap : public QMap<QString, QString>
{
public:
    using QMap<QString, QString>::QMap;
};

/// URL of a mount to its entry. D-Bus form `a{s(ssi)}`.
using StringEntryMap = QMap<QString, Entry>;

} // namespace VeyFM

Q_DECLARE_TYPEINFO(VeyFM::StringMap, Q_MOVABLE_TYPE);
Q_DECLARE_METATYPE(VeyFM::StringMap)
Q_DECLARE_METATYPE(VeyFM::StringEntryMap)

#endif
