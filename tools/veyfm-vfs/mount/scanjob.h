// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SCANJOB_H
#define VEYFM_TOOL_SCANJOB_H

#include "core/entry.h"
#include "jobs/job.h"

#include <QStringList>

namespace VeyFM {
namespace Tool {

/**
 * Has the service look again at what is below the Samba network, a workgroup or a host, and ends
 * with that. The library's own job ends on the news of any other entry of the kind, and at once
 * where it has read nothing yet.
 *
 * What is below the entry has to have been read before, so that all that is told is new.
 */
class ScanJob : public Job
{
public:
    explicit ScanJob(const Entry& entry);
    ~ScanJob() override;

    void start() override;

    /// What its end is called, for whyNoNews().
    static QString news();

    /// The names that have come and gone. @{
    QStringList added() const;
    QStringList removed() const;
    /// @}

private:
    void followNetwork();
    void followWorkgroup(const QString& workgroup);
    void followHost(const QString& host, const QString& workgroup);
    void end(const QStringList& added = {}, const QStringList& removed = {});

    const Entry m_entry;
    QStringList m_added;
    QStringList m_removed;
    bool m_ended = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
