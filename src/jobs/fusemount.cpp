// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/fusemount_p.h"

#include "core/mountpaths.h"
#include "core/urltext.h"
#include "jobs/job.h"
#include "jobs/mountdirectory_p.h"
#include "service/fusemountsmanagerproxy.h"
#include "vfs/vfs.h"

#include <QDir>
#include <QPointer>

namespace VeyFM {

FuseMount::FuseMount(const QString& url, QSharedPointer<Authenticator> authenticator)
    : scheme(UrlText::writtenScheme(url))
    , url(url)
    , authenticator(std::move(authenticator))
{
}

FuseMount::~FuseMount()
{
    if (m_isAsking) {
        removeMountDirectory();
    }
}

QString FuseMount::user() const
{
    return url.userName(QUrl::FullyDecoded);
}

QString FuseMount::host() const
{
    return url.host(QUrl::FullyDecoded);
}

QString FuseMount::account() const
{
    const QString name = user();
    return name.isEmpty() ? host() : name + QLatin1Char('@') + host();
}

QString FuseMount::toolHost() const
{
    return UrlText::toolHost(url);
}

bool FuseMount::prepareRun()
{
    if (!UrlText::isSafeForTool(url)) {
        removeMountDirectory();
        return false;
    }
    m_other.reset();
    authenticator->setResource(scheme, QString(), host(), QString());
    return true;
}

void FuseMount::setOther(const std::optional<Account>& other)
{
    if (!m_other && !other) {
        return;
    }
    m_other = other;
    authenticator->setResource(scheme, QString(), other ? other->host : host(), QString());
}

QString FuseMount::askedUser() const
{
    return m_other ? m_other->user : user();
}

QString FuseMount::registeredMountPath() const
{
    return VFS::ptr()->fuseMountsManager()->mounts().value(MountPaths::mountRootUrl(url));
}

void FuseMount::registerMount() const
{
    VFS::ptr()->fuseMountsManager()->addMount(MountPaths::mountRootUrl(url), mountPath);
}

bool FuseMount::setMountPath(const QString& path)
{
    if (path == mountPath) {
        return true;
    }
    removeMountDirectory();
    mountPath = path;
    if (!makeMountDirectory(mountPath)) {
        mountPath.clear(); // It is not ours to remove.
        return false;
    }
    return true;
}

void FuseMount::removeMountDirectory() const
{
    if (!mountPath.isEmpty()) {
        QDir().rmdir(mountPath);
    }
}

FuseMount::Answer FuseMount::requestPassword(
    const Job* job, const QString& title, const QString& message, QString* password)
{
    const QPointer<const Job> alive(job);
    const QSharedPointer<Authenticator> asked = authenticator; // Outlives its own call.
    bool userChanged = false;
    bool cancelled = false;
    QString name = askedUser();
    m_isAsking = true;
    *password = asked->requestPassword(true, title, message, name, &userChanged, &cancelled);
    if (!alive) {
        return JobDeleted;
    }
    m_isAsking = false;
    if (cancelled) {
        return Cancelled;
    }
    // The configuration of ssh may have another name for the URL's host, but not another user than
    // the URL: that one is somebody's on the way.
    if (userChanged && m_other && !user().isEmpty() && m_other->user != user()) {
        return OtherUserChanged;
    }
    if (userChanged) {
        url.setUserName(name, QUrl::DecodedMode);
        return UserChanged;
    }
    return Answered;
}

bool FuseMount::askQuestion(const Job* job, const QString& title, const QString& text, bool* yes)
{
    const QPointer<const Job> alive(job);
    const QSharedPointer<Authenticator> asked = authenticator;
    m_isAsking = true;
    *yes = asked->askQuestion(title, text);
    if (!alive) {
        return false;
    }
    m_isAsking = false;
    return true;
}

bool FuseMount::credentialsRejected(const Job* job) const
{
    const QPointer<const Job> alive(job);
    const QSharedPointer<Authenticator> told = authenticator;
    if (!askedUser().isEmpty()) {
        told->credentialsRejected(askedUser());
    }
    return alive;
}

bool FuseMount::credentialsAccepted(const Job* job) const
{
    const QPointer<const Job> alive(job);
    const QSharedPointer<Authenticator> told = authenticator;
    told->credentialsAccepted();
    return alive;
}

} // namespace VeyFM
