// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "supervisor.h"

#include "host/secretline.h"
#include "registration.h"

#include <cerrno>

#include <poll.h>
#include <signal.h>
#include <sys/signalfd.h>
#include <unistd.h>

namespace VeyFM {
namespace Mount {

using MountProtocol::End;
using MountProtocol::Line;
using MountProtocol::Question;
using MountProtocol::Report;
using MountProtocol::Request;

namespace {

constexpr int lockPaceMilliseconds = 20;
constexpr int partingMilliseconds = 2000; ///< For a host that does not read.

QString cancelledText(const QString& scheme)
{
    return scheme == QLatin1String("smb")
               ? QStringLiteral("Login cancelled")
               : QStringLiteral("Accessing %1 resource was cancelled").arg(scheme);
}

bool isReadable(int descriptor)
{
    pollfd poll = {descriptor, POLLIN, 0};
    return ::poll(&poll, 1, 0) == 1;
}

} // namespace

Supervisor::Supervisor(Descendants& descendants, int worker, pid_t workerId, int signals)
    : m_descendants(descendants)
    , m_host(STDIN_FILENO, STDOUT_FILENO)
    , m_worker(worker, worker)
    , m_workerId(workerId)
    , m_signals(signals)
{
}

Supervisor::~Supervisor()
{
    ::close(m_worker.input());
    ::close(m_signals);
}

int Supervisor::run()
{
    Report ready;
    ready.kind = Report::Ready;
    ready.text = QStringLiteral("veyfm-mount " VEYFM_VERSION);
    say(ready);
    while (m_state != Over) {
        pollfd polls[] = {
            {m_host.input(), POLLIN, 0},
            {m_host.hasUnsent() ? m_host.output() : -1, POLLOUT, 0},
            {m_isWorkerOpen ? m_worker.input() : -1, POLLIN, 0},
            {m_worker.hasUnsent() ? m_worker.output() : -1, POLLOUT, 0},
            {m_signals, POLLIN, 0}};
        ::poll(polls, std::size(polls), isWaitingForLock() ? lockPaceMilliseconds : -1);
        m_host.write();
        m_worker.write();
        if (polls[2].revents != 0) {
            readWorker();
        }
        if (polls[4].revents != 0 && m_state != Over) {
            readSignals();
        }
        if (polls[0].revents != 0 && m_state != Over) {
            readHost();
        }
        if (isWaitingForLock() && m_state != Over) {
            tryLock();
        }
    }
    m_host.flush(partingMilliseconds);
    return m_isTaken ? 0 : 1;
}

void Supervisor::say(const Report& report)
{
    const QByteArray line = encode(report);
    m_host.send(line.constData(), size_t(line.size()));
}

void Supervisor::readHost()
{
    const bool isOpen = m_host.read();
    Line line;
    while (m_state != Over && m_host.next(&line)) {
        readHostLine(line);
    }
    if (m_state == Over) {
        return;
    }
    if (m_host.isTooLong()) {
        refuse(QStringLiteral("a line is longer than %1 bytes").arg(MountProtocol::longestLine));
    } else if (!isOpen) {
        cancel();
    }
}

void Supervisor::readHostLine(Line& line)
{
    if (m_isPasswordNext) {
        takePassword(line);
        return;
    }
    QString why;
    const auto request = MountProtocol::decodeRequest(line, &why);
    if (request) {
        takeRequest(*request);
    } else {
        refuse(why);
    }
}

void Supervisor::takeRequest(const Request& request)
{
    switch (request.kind) {
    case Request::Mount:
        takeMount(request);
        break;
    case Request::Answer:
        takeAnswer(request);
        break;
    case Request::Cancel:
        cancel();
        break;
    case Request::Take:
        if (m_state == Mounted) {
            m_isTaken = true;
            m_state = Over;
        } else {
            refuse(QStringLiteral("\"take\" comes before anything is mounted"));
        }
        break;
    }
}

void Supervisor::takeMount(const Request& request)
{
    if (m_state != Idle) {
        refuse(QStringLiteral("\"mount\" comes twice"));
        return;
    }
    m_state = Working;
    m_scheme = request.url.section(QLatin1Char(':'), 0, 0);
    const QByteArray line = encode(request);
    m_worker.send(line.constData(), size_t(line.size()));
}

void Supervisor::takeAnswer(const Request& request)
{
    const bool isLogin = request.reply == Request::Login;
    const bool isConfirmation = request.reply == Request::Yes || request.reply == Request::No;
    if (!m_question || m_question->id != request.id) {
        refuse(QStringLiteral("an answer to a question that is not open"));
    } else if (
        (isLogin && m_question->kind != Question::Password) ||
        (isConfirmation && m_question->kind != Question::Confirm)) {
        refuse(QStringLiteral("an answer of another kind than its question"));
    } else {
        m_question.reset();
        m_isPasswordNext = request.hasPassword;
        const QByteArray line = encode(request);
        m_worker.send(line.constData(), size_t(line.size()));
    }
}

void Supervisor::takePassword(Line& line)
{
    m_isPasswordNext = false;
    const QString why = decodeSecret(&line);
    if (!why.isEmpty()) {
        refuse(why);
        return;
    }
    m_worker.send(line.data, line.size);
    m_worker.send("\n", 1);
}

void Supervisor::readWorker()
{
    m_isWorkerOpen = m_worker.read();
    Line line;
    while (m_state != Over && m_worker.next(&line)) {
        readWorkerLine(line);
    }
    if (!m_isWorkerOpen && m_state != Mounted && m_state != Over) {
        failUnexpectedly();
    }
}

void Supervisor::readWorkerLine(const Line& line)
{
    QString why;
    const auto lock = decodeLockRequest(line);
    if (lock) {
        requestLock(*lock);
        return;
    }
    const auto report = MountProtocol::decodeReport(line, &why);
    if (report) {
        takeReport(*report);
    } else {
        fail(5, why);
    }
}

void Supervisor::takeReport(const Report& report)
{
    if (report.kind == Report::Ended) {
        takeEnd(report.end);
        return;
    }
    if (report.kind == Report::Asked) {
        m_question = report.question;
    } else if (report.kind == Report::Accepted) {
        m_mayBeRegistered = true;
    }
    say(report);
}

void Supervisor::takeEnd(const End& end)
{
    if (end.code == 0) {
        // What serves a new mount lives on.
        if (end.mounted != End::New) {
            endWorker();
        }
        m_state = Mounted;
        sayEnd(end);
        return;
    }
    if (end.directory.isEmpty()) {
        endWorker();
        cleanUp();
    }
    sayEnd(end);
    m_state = Over;
}

void Supervisor::readSignals()
{
    signalfd_siginfo info;
    while (::read(m_signals, &info, sizeof info) == ssize_t(sizeof info)) {
        if (info.ssi_signo != SIGCHLD) {
            cancel();
            return;
        }
    }
    if (!m_descendants.reap(m_workerId)) {
        return;
    }
    m_workerId = 0;
    // A child of its may still hold the socket, with the last words of the worker in it.
    while (m_state != Over && m_isWorkerOpen && isReadable(m_worker.input())) {
        readWorker();
    }
    if (m_state == Idle || m_state == Working) {
        failUnexpectedly();
    }
}

bool Supervisor::isWaitingForLock() const
{
    return m_lockRequest && !m_trace;
}

void Supervisor::requestLock(const LockRequest& request)
{
    // Another user has another directory. What was done for the one before is over.
    if (m_trace) {
        m_descendants.end(m_workerId);
        cleanUp();
    }
    m_lockRequest = request;
    m_wasWaitingTold = false;
    if (m_lock.open(request.directory, request.mountRoot)) {
        tryLock();
    } else {
        fail(5, m_lock.why());
    }
}

void Supervisor::tryLock()
{
    if (m_lock.tryLock()) {
        m_trace.emplace(m_lockRequest->directory, m_lockRequest->mountRoot);
        m_worker.send(locked, sizeof locked - 1);
    } else if (!m_wasWaitingTold) {
        m_wasWaitingTold = true;
        Report waiting;
        waiting.kind = Report::Waiting;
        waiting.text = QStringLiteral("being mounted by another program");
        say(waiting);
    }
}

void Supervisor::cancel()
{
    fail(2, cancelledText(m_scheme));
}

void Supervisor::failUnexpectedly()
{
    fail(5, QStringLiteral("the worker of veyfm-mount has ended unexpectedly"));
}

void Supervisor::refuse(const QString& why)
{
    fail(5, why);
}

/// Nothing is left behind when the host reads of it.
void Supervisor::fail(int code, const QString& text)
{
    endWorker();
    cleanUp();
    End end;
    end.code = code;
    end.text = text;
    sayEnd(end);
    m_state = Over;
}

void Supervisor::sayEnd(const End& end)
{
    Report report;
    report.kind = Report::Ended;
    report.end = end;
    say(report);
}

/// The worker first, so that it starts nothing more.
void Supervisor::endWorker()
{
    // What it is reaped by is what ends the others.
    if (m_workerId != 0) {
        ::kill(m_workerId, SIGKILL);
        m_workerId = 0;
    }
    if (m_trace && m_trace->hasNewMount()) {
        m_mayBeRegistered = true;
    }
    m_descendants.end();
}

/// Behind the end of all who could mount something.
void Supervisor::cleanUp()
{
    if (!m_trace) {
        m_lock.close();
        return;
    }
    m_trace->remove();
    if (m_mayBeRegistered && m_lockRequest->isShared) {
        forgetRegistration(m_lockRequest->url);
    }
    m_mayBeRegistered = false;
    m_trace.reset();
    m_lock.close();
}

} // namespace Mount
} // namespace VeyFM
