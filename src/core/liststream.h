// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_LISTSTREAM_H
#define VEYFM_LISTSTREAM_H

#include <QDataStream>
#include <QIODevice>
#include <QList>

namespace VeyFM {

/**
 * Reads the stream form of QList<T> with the results of Qt's own operator: an element that can't
 * be read empties the list, and a stream that had failed before is read all the same and keeps
 * its old status.
 *
 * Qt's operator reserves room for as many elements as the stream announces, so that four bytes
 * of garbage ask for gigabytes. This one grows with what it has read.
 */
template <typename T>
QDataStream& readList(QDataStream& stream, QList<T>& list)
{
    const QDataStream::Status oldStatus = stream.status();
    if (!stream.device() || !stream.device()->isTransactionStarted()) {
        stream.resetStatus();
    }

    list.clear();
    quint32 count = 0;
    stream >> count;
    for (quint32 i = 0; i < count; ++i) {
        T element;
        stream >> element;
        if (stream.status() != QDataStream::Ok) {
            list.clear();
            break;
        }
        list.append(element);
    }

    if (oldStatus != QDataStream::Ok) {
        stream.resetStatus();
        stream.setStatus(oldStatus);
    }
    return stream;
}

} // namespace VeyFM

#endif
