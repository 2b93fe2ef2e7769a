// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "completion/shellreply.h"

#include "completion/shellline.h"
#include "terminal.h"

#include <algorithm>

namespace VeyFM {
namespace Tool {

namespace {

/// Whether more is typed behind it: a section of a path, or a value.
bool leadsOn(const QString& candidate)
{
    return candidate.endsWith(QLatin1Char('/')) ||
           (candidate.startsWith(QLatin1String("--")) && candidate.endsWith(QLatin1Char('=')));
}

QString commonStart(const QStringList& candidates)
{
    QString common = candidates.constFirst();
    for (const QString& candidate : candidates) {
        const auto differ =
            std::mismatch(common.begin(), common.end(), candidate.begin(), candidate.end());
        common.truncate(int(differ.first - common.begin()));
    }
    if (!common.isEmpty() && common.at(common.size() - 1).isHighSurrogate()) {
        common.chop(1);
    }
    return common;
}

/// The last section, which is all that differs.
QString shown(const QString& candidate)
{
    return escaped(candidate.mid(candidate.lastIndexOf(QLatin1Char('/'), -2) + 1));
}

ShellReply
replyWithAll(const ShellLine& line, const QStringList& candidates, bool isQuoteClosed = false)
{
    ShellReply reply;
    for (const QString& candidate : candidates) {
        const bool isWhole = !leadsOn(candidate);
        reply.texts.append(line.replacement(candidate, isWhole && !isQuoteClosed));
        reply.shown.append(shown(candidate));
    }
    reply.endsWord = candidates.size() == 1 && !leadsOn(candidates.constFirst());
    return reply;
}

} // namespace

ShellReply replyForZsh(const ShellLine& line, const QStringList& candidates, bool isQuoteClosed)
{
    if (candidates.isEmpty()) {
        return {};
    }
    const QString common = commonStart(candidates);
    if (candidates.size() > 1 && common.size() > line.words().constLast().size()) {
        return {false, {line.replacement(common, false)}, {shown(common)}};
    }
    return replyWithAll(line, candidates, isQuoteClosed);
}

ShellReply replyForBash(const ShellLine& line, const QStringList& candidates, int type)
{
    const bool isInQuote = line.quote() != ShellQuote::None;
    switch (type) {
    case '?': // A list.
        return {false, replyWithAll(line, candidates).shown};
    case '*': // All of them, with blanks between.
        return isInQuote ? ShellReply() : replyWithAll(line, candidates);
    case '%': // One after the other.
        return replyWithAll(line, candidates);
    default:
        break;
    }

    ShellReply reply = replyForZsh(line, candidates);
    if (reply.texts.size() > 1) {
        // bash puts in what they have in common, which has to be nothing.
        const QLatin1Char blank(' ');
        const bool beginWithBlank = reply.shown.constFirst().startsWith(blank);
        reply.texts = reply.shown;
        reply.texts.append(beginWithBlank ? QStringLiteral("-") : QString(blank));
    } else if (isInQuote && !reply.texts.isEmpty() && !reply.endsWord) {
        // Behind a single text bash would close the quote.
        reply.texts.append(reply.texts.constFirst() + QLatin1Char(' '));
    }
    return reply;
}

} // namespace Tool
} // namespace VeyFM
