// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_VERB_H
#define VEYFM_TOOL_VERB_H

#include <QString>
#include <QStringList>
#include <QVector>

namespace VeyFM {
namespace Tool {

class Invocation;

/// How the program ends.
enum ExitCode {
    Done = 0,      ///< All that was asked for.
    Failed = 1,    ///< Some of it failed; standard error says what and why.
    WrongUsage = 2 ///< The command line makes no sense; nothing was done.
};

/// An option of a verb. One without a value name takes no value.
struct Option
{
    QStringList names; ///< Without dashes, the short name first.
    QString description;
    QString valueName = {};
    QStringList values = {}; ///< The only values it takes; empty for any.
    bool isNumber = false;   ///< Whether it takes a number, from 0 on.
};

/// What the operands of a verb are, for the completion of command lines.
enum class OperandKind {
    Entries,    ///< Places, paths and URLs.
    Verbs,      ///< Names of verbs.
    Devices,    ///< Storage devices.
    Favourites, ///< Favourite bookmarks.
    Bookmarks,  ///< Network bookmarks.
    Texts       ///< What nobody can guess, or what is too slow to ask for.
};

/// What has to be there before a verb runs.
enum class Needs {
    Nothing, ///< The verb makes what it needs by itself.
    Tree,    ///< The tree of places, with the service or without.
    Service  ///< The tree and the service. The verb does not run without.
};

/**
 * A verb of the tool. A new one is a file in verbs/ with one function that returns this, and a
 * line in verbs/verbs.cpp: parsing, help and completion are made from the description.
 *
 * A verb with verbs of its own, such as "storage list", does nothing else than to hold them. Their
 * names are whole: both words, with a space between.
 */
struct Verb
{
    QString name;
    QString operands; ///< As the usage line shows them.
    QString summary;  ///< One line for the list of verbs.
    QString details;  ///< Behind the usage line of the verb's own help.
    OperandKind operandKind = OperandKind::Entries;
    int leastOperands = 0;
    int mostOperands = -1; ///< -1 for any number.
    Needs needs = Needs::Tree;
    bool printsData = true; ///< Whether it knows --json.
    bool hidden = false;    ///< Whether help and completion pass over it.
    QString otherName = {}; ///< A second word for it, which help and completion do not offer.
    bool jsonLines = false; ///< Whether --json prints an object a line, and not one array.
    QVector<Option> options = {};
    /// What is wrong with a command line beyond what the description tells; empty for nothing.
    QString (*whyWrong)(const Invocation& invocation) = nullptr;
    int (*run)(Invocation& invocation) = nullptr; ///< Returns an ExitCode.
    QVector<Verb> verbs = {};                     ///< In place of run().

    /// The word behind that of the verb which holds this one; else the name.
    QString word() const
    {
        return name.mid(name.lastIndexOf(QLatin1Char(' ')) + 1);
    }
};

} // namespace Tool
} // namespace VeyFM

#endif
