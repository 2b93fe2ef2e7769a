// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "locate.h"
#include "report.h"
#include "session.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"
#include "watch/entrywatcher.h"

#include <QSet>

namespace VeyFM {
namespace Tool {

namespace {

int run(Invocation& invocation)
{
    VFS* vfs = VFS::ptr();
    int exitCode = Done;
    EntryList entries;
    QSet<QString> missing;
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        // Not only what exists: that something has gone is news, too.
        const Located located = resolveText(operand);
        if (located.why.isEmpty()) {
            entries.append(located.entry);
            missing.insert(located.entry.path());
        } else {
            report(operand, located.why);
            exitCode = Failed;
        }
    }
    if (entries.isEmpty()) {
        return Failed;
    }
    const QObject listener;
    // The service's echo tells that the news are on their way to everybody.
    QObject::connect(
        vfs->entryWatcher(), &EntryWatcher::entryReset, &listener,
        [&missing](const Entry& entry) { missing.remove(entry.path()); });
    vfs->notifyAllWatchers(entries);
    const int code = waitForNews(
        invocation, operands.join(QLatin1String(", ")), [&] { return missing.isEmpty(); });
    return code == Done ? exitCode : code;
}

} // namespace

Verb notifyVerb()
{
    Verb verb;
    verb.name = QStringLiteral("notify");
    verb.operands = QStringLiteral("ENTRY...");
    verb.summary = QStringLiteral("Have all programs of the session look at entries again");
    verb.details = QStringLiteral("The entries need not exist: that one has gone is news, too.");
    verb.leastOperands = 1;
    verb.needs = Needs::Service;
    verb.printsData = false;
    verb.options = {timeoutOption()};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
