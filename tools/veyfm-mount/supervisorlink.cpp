// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "supervisorlink.h"

#include <cerrno>

#include <sys/socket.h>
#include <unistd.h>

namespace VeyFM {
namespace Mount {

using MountProtocol::Line;
using MountProtocol::Question;
using MountProtocol::Report;
using MountProtocol::Request;

SupervisorLink::SupervisorLink(int socket)
    : m_socket(socket)
{
}

Request SupervisorLink::readMount()
{
    return readRequest(Request::Mount);
}

void SupervisorLink::say(const Report& report)
{
    write(encode(report));
}

void SupervisorLink::lock(const LockRequest& request)
{
    write(encode(request));
    readLine();
}

Reply SupervisorLink::ask(Question question)
{
    question.id = ++m_questions;
    Report report;
    report.kind = Report::Asked;
    report.question = question;
    say(report);
    Reply reply;
    reply.answer = readRequest(Request::Answer);
    if (reply.answer.hasPassword) {
        const Line line = readLine();
        reply.password = QString::fromUtf8(line.data, int(line.size));
        m_reader.room(); // Overwrites the line.
    }
    return reply;
}

Line SupervisorLink::readLine()
{
    Line line;
    while (!m_reader.next(&line)) {
        if (m_reader.readFrom(m_socket) <= 0) {
            ::_exit(1);
        }
    }
    return line;
}

/// The supervisor has looked at it.
Request SupervisorLink::readRequest(Request::Kind kind)
{
    QString why;
    const auto request = MountProtocol::decodeRequest(readLine(), &why);
    if (!request || request->kind != kind) {
        ::_exit(1);
    }
    return *request;
}

void SupervisorLink::write(const QByteArray& line)
{
    const char* from = line.constData();
    const char* const end = from + line.size();
    while (from != end) {
        const ssize_t sent = ::send(m_socket, from, size_t(end - from), MSG_NOSIGNAL);
        if (sent > 0) {
            from += sent;
        } else if (sent == 0 || errno != EINTR) {
            ::_exit(1);
        }
    }
}

} // namespace Mount
} // namespace VeyFM
