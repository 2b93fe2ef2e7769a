// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "verbs/browse.h"

#include "commandline.h"
#include "describe.h"
#include "report.h"
#include "service.h"
#include "service/smbbrowserproxy.h"
#include "session.h"
#include "spinner.h"
#include "table.h"
#include "vfs/vfs.h"

namespace VeyFM {
namespace Tool {

namespace {

const QLatin1Char slash('/');

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
    for (const QString& name : names)
        level.names.insert(name, QString());
    if (names.isEmpty() && !wasInterrupted())
        level.why = whyNothing(again);
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
    if (level.why.isEmpty() && !above.names.contains(name))
        level.why = QStringLiteral("no such ") + QLatin1String(what);
    if (!above.path.isEmpty())
        level.path = above.path + slash + name;
    return level;
}

Level hosts(const QString& workgroup)
{
    Level level = below(workgroups(), workgroup, "workgroup");
    if (level.why.isEmpty() && !wasInterrupted())
        fill(
            level, VFS::ptr()->smbBrowser()->hosts(workgroup),
            question("hosts", "as", {workgroup}));
    return level;
}

Level shares(const QString& workgroup, const QString& host)
{
    Level level = below(hosts(workgroup), host, "host or workgroup");
    level.hasLocalPaths = true;
    if (!level.why.isEmpty() || wasInterrupted())
        return level;
    level.names = VFS::ptr()->smbBrowser()->shares(host, workgroup);
    if (level.names.isEmpty() && !wasInterrupted())
        level.why = whyNothing(question("shares", "a{ss}", {host, workgroup}));
    return level;
}

int print(Invocation& invocation, const Level& level)
{
    if (wasInterrupted())
        return Failed;
    const QStringList operands = invocation.operands();
    if (!level.why.isEmpty()) {
        report(operands.isEmpty() ? invocation.verb().name : operands.join(slash), level.why);
        return Failed;
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
        if (level.hasLocalPaths)
            object.insert(QStringLiteral("localPath"), textOrNull(it.value()));
        json.append(object);
    }
    if (invocation.json())
        json.end();
    else
        table.write(output);
    return Done;
}

int runBrowse(Invocation& invocation)
{
    const QStringList operands = invocation.operands();
    Level level;
    {
        const Waiting waiting(QStringLiteral("Looking at the Samba network"));
        if (operands.isEmpty())
            level = workgroups();
        else if (operands.size() == 1)
            level = hosts(operands.at(0));
        else
            level = shares(operands.at(0), operands.at(1));
    }
    return print(invocation, level);
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

    return {
        browseVerb("workgroups", "", 0, "List the workgroups of the Samba network"),
        browseVerb("hosts", "WORKGROUP", 1, "List the hosts of a workgroup"), shares};
}

} // namespace Tool
} // namespace VeyFM
