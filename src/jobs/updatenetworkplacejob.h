// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_UPDATENETWORKPLACEJOB_H
#define VEYFM_UPDATENETWORKPLACEJOB_H

#include "core/entry.h"
#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

/**
 * Makes sure that a network bookmark has a local path, and mounts its URL if it has none. Ends
 * with the first news of a bookmark, whichever that is; there is no bound on that wait.
 *
 * Ends with code 5 when the entry is no bookmark, and with the code of MountURLJob.
 */
class VEYFMVFS_EXPORT UpdateNetworkPlaceJob : public Job
{
    Q_OBJECT

public:
    /// A job for the entry of a bookmark; it asks @p authenticator, which it holds.
    UpdateNetworkPlaceJob(
        QSharedPointer<Authenticator> authenticator, const Entry& netPlaceEntry,
        QObject* parent = nullptr);
    ~UpdateNetworkPlaceJob() override;

    Entry netPlaceEntry() const; ///< The entry that was passed in.

    void start() override;

private Q_SLOTS:
    void slotMountURLJobFinished(Job* job);
    void slotNetworkPlaceUpdatedInVFS(const Entry& entry);

private:
    const Entry m_netPlaceEntry;
    const QSharedPointer<Authenticator> m_authenticator;
};

} // namespace VeyFM

#endif
