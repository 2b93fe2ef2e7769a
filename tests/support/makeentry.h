// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_MAKEENTRY_H
#define VEYFM_TESTS_MAKEENTRY_H

#include "core/entry.h"

#include <QByteArray>
#include <QDataStream>

/// An entry of any content, on the road by which a stream hands one in.
inline VeyFM::Entry makeEntry(const QString& path, const QString& localPath, int type)
{
    QByteArray bytes;
    QDataStream writer(&bytes, QIODevice::WriteOnly);
    writer << path << localPath << qint32(type);
    QDataStream reader(bytes);
    VeyFM::Entry entry;
    reader >> entry;
    return entry;
}

inline VeyFM::Entry makeEntry(const char* path, const char* localPath, int type)
{
    return makeEntry(QString::fromUtf8(path), QString::fromUtf8(localPath), type);
}

inline VeyFM::Entry entryOfType(int type)
{
    return makeEntry("entry", "", type);
}

#endif
