// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SHAREJOB_H
#define VEYFM_TOOL_SHAREJOB_H

#include "core/entry.h"
#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {
namespace Tool {

/**
 * Has the service attach a Samba share, when the user has proved to have access, and ends when the
 * share has a local path. The library's own job ends on the news of any other share.
 */
class ShareJob : public Job
{
public:
    ShareJob(QSharedPointer<Authenticator> authenticator, const Entry& share);
    ~ShareJob() override;

    void start() override;

private:
    void attached(Job* job);
    void look();

    const QSharedPointer<Authenticator> m_authenticator;
    const Entry m_share;
    bool m_ended = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
