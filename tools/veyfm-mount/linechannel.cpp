// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "linechannel.h"

#include <algorithm>
#include <cerrno>
#include <chrono>

#include <limits.h>
#include <poll.h>
#include <string.h>
#include <unistd.h>

namespace VeyFM {
namespace Mount {

namespace {

bool isWritable(int descriptor, int milliseconds)
{
    pollfd poll = {descriptor, POLLOUT, 0};
    return ::poll(&poll, 1, milliseconds) == 1;
}

} // namespace

LineChannel::LineChannel(int input, int output)
    : m_input(input)
    , m_output(output)
{
}

LineChannel::~LineChannel()
{
    drop();
}

int LineChannel::input() const
{
    return m_input;
}

int LineChannel::output() const
{
    return m_output;
}

bool LineChannel::read()
{
    return m_reader.readFrom(m_input) > 0;
}

bool LineChannel::next(MountProtocol::Line* line)
{
    return m_reader.next(line);
}

bool LineChannel::isTooLong() const
{
    return m_reader.isTooLong();
}

void LineChannel::send(const char* bytes, size_t size)
{
    // An empty password has no bytes, nor a place for them.
    if (size > 0) {
        m_unsent.emplace_back(bytes, bytes + size);
    }
}

bool LineChannel::hasUnsent() const
{
    return !m_unsent.empty();
}

bool LineChannel::write()
{
    while (hasUnsent() && isWritable(m_output, 0)) {
        std::vector<char>& first = m_unsent.front();
        // So much never waits where there is room at all.
        const size_t size = std::min(first.size() - m_sent, size_t(PIPE_BUF));
        const ssize_t written = ::write(m_output, first.data() + m_sent, size);
        if (written < 0 && errno != EINTR && errno != EAGAIN) {
            drop();
            return false;
        }
        m_sent += written > 0 ? size_t(written) : 0;
        if (m_sent == first.size()) {
            ::explicit_bzero(first.data(), first.size());
            m_unsent.pop_front();
            m_sent = 0;
        }
    }
    return true;
}

void LineChannel::flush(int milliseconds)
{
    using Clock = std::chrono::steady_clock;
    const auto latest = Clock::now() + std::chrono::milliseconds(milliseconds);
    while (hasUnsent() && Clock::now() < latest) {
        isWritable(m_output, 10);
        write();
    }
}

void LineChannel::drop()
{
    for (std::vector<char>& bytes : m_unsent) {
        ::explicit_bzero(bytes.data(), bytes.size());
    }
    m_unsent.clear();
    m_sent = 0;
}

} // namespace Mount
} // namespace VeyFM
