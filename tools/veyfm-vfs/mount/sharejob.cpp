// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/sharejob.h"

#include "jobs/updatesmbentryjob.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

namespace VeyFM {
namespace Tool {

ShareJob::ShareJob(QSharedPointer<Authenticator> authenticator, const Entry& share)
    : m_authenticator(std::move(authenticator))
    , m_share(share)
{
}

ShareJob::~ShareJob() = default;

void ShareJob::start()
{
    connect(VFS::ptr(), &VFS::smbShareUpdated, this, &ShareJob::look);
    auto* const job = new UpdateSmbEntryJob(m_authenticator, m_share, this);
    connect(job, &Job::finished, this, &ShareJob::attached);
    job->start();
}

void ShareJob::attached(Job* job)
{
    if (m_ended) {
        return;
    }
    if (job->error() == 0) {
        look();
        return;
    }
    m_ended = true;
    finishedWithError(job->error(), job->errorString());
}

void ShareJob::look()
{
    const Entry share = VFS::ptr()->placeBase()->placeEntry(m_share.path());
    if (m_ended || share.localPath().isEmpty()) {
        return;
    }
    m_ended = true;
    finishedOkLater();
}

} // namespace Tool
} // namespace VeyFM
