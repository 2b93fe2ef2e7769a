// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any text as the line of a shell, and as a name that is put into one.

#include "fuzzing.h"

#include "completion/shellline.h"

using Fuzzing::require;
using namespace VeyFM::Tool;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QString text = Fuzzing::text(data, size);
    const std::pair<ShellQuote, QString> quotes[] = {
        {ShellQuote::None, QString()},
        {ShellQuote::Single, QStringLiteral("'")},
        {ShellQuote::Double, QStringLiteral("\"")},
    };
    // What comes from bytes is no half of a character, and neither names nor lines have a NUL.
    if (text.contains(QChar(QChar::Null)) || QString::fromUtf8(text.toUtf8()) != text) {
        return 0;
    }
    for (const auto& [quote, mark] : quotes) {
        const ShellLine line(
            QStringLiteral("x ") + mark + shellQuoted(text, quote) + mark, QString());
        require(line.isReadable(), "a quoted name is known");
        require(line.quote() == ShellQuote::None, "its quotes are closed");
        require(line.words() == QStringList(text), "it is one word, and the name");
    }

    for (const QString& breaks : {QString(), QStringLiteral(" \t\n\"'@><=;|&(:")}) {
        const ShellLine line(text, breaks);
        if (!line.isReadable()) {
            continue;
        }
        const QString added = line.words().constLast() + QStringLiteral("$(x)! '");
        const QString replacement = line.replacement(added, true);
        require(
            !breaks.isEmpty() ||
                ShellLine(QStringLiteral("x ") + replacement, breaks).words().constLast() == added,
            "a word that is written on means the candidate");
    }
    return 0;
}
