// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountftpurljob.h"

#include "core/mountpaths.h"
#include "jobs/fusemount_p.h"
#include "jobs/job_p.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <QProcess>

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
};

namespace {

const QLatin1Char slash('/');

} // namespace

MountFtpURLJob::MountFtpURLJob(
    QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent)
    : Job(*new MountFtpURLJobPrivate(url, std::move(authenticator)), parent)
{
}

MountFtpURLJob::~MountFtpURLJob() = default;

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
    const QString text = QString::fromLocal8Bit(d->process->readAllStandardError().constData());
    if (!text.contains(QLatin1String("Enter host password for user"))) {
        if (text.contains(QLatin1String("Access denied"))) {
            d->accessDenied = true;
            d->mount.credentialsRejected();
        }
        return;
    }
    QString password;
    // The title says so on the very first question too.
    switch (d->mount.requestPassword(
        tr("Access denied"), tr("Enter host password for user:"), &password)) {
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
        d->process->write(password.toLocal8Bit() + '\n');
        break;
    }
}

void MountFtpURLJob::processFinished(int exitCode)
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
            tr("Access denied"), tr("Enter host password for user:"), &password);
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
    d->mount.authenticator->credentialsAccepted();
    finishedOk();
}

} // namespace VeyFM
