// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_AUTHENTICATOR_H
#define VEYFM_AUTHENTICATOR_H

#include "veyfmvfs_export.h"

#include <QString>

namespace VeyFM {

/**
 * Answers what a job has to ask a user. A job decides when a password or a yes or no is needed,
 * and the host, which implements this, decides how to ask.
 *
 * A job sets the resource that its next question is about before it asks. Two jobs that run at
 * the same time must therefore not share one authenticator. All calls come in the thread of the
 * job, which waits for the answer.
 *
 * After a refused login the FTP and SFTP jobs call requestPassword() twice, and use the second
 * answer. An implementation that remembers its last answer until credentialsRejected() asks once.
 * It has to remember one for each server(): an SFTP job may ask about a jump host on the way, and
 * about its own host behind that.
 *
 * An implementation may run an event loop while it asks, and the job be deleted in there.
 */
class VEYFMVFS_EXPORT Authenticator
{
public:
    Authenticator();
    virtual ~Authenticator();

    /**
     * Returns the password of a user for the resource. An empty one is a password as well.
     *
     * @param isRetry whether an earlier answer was refused; the FTP and SFTP jobs say so always
     * @param title heading for the user, may be empty
     * @param message text for the user, may be empty; the tool's own where the SFTP job is asked
     *     for something else than a password, such as the passphrase of a key or a code
     * @param user in: the user name known so far; out: the one to use
     * @param userChanged in: false, or what the Samba job was told before; out: whether the user
     *     edited the name. That of a jump host can't be changed: the SFTP job fails
     * @param cancelled in: likewise; out: whether the user gave up. Who answers the Samba job
     *     after having given up at its first question clears it
     */
    virtual QString requestPassword(
        bool isRetry, const QString& title, const QString& message, QString& user,
        bool* userChanged, bool* cancelled) = 0;

    /// The server refused the credentials of @p user. The FTP and SFTP jobs leave it out for a URL
    /// without a user name.
    virtual void credentialsRejected(const QString& user) = 0;

    /// The credentials last handed out worked, or none were needed. The Samba job leaves it out
    /// where none were needed, or its first question brought the right ones.
    virtual void credentialsAccepted() = 0;

    /// Asks a question and returns true for yes. The text may be what a tool or a server printed.
    virtual bool askQuestion(const QString& title, const QString& text) = 0;

    /// What the next question is about; a job calls this before it asks.
    void setResource(
        const QString& protocol, const QString& domain, const QString& server,
        const QString& object);

    QString protocol() const; ///< "smb", "ftp" or "sftp".
    QString domain() const;   ///< The workgroup, for Samba.
    QString server() const;   ///< The host, or the jump host that asks.
    QString object() const;   ///< The share, for Samba.

private:
    Q_DISABLE_COPY(Authenticator)

    QString m_protocol;
    QString m_domain;
    QString m_server;
    QString m_object;
};

} // namespace VeyFM

#endif
