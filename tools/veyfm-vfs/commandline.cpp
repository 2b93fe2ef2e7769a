// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"

#include "host/mounturl.h"
#include "patience.h"
#include "report.h"
#include "session.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

#include <algorithm>

namespace VeyFM {
namespace Tool {

using Host::shownUrl;

namespace {

QString hint(const QString& verb)
{
    return QStringLiteral("Try 'veyfm-vfs %1--help'.")
        .arg(verb.isEmpty() ? QString() : verb + QLatin1Char(' '));
}

int wrongUsage(const QString& verb, const QString& why)
{
    report(verb.isEmpty() ? QStringLiteral("usage") : verb, why);
    say(hint(verb));
    return WrongUsage;
}

/// The parser's sentences, as the second half of a message.
QString asReason(QString sentence)
{
    if (sentence.endsWith(QLatin1Char('.'))) {
        sentence.chop(1);
    }
    if (!sentence.isEmpty()) {
        sentence[0] = sentence.at(0).toLower();
    }
    return sentence;
}

QString optionLine(const Option& option)
{
    QStringList names;
    for (const QString& name : option.names) {
        const bool isShort = name.size() == 1;
        QString text = (isShort ? QStringLiteral("-") : QStringLiteral("--")) + name;
        if (!option.valueName.isEmpty()) {
            text += (isShort ? QStringLiteral(" ") : QStringLiteral("=")) + option.valueName;
        }
        names.append(text);
    }
    const bool onlyLong = option.names.constFirst().size() > 1;
    const QString left = (onlyLong ? QStringLiteral("      ") : QStringLiteral("  ")) +
                         names.join(QLatin1String(", "));
    return left.leftJustified(26) + QLatin1Char(' ') + option.description + QLatin1Char('\n');
}

QString helpLines(const QVector<Verb>& verbs)
{
    QString text = QStringLiteral("Commands:\n");
    for (const Verb& verb : verbs) {
        if (!verb.hidden) {
            text += QLatin1String("  ") + verb.word().leftJustified(12) + verb.summary +
                    QLatin1Char('\n');
        }
    }
    return text;
}

} // namespace

Option nullOption()
{
    return {
        {QStringLiteral("0"), QStringLiteral("null")},
        QStringLiteral("End each record with a NUL byte, and names raw")};
}

Option colorOption()
{
    return {
        {QStringLiteral("color")},
        QStringLiteral("Colour by kind: auto (default), always or never"),
        QStringLiteral("WHEN"),
        {QStringLiteral("auto"), QStringLiteral("always"), QStringLiteral("never")}};
}

Option allOption()
{
    return {
        {QStringLiteral("a"), QStringLiteral("all")},
        QStringLiteral("Show names that begin with a dot")};
}

Option timeoutOption()
{
    return {
        {QStringLiteral("timeout")},
        QStringLiteral("Wait so long for the news of the change (default: 10; 0: no bound)"),
        QStringLiteral("SECONDS"),
        {},
        true};
}

QVector<Option> allOptions(const Verb& verb)
{
    QVector<Option> options = verb.options;
    if (verb.printsData) {
        options.append({{QStringLiteral("json")}, QStringLiteral("Print JSON")});
    }
    options.append(
        {{QStringLiteral("verbose")}, QStringLiteral("Show what the library logs, too")});
    QStringList help = {QStringLiteral("h"), QStringLiteral("help")};
    const bool isTaken = std::any_of(options.begin(), options.end(), [&help](const Option& option) {
        return option.names.contains(help.constFirst());
    });
    if (isTaken) {
        help.removeFirst();
    }
    options.append({help, QStringLiteral("Show this help")});
    options.append({{QStringLiteral("version")}, QStringLiteral("Show the version")});
    return options;
}

Invocation::Invocation(const Verb& verb, const QStringList& words)
    : m_verb(verb)
    , m_options(allOptions(verb))
{
    for (const Option& option : m_options) {
        m_parser.addOption({option.names, option.description, option.valueName});
    }
    // The first word is the name of a program to the parser.
    if (!m_parser.parse(QStringList(verb.name) + words)) {
        m_complaint = asReason(m_parser.errorText());
    } else {
        m_complaint = checkValues();
    }
    m_output.setNull(null());
    m_output.setColour(value(QStringLiteral("color")));
}

QString Invocation::checkValues() const
{
    for (const Option& option : m_options) {
        const QString& name = option.names.constLast();
        if (!m_parser.isSet(name)) {
            continue;
        }
        const QString value = m_parser.value(name);
        bool isNumber = false;
        value.toUInt(&isNumber);
        if (option.isNumber && !isNumber) {
            return QStringLiteral("'%1' is no value of --%2: not a number").arg(value, name);
        }
        if (!option.values.isEmpty() && !option.values.contains(value)) {
            return QStringLiteral("'%1' is no value of --%2, which takes %3")
                .arg(value, name, option.values.join(QLatin1String(", ")));
        }
    }
    if (json() && null()) {
        return QStringLiteral("--json and --null exclude each other");
    }
    const bool asksForText = isSet(QStringLiteral("help")) || isSet(QStringLiteral("version"));
    if (operands().size() < m_verb.leastOperands && !asksForText) {
        return QStringLiteral("an operand is missing");
    }
    if (m_verb.mostOperands >= 0 && operands().size() > m_verb.mostOperands && !asksForText) {
        return QStringLiteral("'%1' is an operand too many")
            .arg(shownUrl(operands().at(m_verb.mostOperands)));
    }
    return QString();
}

QString Invocation::complaint() const
{
    return m_complaint;
}

const Verb& Invocation::verb() const
{
    return m_verb;
}

bool Invocation::isSet(const QString& option) const
{
    for (const Option& known : m_options) {
        if (known.names.contains(option)) {
            return m_parser.isSet(option);
        }
    }
    return false;
}

QString Invocation::value(const QString& option) const
{
    return isSet(option) ? m_parser.value(option) : QString();
}

QStringList Invocation::operands() const
{
    return m_parser.positionalArguments();
}

bool Invocation::json() const
{
    return isSet(QStringLiteral("json"));
}

bool Invocation::null() const
{
    return isSet(QStringLiteral("null"));
}

Output& Invocation::output()
{
    return m_output;
}

QString generalHelp()
{
    return QStringLiteral("Usage:\n  veyfm-vfs COMMAND [OPTION...] [OPERAND...]\n\n"
                          "Shows the places, files and directories of the virtual file "
                          "system.\n\n") +
           helpLines(verbs()) +
           QStringLiteral("\n'veyfm-vfs COMMAND --help' tells more of one command, and "
                          "veyfm-vfs(1) of all.\n");
}

QString verbHelp(const Verb& verb)
{
    const QString words = verb.verbs.isEmpty() ? QStringLiteral("[OPTION...]")
                                               : QStringLiteral("COMMAND [OPTION...]");
    QString text =
        QStringLiteral("Usage:\n  veyfm-vfs %1 %2 %3").arg(verb.name, words, verb.operands);
    while (text.endsWith(QLatin1Char(' '))) {
        text.chop(1);
    }
    text += QStringLiteral("\n\n%1.\n").arg(verb.summary);
    if (!verb.details.isEmpty()) {
        text += QLatin1Char('\n') + verb.details + QLatin1Char('\n');
    }
    if (!verb.verbs.isEmpty()) {
        text += QLatin1Char('\n') + helpLines(verb.verbs);
    }
    text += QStringLiteral("\nOptions:\n");
    const QVector<Option> options = allOptions(verb);
    for (const Option& option : options) {
        text += optionLine(option);
    }
    return text;
}

QStringList wordsOf(const char* const* arguments)
{
    QStringList words;
    for (; *arguments; ++arguments) {
        words.append(QString::fromLocal8Bit(QByteArray("/") + *arguments).mid(1));
    }
    return words;
}

int runCommandLine(const QStringList& words)
{
    if (words.isEmpty()) {
        return wrongUsage(QString(), QStringLiteral("a command is missing"));
    }

    const QString& word = words.constFirst();
    const bool wantsHelp = word == QLatin1String("--help") || word == QLatin1String("-h");
    if (wantsHelp || word == QLatin1String("--version")) {
        Output output;
        output.write(wantsHelp ? generalHelp() : versionText());
        return output.finish(Done);
    }
    const Verb* verb = findVerb(word);
    if (!verb) {
        return wrongUsage(
            QString(), QStringLiteral("%1: %2").arg(
                           word, word.startsWith(QLatin1Char('-'))
                                     ? QStringLiteral("an option needs a command before it")
                                     : whyNoVerb(word)));
    }
    int used = 1;
    if (!verb->verbs.isEmpty() && words.size() > 1 && !words.at(1).startsWith(QLatin1Char('-'))) {
        const Verb* inner = findVerb(words.at(1), verb->verbs);
        if (!inner) {
            return wrongUsage(
                verb->name,
                QStringLiteral("%1: %2").arg(words.at(1), whyNoVerb(words.at(1), verb->verbs)));
        }
        verb = inner;
        ++used;
    }

    Invocation invocation(*verb, words.mid(used));
    if (!invocation.complaint().isEmpty()) {
        return wrongUsage(verb->name, invocation.complaint());
    }
    Output& output = invocation.output();
    if (invocation.isSet(QStringLiteral("help"))) {
        output.write(verbHelp(*verb));
        return output.finish(Done);
    }
    if (invocation.isSet(QStringLiteral("version"))) {
        output.write(versionText());
        return output.finish(Done);
    }
    if (!verb->run) {
        return wrongUsage(verb->name, QStringLiteral("a command is missing"));
    }
    const QString why = verb->whyWrong ? verb->whyWrong(invocation) : QString();
    if (!why.isEmpty()) {
        return wrongUsage(verb->name, why);
    }
    setVerbose(invocation.isSet(QStringLiteral("verbose")));
    VFS::initialize();
    const bool wantsArray = invocation.json() && !verb->jsonLines;
    if (wantsArray) {
        Patience::setOutputEnd(QByteArrayLiteral("[]\n"));
    }
    int exitCode = runVerb(invocation);
    // A verb that failed before it had anything to print.
    if (wantsArray && !output.wasUsed()) {
        JsonArray(output).end();
    }
    exitCode = output.finish(exitCode);
    Patience::boundParting(exitCode);
    return exitCode;
}

} // namespace Tool
} // namespace VeyFM
