// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_COMMANDLINE_H
#define VEYFM_TOOL_COMMANDLINE_H

#include "output.h"
#include "verb.h"

#include <QCommandLineParser>

namespace VeyFM {
namespace Tool {

/// One parsed command line of a verb, and where its output goes.
class Invocation
{
public:
    Invocation(const Verb& verb, const QStringList& words);

    /// What is wrong with the command line; empty when nothing is.
    QString complaint() const;

    const Verb& verb() const;
    bool isSet(const QString& option) const;
    QString value(const QString& option) const;
    QStringList operands() const;

    bool json() const; ///< Whether --json was given.
    bool null() const; ///< Whether -0 was given.

    Output& output();

private:
    QString checkValues() const;

    const Verb& m_verb;
    const QVector<Option> m_options;
    QCommandLineParser m_parser;
    QString m_complaint;
    Output m_output;
};

/// The options of @p verb with those that every verb has.
QVector<Option> allOptions(const Verb& verb);

QString generalHelp();
QString verbHelp(const Verb& verb);

/// The arguments as texts. QCoreApplication drops a byte order mark at the head of one.
QStringList wordsOf(const char* const* arguments);

/// Runs the command line @p words, which begins behind the name of the program.
int runCommandLine(const QStringList& words);

/// Options that several verbs share. @{
Option nullOption();
Option colorOption();
Option allOption();
Option timeoutOption();
/// @}

} // namespace Tool
} // namespace VeyFM

#endif
