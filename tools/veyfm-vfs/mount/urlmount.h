// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_URLMOUNT_H
#define VEYFM_TOOL_URLMOUNT_H

#include "mount/login.h"

#include <QString>

namespace VeyFM {
namespace Tool {

/// What a mount came to.
struct UrlMount
{
    enum State {
        New,     ///< This program has mounted it.
        Present, ///< It was mounted before.
        Reached  ///< A Samba URL, for which nothing is mounted.
    };

    QString why; ///< Why there is no local path, with what helps; empty for success.
    State state = New;
    QString url; ///< With the user that was taken in the end.
    QString localPath;
    bool wasInterrupted = false;
    QString placePath; ///< Empty where no place leads there.
};

/**
 * Mounts a URL that whyNotMountable() has nothing against, once the tree is there, and shows on the
 * terminal what takes its time. An ftp or sftp URL is mounted with the service, so that all
 * programs of the session have it, or without. Where it fails or is interrupted nothing stays
 * behind. A path that is not there is a failure, too, but the mount of the root stands then.
 */
UrlMount mountUrl(const QString& url, const Login& login, int timeoutSeconds);

} // namespace Tool
} // namespace VeyFM

#endif
