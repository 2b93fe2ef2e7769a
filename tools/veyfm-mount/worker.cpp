// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "worker.h"

#include "core/smburl.h"
#include "fusemounter.h"
#include "host/boundedchild.h"
#include "host/mounturl.h"
#include "jobs/mounturljob.h"
#include "service.h"
#include "supervisorlink.h"
#include "vfs/vfs.h"

#include <QCoreApplication>
#include <QDir>

#include <cerrno>
#include <chrono>
#include <cstdio>

#include <unistd.h>

namespace VeyFM {
namespace Mount {

using MountProtocol::End;
using MountProtocol::Report;
using MountProtocol::Request;

namespace {

constexpr int missingCode = 1; // See Job.
constexpr int failedCode = 5;

End failure(int code, const QString& text)
{
    End end;
    end.code = code;
    end.text = text;
    return end;
}

/// Whether a job refuses the URL before it looks at any more of it, in its own words.
bool isRefusedByJob(const QString& url)
{
    const QStringList schemes = {
        QStringLiteral("smb"), QStringLiteral("ftp"), QStringLiteral("sftp")};
    const QString scheme = url.section(QLatin1Char(':'), 0, 0);
    if (scheme != QLatin1String("smb")) {
        return !schemes.contains(scheme);
    }
    const SmbUrl smbUrl(url);
    return !smbUrl.isValid() || smbUrl.host().isEmpty() || smbUrl.share().isEmpty();
}

QString whyRefused(const Request& request)
{
    if (Host::shownUrl(request.url) != request.url) {
        return QStringLiteral("a password in a URL is seen by others: leave it out, and it is "
                              "asked for");
    }
    const QString why = Host::whyNotMountable(request.url);
    return why.isEmpty() ? Host::whyNoUser(Host::schemeOf(request.url), request.user) : why;
}

End runJob(JobRunner& runner, const QString& url)
{
    QString localPath;
    const JobResult result = runner.run<MountURLJob>(url, [&localPath](const MountURLJob& job) {
        localPath = QDir::cleanPath(job.localPath());
    });
    End end = failure(result.code, result.text);
    end.mounted = End::Reached;
    end.url = url;
    end.localPath = localPath;
    end.isShared = true;
    return end;
}

End reachShare(SupervisorLink& link, const Request& request)
{
    const QString why = Tool::whyNoRunningService();
    if (!why.isEmpty()) {
        return failure(
            failedCode, QStringLiteral("Samba shares are reached through the service: ") + why);
    }
    JobRunner runner(link, QStringLiteral("smb"));
    const QString user = request.user.isEmpty() ? Host::userOf(request.url) : request.user;
    runner.authenticator().setOfferedUser(user);
    const End end = runJob(runner, request.url);
    if (end.code != 0) {
        return end;
    }
    // smbclient that fails to find something counts as one that was let in.
    const int error = Host::lookAt(end.localPath, std::chrono::milliseconds(request.patience));
    return error == ENOENT || error == ENOTDIR
               ? failure(missingCode, QStringLiteral("there is nothing at %1").arg(end.localPath))
               : end;
}

End mount(SupervisorLink& link, const Request& request)
{
    if (isRefusedByJob(request.url)) {
        JobRunner runner(link, QString());
        return runJob(runner, request.url);
    }
    const QString why = whyRefused(request);
    if (!why.isEmpty()) {
        return failure(failedCode, why);
    }
    if (Host::schemeOf(request.url) == QLatin1String("smb")) {
        return reachShare(link, request);
    }
    QUrl url(request.url);
    if (!request.user.isNull()) {
        url.setUserName(request.user, QUrl::DecodedMode);
    }
    return FuseMounter(link, url, std::chrono::milliseconds(request.patience)).mount();
}

/// What goes wrong comes to the host as the end. The warnings of the library would be seen on its
/// standard error by people who can't place them.
void dropWarnings(QtMsgType type, const QMessageLogContext& context, const QString& message)
{
    if (type == QtFatalMsg) {
        std::fprintf(stderr, "%s\n", qPrintable(qFormatLogMessage(type, context, message)));
    }
}

} // namespace

void runWorker(int socket, int& argc, char** argv)
{
    SupervisorLink link(socket);
    const Request request = link.readMount();
    qInstallMessageHandler(dropWarnings);
    QCoreApplication application(argc, argv);
    QCoreApplication::setApplicationName(QStringLiteral("veyfm-mount"));
    VFS::setServiceProbe(Tool::probeMilliseconds);
    VFS::initialize();
    Report report;
    report.kind = Report::Ended;
    report.end = mount(link, request);
    link.say(report);
    // The supervisor does all that is left.
    ::_exit(0);
}

} // namespace Mount
} // namespace VeyFM
