// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountftpurljob.h"

#include "core/mountpaths.h"
#include "jobs/fusemount_p.h"
#include "jobs/job_p.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <QPointer>
#include <QProcess>

#include <optional>
#include <utility>

namespace VeyFM {

class MountFtpURLJobPrivate : public JobPrivate
{
public:
    MountFtpURLJobPrivate(const QString& url, QSharedPointer<Authenticator> authenticator)
        : mount(url, std::move(authenticator))
    {
    }

    FuseMount mount;
    QString localPath;
    QProcess* process = nullptr; // Child of the job, and used again.
    // Each is consumed by the end of the tool.
    bool accessDenied = false;
    bool restartRequested = false;
    bool cancelled = false;

    // What the tool has done and nobody has looked at. An authenticator may run an event loop, so
    // the tool may speak on, and end, while a question is open: that waits for the answer.
    bool isHandling = false;
    QByteArrayList output; // A read each.
    int outputSize = 0;
    std::optional<int> exitCode;
};

namespace {

const QLatin1Char slash('/');

constexpr int mostOutput = 65536; // As much as a pipe holds.
constexpr int patienceMs = 1000;

} // namespace

MountFtpURLJob::MountFtpURLJob(
    QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent)
    : Job(*new MountFtpURLJobPrivate(url, std::move(authenticator)), parent)
{
}

MountFtpURLJob::~MountFtpURLJob()
{
    Q_D(MountFtpURLJob);
    if (d->process && d->process->state() != QProcess::NotRunning) {
        d->process->disconnect(this);
        d->process->terminate();
        if (!d->process->waitForFinished(patienceMs)) {
            d->process->kill();
            d->process->waitForFinished();
        }
        d->mount.removeMountDirectory();
    }
}

QString MountFtpURLJob::url() const
{
    return d_func()->mount.url.toString();
}

QString MountFtpURLJob::localPath() const
{
    return d_func()->localPath;
}

void MountFtpURLJob::start()
{
    Q_D(MountFtpURLJob);
    if (d->mount.scheme != QLatin1String("ftp")) {
        finishedWithError(5, tr("Url scheme is not ftp"));
        return;
    }
    if (!checkAlreadyMounted()) {
        run();
    }
}

bool MountFtpURLJob::checkAlreadyMounted()
{
    Q_D(MountFtpURLJob);
    const QString mounted = d->mount.registeredMountPath();
    if (mounted.isEmpty()) {
        return false;
    }
    // The path brings a slash of its own, so that there are two.
    d->localPath = mounted + slash + d->mount.url.path(QUrl::FullyDecoded);
    finishedOk();
    return true;
}

QString MountFtpURLJob::ftpDirPath()
{
    return VFS::ptr()->settings()->mountRootPath() + QLatin1String("/ftp");
}

void MountFtpURLJob::updateMountPath()
{
    Q_D(MountFtpURLJob);
    d->mount.setMountPath(ftpDirPath() + slash + d->mount.account());
}

void MountFtpURLJob::run()
{
    Q_D(MountFtpURLJob);
    if (!d->mount.isSafe(d->mount.host())) {
        d->mount.removeMountDirectory();
        finishedWithError(5, tr("Mounting ftp resource failed"));
        return;
    }
    d->mount.authenticator->setResource(
        QStringLiteral("ftp"), QString(), d->mount.host(), QString());
    updateMountPath();

    QStringList arguments;
    const QString user = d->mount.user();
    if (!user.isEmpty()) {
        arguments << QStringLiteral("-o") << QLatin1String("user=") + user;
    }
    arguments << d->mount.host() << d->mount.mountPath;

    if (!d->process) {
        d->process = new QProcess(this);
        d->process->setStandardOutputFile(QProcess::nullDevice()); // It is not read.
        connect(
            d->process, &QProcess::readyReadStandardError, this,
            &MountFtpURLJob::readStandardError);
        connect(d->process, SIGNAL(finished(int)), this, SLOT(processFinished(int)));
    }
    d->process->start(QStringLiteral("curlftpfs"), arguments, QIODevice::ReadWrite);
}

void MountFtpURLJob::readStandardError()
{
    Q_D(MountFtpURLJob);
    d->output.append(d->process->readAllStandardError());
    d->outputSize += d->output.last().size();
    while (d->outputSize > mostOutput && d->output.size() > 1) {
        d->outputSize -= d->output.takeFirst().size();
    }
    handleEvents();
}

void MountFtpURLJob::processFinished(int exitCode)
{
    Q_D(MountFtpURLJob);
    d->exitCode = exitCode;
    handleEvents();
}

// In their order, and each to its end before the next.
void MountFtpURLJob::handleEvents()
{
    Q_D(MountFtpURLJob);
    if (d->isHandling) {
        return;
    }
    d->isHandling = true;
    const QPointer<MountFtpURLJob> alive(this);
    while (alive && (!d->output.isEmpty() || d->exitCode)) {
        if (!d->output.isEmpty()) {
            const QByteArray output = d->output.takeFirst();
            d->outputSize -= output.size();
            handleOutput(output);
        } else {
            const int exitCode = *std::exchange(d->exitCode, std::nullopt);
            handleEnd(exitCode);
        }
    }
    if (alive) {
        d->isHandling = false;
    }
}

void MountFtpURLJob::handleOutput(const QByteArray& output)
{
    Q_D(MountFtpURLJob);
    const QString text = QString::fromLocal8Bit(output.constData()); // Up to a NUL byte.
    if (!text.contains(QLatin1String("Enter host password for user"))) {
        if (text.contains(QLatin1String("Access denied"))) {
            d->accessDenied = true;
            d->mount.credentialsRejected(this);
        }
        return;
    }
    QString password;
    // The title says so on the very first question too.
    switch (d->mount.requestPassword(
        this, tr("Access denied"), tr("Enter host password for user:"), &password)) {
    case FuseMount::JobDeleted:
        break;
    case FuseMount::Cancelled:
        d->cancelled = true;
        d->process->terminate();
        finishedWithError(2, tr("Accessing ftp resource was cancelled"));
        break;
    case FuseMount::UserChanged:
        d->restartRequested = true;
        d->process->terminate();
        break;
    case FuseMount::Answered:
        if (d->process->state() != QProcess::NotRunning) { // As after an end amid the question.
            d->process->write(password.toLocal8Bit() + '\n');
        }
        break;
    }
}

void MountFtpURLJob::handleEnd(int exitCode)
{
    Q_D(MountFtpURLJob);
    if (d->cancelled) {
        d->cancelled = false;
        d->mount.removeMountDirectory();
        return; // The job has finished before.
    }
    if (d->restartRequested) {
        d->restartRequested = false;
        // The new user may have a mount already.
        if (!checkAlreadyMounted()) {
            run();
        }
        return;
    }
    if (d->accessDenied) {
        d->accessDenied = false;
        // This answer goes nowhere, since the tool has ended: the new run asks again. An
        // authenticator that remembers asks its user once.
        QString password;
        const FuseMount::Answer answer = d->mount.requestPassword(
            this, tr("Access denied"), tr("Enter host password for user:"), &password);
        if (answer == FuseMount::JobDeleted) {
            return;
        }
        if (answer == FuseMount::Cancelled) {
            d->mount.removeMountDirectory();
            finishedWithError(2, tr("Accessing ftp resource was cancelled"));
        } else if (answer != FuseMount::UserChanged || !checkAlreadyMounted()) {
            run();
        }
        return;
    }
    if (exitCode != 0 && !d->mount.mountPath.isEmpty()) {
        d->mount.removeMountDirectory();
        finishedWithError(5, tr("Mounting ftp resource failed"));
        return;
    }
    d->localPath = d->mount.mountPath + slash + MountPaths::mountRootRelativePath(d->mount.url);
    d->mount.registerMount();
    if (d->mount.credentialsAccepted(this)) {
        finishedOk();
    }
}

} // namespace VeyFM
