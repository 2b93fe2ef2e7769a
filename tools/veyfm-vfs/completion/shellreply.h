// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SHELLREPLY_H
#define VEYFM_TOOL_SHELLREPLY_H

#include <QStringList>

namespace VeyFM {
namespace Tool {

class ShellLine;

/// What the scripts in this directory put into a command line. Nothing of it is quoted again.
struct ShellReply
{
    bool endsWord = false;  ///< Whether a blank goes behind what is put in.
    QStringList texts = {}; ///< In place of the word at the cursor; several to choose from.
    QStringList shown = {}; ///< What stands for each of them in a list.
};

/**
 * For zsh. What all candidates have in common is the one text as long as that is more than was
 * typed: zsh would find it among the quoted texts, and cut one behind a backslash. @p isQuoteClosed
 * tells that the quote at the cursor is closed right behind it.
 */
ShellReply
replyForZsh(const ShellLine& line, const QStringList& candidates, bool isQuoteClosed = false);

/// For bash, the array COMPREPLY. @p type is COMP_TYPE.
ShellReply replyForBash(const ShellLine& line, const QStringList& candidates, int type);

} // namespace Tool
} // namespace VeyFM

#endif
