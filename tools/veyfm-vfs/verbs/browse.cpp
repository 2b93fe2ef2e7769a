// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "verbs/browse.h"

#include "commandline.h"
#include "describe.h"
#include "mount/scanjob.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "service/smbbrowserproxy.h"
#include "session.h"
#include "table.h"
#include "vfs/vfs.h"

#include <algorithm>

namespace VeyFM {
namespace Tool {

namespace {

const QLatin1Char slash('/');

constexpr int defaultTimeout = 60; // Of a scan, in seconds.

/// A level of the Samba network: names, and local paths where it has them.
struct Level
{
    StringMap names;
    QString path; ///< Of the place above; empty for none.
    bool hasLocalPaths = false;
    QString why; ///< Why it can't be read, or empty.
};

Question question(const char* method, const char* signature, const QVariantList& arguments = {})
{
    return {
        QStringLiteral("SmbBrowser"), QLatin1String(method), QLatin1String(signature), arguments};
}

void fill(Level& level, const QStringList& names, const Question& again)
{
    for (const QString& name : names) {
        level.names.insert(name, QString());
    }
    if (names.isEmpty() && !wasInterrupted()) {
        level.why = whyNothing(again);
    }
}

// Each level is known only through the one above.

Level workgroups()
{
    Level level;
    level.path = VFS::ptr()->sambaNetworkEntry().path();
    fill(level, VFS::ptr()->smbBrowser()->workgroups(), question("workgroups", "as"));
    return level;
}

Level below(const Level& above, const QString& name, const char* what)
{
    Level level;
    level.why = above.why;
    if (level.why.isEmpty() && !above.names.contains(name)) {
        level.why = QStringLiteral("no such ") + QLatin1String(what);
    }
    if (!above.path.isEmpty()) {
        level.path = above.path + slash + name;
    }
    return level;
}

Level hosts(const QString& workgroup)
{
    Level level = below(workgroups(), workgroup, "workgroup");
    if (level.why.isEmpty() && !wasInterrupted()) {
        fill(
            level, VFS::ptr()->smbBrowser()->hosts(workgroup),
            question("hosts", "as", {workgroup}));
    }
    return level;
}

Level shares(const QString& workgroup, const QString& host)
{
    Level level = below(hosts(workgroup), host, "host or workgroup");
    level.hasLocalPaths = true;
    if (!level.why.isEmpty() || wasInterrupted()) {
        return level;
    }
    level.names = VFS::ptr()->smbBrowser()->shares(host, workgroup);
    if (level.names.isEmpty() && !wasInterrupted()) {
        level.why = whyNothing(question("shares", "a{ss}", {host, workgroup}));
    }
    return level;
}

int fail(const Invocation& invocation, const QString& why)
{
    const QStringList operands = invocation.operands();
    report(operands.isEmpty() ? invocation.verb().name : operands.join(slash), why);
    return Failed;
}

int print(Invocation& invocation, const Level& level)
{
    if (wasInterrupted()) {
        return Failed;
    }
    if (!level.why.isEmpty()) {
        return fail(invocation, level.why);
    }
    Output& output = invocation.output();
    JsonArray json(output);
    Table table;
    for (auto it = level.names.cbegin(); it != level.names.cend(); ++it) {
        if (!invocation.json()) {
            table.add(
                level.hasLocalPaths ? QStringList({it.key(), it.value()}) : QStringList(it.key()));
            continue;
        }
        const QString path = level.path.isEmpty() ? QString() : level.path + slash + it.key();
        QJsonObject object = {
            {QStringLiteral("name"), it.key()}, {QStringLiteral("path"), textOrNull(path)}};
        if (level.hasLocalPaths) {
            object.insert(QStringLiteral("localPath"), textOrNull(it.value()));
        }
        json.append(object);
    }
    if (invocation.json()) {
        json.end();
    } else {
        table.write(output);
    }
    return Done;
}

/// The level that the operands name.
Level namedLevel(const Invocation& invocation)
{
    const Asking asking(QStringLiteral("Looking at the Samba network"));
    const QStringList operands = invocation.operands();
    if (operands.isEmpty()) {
        return workgroups();
    }
    return operands.size() == 1 ? hosts(operands.at(0)) : shares(operands.at(0), operands.at(1));
}

int runBrowse(Invocation& invocation)
{
    return print(invocation, namedLevel(invocation));
}

int printNews(Invocation& invocation, const Level& level, const ScanJob& job)
{
    Output& output = invocation.output();
    JsonArray json(output);
    Table table;
    const auto add = [&](const QString& change, const QStringList& names) {
        for (const QString& name : names) {
            const QString path = level.path + slash + name;
            if (invocation.json()) {
                json.append(
                    {{QStringLiteral("change"), change},
                     {QStringLiteral("name"), name},
                     {QStringLiteral("path"), path}});
            } else {
                table.add({change, path});
            }
        }
    };
    add(QStringLiteral("removed"), job.removed());
    add(QStringLiteral("added"), job.added());
    if (invocation.json()) {
        json.end();
    } else {
        table.write(output);
    }
    return Done;
}

/// The place of a level; null where the tree has none.
Entry placeOf(const QStringList& names)
{
    Entry place = VFS::ptr()->sambaNetworkEntry();
    for (const QString& name : names) {
        const EntryList children = VFS::ptr()->childs(place);
        const QString path = place.path() + slash + name;
        const auto found =
            std::find_if(children.begin(), children.end(), [&path](const Entry& child) {
                return child.path() == path;
            });
        if (found == children.end()) {
            return Entry();
        }
        place = *found;
    }
    return place;
}

int runRescan(Invocation& invocation)
{
    const Level level = namedLevel(invocation);
    if (wasInterrupted()) {
        return Failed;
    }
    if (!level.why.isEmpty()) {
        return fail(invocation, level.why);
    }
    const Entry entry = placeOf(invocation.operands());
    if (entry.isNull()) {
        return fail(
            invocation, QStringLiteral("there is no such place: is the network switched off?"));
    }
    bool ended = false;
    ScanJob job(entry);
    job.setDeleteOnFinish(false);
    QObject::connect(&job, &Job::finished, &job, [&ended] { ended = true; });
    job.start();
    const int seconds = secondsToWait(invocation, defaultTimeout);
    if (waitUntil(QStringLiteral("Scanning the Samba network"), seconds, [&] { return ended; })) {
        return printNews(invocation, level, job);
    }
    if (wasInterrupted()) {
        return Failed;
    }
    return fail(invocation, whyNoNews(ScanJob::news(), seconds));
}

Verb browseVerb(const char* name, const char* operands, int count, const char* summary)
{
    Verb verb;
    verb.name = QStringLiteral("network ") + QLatin1String(name);
    verb.operands = QLatin1String(operands);
    verb.summary = QLatin1String(summary);
    verb.operandKind = OperandKind::Texts;
    verb.leastOperands = count;
    verb.mostOperands = count;
    verb.needs = Needs::Service;
    verb.run = runBrowse;
    return verb;
}

} // namespace

QVector<Verb> browseVerbs()
{
    Verb shares =
        browseVerb("shares", "WORKGROUP HOST", 2, "List the shares of a host in the Samba network");
    shares.details = QStringLiteral("One share a line: its name, and its directory while mounted.");

    Verb rescan = browseVerb(
        "rescan", "[WORKGROUP [HOST]]", 0, "Have the service look again at the Samba network");
    rescan.details = QStringLiteral(
        "Looks for workgroups, for the hosts of a workgroup, or for the shares of a host, and\n"
        "prints what has been added and removed, one path a line.");
    rescan.mostOperands = 2;
    rescan.options = {timeoutOption()};
    rescan.options[0].description =
        QStringLiteral("Wait so long for the end of the scan (default: 60; 0: no bound)");
    rescan.run = runRescan;

    return {
        browseVerb("workgroups", "", 0, "List the workgroups of the Samba network"),
        browseVerb("hosts", "WORKGROUP", 1, "List the hosts of a workgroup"), shares, rescan};
}

} // namespace Tool
} // namespace VeyFM
