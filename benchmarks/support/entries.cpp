// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/entries.h"

#include <QDataStream>

#include <algorithm>
#include <random>

namespace Benchmarks {

VeyFM::EntryList entriesOf(const QStringList& paths)
{
    // The stream form is the one road on which a host can make an entry of anything.
    QByteArray bytes;
    QDataStream out(&bytes, QIODevice::WriteOnly);
    for (const QString& path : paths) {
        out << path << path << qint32(VeyFM::TypeFile);
    }
    VeyFM::EntryList result;
    result.reserve(paths.size());
    QDataStream in(bytes);
    for (int i = 0; i < paths.size(); ++i) {
        result.append(VeyFM::Entry());
        in >> result.last();
    }
    return result;
}

QStringList manyPaths(int first, int count)
{
    QStringList result;
    result.reserve(count);
    for (int i = first; i < first + count; ++i) {
        result.append(QStringLiteral("/home/user/Pictures/album-%1/picture-%2.jpg")
                          .arg(i / 1000, 4, 10, QLatin1Char('0'))
                          .arg(i, 7, 10, QLatin1Char('0')));
    }
    return result;
}

QStringList shuffled(QStringList paths)
{
    std::shuffle(paths.begin(), paths.end(), std::mt19937(1));
    return paths;
}

} // namespace Benchmarks
