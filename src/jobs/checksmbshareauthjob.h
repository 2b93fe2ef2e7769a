// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_CHECKSMBSHAREAUTHJOB_H
#define VEYFM_CHECKSMBSHAREAUTHJOB_H

#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

/**
 * Finds out whether the user can read a Samba share, and asks for credentials until that is so or
 * the user gives up. Nothing is mounted: access is proved by listing the share with `smbclient`,
 * first with the Kerberos ticket of the user, then as a guest, then with what the authenticator
 * gives. Passwords reach the tool in its environment.
 *
 * The whole conversation happens inside start(), in the caller's thread, with up to 30 seconds a
 * try. There is no bound on the number of tries.
 *
 * Ends with code 4 for a user outside the "fuse" group, and with code 2 and "Login cancelled".
 * A tool that is missing or fails in any other way than by a refusal counts as access. So does a
 * share, host or user whose name would become an option of the tool, or holds a control character:
 * the tool is not run then. A blank in a name ends the word that it is in.
 */
class VEYFMVFS_EXPORT CheckSmbShareAuthJob : public Job
{
    Q_OBJECT

public:
    /// What checkAuth() has seen.
    enum Result { NoRefusal = 0, AccessDenied = 1, LogonFailure = 2 };

    /// Sets the resource of the authenticator, from which the job reads it back: two jobs that
    /// run at the same time must not share one.
    CheckSmbShareAuthJob(
        QSharedPointer<Authenticator> authenticator, const QString& share, const QString& host,
        const QString& workgroup, QObject* parent = nullptr);
    ~CheckSmbShareAuthJob() override;

    QString share() const;     ///< The share, as the authenticator holds it.
    QString host() const;      ///< The host, likewise.
    QString workgroup() const; ///< The workgroup, likewise; may be empty.

    /// The canonical host name under which the share has to be reached, where Kerberos is what
    /// worked; empty otherwise.
    QString hostForKerberos() const;

    /// The share as a text for messages.
    QString resourcePath() const;

    /// Lists the share as a user, or as a guest without one, and returns a Result. A password
    /// without a user is dropped. Blocks for up to 30 seconds.
    int checkAuth(const QString& user, const QString& password) const;

    /// Lists the share with the user's ticket; 0 if that worked. Blocks for up to 30 seconds.
    int checkKerberosAuth();

    void start() override;

private:
    void askUntilGranted(int guestResult);

    const QSharedPointer<Authenticator> m_authenticator;
    QString m_hostForKerberos;
};

} // namespace VeyFM

#endif
