// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "veysu.h"

#include "ptylaunch.h"

#include <QDeadlineTimer>

#include <cerrno>
#include <csignal>
#include <poll.h>
#include <sys/wait.h>
#include <termios.h>
#include <utility>

namespace VeySu {

namespace {

constexpr int PauseMs = 10;
constexpr int GatherMs = 250;
constexpr int ChunkBytes = 64 * 1024;
constexpr int EchoOffMs = 2000;
constexpr int EchoCheckMs = 10;
constexpr int TermMs = 500;

/// poll() that signals do not interrupt. A negative time has no bound, as in poll().
int pollForInput(pollfd* fds, nfds_t count, int timeoutMs)
{
    const QDeadlineTimer deadline(timeoutMs);
    int ready = -1;
    do {
        ready = poll(fds, count, int(deadline.remainingTime()));
    } while (ready < 0 && errno == EINTR);
    return ready;
}

bool hasInput(int fd, int timeoutMs)
{
    pollfd wanted = {fd, POLLIN, 0};
    return pollForInput(&wanted, 1, timeoutMs) > 0;
}

int exitStatus(int waitStatus)
{
    return WIFSIGNALED(waitStatus) ? 128 + WTERMSIG(waitStatus) : WEXITSTATUS(waitStatus);
}

} // namespace

class PtyProcessPrivate
{
public:
    ~PtyProcessPrivate()
    {
        endChild();
    }

    bool childEnded(int timeoutMs) const
    {
        return hasInput(child.handle.get(), timeoutMs);
    }

    bool waitForOutput() const;
    bool readInto(QByteArray& output) const;
    void reap();
    void endChild();

    PtyChild child;
    QByteArray unread; ///< Taken from the terminal while waiting for the child's end.
    int status = NotStartedStatus;
};

/// False at the end of the child's side.
bool PtyProcessPrivate::waitForOutput() const
{
    pollfd wanted[] = {{child.master.get(), POLLIN, 0}, {child.handle.get(), POLLIN, 0}};
    if (pollForInput(wanted, 2, -1) <= 0) {
        return false;
    }
    // Once more, for what was printed between the two looks. The end of the terminal alone would
    // not do: a helper in the background that holds it open, as its standard error say, would
    // keep it from coming.
    return wanted[0].revents != 0 || hasInput(child.master.get(), 0);
}

/// One read; false at the end, which a terminal without a child tells as EIO.
bool PtyProcessPrivate::readInto(QByteArray& output) const
{
    char buffer[4096];
    ssize_t count = -1;
    do {
        count = read(child.master.get(), buffer, sizeof buffer);
    } while (count < 0 && errno == EINTR);
    if (count <= 0) {
        return false;
    }
    output.append(buffer, int(count));
    return true;
}

void PtyProcessPrivate::reap()
{
    int waitStatus = 0;
    pid_t waited = -1;
    do {
        waited = waitpid(child.pid, &waitStatus, 0);
    } while (waited < 0 && errno == EINTR);
    status = waited == child.pid ? exitStatus(waitStatus) : NotStartedStatus;
    child.pid = -1;
}

void PtyProcessPrivate::endChild()
{
    child.master = UniqueFd();
    if (child.pid < 0) {
        return;
    }
    // The process alone and not its group, which may hold helpers of what went to the background.
    if (!childEnded(0)) {
        kill(child.pid, SIGTERM);
    }
    if (!childEnded(TermMs)) {
        kill(child.pid, SIGKILL);
    }
    reap();
}

PtyProcess::PtyProcess()
    : d_ptr(std::make_unique<PtyProcessPrivate>())
{
}

PtyProcess::~PtyProcess() = default;

int PtyProcess::exec(const QByteArray& command, const QList<QByteArray>& args)
{
    d_ptr->endChild();
    d_ptr->unread.clear();
    d_ptr->status = NotStartedStatus;
    d_ptr->child = launchOnPty(command, args);
    return d_ptr->child.pid < 0 ? -1 : 0;
}

QByteArray PtyProcess::readAll(bool block)
{
    QByteArray output = std::exchange(d_ptr->unread, QByteArray());
    const int master = d_ptr->child.master.get();
    if (master < 0) {
        return output;
    }
    if (block && output.isEmpty() && !d_ptr->waitForOutput()) {
        return output;
    }

    const QDeadlineTimer limit(GatherMs);
    while (output.size() < ChunkBytes && !limit.hasExpired() &&
           hasInput(master, block ? PauseMs : 0) && d_ptr->readInto(output)) {
    }
    return output;
}

int PtyProcess::fd() const
{
    return d_ptr->child.master.get();
}

int PtyProcess::WaitSlave()
{
    const QDeadlineTimer limit(EchoOffMs);
    while (d_ptr->child.pid >= 0) {
        // The mode read on this side is that of the terminal, which both sides share.
        termios mode;
        if (tcgetattr(fd(), &mode) != 0) {
            return -1;
        }
        if ((mode.c_lflag & ECHO) == 0) {
            return 0;
        }
        if (limit.hasExpired() || d_ptr->childEnded(EchoCheckMs)) {
            return -1;
        }
    }
    return -1;
}

int PtyProcess::waitForChild()
{
    pollfd wanted[] = {
        {d_ptr->child.master.get(), POLLIN, 0}, {d_ptr->child.handle.get(), POLLIN, 0}};
    while (d_ptr->child.pid >= 0) {
        if (pollForInput(wanted, 2, -1) < 0 || wanted[1].revents != 0) {
            d_ptr->reap();
        } else if (d_ptr->readInto(d_ptr->unread)) {
            d_ptr->unread = d_ptr->unread.right(ChunkBytes);
        } else {
            wanted[0].fd = -1; // Closed by the child, which goes on without it.
        }
    }
    return d_ptr->status;
}

} // namespace VeySu
