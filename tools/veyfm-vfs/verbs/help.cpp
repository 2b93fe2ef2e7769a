// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "report.h"
#include "verbs/verbs.h"

namespace VeyFM {
namespace Tool {

namespace {

int run(Invocation& invocation)
{
    const QStringList names = invocation.operands();
    if (names.isEmpty()) {
        invocation.output().write(generalHelp());
    }
    int exitCode = Done;
    for (int i = 0; i < names.size(); ++i) {
        const QString& name = names.at(i);
        const Verb* verb = findVerb(name);
        // "help storage list" is about one command.
        const Verb* inner = verb ? findVerb(names.value(i + 1), verb->verbs) : nullptr;
        if (inner) {
            verb = inner;
            ++i;
        }
        if (verb) {
            invocation.output().write(verbHelp(*verb));
        } else {
            report(name, whyNoVerb(name));
            exitCode = Failed;
        }
    }
    return exitCode;
}

} // namespace

Verb helpVerb()
{
    Verb verb;
    verb.name = QStringLiteral("help");
    verb.operands = QStringLiteral("[COMMAND...]");
    verb.summary = QStringLiteral("Show help");
    verb.operandKind = OperandKind::Verbs;
    verb.needs = Needs::Nothing;
    verb.printsData = false;
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
