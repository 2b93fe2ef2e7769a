// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FUSEMOUNT_P_H
#define VEYFM_FUSEMOUNT_P_H

#include "jobs/authenticator.h"
#include "jobs/sshprompt_p.h"

#include <QSharedPointer>
#include <QString>
#include <QUrl>

#include <optional>

namespace VeyFM {

class Job;

/// What the FTP and SFTP jobs have in common: a URL, the directory that it is mounted on, and the
/// question for a password.
class FuseMount
{
public:
    FuseMount(const QString& url, QSharedPointer<Authenticator> authenticator);
    ~FuseMount();

    QString user() const;
    QString host() const;
    /// "user@host", or "host" without a user.
    QString account() const;

    /// The host as a tool wants it, which is not that of the directory for an IPv6 address.
    QString toolHost() const;

    /// Tells the authenticator that it will be asked about the URL. False, with the directory of an
    /// earlier attempt removed, if user and host must not be handed to a tool.
    bool prepareRun();

    /// Where the service says that the URL's root is mounted already; empty if nowhere. Its word
    /// is taken as it stands.
    QString registeredMountPath() const;
    /// Tells the service.
    void registerMount() const;

    /// Makes the directory of the mount, and removes the one of an earlier attempt if that
    /// differs. False if nothing must be mounted there.
    bool setMountPath(const QString& path);
    /// Removes the directory, if there is one and it is empty.
    void removeMountDirectory() const;

    // An authenticator may run an event loop, and the job, with this object, be deleted in there.
    // The functions that call it tell, and touch nothing then; the directory goes with the job.

    enum Answer {
        Answered,
        UserChanged,      ///< In the URL.
        OtherUserChanged, ///< That of a host on the way, whom nobody can tell the tool.
        Cancelled,
        JobDeleted,
    };
    /// Asks for the password of the URL's user, or of whom setOther() has named; a changed user
    /// name goes into the URL.
    Answer requestPassword(
        const Job* job, const QString& title, const QString& message, QString* password);
    /// Has what follows, up to the next run, be about a user on another host, such as one on the
    /// way to the URL's; or about the URL again.
    void setOther(const std::optional<Account>& other);
    /// Asks for a yes or no. False for a deleted job.
    bool askQuestion(const Job* job, const QString& title, const QString& text, bool* yes);
    /// Tells the authenticator of whom it was asked about last, if there is a user that it can be
    /// told of. False for a deleted job.
    bool credentialsRejected(const Job* job) const;
    /// False for a deleted job.
    bool credentialsAccepted(const Job* job) const;

    const QString scheme; // As it was written.
    QUrl url;
    QString mountPath;
    const QSharedPointer<Authenticator> authenticator;

private:
    Q_DISABLE_COPY(FuseMount)

    /// Whom the questions are about.
    QString askedUser() const;

    bool m_isAsking = false;
    std::optional<Account> m_other;
};

} // namespace VeyFM

#endif
