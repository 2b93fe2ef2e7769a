// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_FUSEMOUNTER_H
#define VEYFM_MOUNT_FUSEMOUNTER_H

#include "host/mountinfo.h"
#include "jobrunner.h"

#include <QUrl>

#include <chrono>

namespace VeyFM {
namespace Mount {

/**
 * Mounts a URL of the schemes ftp and sftp: its root, once for all URLs of the host. With the
 * service, so that all programs of the session have it, or without.
 */
class FuseMounter
{
public:
    FuseMounter(SupervisorLink& link, const QUrl& url, std::chrono::milliseconds patience);

    MountProtocol::End mount();

private:
    QString rootUrl() const;
    void lock();
    void find();
    bool wasThere() const;
    JobResult work();
    template <typename MadeJob>
    JobResult runJob();
    JobResult share();
    void forgetRegistration();
    void registerAs(const QString& directory) const;
    QString whyNotUsable() const;
    MountProtocol::End endOf(const JobResult& result) const;
    QString placeOf(const QString& localPath) const;

    SupervisorLink& m_link;
    const std::chrono::milliseconds m_patience;
    const QString m_mountRoot;
    QUrl m_url;
    JobRunner m_runner;
    Host::MountInfo m_before;    ///< When the lock was granted.
    QString m_whyAlone;          ///< Why other programs don't see what is mounted, or empty.
    QString m_directory;         ///< That of the root.
    bool m_isRegistered = false; ///< Whether the service takes the directory for a mount.
    bool m_hasPlace = false;
};

} // namespace Mount
} // namespace VeyFM

#endif
