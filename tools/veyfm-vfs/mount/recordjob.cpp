// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/recordjob.h"

#include "service/networkplacesmanagerproxy.h"
#include "vfs/vfs.h"

namespace VeyFM {
namespace Tool {

RecordJob::RecordJob(const Entry& bookmark, const QString& localPath)
    : m_bookmark(bookmark)
    , m_localPath(localPath)
{
}

RecordJob::~RecordJob() = default;

void RecordJob::start()
{
    VFS* vfs = VFS::ptr();
    // Before the request, so that the news can't be missed.
    connect(vfs, &VFS::networkPlaceUpdated, this, &RecordJob::look);
    NetworkPlace place = vfs->networkPlace(m_bookmark);
    place.setLocalPath(m_localPath);
    vfs->networkPlacesManager()->updateNetworkPlace(place);
}

void RecordJob::look()
{
    // The news may be of another bookmark.
    if (m_ended || VFS::ptr()->networkPlace(m_bookmark).localPath() != m_localPath) {
        return;
    }
    m_ended = true;
    finishedOkLater();
}

} // namespace Tool
} // namespace VeyFM
