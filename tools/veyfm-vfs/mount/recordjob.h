// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_RECORDJOB_H
#define VEYFM_TOOL_RECORDJOB_H

#include "core/entry.h"
#include "jobs/job.h"

namespace VeyFM {
namespace Tool {

/// Has the service note where a network bookmark is mounted, and ends when it has told of that.
class RecordJob : public Job
{
public:
    RecordJob(const Entry& bookmark, const QString& localPath);
    ~RecordJob() override;

    void start() override;

private:
    void look();

    const Entry m_bookmark;
    const QString m_localPath;
    bool m_ended = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
