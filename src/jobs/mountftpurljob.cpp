// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountftpurljob.h"

#include "jobs/fusemountjob_p.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <QPointer>
#include <QProcess>

#include <optional>
#include <utility>

namespace VeyFM {

class MountFtpURLJobPrivate : public FuseMountJobPrivate
{
public:
    using FuseMountJobPrivate::FuseMountJobPrivate;

    FuseMount::Answer requestPassword(QString* password) override
    {
        // The title says so on the very first question too.
        return mount.requestPassword(
            q_ptr, MountFtpURLJob::tr("Access denied"),
            MountFtpURLJob::tr("Enter host password for user:"), password);
    }

    QProcess* process = nullptr; // Child of the job, and used again.

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
    if (d->isHandling) {
        // It may be amid a signal of the process, which goes on behind that.
        d->process->disconnect(this);
        d->process->setParent(nullptr);
        d->process->deleteLater();
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
    // The whole path, which brings a slash of its own, so that there are two.
    if (!d->takeRegisteredMount(d->mount.url.path(QUrl::FullyDecoded))) {
        return false;
    }
    finishedOk();
    return true;
}

QString MountFtpURLJob::ftpDirPath()
{
    return VFS::ptr()->settings()->mountRootPath() + QLatin1String("/ftp");
}

bool MountFtpURLJob::updateMountPath()
{
    Q_D(MountFtpURLJob);
    return d->mount.setMountPath(ftpDirPath() + slash + d->mount.account());
}

void MountFtpURLJob::run()
{
    Q_D(MountFtpURLJob);
    if (!d->mount.prepareRun() || !updateMountPath()) {
        finishedWithError(5, tr("Mounting ftp resource failed"));
        return;
    }

    QStringList arguments;
    const QString user = d->mount.user();
    if (!user.isEmpty()) {
        arguments << QStringLiteral("-o") << QLatin1String("user=") + user;
    }
    arguments << d->mount.toolHost() << d->mount.mountPath;

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
    switch (d->requestPassword(&password)) {
    case FuseMount::JobDeleted:
        break;
    case FuseMount::Cancelled:
        d->cancelled = true;
        d->process->terminate();
        finishedWithError(2, tr("Accessing ftp resource was cancelled"));
        break;
    case FuseMount::OtherUserChanged: // There is no other host.
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
    switch (d->takeEnd(exitCode)) {
    case FuseMountJobPrivate::Over:
        break; // The job has finished before, where the user gave up at the prompt.
    case FuseMountJobPrivate::UserChanged:
        if (!checkAlreadyMounted()) {
            run();
        }
        break;
    case FuseMountJobPrivate::RunAgain:
        run();
        break;
    case FuseMountJobPrivate::GivenUp:
        finishedWithError(2, tr("Accessing ftp resource was cancelled"));
        break;
    case FuseMountJobPrivate::Failed:
        finishedWithError(5, tr("Mounting ftp resource failed"));
        break;
    case FuseMountJobPrivate::Mounted:
        finishedOk();
        break;
    }
}

} // namespace VeyFM
