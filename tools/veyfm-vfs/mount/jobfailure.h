// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_JOBFAILURE_H
#define VEYFM_TOOL_JOBFAILURE_H

#include "mount/watchedjob.h"

namespace VeyFM {
namespace Tool {

/// Why no job of the scheme can work on this system, with what helps; empty when one can.
QString whyNoTool(const QString& scheme);

/// Why a user outside the group "fuse" can't mount, with what helps; empty for others.
QString whyOutsideGroup();

/// Why a job of the scheme did not come to a good end, with what helps. @p isMounted says whether
/// there is a mount all the same.
QString whyFailed(
    const JobResult& result, const QString& scheme, const TerminalAuthenticator& authenticator,
    const JobWatch& watch, bool isMounted = false);

} // namespace Tool
} // namespace VeyFM

#endif
