// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_DESCENDANTS_H
#define VEYFM_MOUNT_DESCENDANTS_H

#include <vector>

#include <sys/types.h>

namespace VeyFM {
namespace Mount {

/**
 * All that runs below this process. As a child subreaper it gets whatever has lost its parent, so
 * nothing that a tool starts gets away: neither sshfs, which goes to the background, nor its ssh.
 *
 * SIGCHLD must be blocked. This process may begin with children of the program that it has
 * replaced; those, and theirs at that time, are left alone.
 */
class Descendants
{
public:
    /// Makes this process the subreaper, before it starts anything.
    Descendants();

    /**
     * Ends all but one of them, which may be 0: by SIGTERM, and after two seconds by SIGKILL. What
     * they start when they have been asked gets that time in peace, as does fusermount3, which
     * sshfs runs at its end. What does not even go then waits in the kernel for a file system, and
     * is left behind a second later.
     */
    void end(pid_t spared = 0);

    /// Takes note of children that have ended. Whether that one is among them.
    bool reap(pid_t child);

private:
    struct Process
    {
        pid_t pid;
        pid_t parent;
    };

    std::vector<Process> running(pid_t spared) const;
    bool hasNone(pid_t spared) const;
    static bool signal(const Process& process, int number);

    std::vector<pid_t> m_inherited;
};

} // namespace Mount
} // namespace VeyFM

#endif
