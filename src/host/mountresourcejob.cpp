// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountresourcejob.h"

#include "host/helperprogram.h"
#include "host/mountresourcejob_p.h"

namespace VeyFM {

using MountProtocol::Request;

MountResourceJob::MountResourceJob(const QString& url, QObject* parent)
    : MountResourceJob(QSharedPointer<Authenticator>(), url, parent)
{
}

MountResourceJob::MountResourceJob(
    QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent)
    : Job(*new MountResourceJobPrivate(std::move(authenticator), url), parent)
{
    qRegisterMetaType<MountQuestion>();
}

MountResourceJob::~MountResourceJob() = default;

void MountResourceJob::setUser(const QString& user)
{
    d_func()->user = user;
}

void MountResourceJob::setSilenceLimit(int milliseconds)
{
    d_func()->silenceLimit = milliseconds;
}

int MountResourceJob::silenceLimit() const
{
    return d_func()->silenceLimit;
}

void MountResourceJob::setPatience(int milliseconds)
{
    d_func()->patience = milliseconds;
}

void MountResourceJob::setLastTry(bool isLast)
{
    d_func()->isLastTry = isLast;
}

void MountResourceJob::setHelperProgram(const QString& program)
{
    d_func()->program = program;
}

QString MountResourceJob::helperProgram() const
{
    Q_D(const MountResourceJob);
    return d->program.isEmpty() ? Host::mountHelperProgram() : d->program;
}

void MountResourceJob::start()
{
    Q_D(MountResourceJob);
    d->program = helperProgram();
    d->start();
}

const MountQuestion* MountResourceJob::question() const
{
    Q_D(const MountResourceJob);
    return d->question ? &*d->question : nullptr;
}

QString MountResourceJob::url() const
{
    return d_func()->result.url;
}

QString MountResourceJob::localPath() const
{
    return d_func()->result.localPath;
}

QString MountResourceJob::path() const
{
    return d_func()->result.path;
}

Entry MountResourceJob::entry() const
{
    return d_func()->entry;
}

QString MountResourceJob::directory() const
{
    return d_func()->result.directory;
}

bool MountResourceJob::isNew() const
{
    Q_D(const MountResourceJob);
    return !d->result.localPath.isEmpty() && d->result.mounted == MountProtocol::End::New;
}

bool MountResourceJob::isShared() const
{
    return d_func()->result.isShared;
}

QString MountResourceJob::whyNotShared() const
{
    return d_func()->result.why;
}

void MountResourceJob::cancel()
{
    d_func()->cancel();
}

void MountResourceJob::answerPassword(const QString& user, const QString& password)
{
    Request request;
    request.reply = Request::Login;
    request.user = user;
    request.hasPassword = true;
    d_func()->answer(request, password);
}

void MountResourceJob::answerUser(const QString& user)
{
    Request request;
    request.reply = Request::Login;
    request.user = user.isNull() ? QStringLiteral("") : user;
    d_func()->answer(request);
}

void MountResourceJob::confirm(bool yes)
{
    Request request;
    request.reply = yes ? Request::Yes : Request::No;
    d_func()->answer(request);
}

void MountResourceJob::giveUp()
{
    Request request;
    request.reply = Request::GivenUp;
    d_func()->answer(request);
}

} // namespace VeyFM
