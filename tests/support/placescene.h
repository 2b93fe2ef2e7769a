// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_PLACESCENE_H
#define VEYFM_TESTS_PLACESCENE_H

#include "vfs/vfsplacebase.h"

#include <QDataStream>
#include <QObject>
#include <QStringList>

#include <functional>

inline QString operator""_s(const char16_t* text, std::size_t size)
{
    return QString::fromUtf16(text, int(size));
}

/// An entry of any content that is in no store of the test.
inline VeyFM::Entry
makePlace(const QString& path, int type = VeyFM::TypePlace, const QString& localPath = QString())
{
    return VeyFM::VFSPlaceBase().createPlace(path, type, localPath);
}

/// An entry that is no place, as a directory has them.
inline VeyFM::Entry makeDir(const QString& path)
{
    return makePlace(path, VeyFM::TypeDir, path);
}

/// The stored fields as one text. Entry::localPath() would compute a missing local path.
inline QString fields(const VeyFM::Entry& entry)
{
    QByteArray bytes;
    QDataStream writer(&bytes, QIODevice::WriteOnly);
    writer << entry;
    QDataStream stream(bytes);
    QString path;
    QString localPath;
    qint32 type = -1;
    stream >> path >> localPath >> type;
    return QStringLiteral("%1|%2|%3").arg(path, localPath, QString::number(type));
}

/// Owner of the slots that fill pending places. It notes each call, and then does `work`.
class PlaceFiller : public QObject
{
    Q_OBJECT

public:
    QStringList filled;
    QStringList filledOtherwise;
    std::function<void(const QString&)> work;

private Q_SLOTS:
    // Private and reached by name.
    void fill(const QString& path)
    {
        filled.append(path);
        if (work) {
            work(path);
        }
    }

    void fillOtherwise(const QString& path)
    {
        filledOtherwise.append(path);
    }
};

#endif
