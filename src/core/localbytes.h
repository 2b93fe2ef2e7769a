// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_LOCALBYTES_H
#define VEYFM_LOCALBYTES_H

#include <QByteArray>
#include <QString>
#include <QVarLengthArray>

#include <cstring>

namespace VeyFM {

/**
 * A path in the encoding of the system, for one system call. Plain ASCII, which is the same in
 * every local encoding, is copied to the stack without a codec and without an allocation.
 */
class LocalBytes
{
public:
    explicit LocalBytes(const QString& path)
    {
        const int size = path.size();
        m_bytes.resize(size + 1);
        // Locals: what is written as char could alias a member, and the loop would crawl.
        char* const bytes = m_bytes.data();
        const ushort* const units = path.utf16();
        ushort all = 0;
        for (int i = 0; i < size; ++i) {
            all |= units[i];
            bytes[i] = char(units[i]);
        }
        bytes[size] = '\0';
        if (all >= 0x80) {
            const QByteArray encoded = path.toLocal8Bit();
            m_bytes.resize(0);
            m_bytes.append(encoded.constData(), encoded.size() + 1);
        }
        m_holdsNul = std::strlen(m_bytes.constData()) != size_t(m_bytes.size() - 1);
    }

    /// Whether the system can take this path at all: it ends a path at the first NUL.
    bool isUsable() const
    {
        return !m_holdsNul;
    }

    const char* data() const
    {
        return m_bytes.constData();
    }

private:
    QVarLengthArray<char, 512> m_bytes;
    bool m_holdsNul;
};

} // namespace VeyFM

#endif
