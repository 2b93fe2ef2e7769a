// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_OUTSIDEGROUP_H
#define VEYFM_TESTS_OUTSIDEGROUP_H

#include "core/fuse.h"
#include "jobs/job.h"

#include <QtGlobal>

#include <cerrno>
#include <cstring>
#include <grp.h>
#include <unistd.h>
#include <vector>

/**
 * Goes on as a user without groups for as long as the object lives, where the test runs as root.
 * Connections that are open stay so. Whether it worked shows in Fuse::isInFuseGroup(), which asks
 * for the real user.
 */
class OutsideGroup
{
public:
    OutsideGroup()
    {
        constexpr uid_t nobody = 65534;
        if (m_wasRoot) {
            m_groups.resize(size_t(verified(getgroups(0, nullptr))));
            verified(getgroups(int(m_groups.size()), m_groups.data()));
            verified(setgroups(0, nullptr));
            verified(setresuid(nobody, nobody, 0));
        }
    }
    ~OutsideGroup()
    {
        if (m_wasRoot) {
            verified(setresuid(0, 0, 0));
            verified(setgroups(m_groups.size(), m_groups.data()));
        }
    }
    OutsideGroup(const OutsideGroup&) = delete;
    OutsideGroup& operator=(const OutsideGroup&) = delete;

private:
    // Nothing may go on with half of the rights.
    static int verified(int result)
    {
        if (result < 0) {
            qFatal("can't leave groups: %s", std::strerror(errno));
        }
        return result;
    }

    const bool m_wasRoot = geteuid() == 0;
    std::vector<gid_t> m_groups;
};

/// Starts a job outside the group "fuse"; false where that can't be left.
inline bool startOutsideGroup(VeyFM::Job* job)
{
    const OutsideGroup outside;
    if (VeyFM::Fuse::isInFuseGroup()) {
        return false;
    }
    job->start();
    return true;
}

#endif
