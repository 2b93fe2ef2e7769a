// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/fusemount_p.h"

#include "core/mountpaths.h"
#include "jobs/urlscheme_p.h"
#include "service/fusemountsmanagerproxy.h"
#include "vfs/vfs.h"

#include <QDir>

#include <algorithm>

namespace VeyFM {

namespace {

bool isHarmless(const QString& name)
{
    return std::none_of(name.begin(), name.end(), [](QChar c) {
        return c == QLatin1Char('/') || c.category() == QChar::Other_Control;
    });
}

} // namespace

FuseMount::FuseMount(const QString& url, QSharedPointer<Authenticator> authenticator)
    : scheme(writtenScheme(url))
    , url(url)
    , authenticator(std::move(authenticator))
{
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

bool FuseMount::isSafe(const QString& target) const
{
    const QLatin1Char dash('-');
    return !host().isEmpty() && !host().startsWith(dash) && !target.startsWith(dash) &&
           isHarmless(user()) && isHarmless(host());
}

QString FuseMount::registeredMountPath() const
{
    return VFS::ptr()->fuseMountsManager()->mounts().value(MountPaths::mountRootUrl(url));
}

void FuseMount::registerMount() const
{
    VFS::ptr()->fuseMountsManager()->addMount(MountPaths::mountRootUrl(url), mountPath);
}

void FuseMount::setMountPath(const QString& path)
{
    if (path == mountPath) {
        return;
    }
    removeMountDirectory();
    mountPath = path;
    if (!QDir(mountPath).exists()) {
        QDir().mkpath(mountPath);
    }
}

void FuseMount::removeMountDirectory() const
{
    if (!mountPath.isEmpty()) {
        QDir().rmdir(mountPath);
    }
}

FuseMount::Answer
FuseMount::requestPassword(const QString& title, const QString& message, QString* password)
{
    bool userChanged = false;
    bool cancelled = false;
    QString name = user();
    *password =
        authenticator->requestPassword(true, title, message, name, &userChanged, &cancelled);
    if (cancelled) {
        return Cancelled;
    }
    if (userChanged) {
        url.setUserName(name, QUrl::DecodedMode);
        return UserChanged;
    }
    return Answered;
}

void FuseMount::credentialsRejected() const
{
    if (!user().isEmpty()) {
        authenticator->credentialsRejected(user());
    }
}

} // namespace VeyFM
