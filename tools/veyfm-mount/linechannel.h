// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_LINECHANNEL_H
#define VEYFM_MOUNT_LINECHANNEL_H

#include "host/linereader.h"

#include <deque>
#include <vector>

namespace VeyFM {
namespace Mount {

/**
 * Lines in both directions, without ever waiting: what can't be written at once is kept. What was
 * written or read is overwritten, since it may be a password.
 *
 * The descriptors stay the caller's, and may block.
 */
class LineChannel
{
public:
    LineChannel(int input, int output);
    ~LineChannel();

    int input() const;
    int output() const;

    /// Reads what is there; to be called when there is something. False at the end.
    bool read();

    /// See LineReader. @{
    bool next(MountProtocol::Line* line);
    bool isTooLong() const;
    /// @}

    /// Keeps bytes for write().
    void send(const char* bytes, size_t size);

    bool hasUnsent() const;

    /// Writes what can be written now. False when nobody reads any more; nothing is unsent then.
    bool write();

    /// The same until all is written, for a time at most.
    void flush(int milliseconds);

private:
    LineChannel(const LineChannel&) = delete;
    LineChannel& operator=(const LineChannel&) = delete;

    void drop();

    const int m_input;
    const int m_output;
    MountProtocol::LineReader m_reader;
    std::deque<std::vector<char>> m_unsent;
    size_t m_sent = 0; ///< Of the first.
};

} // namespace Mount
} // namespace VeyFM

#endif
