// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "fusemounter.h"

#include "core/mountpaths.h"
#include "host/boundedchild.h"
#include "host/fusedirectory.h"
#include "jobs/mountfuseentryjob.h"
#include "jobs/mounturljob.h"
#include "service.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "vfs/vfssettings.h"

#include <QDir>

#include <cerrno>
#include <cstring>

namespace VeyFM {
namespace Mount {

using Host::MountInfo;
using MountProtocol::End;

namespace {

const QLatin1Char slash('/');

constexpr int missingCode = 1; // See Job.
constexpr int failedCode = 5;

QString whyNoService()
{
    return VFS::ptr()->settings()->isNetworkEnabled()
               ? Tool::whyNoRunningService()
               : QStringLiteral("the network is switched off in the settings");
}

} // namespace

FuseMounter::FuseMounter(SupervisorLink& link, const QUrl& url, std::chrono::milliseconds patience)
    : m_link(link)
    , m_patience(patience)
    , m_mountRoot(VFS::ptr()->settings()->mountRootPath())
    , m_url(url)
    , m_runner(link, url.scheme())
    , m_before(QByteArray())
{
}

QString FuseMounter::rootUrl() const
{
    return MountPaths::mountRootUrl(m_url);
}

End FuseMounter::mount()
{
    m_whyAlone = whyNoService();
    m_runner.authenticator().setMountHost(m_url.host(QUrl::FullyDecoded));
    while (true) {
        lock();
        const JobResult result = work();
        const QString user = m_runner.authenticator().takeNewUser();
        if (user.isNull()) {
            return endOf(result);
        }
        m_url.setUserName(user, QUrl::DecodedMode);
    }
}

void FuseMounter::lock()
{
    LockRequest request;
    request.directory = Host::fuseDirectory(m_url, m_mountRoot);
    request.mountRoot = m_mountRoot;
    request.url = rootUrl();
    request.isShared = m_whyAlone.isEmpty();
    m_link.lock(request);
    m_before = MountInfo::read();
}

/// Looks where the URL is mounted, or will be.
void FuseMounter::find()
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
        m_directory = Host::fuseDirectory(m_url, m_mountRoot);
    }
}

bool FuseMounter::wasThere() const
{
    return Host::isOnFuseMount(m_directory, m_mountRoot, m_before);
}

JobResult FuseMounter::work()
{
    find();
    if (wasThere()) {
        const QString why = whyNotUsable();
        return why.isEmpty() ? share() : JobResult{failedCode, why};
    }
    forgetRegistration();
    // A place that is there would do for the job that makes one, mounted or not.
    JobResult result =
        m_whyAlone.isEmpty() && !m_hasPlace ? runJob<MountFuseEntryJob>() : runJob<MountURLJob>();
    if (result.code != 0) {
        return result;
    }
    // Another program may have registered something meanwhile, which the job takes as it stands.
    find();
    if (m_isRegistered && !Host::isOnFuseMount(m_directory, m_mountRoot, MountInfo::read())) {
        forgetRegistration();
        result = runJob<MountURLJob>();
        find();
    }
    const QString why = result.code == 0 ? whyNotUsable() : QString();
    return why.isEmpty() ? result : JobResult{failedCode, why};
}

template <typename MadeJob>
JobResult FuseMounter::runJob()
{
    return m_runner.run<MadeJob>(rootUrl(), [](const MadeJob&) {});
}

/// Makes a mount known that the service knows nothing of, or has no place for.
JobResult FuseMounter::share()
{
    if (!m_whyAlone.isEmpty() || m_hasPlace) {
        return {};
    }
    if (!m_isRegistered) {
        registerAs(m_directory);
        find();
    }
    if (!m_isRegistered) {
        // The job would mount once more, on top.
        m_whyAlone = QStringLiteral("the file manager service did not take it");
        return {};
    }
    return runJob<MountFuseEntryJob>();
}

/// What is registered but not mounted is no help: a job would take it for a mount.
void FuseMounter::forgetRegistration()
{
    if (m_isRegistered) {
        registerAs(QString());
    }
    m_isRegistered = false;
}

void FuseMounter::registerAs(const QString& directory) const
{
    VFS::ptr()->fuseMountsManager()->addMount(rootUrl(), directory);
}

QString FuseMounter::whyNotUsable() const
{
    if (!Host::isOnFuseMount(m_directory, m_mountRoot, MountInfo::read())) {
        return QStringLiteral("the tool ended well, but nothing is mounted on %1").arg(m_directory);
    }
    if (!wasThere()) {
        return QString();
    }
    const int error = Host::lookAt(m_directory, m_patience);
    if (error == 0) {
        return QString();
    }
    const QString why = error < 0 ? QStringLiteral("it does not answer")
                                  : QString::fromLocal8Bit(std::strerror(error));
    return QStringLiteral("it was mounted before, but is dead (%2): run fusermount3 -uz '%1', "
                          "then try again")
        .arg(m_directory, why);
}

End FuseMounter::endOf(const JobResult& result) const
{
    End end;
    end.code = result.code;
    end.text = result.text;
    // What was there is never taken back.
    end.directory = result.code == 0 || wasThere() ? m_directory : QString();
    if (result.code != 0) {
        return end;
    }
    end.mounted = wasThere() ? End::Present : End::New;
    end.url = m_url.toString(QUrl::FullyEncoded);
    end.localPath = QDir::cleanPath(m_directory + slash + MountPaths::mountRootRelativePath(m_url));
    end.path = placeOf(end.localPath);
    end.isShared = m_whyAlone.isEmpty();
    end.why = m_whyAlone;
    const int error = Host::lookAt(end.localPath, m_patience);
    if (error == ENOENT || error == ENOTDIR) {
        end.code = missingCode;
        end.text = QStringLiteral("it is mounted, but the server has no such file or directory: %1")
                       .arg(end.localPath);
    }
    return end;
}

/// The place of the mount, and the path below it.
QString FuseMounter::placeOf(const QString& localPath) const
{
    const Entry named = VFS::ptr()->createEntryForUrl(rootUrl(), m_directory);
    const Entry place = VFS::ptr()->placeBase()->placeEntry(named.path());
    const QString root = QDir::cleanPath(place.localPath());
    if (place.isNull() || !(localPath + slash).startsWith(root + slash)) {
        return QString();
    }
    return place.path() + localPath.mid(root.size());
}

} // namespace Mount
} // namespace VeyFM
