// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_UPDATESMBENTRYJOB_H
#define VEYFM_UPDATESMBENTRYJOB_H

#include "core/entry.h"
#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

/**
 * Brings a Samba entry up to date: has the service look again at the network, a workgroup or a
 * host, or proves access to a share and has it attached. Ends on the news that follow, whichever
 * entry they are about; there is no bound on that wait.
 *
 * Ends with code 1 when the entry is not of a Samba kind, and with the code of
 * CheckSmbShareAuthJob.
 */
class VEYFMVFS_EXPORT UpdateSmbEntryJob : public Job
{
    Q_OBJECT

public:
    /// A job for a Samba entry; it asks @p authenticator, which it holds.
    UpdateSmbEntryJob(
        QSharedPointer<Authenticator> authenticator, const Entry& smbEntry,
        QObject* parent = nullptr);
    ~UpdateSmbEntryJob() override;

    Entry smbEntry() const; ///< The entry that was passed in.

    void start() override;

private Q_SLOTS:
    void updateWorkgroupsFinished();
    void updateWorkgroupFinished();
    void updateHostFinished();
    void checkJobFinished(Job* job);
    void slotSharedUpdatedInVFS(const Entry& entry);

private:
    void updateShare();

    const Entry m_smbEntry;
    const QSharedPointer<Authenticator> m_authenticator;
};

} // namespace VeyFM

#endif
