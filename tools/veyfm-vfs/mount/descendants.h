// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_DESCENDANTS_H
#define VEYFM_TOOL_DESCENDANTS_H

#include <chrono>
#include <map>

#include <sys/types.h>

namespace VeyFM {
namespace Tool {

/**
 * To be called first in the program. Children stay with a process that runs another program, so
 * it may begin with some that it has not started. They and theirs are left alone in what follows.
 */
void leaveInheritedChildren();

/// Whether a process runs that this one has started, or that such a one has.
bool hasRunningDescendants();

/// What the children have used that this process has waited for. When it is more than before,
/// another one has ended. From any thread.
long usageOfEndedChildren();

/**
 * Ends the processes that this one has started, and those that they have. Each is asked to end
 * (SIGTERM) when it is first seen, and made to (SIGKILL) when it is still there a second later,
 * also if it has lost its parent meanwhile. What a process starts when it has been asked gets that
 * second in peace: sshfs runs fusermount3 at its end. Other processes are never touched.
 */
class Descendants
{
public:
    Descendants() = default;
    ~Descendants();

    /// Looks once. To be called again and again, since what has ended may be followed by another.
    void end();

private:
    Descendants(const Descendants&) = delete;
    Descendants& operator=(const Descendants&) = delete;

    using Clock = std::chrono::steady_clock;

    struct Seen
    {
        int handle;    ///< A pidfd: another process that gets the number is not meant.
        bool isHelper; ///< Of one that had been asked before.
        Clock::time_point asked;
    };

    void add(pid_t pid, bool isHelper);
    bool wasAsked(pid_t pid) const;

    std::map<pid_t, Seen> m_seen;
};

} // namespace Tool
} // namespace VeyFM

#endif
