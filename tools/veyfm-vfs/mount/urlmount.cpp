// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/urlmount.h"

#include "core/mountpaths.h"
#include "core/smburl.h"
#include "host/mountinfo.h"
#include "host/mounturl.h"
#include "jobs/mountfuseentryjob.h"
#include "jobs/mounturljob.h"
#include "mount/descendants.h"
#include "mount/fusedirectory.h"
#include "mount/jobfailure.h"
#include "mount/mountauthenticator.h"
#include "mount/watchedjob.h"
#include "report.h"
#include "service.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "spinner.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "vfs/vfssettings.h"

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDir>
#include <QUrl>

#include <algorithm>

namespace VeyFM {
namespace Tool {

using Host::schemeOf;
using Host::shownUrl;
using Host::userOf;

namespace {

const QLatin1Char slash('/');

int lookSeconds(int timeoutSeconds)
{
    constexpr int longest = 5;
    return timeoutSeconds == 0 ? longest : std::min(timeoutSeconds, longest);
}

/// Runs the jobs of one command, which share the answers of the user and the watch.
class JobRunner
{
public:
    JobRunner(const QString& scheme, const QString& shown, const Login& login, int timeoutSeconds)
        : m_scheme(scheme)
        , m_doing(QStringLiteral("Mounting ") + shown)
        , m_authenticator(QSharedPointer<MountAuthenticator>::create(login))
        , m_watch(m_authenticator, timeoutSeconds)
    {
    }

    /// Runs a job for what @p url() returns, and another one as long as that is of use. Calls
    /// @p take with the one that did well; else returns why there is none.
    template <typename MadeJob, typename Url, typename Take>
    QString run(const Url& url, const Take& take)
    {
        while (true) {
            const QString jobUrl = url();
            m_authenticator->setAccount(userOf(jobUrl), QUrl(jobUrl).host(QUrl::FullyDecoded));
            MadeJob job(m_authenticator, jobUrl);
            const JobResult result = m_watch.run(job, m_doing);
            m_wasStopped =
                result.end == JobResult::TimedOut || result.end == JobResult::Interrupted;
            if (result.isOk()) {
                take(job);
                return QString();
            }
            if (result.end == JobResult::Silent && m_authenticator->isWorthAnotherJob()) {
                continue;
            }
            QString why = m_watch.whyStopped();
            m_watch.call([&] { why = whyFailed(result, m_scheme, *m_authenticator, m_watch); });
            return why;
        }
    }

    MountAuthenticator& authenticator()
    {
        return *m_authenticator;
    }
    const MountAuthenticator& authenticator() const
    {
        return *m_authenticator;
    }
    /// Whether the last job did not come to its own end.
    bool wasStopped() const
    {
        return m_wasStopped;
    }
    JobWatch& watch()
    {
        return m_watch;
    }

private:
    const QString m_scheme;
    const QString m_doing;
    const QSharedPointer<MountAuthenticator> m_authenticator;
    JobWatch m_watch;
    bool m_wasStopped = false;
};

/// Mounts a URL of the schemes ftp and sftp: its root, once for all URLs of the host.
class FuseMounter
{
public:
    FuseMounter(const QUrl& url, const Login& login, int timeoutSeconds)
        : m_patience(lookSeconds(timeoutSeconds))
        , m_firstUrl(url)
        , m_url(url)
        , m_shown(shownUrl(url.toString()))
        , m_before(MountInfo::read())
        , m_trace(url.scheme())
        , m_runner(url.scheme(), m_shown, login, timeoutSeconds)
    {
        m_runner.authenticator().setQuestionHandler([this](bool asking) {
            if (asking) {
                m_trace.pause();
            } else {
                m_trace.resume();
            }
        });
        // A job is cut off in a call to the service, before its tool runs or when that has done
        // well.
        m_runner.watch().setCutOff(m_shown, [this] {
            m_trace.remove(
                directories(), hasRunTool() ? FuseTrace::AllMounts : FuseTrace::NoMounts);
        });
    }

    UrlMount mount()
    {
        UrlMount result;
        m_runner.watch().call([this] {
            m_whyAlone = VFS::ptr()->settings()->isNetworkEnabled()
                             ? whyNoRunningService()
                             : QStringLiteral("the network is switched off in the settings");
        });
        find();
        if (!m_runner.watch().wasInterrupted()) {
            result.why = work();
        }
        if (m_runner.watch().wasInterrupted()) {
            result.why = m_runner.watch().whyStopped();
        }
        if (!result.why.isEmpty()) {
            result.wasInterrupted = m_runner.watch().wasInterrupted();
            cleanUp();
            return result;
        }
        result.state = wasThere() ? UrlMount::Present : UrlMount::New;
        if (result.state == UrlMount::New && !m_whyAlone.isEmpty()) {
            reportAlone(m_whyAlone);
        }
        result.url = m_url.toString(QUrl::FullyEncoded);
        result.localPath =
            QDir::cleanPath(m_directory + slash + MountPaths::mountRootRelativePath(m_url));
        m_runner.watch().call([this, &result] { result.placePath = placeOf(result.localPath); });
        return result;
    }

private:
    QString rootUrl() const
    {
        return MountPaths::mountRootUrl(m_url);
    }

