// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "verbs/describeeach.h"

#include "commandline.h"
#include "output.h"
#include "report.h"

namespace VeyFM {
namespace Tool {

int describeEach(Invocation& invocation, const Description& description)
{
    Output& output = invocation.output();
    JsonArray json(output);
    int exitCode = Done;
    bool first = true;
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const Located located = description.find(operand);
        if (!located.why.isEmpty()) {
            report(operand, located.why);
            exitCode = Failed;
        } else if (invocation.json()) {
            json.append(description.toJson(operand, located.entry));
        } else {
            if (!first) {
                output.write(QByteArrayLiteral("\n"));
            }
            description.print(output, operand, located.entry);
            first = false;
        }
    }
    if (invocation.json()) {
        json.end();
    }
    return exitCode;
}

} // namespace Tool
} // namespace VeyFM
