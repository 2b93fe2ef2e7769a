// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_LINEREADER_H
#define VEYFM_LINEREADER_H

#include <cstddef>
#include <memory>

#include <sys/types.h>

namespace VeyFM {
namespace MountProtocol {

/// A line without its end. It may be written to, as to read it in place.
struct Line
{
    char* data = nullptr;
    size_t size = 0;
};

/**
 * Cuts what comes through a pipe into lines. Since a line may be a password, its bytes are nowhere
 * but in one buffer, and overwritten there when the next line is asked for.
 *
 * A line that is too long can't be skipped: what follows is no line of the protocol.
 */
class LineReader
{
public:
    LineReader();
    ~LineReader();

    /// Where the next bytes are to be put, roomSize() at most; then added() is told how many. There
    /// is room as long as no line is ready and none was too long. What next() returned is gone. @{
    char* room();
    size_t roomSize() const;
    void added(size_t size);
    /// @}

    /// The same by one read(), again after a signal: what that returns; -1 without room.
    ssize_t readFrom(int descriptor);

    /// Takes the next line, which stands until anything else is called; false where there is none.
    bool next(Line* line);

    /// Whether what is next is longer than a line may be.
    bool isTooLong() const;

private:
    LineReader(const LineReader&) = delete;
    LineReader& operator=(const LineReader&) = delete;

    void eraseTaken();
    size_t lineEnd() const;

    const std::unique_ptr<char[]> m_buffer;
    size_t m_taken = 0; ///< Bytes of the line that was given out, at the begin.
    size_t m_size = 0;
};

} // namespace MountProtocol
} // namespace VeyFM

#endif
