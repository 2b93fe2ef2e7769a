// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "locate.h"
#include "shown.h"
#include "verbs/describeeach.h"
#include "verbs/verbs.h"

namespace VeyFM {
namespace Tool {

namespace {

void print(Output& output, const QString& text, const Entry& entry)
{
    const auto line = [&output](const char* label, const QByteArray& value) {
        output.write(QByteArray(label) + ": " + value + '\n');
    };
    const auto textLine = [&](const char* label, const QString& value) {
        if (!value.isEmpty()) {
            line(label, output.label(value, Entry()));
        }
    };
    textLine("text", shownLocation(text));
    line("path", output.label(shownPath(entry), entry));
    textLine("local path", entry.localPath());
    textLine("type", QStringLiteral("%1 (%2)").arg(typeName(entry.type())).arg(entry.type()));
    textLine("URL", urlOf(entry));
    textLine("network URL", networkUrlOf(entry));
    textLine("exists", entry.isExists() ? QStringLiteral("yes") : QStringLiteral("no"));
}

QJsonObject describe(const QString& text, const Entry& entry)
{
    QJsonObject object = toJson(entry);
    object.insert(QStringLiteral("text"), shownLocation(text));
    object.insert(QStringLiteral("url"), textOrNull(urlOf(entry)));
    object.insert(QStringLiteral("networkUrl"), textOrNull(networkUrlOf(entry)));
    object.insert(QStringLiteral("exists"), entry.isExists());
    return object;
}

int run(Invocation& invocation)
{
    return describeEach(invocation, {resolveText, describe, print});
}

} // namespace

Verb resolveVerb()
{
    Verb verb;
    verb.name = QStringLiteral("resolve");
    verb.operands = QStringLiteral("TEXT...");
    verb.summary = QStringLiteral("Show what a text means: path, local path, type and URL");
    verb.details = QStringLiteral(
        "What the text names need not exist. A text with a colon behind a word is a URL, and a\n"
        "place wins over a file of its name: ./Home is the file.");
    verb.leastOperands = 1;
    verb.options = {colorOption()};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