    /// Looks where the URL is mounted, or will be.
    void find()
    {
        m_runner.watch().call([this] { look(); });
    }

    void look()
    {
        m_directory.clear();
        m_hasPlace = false;
        m_isRegistered = false;
        if (m_whyAlone.isEmpty()) {
            const QMap<QString, Entry> places = VFS::ptr()->networkMountsManager()->mounts();
            m_hasPlace = places.contains(rootUrl());
            m_directory = VFS::ptr()->fuseMountsManager()->mounts().value(rootUrl());
            m_isRegistered = !m_directory.isEmpty();
            if (!m_isRegistered) {
                m_directory = places.value(rootUrl()).localPath();
            }
        }
        if (m_directory.isEmpty()) {
            m_directory = fuseDirectory(m_url);
        }
    }

    /// From any thread.
    bool hasRunTool() const
    {
        return usageOfEndedChildren() > m_usageBefore || hasRunningDescendants();
    }

    bool wasThere() const
    {
        return isOnFuseMount(m_directory, m_before);
    }

    /// Why the URL is not mounted in the end, or empty.
    QString work()
    {
        if (wasThere()) {
            const QString why = whyNotUsable();
            return why.isEmpty() ? share() : why;
        }
        QString why = whyNoTool(m_url.scheme());
        if (!why.isEmpty()) {
            return why;
        }
        forgetRegistration();
        // A place that is there would do for the job that makes one, mounted or not.
        why = m_whyAlone.isEmpty() && !m_hasPlace ? runJob<MountFuseEntryJob>()
                                                  : runJob<MountURLJob>();
        if (!why.isEmpty()) {
            return why;
        }
        // The user may have changed on the way, and what is registered for the new one is taken
        // by the job as it stands.
        find();
        if (m_isRegistered && !isOnFuseMount(m_directory, MountInfo::read())) {
            forgetRegistration();
            why = runJob<MountURLJob>();
            find();
        }
        return why.isEmpty() ? whyNotUsable() : why;
    }

    template <typename MadeJob>
    QString runJob()
    {
        const auto url = [this] {
            takeUser();
            return rootUrl();
        };
        const QString why = m_runner.run<MadeJob>(url, [](const MadeJob&) {});
        takeUser();
        return why;
    }

    /// The user may change with each job.
    void takeUser()
    {
        const QStringList users = m_runner.authenticator().changedUsers();
        if (!users.isEmpty()) {
            m_url.setUserName(users.constLast(), QUrl::DecodedMode);
        }
    }

    /// Makes a mount known that the service knows nothing of, or has no place for.
    QString share()
    {
        if (!m_whyAlone.isEmpty() || m_hasPlace) {
            return QString();
        }
        if (!m_isRegistered) {
            registerAs(m_directory);
            find();
        }
        if (!m_isRegistered && !m_runner.watch().wasInterrupted()) {
            // The job would mount once more, on top.
            reportAlone(QStringLiteral("the file manager service did not take it"));
            return QString();
        }
        return runJob<MountFuseEntryJob>();
    }

    void reportAlone(const QString& why) const
    {
        report(m_shown, QStringLiteral("other programs don't see this mount: ") + why);
    }

    /// What is registered but not mounted is no help: a job would take it for a mount.
    void forgetRegistration()
    {
        if (m_isRegistered) {
            registerAs(QString());
        }
        m_isRegistered = false;
    }

    void registerAs(const QString& directory)
    {
        m_runner.watch().call([this, &directory] {
            VFS::ptr()->fuseMountsManager()->addMount(rootUrl(), directory);
        });
    }

    QString whyNotUsable() const
    {
        if (!isOnFuseMount(m_directory, MountInfo::read())) {
            return QStringLiteral("the tool ended well, but nothing is mounted on %1")
                .arg(m_directory);
        }
        if (!wasThere()) {
            return QString();
        }
        const Waiting waiting(QStringLiteral("Looking at the mount"));
        const QString why = whyDead(m_directory, m_patience);
        if (why.isEmpty()) {
            return QString();
        }
        return QStringLiteral("it was mounted before, but is dead (%2): run fusermount3 -uz '%1', "
                              "then try again")
            .arg(m_directory, why);
    }

