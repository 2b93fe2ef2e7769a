// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYSU_H
#define VEYSU_H

#include <QByteArray>
#include <QList>

#include <memory>

/**
 * @file
 * Stand-in for the platform library `libveysu`: a tool that believes a person sits before it.
 */

namespace VeySu {

class PtyProcessPrivate;

/**
 * A child process on a pseudo-terminal of its own, for tools that ask for passwords on a terminal
 * and nowhere else.
 *
 * One object holds one child at a time and may be used again when that has ended. Nothing here
 * needs an event loop. An object may be used from any thread, but from one at a time. Needs Linux
 * 5.3 or newer.
 */
class PtyProcess
{
public:
    PtyProcess();

    /**
     * Closes the terminal and waits for the child. One that still runs is told to end (SIGTERM),
     * and after half a second is made to (SIGKILL); what it has put into the background by then
     * goes on.
     */
    virtual ~PtyProcess();

    /**
     * Starts @p command with @p args (its own name comes before them by itself) on a new
     * pseudo-terminal, which is its controlling terminal and its three standard streams. There is
     * no shell: a command without a slash is looked up on `PATH`, and arguments reach it as they
     * are, up to a NUL byte.
     *
     * The terminal echoes and edits lines, as a fresh one does, but does not post-process output:
     * `\n` stays `\n`. The child inherits the environment and the working directory, and no other
     * descriptor. Its signals are as a login leaves them, but for SIGHUP, which is ignored, so
     * that a helper of a tool that goes to the background outlives the session leader.
     *
     * A child from before that still runs is ended as by the destructor, and its output and its
     * terminal are gone.
     *
     * @return 0, or -1 when nothing was started. Then, and when the file turns out not to be
     * executable, readAll() gives nothing and waitForChild() gives 127.
     */
    int exec(const QByteArray& command, const QList<QByteArray>& args);

    /**
     * What the child has printed and nobody has read yet.
     *
     * With @p block, waits for output without a bound, then gathers what keeps coming with pauses
     * of less than 10 ms, so that a question printed in pieces arrives whole. Gathering ends after
     * 250 ms or 64 KiB; the rest is for the next call. An empty result is the end of the child's
     * side: the child has ended, or closed the terminal. Helpers that it left in the background
     * with the terminal open do not count.
     *
     * Without @p block, returns at once, and an empty result may also mean that there is nothing
     * yet.
     */
    QByteArray readAll(bool block);

    /**
     * Our side of the terminal, for write(); -1 before the first exec() and when nothing was
     * started. The object owns it. It stays open when the child ends, until the next exec().
     */
    int fd() const;

    /**
     * Waits until the child has switched the echo of the terminal off, as tools do to take a
     * password: some print the question first, and what is written before shows up in their output
     * or is dropped.
     *
     * @return 0 when the echo is off; -1 when it is still on after two seconds, when the child
     * ends before, or when there is none.
     */
    int WaitSlave();

    /**
     * Waits for the end of the child, without a bound. It is not held up by output that nobody
     * reads: the last 64 KiB of that are kept for readAll().
     *
     * @return Its exit code, or 128 and the number of the signal that ended it; 127 when it could
     * not be started, or when the host ignores SIGCHLD and the status is lost. Later calls give
     * the same again, until the next exec().
     */
    int waitForChild();

private:
    PtyProcess(const PtyProcess&) = delete;
    PtyProcess& operator=(const PtyProcess&) = delete;

    std::unique_ptr<PtyProcessPrivate> const d_ptr;
};

} // namespace VeySu

#endif
