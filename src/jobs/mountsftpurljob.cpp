// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountsftpurljob.h"

#include "core/mountpaths.h"
#include "jobs/fusemountjob_p.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <veysu.h>

#include <QRegExp>

#include <memory>

#include <unistd.h>

namespace VeyFM {

class MountSFtpURLJobPrivate : public FuseMountJobPrivate
{
public:
    using FuseMountJobPrivate::FuseMountJobPrivate;

    FuseMount::Answer requestPassword(QString* password) override
    {
        // The title says so on the very first question too.
        return mount.requestPassword(
            q_ptr, MountSFtpURLJob::tr("Access denied"),
            MountSFtpURLJob::tr("Enter host password for user:"), password);
    }

    // Made by the first run, and used again. Goes, with the tool, before the directory may.
    std::unique_ptr<VeySu::PtyProcess> process;
};

namespace {

const QLatin1Char slash('/');

bool isBelowHome(const QUrl& url)
{
    return url.path(QUrl::FullyDecoded).startsWith(QLatin1String("/~"));
}

// A tool that no longer listens shows in its end, so the result is of no use.
void typeLine(int terminal, const QByteArray& text)
{
    if (!text.isEmpty()) {
        [[maybe_unused]] const ssize_t written =
            ::write(terminal, text.constData(), size_t(text.size()));
    }
    [[maybe_unused]] const ssize_t ended = ::write(terminal, "\n", 1);
}

} // namespace

MountSFtpURLJob::MountSFtpURLJob(
    QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent)
    : Job(*new MountSFtpURLJobPrivate(url, std::move(authenticator)), parent)
{
}

MountSFtpURLJob::~MountSFtpURLJob() = default;

QString MountSFtpURLJob::url() const
{
    return d_func()->mount.url.toString();
}

QString MountSFtpURLJob::localPath() const
{
    return d_func()->localPath;
}

void MountSFtpURLJob::start()
{
    Q_D(MountSFtpURLJob);
    if (d->mount.scheme != QLatin1String("sftp")) {
        finishedWithError(5, tr("Url scheme is not sftp"));
        return;
    }
    if (!checkAlreadyMounted()) {
        run();
    }
}

bool MountSFtpURLJob::checkAlreadyMounted()
{
    Q_D(MountSFtpURLJob);
    if (!d->takeRegisteredMount(MountPaths::mountRootRelativePath(d->mount.url))) {
        return false;
    }
    finishedOk();
    return true;
}

QString MountSFtpURLJob::sftpDirPath()
{
    return VFS::ptr()->settings()->mountRootPath() + QLatin1String("/sftp");
}

bool MountSFtpURLJob::updateMountPath()
{
    Q_D(MountSFtpURLJob);
    QString path = sftpDirPath() + slash + d->mount.account();
    if (isBelowHome(d->mount.url)) {
        path += QLatin1Char('~');
    }
    return d->mount.setMountPath(path);
}

void MountSFtpURLJob::run()
{
    while (runOnce()) {
    }
}

// True when the tool has to run again.
bool MountSFtpURLJob::runOnce()
{
    Q_D(MountSFtpURLJob);
    if (!d->mount.prepareRun() || !updateMountPath()) {
        finishedWithError(5, tr("Mounting sftp resource failed"));
        return false;
    }

    // Always the whole tree; the path below it is added to the result alone.
    const QString user = d->mount.user();
    const QString target = (user.isEmpty() ? user : user + QLatin1Char('@')) + d->mount.toolHost() +
                           QLatin1Char(':') +
                           (isBelowHome(d->mount.url) ? QString() : QString(slash));
    if (!d->process) {
        d->process = std::make_unique<VeySu::PtyProcess>();
    }
    // With one prompt a wrong password ends the tool, which would ask again otherwise.
    d->process->exec(
        "sshfs", {target.toLocal8Bit(), d->mount.mountPath.toLocal8Bit(), "-o",
                  "NumberOfPasswordPrompts=1"});
    return converseSshfs();
}

// Answers the tool until it ends. True when it has to run again; like all here that ask, false
// when the job has been deleted meanwhile, and then nothing may be touched.
bool MountSFtpURLJob::converseSshfs()
{
    Q_D(MountSFtpURLJob);
    bool questionAnswered = false;
    while (true) {
        const QByteArray output = d->process->readAll(true);
        if (output.isEmpty()) {
            break;
        }
        if (output.contains(" password:")) {
            if (!answerPasswordPrompt()) {
                return false;
            }
            if (d->cancelled || d->restartRequested) {
                break;
            }
        } else if (output.contains("Connection reset by peer")) {
            // Behind a question this reads as the result of its answer, also where that was a
            // yes and the password is what was refused.
            if (questionAnswered) {
                d->cancelled = true;
            } else {
                d->accessDenied = true;
                if (!d->mount.credentialsRejected(this)) {
                    return false;
                }
            }
            break;
        } else if (output.contains("yes/no")) {
            if (!askHostKeyQuestion(output)) {
                return false;
            }
            questionAnswered = true;
        }
    }
    return processFinished(d->process->waitForChild());
}

bool MountSFtpURLJob::askHostKeyQuestion(const QByteArray& output)
{
    Q_D(MountSFtpURLJob);
    QString text = QString::fromLocal8Bit(output);
    // Only the wording for RSA keys is known. For any other the user reads the tool's own text.
    const QRegExp question(
        QStringLiteral("The authenticity of host '([^']*)' can't be established\\.\\s+"
                       "RSA key fingerprint is ([^\\s\\.]*)\\.\\s+"
                       "Are you sure you want to continue connecting \\(yes/no\\)\\?\\s*"));
    if (question.indexIn(text) >= 0) {
        text = tr("The authenticity of host '%1' can't be established.\n"
                  "RSA key fingerprint is %2.\n"
                  "Are you sure you want to continue connecting?")
                   .arg(question.cap(1), question.cap(2));
    }
    bool yes = false;
    if (!d->mount.askQuestion(this, tr("Question"), text, &yes)) {
        return false;
    }
    typeLine(d->process->fd(), yes ? "yes" : "no");
    return true;
}

// False when the job has ended.
bool MountSFtpURLJob::answerPasswordPrompt()
{
    Q_D(MountSFtpURLJob);
    QString password;
    switch (d->requestPassword(&password)) {
    case FuseMount::JobDeleted:
        return false;
    case FuseMount::Cancelled:
        d->cancelled = true;
        typeLine(d->process->fd(), QByteArray());
        break;
    case FuseMount::UserChanged:
        d->restartRequested = true;
        typeLine(d->process->fd(), QByteArray());
        break;
    case FuseMount::Answered:
        if (d->process->WaitSlave() != 0) {
            // The tool is neither waited for nor ended, and its directory stays.
            finishedWithError(5, tr("Can't pass password to sshfs"));
            return false;
        }
        typeLine(d->process->fd(), password.toLocal8Bit());
        break;
    }
    return true;
}

// True when the tool has to run again.
bool MountSFtpURLJob::processFinished(int status)
{
    Q_D(MountSFtpURLJob);
    switch (d->takeEnd(status)) {
    case FuseMountJobPrivate::Over:
        break; // Silently: whoever waits for finished() goes on waiting. Callers know.
    case FuseMountJobPrivate::UserChanged:
        return !checkAlreadyMounted();
    case FuseMountJobPrivate::RunAgain:
        return true;
    case FuseMountJobPrivate::GivenUp:
        finishedWithError(2, tr("Accessing sftp resource was cancelled"));
        break;
    case FuseMountJobPrivate::Failed:
        finishedWithError(5, tr("Mounting sftp resource failed"));
        break;
    case FuseMountJobPrivate::Mounted:
        finishedOk();
        break;
    }
    return false;
}

} // namespace VeyFM
