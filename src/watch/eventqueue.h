// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_EVENTQUEUE_H
#define VEYFM_EVENTQUEUE_H

#include <QVarLengthArray>

#include <sys/inotify.h>

namespace VeyFM {

/// Events of an inotify descriptor that have been read and not looked at yet, the oldest first.
class EventQueue
{
public:
    /// Reads whatever waits at a descriptor that does not block, behind what is here already.
    /// The usual batch takes one read, and no allocation.
    void fill(int fd);

    /// The oldest event, which leaves the queue, or null. Valid until the next call.
    const inotify_event* take();

private:
    int append(int fd, int room);

    QVarLengthArray<char, 4096> m_bytes;
    int m_taken = 0; // in bytes
};

} // namespace VeyFM

#endif
