// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountsftpurljob.h"

#include "core/mountpaths.h"
#include "jobs/fusemountjob_p.h"
#include "jobs/sshprompt_p.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <veysu.h>

#include <QDeadlineTimer>
#include <QRegExp>

#include <memory>
#include <optional>

#include <poll.h>
#include <termios.h>
#include <unistd.h>

namespace VeyFM {

class MountSFtpURLJobPrivate : public FuseMountJobPrivate
{
public:
    using FuseMountJobPrivate::FuseMountJobPrivate;

    FuseMount::Answer requestPassword(QString* password) override
    {
        return requestPassword(MountSFtpURLJob::tr("Enter host password for user:"), password);
    }
    FuseMount::Answer requestPassword(const QString& message, QString* password)
    {
        // The title says so on the very first question too.
        return mount.requestPassword(
            q_ptr, MountSFtpURLJob::tr("Access denied"), message, password);
    }

    bool takeAccount();
    bool waitsForAnswer() const;
    void type(const QByteArray& line);

    // Made by the first run, and used again. Goes, with the tool, before the directory may.
    std::unique_ptr<VeySu::PtyProcess> process;
    SshPrompt prompt;
};

namespace {

const QLatin1Char slash('/');

bool isBelowHome(const QUrl& url)
{
    return url.path(QUrl::FullyDecoded).startsWith(QLatin1String("/~"));
}

constexpr int silenceMs = 1000;
constexpr int lookMs = 50;

// A tool that no longer listens shows in its end, so the result is of no use.
void send(int terminal, const QByteArray& bytes)
{
    if (!bytes.isEmpty()) {
        [[maybe_unused]] const ssize_t written =
            ::write(terminal, bytes.constData(), size_t(bytes.size()));
    }
}

bool showsWhatIsTyped(int terminal)
{
    termios mode = {};
    return ::tcgetattr(terminal, &mode) == 0 && (mode.c_lflag & ECHO) != 0;
}

} // namespace

void MountSFtpURLJobPrivate::type(const QByteArray& line)
{
    const int terminal = process->fd();
    prompt.clear(showsWhatIsTyped(terminal) ? line + '\n' : QByteArray());
    send(terminal, line);
    send(terminal, "\n");
}

// Has the authenticator know whom the prompt is about. False when that is not certain: a server on
// the way may have made its prompt look like that of the URL's host, or the other way round.
bool MountSFtpURLJobPrivate::takeAccount()
{
    const QVector<Account> accounts = prompt.accounts();
    if (accounts.size() > 1) {
        return false;
    }
    // As the tool got the name, and with the case that it writes.
    const QString own = QString::fromLocal8Bit(mount.host().toLocal8Bit());
    const bool isOther =
        !accounts.isEmpty() && accounts.first().host.compare(own, Qt::CaseInsensitive) != 0;
    mount.setOther(isOther ? std::make_optional(accounts.first()) : std::nullopt);
    return true;
}

// Whether the tool, having printed part of a line, adds nothing to it for a while. One that has
// ended waits for nothing, though a helper in the background may hold its terminal, whose session
// ended with the tool.
bool MountSFtpURLJobPrivate::waitsForAnswer() const
{
    if (!prompt.isOpen()) {
        return false;
    }
    const QDeadlineTimer silence(silenceMs);
    pollfd wanted = {process->fd(), POLLIN, 0};
    while (!silence.hasExpired()) {
        if (::tcgetsid(wanted.fd) < 0 || ::poll(&wanted, 1, lookMs) > 0) {
            return false;
        }
    }
    return ::tcgetsid(wanted.fd) >= 0;
}

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
    d->prompt.clear();
    while (true) {
        const QByteArray output = d->process->readAll(true);
        if (output.isEmpty()) {
            break;
        }
        d->prompt.append(output);
        if (output.contains(" password:")) {
            if (!answerPrompt(PasswordPrompt)) {
                return false;
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
        } else if (d->waitsForAnswer()) {
            if (!answerPrompt(OtherPrompt)) {
                return false;
            }
        }
        if (d->cancelled || d->restartRequested || d->failed) {
            endConversation();
            break;
        }
    }
    return processFinished(d->process->waitForChild());
}

// Has the tool end without the answer that it wants. An empty one will do for the URL's host, where
// there is one try. A tool on the way to it has more, and another login or key may come: they are
// interrupted, as a person would.
void MountSFtpURLJob::endConversation()
{
    Q_D(MountSFtpURLJob);
    d->type(QByteArray());
    while (true) {
        const QByteArray output = d->process->readAll(true);
        if (output.isEmpty()) {
            break;
        }
        d->prompt.append(output);
        if (d->waitsForAnswer()) {
            d->prompt.clear();
            send(d->process->fd(), "\003");
        }
    }
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
    d->type(yes ? "yes" : "no");
    return true;
}

// False when the job has ended.
bool MountSFtpURLJob::answerPrompt(Prompt prompt)
{
    Q_D(MountSFtpURLJob);
    if (!d->takeAccount()) {
        d->failed = true;
        return true;
    }
    QString password;
    const bool isOther = prompt == OtherPrompt;
    switch (isOther ? d->requestPassword(d->prompt.text(), &password)
                    : d->requestPassword(&password)) {
    case FuseMount::JobDeleted:
        return false;
    case FuseMount::Cancelled:
        d->cancelled = true;
        break;
    case FuseMount::UserChanged:
        d->restartRequested = true;
        break;
    case FuseMount::OtherUserChanged:
        d->failed = true;
        break;
    case FuseMount::Answered:
        // Other answers may be shown as they are typed.
        if (!isOther && d->process->WaitSlave() != 0) {
            // The tool is neither waited for nor ended, and its directory stays.
            finishedWithError(5, tr("Can't pass password to sshfs"));
            return false;
        }
        d->type(password.toLocal8Bit());
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
