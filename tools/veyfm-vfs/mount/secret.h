// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SECRET_H
#define VEYFM_TOOL_SECRET_H

#include <QString>

#include <algorithm>
#include <array>

#include <string.h>

namespace VeyFM {
namespace Tool {

/// A password, in one place of memory that is overwritten when it is no longer needed.
class Secret
{
public:
    Secret() = default;
    ~Secret()
    {
        clear();
    }

    /// Bytes that it holds at most.
    static constexpr size_t longest = 1024;

    /// Does nothing beyond the longest.
    void append(char byte)
    {
        m_isTooLong = m_size == longest;
        if (!m_isTooLong) {
            m_bytes[m_size++] = byte;
        }
    }

    void clear()
    {
        ::explicit_bzero(m_bytes.data(), m_bytes.size());
        m_size = 0;
        m_isTooLong = false;
    }

    /// Whether there was more than it holds.
    bool isTooLong() const
    {
        return m_isTooLong;
    }

    bool isEmpty() const
    {
        return m_size == 0;
    }

    /// Whether there is one that a terminal would take for more than a letter. A tab is none.
    bool holdsControlCharacter() const
    {
        return std::any_of(m_bytes.begin(), m_bytes.begin() + m_size, [](char byte) {
            const auto code = static_cast<unsigned char>(byte);
            return (code < 0x20 && byte != '\t') || code == 0x7f;
        });
    }

    /// Whether the encoding of the locale can express it.
    bool isText() const
    {
        QString read = text();
        QByteArray written = read.toLocal8Bit();
        const bool same = written.size() == int(m_size) &&
                          std::equal(written.cbegin(), written.cend(), m_bytes.cbegin());
        read.fill(QChar(QChar::Null));
        written.fill('\0');
        return same;
    }

    /// A copy, read in the encoding of the locale. It is out of reach of clear().
    QString text() const
    {
        return QString::fromLocal8Bit(m_bytes.data(), int(m_size));
    }

private:
    Q_DISABLE_COPY(Secret)

    std::array<char, longest> m_bytes = {};
    size_t m_size = 0;
    bool m_isTooLong = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
