// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_SUPERVISORLINK_H
#define VEYFM_MOUNT_SUPERVISORLINK_H

#include "halves.h"
#include "host/linereader.h"
#include "host/mountprotocol.h"

#include <QString>

namespace VeyFM {
namespace Mount {

/// An answer with its password.
struct Reply
{
    MountProtocol::Request answer;
    QString password;
};

/// The worker's end of the talk with its supervisor. All waits; when the supervisor does not listen
/// any more the process ends.
class SupervisorLink
{
public:
    explicit SupervisorLink(int socket);

    /// What the host wants to be mounted.
    MountProtocol::Request readMount();

    void say(const MountProtocol::Report& report);

    /// Waits until the lock is granted.
    void lock(const LockRequest& request);

    /// Gives the question its number, and waits for the answer. The caller erases the password.
    Reply ask(MountProtocol::Question question);

private:
    MountProtocol::Line readLine();
    MountProtocol::Request readRequest(MountProtocol::Request::Kind kind);
    void write(const QByteArray& line);

    const int m_socket;
    MountProtocol::LineReader m_reader;
    int m_questions = 0;
};

} // namespace Mount
} // namespace VeyFM

#endif
