// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/linereader.h"

#include "host/mountprotocol.h"

#include <cerrno>
#include <cstring>

#include <unistd.h>

namespace VeyFM {
namespace MountProtocol {

namespace {

constexpr size_t capacity = longestLine + 1; // With its end.

} // namespace

LineReader::LineReader()
    : m_buffer(new char[capacity])
{
}

LineReader::~LineReader()
{
    ::explicit_bzero(m_buffer.get(), capacity);
}

char* LineReader::room()
{
    eraseTaken();
    return m_buffer.get() + m_size;
}

size_t LineReader::roomSize() const
{
    return capacity - (m_size - m_taken);
}

void LineReader::added(size_t size)
{
    m_size += size;
}

ssize_t LineReader::readFrom(int descriptor)
{
    char* const begin = room();
    if (roomSize() == 0) {
        errno = EMSGSIZE;
        return -1;
    }
    ssize_t size = 0;
    do {
        size = ::read(descriptor, begin, roomSize());
    } while (size < 0 && errno == EINTR);
    if (size > 0) {
        added(size_t(size));
    }
    return size;
}

bool LineReader::next(Line* line)
{
    eraseTaken();
    const size_t end = lineEnd();
    if (end == m_size) {
        return false;
    }
    m_taken = end + 1;
    *line = {m_buffer.get(), end};
    return true;
}

bool LineReader::isTooLong() const
{
    return m_size - m_taken == capacity && lineEnd() == m_size;
}

void LineReader::eraseTaken()
{
    if (m_taken == 0) {
        return;
    }
    const size_t left = m_size - m_taken;
    std::memmove(m_buffer.get(), m_buffer.get() + m_taken, left);
    ::explicit_bzero(m_buffer.get() + left, m_taken);
    m_size = left;
    m_taken = 0;
}

/// Where the next line ends, or the end of all bytes.
size_t LineReader::lineEnd() const
{
    const char* const begin = m_buffer.get() + m_taken;
    const void* const found =
        m_size == m_taken ? nullptr : std::memchr(begin, '\n', m_size - m_taken);
    return found ? size_t(static_cast<const char*>(found) - m_buffer.get()) : m_size;
}

} // namespace MountProtocol
} // namespace VeyFM
