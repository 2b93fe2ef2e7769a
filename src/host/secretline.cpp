// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/secretline.h"

#include "host/mountprotocol.h"

#include <algorithm>

#include <string.h>

namespace VeyFM {
namespace MountProtocol {

namespace {

constexpr size_t longestEscape = 6; // "\u0041"

int hexDigit(char c)
{
    if (c >= '0' && c <= '9') {
        return c - '0';
    }
    const char lower = char(c | 0x20);
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : -1;
}

/// Writes a code point as UTF-8. Behind it.
char* writeUtf8(char32_t code, char* to)
{
    const auto tail = [](char32_t bits) {
        return char(0x80 | (bits & 0x3f));
    };
    if (code < 0x80) {
        *to++ = char(code);
    } else if (code < 0x800) {
        *to++ = char(0xc0 | (code >> 6));
        *to++ = tail(code);
    } else if (code < 0x10000) {
        *to++ = char(0xe0 | (code >> 12));
        *to++ = tail(code >> 6);
        *to++ = tail(code);
    } else {
        *to++ = char(0xf0 | (code >> 18));
        *to++ = tail(code >> 12);
        *to++ = tail(code >> 6);
        *to++ = tail(code);
    }
    return to;
}

/// The length of the UTF-8 character that begins here, and whose bytes are not those of something
/// else; 0 for none.
size_t utf8Length(const char* at, size_t left)
{
    const auto byte = [at](size_t i) {
        return static_cast<unsigned char>(at[i]);
    };
    const unsigned char first = byte(0);
    const size_t length = first < 0x80                     ? 1
                          : first >= 0xc2 && first <= 0xdf ? 2
                          : (first & 0xf0) == 0xe0         ? 3
                          : first >= 0xf0 && first <= 0xf4 ? 4
                                                           : 0;
    if (length == 0 || length > left) {
        return 0;
    }
    for (size_t i = 1; i < length; ++i) {
        if ((byte(i) & 0xc0) != 0x80) {
            return 0;
        }
    }
    const bool isOverlong = (first == 0xe0 && byte(1) < 0xa0) || (first == 0xf0 && byte(1) < 0x90);
    const bool isSurrogate = first == 0xed && byte(1) >= 0xa0;
    const bool isBeyond = first == 0xf4 && byte(1) >= 0x90;
    return isOverlong || isSurrogate || isBeyond ? 0 : length;
}

/// Reads the inside of a JSON string, and writes it back over what was read, which is never
/// shorter.
class StringInside
{
public:
    StringInside(char* begin, size_t size)
        : m_from(begin)
        , m_to(begin)
        , m_end(begin + size)
    {
    }

    /// False where it is none.
    bool decode()
    {
        while (m_from != m_end) {
            const bool isRead = *m_from == '\\' ? readEscape() : copyCharacter();
            if (!isRead) {
                return false;
            }
        }
        return true;
    }

    /// Behind what was written.
    const char* end() const
    {
        return m_to;
    }

private:
    size_t left() const
    {
        return size_t(m_end - m_from);
    }

    bool copyCharacter()
    {
        const size_t length = utf8Length(m_from, left());
        if (length == 0 || *m_from == '"' || static_cast<unsigned char>(*m_from) < 0x20) {
            return false;
        }
        m_to = std::copy(m_from, m_from + length, m_to);
        m_from += length;
        return true;
    }

    /// The number of "\u0041", or -1.
    int readUnit()
    {
        if (left() < longestEscape || m_from[0] != '\\' || m_from[1] != 'u') {
            return -1;
        }
        int unit = 0;
        for (size_t i = 2; i < longestEscape; ++i) {
            const int digit = hexDigit(m_from[i]);
            if (digit < 0) {
                return -1;
            }
            unit = unit * 16 + digit;
        }
        m_from += longestEscape;
        return unit;
    }

    bool readCode()
    {
        const int unit = readUnit();
        if (unit < 0 || QChar::isLowSurrogate(uint(unit))) {
            return false;
        }
        if (!QChar::isHighSurrogate(uint(unit))) {
            m_to = writeUtf8(char32_t(unit), m_to);
            return true;
        }
        const int second = readUnit();
        if (second < 0 || !QChar::isLowSurrogate(uint(second))) {
            return false;
        }
        m_to = writeUtf8(QChar::surrogateToUcs4(ushort(unit), ushort(second)), m_to);
        return true;
    }

    bool readEscape()
    {
        if (left() < 2) {
            return false;
        }
        if (m_from[1] == 'u') {
            return readCode();
        }
        static constexpr char names[] = "\"\\/bfnrt";
        static constexpr char values[] = "\"\\/\b\f\n\r\t";
        const char* const name = ::strchr(names, m_from[1]);
        if (!name || *name == '\0') {
            return false;
        }
        *m_to++ = values[name - names];
        m_from += 2;
        return true;
    }

    char* m_from;
    char* m_to;
    const char* const m_end;
};

bool isControl(char c)
{
    const auto code = static_cast<unsigned char>(c);
    return (code < 0x20 && c != '\t') || code == 0x7f;
}

} // namespace

SecretLine::SecretLine(const QString& password)
    : m_capacity(size_t(password.size()) * longestEscape + sizeof "\"\"\n")
    , m_bytes(new char[m_capacity])
{
    char* to = m_bytes.get();
    *to++ = '"';
    for (int i = 0; i < password.size(); ++i) {
        const QChar c = password.at(i);
        const bool isPair =
            c.isHighSurrogate() && i + 1 < password.size() && password.at(i + 1).isLowSurrogate();
        if (isPair) {
            to = writeUtf8(QChar::surrogateToUcs4(c, password.at(++i)), to);
        } else if (
            c.unicode() < 0x20 || c == QLatin1Char('"') || c == QLatin1Char('\\') ||
            c.isSurrogate()) {
            static constexpr char digits[] = "0123456789abcdef";
            to = std::copy_n("\\u", 2, to);
            for (int shift = 12; shift >= 0; shift -= 4) {
                *to++ = digits[(c.unicode() >> shift) & 0xf];
            }
        } else {
            to = writeUtf8(c.unicode(), to);
        }
    }
    to = std::copy_n("\"\n", 2, to);
    m_size = size_t(to - m_bytes.get());
}

SecretLine::~SecretLine()
{
    ::explicit_bzero(m_bytes.get(), m_capacity);
}

const char* SecretLine::data() const
{
    return m_bytes.get();
}

size_t SecretLine::size() const
{
    return m_size;
}

QString decodeSecret(Line* line)
{
    if (line->size < 2 || line->data[0] != '"' || line->data[line->size - 1] != '"') {
        return QStringLiteral("a password is a line of its own with one JSON string");
    }
    StringInside inside(line->data + 1, line->size - 2);
    if (!inside.decode()) {
        return QStringLiteral("a password is no valid JSON string");
    }
    line->data += 1;
    line->size = size_t(inside.end() - line->data);
    if (line->size > longestPassword) {
        return QStringLiteral("a password can't be longer than %1 bytes").arg(longestPassword);
    }
    if (std::any_of(line->data, line->data + line->size, isControl)) {
        return QStringLiteral("a password can't hold a control character");
    }
    return QString();
}

void erase(QString* text)
{
    if (text->isDetached()) {
        ::explicit_bzero(text->data(), size_t(text->size()) * sizeof(QChar));
    }
}

} // namespace MountProtocol
} // namespace VeyFM
