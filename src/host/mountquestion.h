// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTQUESTION_H
#define VEYFM_MOUNTQUESTION_H

#include "veyfmvfshost_export.h"

#include <QMetaType>
#include <QString>

namespace VeyFM {

/**
 * What a MountResourceJob wants to know of its user: a password, or a yes or no. A value without
 * life of its own.
 *
 * The texts may be what a tool or a server printed: show them as plain text.
 */
struct VEYFMVFSHOST_EXPORT MountQuestion
{
    /// Heading for the user; may be empty.
    QString title;

    /// Text for the user; may be empty. Of a host that is met for the first time it holds the
    /// fingerprint of the key.
    QString message;

    /// The user name known so far, and the default for another one; may be empty. With what
    /// follows for passwords only.
    QString user;

    /// What the password is for, as an Authenticator is told: "smb", "ftp" or "sftp"; the host, or
    /// that on the way to it which asks; and for Samba the workgroup and the share. @{
    QString protocol;
    QString host;
    QString domain;
    QString object;
    /// @}

    /// Whether an earlier answer was refused.
    bool isRetry = false;
};

} // namespace VeyFM

Q_DECLARE_METATYPE(VeyFM::MountQuestion)

#endif