    /// Directories that the jobs may have mounted on. From any thread.
    QStringList directories() const
    {
        QStringList all = {fuseDirectory(m_firstUrl)};
        const QStringList users = m_runner.authenticator().changedUsers();
        for (const QString& user : users) {
            QUrl url = m_firstUrl;
            url.setUserName(user, QUrl::DecodedMode);
            all.append(fuseDirectory(url));
        }
        return all;
    }

    void cleanUp()
    {
        FuseTrace::Made made = FuseTrace::NoMounts;
        if (m_runner.authenticator().hasMounted()) {
            made = FuseTrace::AllMounts;
        } else if (m_runner.wasStopped()) {
            made = FuseTrace::DeadMounts;
        }
        m_trace.remove(directories(), made);
        if (wasThere() || !m_whyAlone.isEmpty() || !m_runner.authenticator().wasAccepted()) {
            return;
        }
        // Without waiting: that it is silent may be the reason.
        QDBusMessage message = QDBusMessage::createMethodCall(
            serviceName(), QStringLiteral("/FuseMountsManager"),
            QStringLiteral("org.veylabs.FileManager.FuseMountsManager"),
            QStringLiteral("addMount"));
        message.setArguments({rootUrl(), QString()});
        QDBusConnection::sessionBus().send(message);
    }

    /// The place of the mount, and the path below it.
    QString placeOf(const QString& localPath) const
    {
        const Entry named = VFS::ptr()->createEntryForUrl(rootUrl(), m_directory);
        const Entry place = VFS::ptr()->placeBase()->placeEntry(named.path());
        const QString root = QDir::cleanPath(place.localPath());
        if (place.isNull() || !(localPath + slash).startsWith(root + slash)) {
            return QString();
        }
        return place.path() + localPath.mid(root.size());
    }

    const int m_patience;
    const QUrl m_firstUrl;
    QUrl m_url; ///< With the user that was taken in the end.
    const QString m_shown;
    const MountInfo m_before;
    FuseTrace m_trace;
    QString m_whyAlone;          ///< Why other programs don't see what is mounted, or empty.
    QString m_directory;         ///< That of the root.
    bool m_isRegistered = false; ///< Whether the service takes the directory for a mount.
    bool m_hasPlace = false;
    const long m_usageBefore = usageOfEndedChildren();
    JobRunner m_runner; ///< Ends first, with the thread that cleans up.
};

UrlMount mountSamba(const QString& url, const Login& login, int timeoutSeconds)
{
    UrlMount result;
    result.state = UrlMount::Reached;
    result.url = url;
    const QString scheme = schemeOf(url);
    JobRunner runner(scheme, shownUrl(url), login, timeoutSeconds);
    runner.watch().setCutOff(shownUrl(url));
    runner.watch().call([&result] { result.why = whyNoRunningService(); });
    if (!result.why.isEmpty()) {
        result.why.prepend(QStringLiteral("Samba shares are reached through the service: "));
    } else {
        result.why = whyNoTool(scheme);
    }
    if (result.why.isEmpty()) {
        result.why = runner.run<MountURLJob>(
            [&url] { return url; },
            [&result](const MountURLJob& job) {
                result.localPath = QDir::cleanPath(job.localPath());
            });
    }
    result.wasInterrupted = runner.watch().wasInterrupted();
    return result;
}

UrlMount mountFuse(const QString& url, const Login& login, int timeoutSeconds)
{
    QUrl parsed(url);
    if (!login.user.isEmpty()) {
        parsed.setUserName(login.user, QUrl::DecodedMode);
    }
    return FuseMounter(parsed, login, timeoutSeconds).mount();
}

/// Why a local path that a job came to is of no use, or empty. The jobs don't look.
QString whyMissing(const UrlMount& mount, int timeoutSeconds)
{
    const Waiting waiting(QStringLiteral("Looking at the mount"));
    if (!isMissing(mount.localPath, lookSeconds(timeoutSeconds))) {
        return QString();
    }
    // smbclient that fails to find something counts as one that was let in.
    if (mount.state == UrlMount::Reached) {
        return QStringLiteral("there is nothing at %1: look with 'smbclient -L %2' whether the "
                              "host answers and has that share")
            .arg(mount.localPath, SmbUrl(mount.url).host());
    }
    return QStringLiteral("it is mounted, but the server has no such file or directory: %1")
        .arg(mount.localPath);
}

} // namespace

UrlMount mountUrl(const QString& url, const Login& login, int timeoutSeconds)
{
    UrlMount mount = schemeOf(url) == QLatin1String("smb") ? mountSamba(url, login, timeoutSeconds)
                                                           : mountFuse(url, login, timeoutSeconds);
    if (mount.why.isEmpty()) {
        mount.why = whyMissing(mount, timeoutSeconds);
    }
    return mount;
}

} // namespace Tool
} // namespace VeyFM
