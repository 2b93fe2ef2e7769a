// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/jobfailure.h"

#include "core/fuse.h"
#include "host/helpertexts.h"
#include "jobs/mountftpurljob.h"
#include "jobs/mountfuseentryjob.h"
#include "jobs/mountsftpurljob.h"
#include "jobs/mountsmburljob.h"
#include "mount/login.h"
#include "report.h"

#include <QStandardPaths>

#include <algorithm>
#include <cerrno>
#include <grp.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

struct MountTool
{
    const char* scheme;
    const char* program;
    const char* hint;
};

constexpr MountTool mountTools[] = {
    {"sftp", "sshfs", "install the package sshfs"},
    {"smb", "smbclient", "install the package smbclient"},
    {"ftp", "curlftpfs",
     "where there is no package of it, as on Debian 12, install the one that libveyfmvfs ships, by "
     "its CMake option VEYFM_INSTALL_CURLFTPFS_RCLONE"},
};

bool isInstalled(const char* program)
{
    return !QStandardPaths::findExecutable(QLatin1String(program)).isEmpty();
}

QString programOf(const QString& scheme)
{
    for (const MountTool& tool : mountTools) {
        if (scheme == QLatin1String(tool.scheme)) {
            return QLatin1String(tool.program);
        }
    }
    return QStringLiteral("the tool");
}

bool isFuseGroupThere()
{
    char buffer[4096];
    group record;
    group* found = nullptr;
    return ::getgrnam_r("fuse", &record, buffer, sizeof buffer, &found) == 0 && found;
}

QString lookWithSsh(const TerminalAuthenticator& authenticator)
{
    return QStringLiteral("look with '%1' whether the host answers and lets you in")
        .arg(authenticator.sshCommand());
}

QString
whyNoProgress(const QString& scheme, const TerminalAuthenticator& authenticator, bool isMounted)
{
    if (authenticator.isDescriptorSilent()) {
        return QStringLiteral("no password came from the descriptor of --password-fd");
    }
    // Nothing but the service is waited for then.
    if (isMounted || authenticator.wasAccepted()) {
        return QStringLiteral("the file manager service does not tell of the mount");
    }
    if (scheme == QLatin1String("sftp")) {
        return QStringLiteral("sshfs may be waiting for more than a password; ") +
               lookWithSsh(authenticator);
    }
    return programOf(scheme) + QStringLiteral(" waits for the server");
}

/// Why sshfs and curlftpfs can't mount anything, or empty.
QString whyNoFuse(const QString& scheme)
{
    if (::access("/dev/fuse", R_OK | W_OK) != 0) {
        const int error = errno;
        return QStringLiteral("/dev/fuse: %1%2")
            .arg(
                systemReason(error),
                error == ENOENT ? QStringLiteral(": run 'sudo modprobe fuse'") : QString());
    }
    if (!isInstalled("fusermount3") && !isInstalled("fusermount")) {
        return QStringLiteral("fusermount3 is not installed: install the package fuse3");
    }
    if (scheme == QLatin1String("sftp") && !isInstalled("ssh")) {
        return QStringLiteral("ssh is not installed: install the package openssh-client");
    }
    return QString();
}

/// Whether it is what the jobs say of tools that have failed.
bool isOfTool(const QString& text)
{
    const QString all[] = {
        MountSFtpURLJob::tr("Mounting sftp resource failed"),
        MountSFtpURLJob::tr("Can't pass password to sshfs"),
        MountFtpURLJob::tr("Mounting ftp resource failed"),
        MountSmbURLJob::tr("Can't get local path for samba network")};
    return std::find(std::begin(all), std::end(all), text) != std::end(all);
}

QString whyToolFailed(
    const QString& text, const QString& scheme, const TerminalAuthenticator& authenticator)
{
    if (text == QLatin1String(Host::endedBeforePassword)) {
        return authenticator.withSshCommand(Host::endedBeforePassword);
    }
    if (text == QLatin1String(Host::endedByServer)) {
        return text + QStringLiteral(": ") + lookWithSsh(authenticator);
    }
    if (!isOfTool(text)) {
        return text;
    }
    if (scheme == QLatin1String("smb")) {
        return QStringLiteral("the file manager service has no directory in which it keeps the "
                              "Samba network: see its own documentation");
    }
    const QString why = whyNoFuse(scheme);
    if (!why.isEmpty()) {
        return why;
    }
    if (scheme == QLatin1String("sftp")) {
        return text + QStringLiteral(": ") + lookWithSsh(authenticator);
    }
    return text + QStringLiteral(": check the name of the host, and that it answers");
}

} // namespace

QString whyNoTool(const QString& scheme)
{
    for (const MountTool& tool : mountTools) {
        if (scheme == QLatin1String(tool.scheme) && !isInstalled(tool.program)) {
            return QStringLiteral("%1 is not installed: %2")
                .arg(QLatin1String(tool.program), QLatin1String(tool.hint));
        }
    }
    return QString();
}

QString whyOutsideGroup()
{
    if (Fuse::isInFuseGroup()) {
        return QString();
    }
    const QString login = loginName();
    return QStringLiteral("only members of the group 'fuse' can do that: run '%1sudo usermod -aG "
                          "fuse %2', then log in again")
        .arg(
            isFuseGroupThere() ? QString() : QStringLiteral("sudo groupadd --system fuse && "),
            login.isEmpty() ? QStringLiteral("$USER") : login);
}

QString whyFailed(
    const JobResult& result, const QString& scheme, const TerminalAuthenticator& authenticator,
    const JobWatch& watch, bool isMounted)
{
    if (result.end == JobResult::Interrupted) {
        return watch.whyStopped();
    }
    if (result.end == JobResult::TimedOut) {
        return watch.whyStopped() + QStringLiteral(": ") +
               whyNoProgress(scheme, authenticator, isMounted);
    }
    // Codes that say that the user gave up, and also that nothing was tried.
    if (result.code == 2 || result.code == 4) {
        const QString why = result.code == 2 ? authenticator.whyGivenUp() : QString();
        const QString whyOutside = why.isEmpty() ? whyOutsideGroup() : why;
        return whyOutside.isEmpty() ? result.text : whyOutside;
    }
    if (result.code == 5) {
        return whyToolFailed(result.text, scheme, authenticator);
    }
    return result.text == MountFuseEntryJob::tr("Couldn't access resource")
               ? result.text + QStringLiteral(": the file manager service refuses the mount")
               : result.text;
}

} // namespace Tool
} // namespace VeyFM
