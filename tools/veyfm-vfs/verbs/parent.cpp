// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "locate.h"
#include "report.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

#include <QJsonArray>

namespace VeyFM {
namespace Tool {

namespace {

int run(Invocation& invocation)
{
    Output& output = invocation.output();
    JsonArray json(output);
    const VFS& vfs = *VFS::ptr();
    int exitCode = Done;

    Entry root = vfs.rootEntry();
    if (invocation.isSet(QStringLiteral("root"))) {
        const QString text = invocation.value(QStringLiteral("root"));
        const Located located = resolveText(text);
        root = located.entry;
        const QString why =
            located.why.isEmpty() && !root.isPlace() ? QStringLiteral("not a place") : located.why;
        if (!why.isEmpty()) {
            report(text, why);
            return Failed;
        }
    }

    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const Located located = locate(operand);
        if (!located.why.isEmpty()) {
            report(operand, located.why);
            exitCode = Failed;
            continue;
        }
        const EntryList chain = vfs.pathEntryList(located.entry, root);
        QJsonArray elements;
        for (const Entry& entry : chain) {
            if (invocation.json()) {
                elements.append(toJson(entry));
            }
            // The top of the tree has a name that is not meant to be seen.
            else if (entry != vfs.rootEntry() || chain.size() == 1) {
                output.writeRecord(output.name(shownPath(entry), entry));
            }
        }
        if (invocation.json()) {
            json.append(
                {{QStringLiteral("path"), shownPath(located.entry)},
                 {QStringLiteral("chain"), elements}});
        }
    }
    if (invocation.json()) {
        json.end();
    }
    return exitCode;
}

} // namespace

Verb parentVerb()
{
    Verb verb;
    verb.name = QStringLiteral("parent");
    verb.operands = QStringLiteral("ENTRY...");
    verb.summary = QStringLiteral("Show the chain of places and directories above an entry");
    verb.details = QStringLiteral("One path a line, from the top of the tree to the entry itself.");
    verb.leastOperands = 1;
    verb.options = {
        {{QStringLiteral("root")},
         QStringLiteral("Look from this place, not from the top"),
         QStringLiteral("PLACE")},
        nullOption(),
        colorOption()};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
