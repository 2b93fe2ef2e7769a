// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_RECORDSTREAM_H
#define VEYFM_RECORDSTREAM_H

#include "fuzzing.h"

#include <QByteArray>
#include <QDataStream>

/**
 * Reads records of one type from the bytes of an input until they end, and checks that each comes
 * back when it is written. The record's == looks at its key alone, so bytes are compared.
 */
template <typename Record>
void readRecords(const std::uint8_t* data, std::size_t size)
{
    const auto written = [](const Record& record) {
        QByteArray bytes;
        QDataStream stream(&bytes, QIODevice::WriteOnly);
        stream << record;
        Fuzzing::require(stream.status() == QDataStream::Ok, "a record can be written");
        return bytes;
    };

    const QByteArray input =
        QByteArray::fromRawData(reinterpret_cast<const char*>(data), static_cast<int>(size));
    QDataStream stream(input);
    while (!stream.atEnd()) {
        const qint64 start = stream.device()->pos();
        Record record;
        stream >> record;
        const qint64 end = stream.device()->pos();
        Fuzzing::require(end > start, "a read moves on");

        // Readable also when the input ended within it.
        const QByteArray bytes = written(record);
        Record again;
        QDataStream back(bytes);
        back >> again;
        Fuzzing::require(back.status() == QDataStream::Ok, "what was written can be read");
        Fuzzing::require(back.atEnd(), "what was written is read to its end");
        Fuzzing::require(written(again) == bytes, "what was written comes back");

        if (stream.status() != QDataStream::Ok) {
            return;
        }
        Fuzzing::require(
            bytes == input.mid(static_cast<int>(start), static_cast<int>(end - start)),
            "a record that was read in full is written as it came");
    }
}

#endif
