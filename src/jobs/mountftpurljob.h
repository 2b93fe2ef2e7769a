// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTFTPURLJOB_H
#define VEYFM_MOUNTFTPURLJOB_H

#include "jobs/authenticator.h"
#include "jobs/job.h"

#include <QSharedPointer>

namespace VeyFM {

class MountFtpURLJobPrivate;

/**
 * Makes an "ftp" URL reachable in the local file system, by running `curlftpfs` on a directory
 * below VFSSettings::mountRootPath(). The tool asks for the password, the job asks the
 * authenticator, and the answer goes to the tool's standard input. A mount is recorded in the
 * service, so that other processes find it; one that is recorded there already is taken.
 *
 * Ends with code 5 for another scheme, for a host or user that no tool may be given, and when the
 * tool fails; with code 2 when the user gives up. A tool that can't be started leaves the job
 * running.
 *
 * No tool may be given a host that begins with a dash, nor a host or user with a slash, a comma or
 * a control character, encoded or not. A host in brackets has to be an IPv6 address, with a zone
 * or without.
 *
 * The directory is made for the user alone. Where a link or the directory of another user is in its
 * place, that fails as the tool does.
 */
class VEYFMVFS_EXPORT MountFtpURLJob : public Job
{
    Q_OBJECT

public:
    /// A job for a URL as text; it asks @p authenticator, which it holds.
    MountFtpURLJob(
        QSharedPointer<Authenticator> authenticator, const QString& url, QObject* parent = nullptr);
    ~MountFtpURLJob() override;

    QString url() const;       ///< As Qt writes it, with a user name that was changed on the way.
    QString localPath() const; ///< The result, empty until success.

    void start() override;

private Q_SLOTS:
    void readStandardError();
    void processFinished(int exitCode);

private:
    Q_DECLARE_PRIVATE(MountFtpURLJob)
    static QString ftpDirPath();
    bool updateMountPath();
    void run();
    bool checkAlreadyMounted();
    void handleEvents();
    void handleOutput(const QByteArray& output);
    void handleEnd(int exitCode);
};

} // namespace VeyFM

#endif
