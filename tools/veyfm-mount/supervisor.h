// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_SUPERVISOR_H
#define VEYFM_MOUNT_SUPERVISOR_H

#include "descendants.h"
#include "halves.h"
#include "host/mountlock.h"
#include "host/mountprotocol.h"
#include "linechannel.h"
#include "mounttrace.h"

#include <QString>

#include <optional>

#include <sys/types.h>

namespace VeyFM {
namespace Mount {

/**
 * The half of the program that the host talks with. It passes on what host and worker say, holds
 * the lock of the directory that the worker mounts on, and ends and takes back all when the host
 * wants that, or has gone. It touches no mount, no network and no bus, so that nothing keeps it
 * from doing so.
 */
class Supervisor
{
public:
    /// Takes over the descriptors; @p signals is a signalfd. SIGPIPE is to be ignored.
    Supervisor(Descendants& descendants, int worker, pid_t workerId, int signals);
    ~Supervisor();

    /// Until all is over: the exit code.
    int run();

private:
    enum State {
        Idle, ///< The host has not said yet what to mount.
        Working,
        Mounted, ///< The host has not taken it yet.
        Over
    };

    void readHost();
    void readHostLine(MountProtocol::Line& line);
    void takeRequest(const MountProtocol::Request& request);
    void takeMount(const MountProtocol::Request& request);
    void takeAnswer(const MountProtocol::Request& request);
    void takePassword(MountProtocol::Line& line);
    void readWorker();
    void readWorkerLine(const MountProtocol::Line& line);
    void takeReport(const MountProtocol::Report& report);
    void takeEnd(const MountProtocol::End& end);
    void readSignals();
    void requestLock(const LockRequest& request);
    void tryLock();
    void say(const MountProtocol::Report& report);
    void cancel();
    void failUnexpectedly();
    void refuse(const QString& why);
    void fail(int code, const QString& text);
    void sayEnd(const MountProtocol::End& end);
    void endWorker();
    void cleanUp();
    bool isWaitingForLock() const;

    Descendants& m_descendants;
    LineChannel m_host;
    LineChannel m_worker;
    pid_t m_workerId; ///< 0 when it has ended.
    bool m_isWorkerOpen = true;
    const int m_signals;

    State m_state = Idle;
    bool m_isTaken = false;
    QString m_scheme;
    std::optional<MountProtocol::Question> m_question;
    bool m_isPasswordNext = false;

    std::optional<LockRequest> m_lockRequest;
    Host::MountLock m_lock;
    bool m_wasWaitingTold = false;
    std::optional<MountTrace> m_trace; ///< From the lock on.
    bool m_mayBeRegistered = false;    ///< Whether the service may have been told of a mount.
};

} // namespace Mount
} // namespace VeyFM

#endif
