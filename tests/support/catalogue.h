// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_CATALOGUE_H
#define VEYFM_TESTS_CATALOGUE_H

#include <QByteArray>
#include <QDataStream>
#include <QMap>
#include <QString>

// What lrelease writes, for a few texts of one context. @{

inline quint32 catalogueHash(const QByteArray& source)
{
    quint32 hash = 0;
    for (const char c : source) {
        hash = (hash << 4) + uchar(c);
        const quint32 top = hash & 0xf0000000;
        hash ^= top >> 24;
        hash &= ~top;
    }
    return hash == 0 ? 1 : hash;
}

inline QByteArray catalogue(const QByteArray& context, const QMap<QByteArray, QString>& texts)
{
    enum Section : quint8 { Hashes = 0x42, Messages = 0x69 };
    enum Tag : quint8 { End = 1, Translation = 3, SourceText = 6, Context = 7 };

    QByteArray messages;
    QDataStream message(&messages, QIODevice::WriteOnly);
    QMap<quint32, quint32> offsets;
    for (auto text = texts.begin(); text != texts.end(); ++text) {
        offsets.insert(catalogueHash(text.key()), quint32(messages.size()));
        // The stream's own form of a string is the one that is wanted.
        message << quint8(Translation) << text.value();
        message << quint8(SourceText) << text.key() << quint8(Context) << context << quint8(End);
    }
    QByteArray hashes;
    QDataStream hash(&hashes, QIODevice::WriteOnly);
    for (auto offset = offsets.begin(); offset != offsets.end(); ++offset) {
        hash << offset.key() << offset.value();
    }

    QByteArray result = QByteArray::fromHex("3cb86418caef9c95cd211cbf60a1bddd");
    QDataStream stream(&result, QIODevice::Append);
    stream << quint8(Hashes) << hashes << quint8(Messages) << messages;
    return result;
}

// @}

#endif
