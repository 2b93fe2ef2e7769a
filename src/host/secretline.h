// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SECRETLINE_H
#define VEYFM_SECRETLINE_H

#include "host/linereader.h"

#include <QString>

#include <cstddef>
#include <memory>

namespace VeyFM {
namespace MountProtocol {

/// A password as a line of the protocol, with its end: one JSON string. Overwritten when it goes.
class SecretLine
{
public:
    explicit SecretLine(const QString& password);
    ~SecretLine();

    const char* data() const;
    size_t size() const;

private:
    SecretLine(const SecretLine&) = delete;
    SecretLine& operator=(const SecretLine&) = delete;

    const size_t m_capacity;
    const std::unique_ptr<char[]> m_bytes;
    size_t m_size = 0;
};

/**
 * Reads the password of a line in place: then the line is its UTF-8, without an end. Returns why it
 * is none, or empty; never a part of it.
 */
QString decodeSecret(Line* line);

/// Overwrites the characters of a text, where no other shares them.
void erase(QString* text);

} // namespace MountProtocol
} // namespace VeyFM

#endif
