// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/jobfailure.h"

#include "core/fuse.h"
#include "mount/login.h"
#include "report.h"
#include "service/smbbrowserproxy.h"
#include "vfs/vfs.h"

#include <QStandardPaths>

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

QString whyNoProgress(const QString& scheme, const TerminalAuthenticator& authenticator)
{
    if (authenticator.isDescriptorSilent()) {
        return QStringLiteral("no password came from the descriptor of --password-fd");
    }
    // A job that runs no tool, or is done with it, waits for the service alone.
    if (authenticator.protocol().isEmpty() || authenticator.wasAccepted() ||
        authenticator.wasUserChangedLast()) {
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

QString whyToolFailed(
    const QString& text, const QString& scheme, const TerminalAuthenticator& authenticator)
{
    if (scheme == QLatin1String("smb")) {
        return VFS::ptr()->smbBrowser()->smbNetworkLocalPath().isEmpty()
                   ? QStringLiteral("the file manager service has no directory in which it keeps "
                                    "the Samba network: see its own documentation")
                   : text;
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
    const JobWatch& watch)
{
    if (result.end == JobResult::Interrupted) {
        return watch.whyStopped();
    }
    if (result.end == JobResult::TimedOut) {
        return watch.whyStopped() + QStringLiteral(": ") + whyNoProgress(scheme, authenticator);
    }
    if (result.end == JobResult::NotStarted) {
        return QStringLiteral("%1 can't be started: %2").arg(programOf(scheme), result.text);
    }
    if (!authenticator.whyGivenUp().isEmpty()) {
        return authenticator.whyGivenUp();
    }
    if (result.end == JobResult::Silent) {
        return QStringLiteral("the server ended the connection: ") + lookWithSsh(authenticator);
    }
    // Codes that say so, and also that the user gave up.
    if (result.code == 2 || result.code == 4) {
        const QString why = whyOutsideGroup();
        if (!why.isEmpty()) {
            return why;
        }
    }
    if (result.code == 5) {
        return whyToolFailed(result.text, scheme, authenticator);
    }
    // The tool has done its work then.
    return authenticator.wasAccepted()
               ? result.text + QStringLiteral(": the file manager service refuses the mount")
               : result.text;
}

} // namespace Tool
} // namespace VeyFM
