// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/fusemountjob_p.h"

#include "core/mountpaths.h"

#include <utility>

namespace VeyFM {

FuseMountJobPrivate::FuseMountJobPrivate(
    const QString& url, QSharedPointer<Authenticator> authenticator)
    : mount(url, std::move(authenticator))
{
}

bool FuseMountJobPrivate::takeRegisteredMount(const QString& relativePath)
{
    const QString mounted = mount.registeredMountPath();
    if (mounted.isEmpty()) {
        return false;
    }
    localPath = mounted + QLatin1Char('/') + relativePath;
    return true;
}

FuseMountJobPrivate::End FuseMountJobPrivate::takeEnd(int exitCode)
{
    if (std::exchange(cancelled, false)) {
        mount.removeMountDirectory();
        return Over;
    }
    if (std::exchange(restartRequested, false)) {
        return UserChanged;
    }
    if (std::exchange(failed, false)) {
        mount.removeMountDirectory();
        return Failed;
    }
    if (std::exchange(accessDenied, false)) {
        // This answer goes nowhere, since the tool has ended: the new run asks again. An
        // authenticator that remembers asks its user once.
        QString password;
        switch (requestPassword(&password)) {
        case FuseMount::JobDeleted:
            return Over;
        case FuseMount::Cancelled:
            mount.removeMountDirectory();
            return GivenUp;
        case FuseMount::UserChanged:
            return UserChanged;
        case FuseMount::OtherUserChanged:
            mount.removeMountDirectory();
            return Failed;
        case FuseMount::Answered:
            return RunAgain;
        }
    }
    if (exitCode != 0 && !mount.mountPath.isEmpty()) {
        mount.removeMountDirectory();
        return Failed;
    }
    localPath = mount.mountPath + QLatin1Char('/') + MountPaths::mountRootRelativePath(mount.url);
    mount.registerMount();
    return mount.credentialsAccepted(q_ptr) ? Mounted : Over;
}

} // namespace VeyFM
