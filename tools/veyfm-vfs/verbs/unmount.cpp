// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "host/mounturl.h"
#include "host/unmountresourcejob.h"
#include "report.h"
#include "spinner.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QDir>
#include <QUrl>

namespace VeyFM {
namespace Tool {

namespace {

/// What the job takes for the operand: as for all verbs, a place wins over a file of its name.
QString jobText(const QString& operand)
{
    const QUrl url(operand);
    if (url.isLocalFile()) {
        return url.toLocalFile();
    }
    const bool isLocal = !operand.isEmpty() && !operand.contains(QLatin1String("://")) &&
                         !VFS::ptr()->placeBase()->isPathContainsPlace(operand);
    return isLocal ? QDir::current().absoluteFilePath(operand) : operand;
}

/// Why it was not unmounted, or empty.
QString unmount(const QString& operand, bool lazily, QString* directory)
{
    const Waiting waiting(QStringLiteral("Unmounting"));
    UnmountResourceJob job(jobText(operand));
    job.setDeleteOnFinish(false);
    job.setLazy(lazily);
    job.exec();
    *directory = job.directory();
    if (job.error() == 0) {
        return QString();
    }
    const bool mayHelp = !job.holders().isEmpty() && !lazily;
    return mayHelp ? job.errorString() +
                         QStringLiteral(": end them, or take it away all the same with --lazy")
                   : job.errorString();
}

int run(Invocation& invocation)
{
    int exitCode = Done;
    JsonArray json(invocation.output());
    const bool lazily = invocation.isSet(QStringLiteral("lazy"));
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const QString shown = Host::shownUrl(operand);
        QString directory;
        const QString why = unmount(operand, lazily, &directory);
        if (!why.isEmpty()) {
            // The job does not know what stands before its text.
            const QString twice = shown + QLatin1Char(' ');
            report(shown, why.startsWith(twice) ? why.mid(twice.size()) : why);
            exitCode = Failed;
        } else if (invocation.json()) {
            json.append(
                {{QStringLiteral("operand"), shown}, {QStringLiteral("localPath"), directory}});
        }
    }
    if (invocation.json()) {
        json.end();
    }
    return exitCode;
}

} // namespace

Verb unmountVerb()
{
    Verb verb;
    verb.name = QStringLiteral("unmount");
    verb.operands = QStringLiteral("ENTRY...");
    verb.summary = QStringLiteral("Unmount network resources");
    verb.details = QStringLiteral(
        "Takes away the mount of sftp or ftp in which an entry lies: a place such as\n"
        "SFTP/user@host, a local path or a URL. Its empty directory goes, too, and the service\n"
        "forgets it. One that is in use fails, and the programs that use it are named.");
    verb.leastOperands = 1;
    verb.options = {
        {{QStringLiteral("l"), QStringLiteral("lazy")},
         QStringLiteral("Also what is in use, or whose server has gone")}};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
