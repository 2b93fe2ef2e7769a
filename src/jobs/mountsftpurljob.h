// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTSFTPURLJOB_H
#define VEYFM_MOUNTSFTPURLJOB_H

#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

class MountSFtpURLJobPrivate;

/**
 * Makes an "sftp" URL reachable in the local file system, by running `sshfs` on a directory below
 * VFSSettings::mountRootPath(). The tool sits before a pseudo-terminal, on which the job answers
 * its questions (the password, the key of an unknown host) with what the authenticator says. A
 * mount is recorded in the service, so that other processes find it; one that is recorded there
 * already is taken.
 *
 * A prompt that names another host than the URL's, such as that of a jump host, is asked about that
 * host and for the user whom it names. One in other words than those for a password (the passphrase
 * of a key, a code) is asked with the tool's own text as the message, once the tool has been silent
 * for a second behind it.
 *
 * Everything happens inside start(), which blocks for as long as the tool runs. A path that
 * begins with "/~" means the user's home directory on the host, and is a mount of its own.
 *
 * Ends with code 5 for another scheme, for a host or user that no tool may be given, when the tool
 * fails, when it can't be told which host a prompt is from, and when the user of a jump host is
 * changed, which nobody can tell the tool; with code 2 when the user gives up after a refusal. A
 * user who gives up at a password prompt, or refuses the key of a host, leaves the job unfinished:
 * start() returns and finished() never comes. So does a login that is refused in the run in which
 * the key of the host was confirmed.
 *
 * No tool may be given a host or user that begins with a dash or holds a slash or a control
 * character, nor a user with a colon or brackets, encoded or not. A host in brackets has to be an
 * IPv6 address, with a zone or without.
 *
 * The directory is made for the user alone. Where a link or the directory of another user is in its
 * place, that fails as the tool does.
 */
class VEYFMVFS_EXPORT MountSFtpURLJob : public Job
{
    Q_OBJECT

public:
    /// A job for a URL as text; it asks @p authenticator, which it holds.
    MountSFtpURLJob(
        QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent = nullptr);
    ~MountSFtpURLJob() override;

    QString url() const;       ///< As Qt writes it, with a user name that was changed on the way.
    QString localPath() const; ///< The result, empty until success.

    void start() override;

private:
    Q_DECLARE_PRIVATE(MountSFtpURLJob)
    static QString sftpDirPath();
    bool updateMountPath();
    bool checkAlreadyMounted();
    void run();
    bool runOnce();
    bool converseSshfs();
    bool processFinished(int status);
    bool askHostKeyQuestion(const QByteArray& output);
    enum Prompt { PasswordPrompt, OtherPrompt };
    bool answerPrompt(Prompt prompt);
    void endConversation();
};

} // namespace VeyFM

#endif
