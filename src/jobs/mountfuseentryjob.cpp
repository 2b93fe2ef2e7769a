// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/mountfuseentryjob.h"

#include "core/fuse.h"
#include "core/mountpaths.h"
#include "jobs/mounturljob.h"
#include "service/networkmountsmanagerproxy.h"
#include "vfs/vfs.h"

#include <QUrl>

namespace VeyFM {

MountFuseEntryJob::MountFuseEntryJob(
    QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent)
    : Job(parent)
    , m_url(url)
    , m_authenticator(std::move(authenticator))
{
}

MountFuseEntryJob::~MountFuseEntryJob() = default;

QString MountFuseEntryJob::path() const
{
    return m_path;
}

void MountFuseEntryJob::start()
{
    const QUrl url(m_url);
    if (!Fuse::isInFuseGroup()) {
        // Code 2, where CheckSmbShareAuthJob has 4 for the same.
        finishedWithError(
            2, tr("You must be in 'fuse' group in order to view urls with protocol '%1'!")
                   .arg(url.scheme()));
        return;
    }
    const QMap<QString, Entry> mounts = VFS::ptr()->networkMountsManager()->mounts();
    const auto found = mounts.constFind(MountPaths::mountRootUrl(url));
    if (found != mounts.constEnd()) {
        m_path = found->path() + QLatin1Char('/') + MountPaths::mountRootRelativePath(url);
        finishedOk();
        return;
    }
    // May finish before start() returns, so nothing comes behind this.
    auto* const job = new MountURLJob(m_authenticator, m_url, this);
    connect(job, &Job::finished, this, &MountFuseEntryJob::slotMountUrlFinished);
    job->start();
}

// The whole path of the URL, "/~" and all, unlike for a mount found by its root.
QString MountFuseEntryJob::pathBelow(const Entry& mount) const
{
    return mount.path() + QLatin1Char('/') + QUrl(m_url).path(QUrl::FullyDecoded);
}

void MountFuseEntryJob::slotMountUrlFinished(Job* job)
{
    auto* const mountJob = qobject_cast<MountURLJob*>(job);
    if (mountJob->error() != 0) {
        finishedWithError(mountJob->error(), mountJob->errorString());
        return;
    }
    // Here the key is the whole URL, and not that of its root.
    const QString url = mountJob->url();
    const QMap<QString, Entry> mounts = VFS::ptr()->networkMountsManager()->mounts();
    const auto found = mounts.constFind(url);
    if (found != mounts.constEnd()) {
        m_path = pathBelow(*found);
        finishedOk();
        return;
    }
    const Entry entry = VFS::ptr()->createEntryForUrl(url, mountJob->localPath());
    if (entry.isNull()) {
        finishedWithError(1, tr("Can't create entry for url"));
        return;
    }
    connect(VFS::ptr(), &VFS::fuseMountAdded, this, &MountFuseEntryJob::slotFuseMountAdded);
    m_waitedUrl = url;
    VFS::ptr()->networkMountsManager()->addMount(m_waitedUrl, entry);
}

void MountFuseEntryJob::slotFuseMountAdded(const QString& url, const Entry& entry)
{
    if (url != m_waitedUrl) {
        return; // Somebody else's mount.
    }
    if (entry.isNull()) {
        finishedWithError(1, tr("Couldn't access resource"));
        return;
    }
    m_path = pathBelow(entry);
    // Later, so that everybody else has heard of the mount when the job ends.
    finishedOkLater();
}

} // namespace VeyFM
