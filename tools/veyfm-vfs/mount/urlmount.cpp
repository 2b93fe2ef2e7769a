// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/urlmount.h"

#include "core/smburl.h"
#include "host/fusedirectory.h"
#include "host/mountinfo.h"
#include "host/mountresourcejob.h"
#include "host/mounturl.h"
#include "host/secretline.h"
#include "host/unmountresourcejob.h"
#include "mount/jobfailure.h"
#include "mount/watchedjob.h"
#include "report.h"
#include "service.h"
#include "spinner.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

#include <QUrl>

#include <algorithm>

namespace VeyFM {
namespace Tool {

using Host::shownUrl;

namespace {

constexpr int longestLook = 5000; // Milliseconds.

/// Mounts one URL.
class Mounter
{
public:
    Mounter(const QString& url, const Login& login, int timeoutSeconds)
        : m_url(url)
        , m_scheme(Host::schemeOf(url))
        , m_shown(shownUrl(url))
        , m_doing(QStringLiteral("Mounting ") + m_shown)
        , m_authenticator(QSharedPointer<TerminalAuthenticator>::create(login))
        , m_watch(m_authenticator, timeoutSeconds)
        , m_job(url)
    {
        m_authenticator->setAccount(login.user, QUrl(url).host(QUrl::FullyDecoded));
        m_watch.setCutOff(m_shown);
        m_job.setUser(login.user);
        // Half of the time that it has, so that it can tell.
        if (timeoutSeconds > 0) {
            m_job.setPatience(int(std::min<qint64>(longestLook, timeoutSeconds * 500LL)));
        }
        connectJob();
    }

    UrlMount mount()
    {
        UrlMount result;
        // Without it an SFTP job would be silent, and a Samba job find that it may enter.
        const QString why = isMounted() ? QString() : whyNoTool(m_scheme);
        if (!why.isEmpty() && (!isSamba() || hasService())) {
            result.why = why;
        } else {
            run(&result);
        }
        result.wasInterrupted = m_watch.wasInterrupted();
        return result;
    }

private:
    Q_DISABLE_COPY(Mounter)

    bool isSamba() const
    {
        return m_scheme == QLatin1String("smb");
    }

    void connectJob()
    {
        using MountJob = MountResourceJob;
        QObject::connect(
            &m_job, &MountJob::passwordRequested, &m_job,
            [this](const MountQuestion& question) { answerPassword(question); });
        QObject::connect(
            &m_job, &MountJob::confirmationRequested, &m_job,
            [this](const MountQuestion& question) {
                m_job.confirm(m_authenticator->askQuestion(question.title, question.message));
            });
        QObject::connect(
            &m_job, &MountJob::credentialsRejected, &m_job,
            [this](const QString& user) { m_authenticator->credentialsRejected(user); });
        QObject::connect(&m_job, &MountJob::credentialsAccepted, &m_job, [this] {
            m_authenticator->credentialsAccepted();
        });
        QObject::connect(&m_job, &MountJob::waitingForOther, &m_job, [this](const QString& text) {
            Spinner::end();
            Spinner::begin(QStringLiteral("%1: %2").arg(m_doing, text));
        });
    }

    void answerPassword(const MountQuestion& question)
    {
        m_authenticator->setResource(
            question.protocol, question.domain, question.host, question.object);
        QString user = question.user;
        bool isUserChanged = false;
        bool isCancelled = false;
        QString password = m_authenticator->requestPassword(
            question.isRetry, question.title, question.message, user, &isUserChanged, &isCancelled);
        if (isCancelled) {
            m_job.giveUp();
        } else if (isUserChanged && !isSamba()) {
            m_job.answerUser(user);
        } else {
            m_job.setLastTry(m_authenticator->isLastTry());
            m_job.answerPassword(user, password);
        }
        MountProtocol::erase(&password);
    }

    /// Whether there is a mount of the URL's host, for the user that the job has by now.
    bool isMounted() const
    {
        if (isSamba()) {
            return false;
        }
        QUrl url(m_url);
        if (!m_authenticator->user().isEmpty()) {
            url.setUserName(m_authenticator->user(), QUrl::DecodedMode);
        }
        const QString root = VFS::ptr()->settings()->mountRootPath();
        return Host::isOnFuseMount(Host::fuseDirectory(url, root), root, Host::MountInfo::read());
    }

    void run(UrlMount* result)
    {
        const JobResult ended = m_watch.run(m_job, m_doing, [this] { m_job.cancel(); });
        if (!ended.isOk()) {
            result->why = whyNot(ended);
            return;
        }
        result->state = isSamba()       ? UrlMount::Reached
                        : m_job.isNew() ? UrlMount::New
                                        : UrlMount::Present;
        result->url = m_job.url();
        result->localPath = m_job.localPath();
        result->placePath = m_job.path();
        // That there is no service is no news of what was there before.
        if (!m_job.whyNotShared().isEmpty() && (m_job.isNew() || isShareable())) {
            report(
                m_shown,
                QStringLiteral("other programs don't see this mount: ") + m_job.whyNotShared());
        }
    }

    QString whyNot(const JobResult& ended)
    {
        if (m_job.isNew()) {
            // It was handed over when it was too late.
            UnmountResourceJob job(m_job.directory());
            job.setDeleteOnFinish(false);
            job.exec();
        }
        const QString why = whyFailed(ended, m_scheme, *m_authenticator, m_watch, isMounted());
        const bool isMissing = ended.end == JobResult::Finished && ended.code == 1;
        return isSamba() && isMissing
                   ? QStringLiteral("%1: look with 'smbclient -L %2' whether the host answers and "
                                    "has that share")
                         .arg(why, SmbUrl(m_url).host())
                   : why;
    }

    bool isShareable()
    {
        return VFS::ptr()->settings()->isNetworkEnabled() && hasService();
    }

    bool hasService()
    {
        bool isThere = false;
        m_watch.call([&isThere] { isThere = whyNoRunningService().isEmpty(); });
        return isThere;
    }

    const QString m_url;
    const QString m_scheme;
    const QString m_shown;
    const QString m_doing;
    const QSharedPointer<TerminalAuthenticator> m_authenticator;
    JobWatch m_watch;
    MountResourceJob m_job;
};

} // namespace

UrlMount mountUrl(const QString& url, const Login& login, int timeoutSeconds)
{
    return Mounter(url, login, timeoutSeconds).mount();
}

} // namespace Tool
} // namespace VeyFM
