// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/eventqueue.h"

#include <algorithm>
#include <climits>

#include <sys/ioctl.h>
#include <unistd.h>

namespace VeyFM {

namespace {

constexpr int UsualBatch = 4096;
constexpr int LargestEvent = sizeof(inotify_event) + NAME_MAX + 1;

} // namespace

void EventQueue::fill(int fd)
{
    // A read gives as many whole events as fit. Where one more would have fitted, none waits.
    if (append(fd, UsualBatch) > UsualBatch - LargestEvent) {
        int waiting = 0;
        ioctl(fd, FIONREAD, &waiting);
        if (waiting > 0) {
            append(fd, waiting);
        }
    }
}

const inotify_event* EventQueue::take()
{
    if (m_taken == m_bytes.size()) {
        m_taken = 0;
        m_bytes.clear();
        m_bytes.squeeze();
        return nullptr;
    }
    const auto* event = reinterpret_cast<const inotify_event*>(m_bytes.constData() + m_taken);
    m_taken += int(sizeof(inotify_event) + event->len);
    return event;
}

// How many bytes came.
int EventQueue::append(int fd, int room)
{
    const int size = m_bytes.size();
    m_bytes.resize(size + room);
    const ssize_t got = read(fd, m_bytes.data() + size, size_t(room));
    m_bytes.resize(size + std::max(0, int(got)));
    return int(got);
}

} // namespace VeyFM
