// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "completion/shellline.h"

#include <QDir>
#include <QRegularExpression>

#include <algorithm>

namespace VeyFM {
namespace Tool {

namespace {

const QLatin1Char backslash('\\');
const QLatin1Char doubleQuote('"');
const QLatin1Char singleQuote('\'');
const QLatin1Char dollar('$');
const QLatin1Char backtick('`');
const QLatin1Char equals('=');
const QLatin1Char tilde('~');

constexpr const char* activeInDouble = "$`\"\\";

bool isBlank(QChar c)
{
    return c == QLatin1Char(' ') || c == QLatin1Char('\t') || c == QLatin1Char('\n');
}

bool isOneOf(QChar c, const char* characters)
{
    return c.unicode() < 0x80 && c.unicode() != 0 && QByteArray(characters).contains(c.toLatin1());
}

/// What a terminal would act upon. It is written by the numbers of its bytes, in quotes of its own.
bool isControl(QChar c)
{
    return c.unicode() < 0x20 || (c.unicode() >= 0x7f && c.unicode() < 0xa0);
}

QString ansiQuoted(QChar c)
{
    QString text = QStringLiteral("$'");
    if (c == QLatin1Char('\n')) {
        text += QLatin1String("\\n");
    } else if (c == QLatin1Char('\t')) {
        text += QLatin1String("\\t");
    } else {
        const QByteArray bytes = QString(c).toLocal8Bit();
        for (const char byte : bytes) {
            text += QStringLiteral("\\%1").arg(uint(uchar(byte)), 3, 8, QLatin1Char('0'));
        }
    }
    return text + singleQuote;
}

/// Outside of quotes. Characters that mean something at some places only are quoted everywhere.
QString quotedPlainly(QChar c)
{
    const bool means = c.unicode() < 0x80 && !c.isLetterOrNumber() && !isOneOf(c, "_./,+@%:-=");
    return means ? QString(backslash) + c : QString(c);
}

QString quotedInDouble(QChar c)
{
    if (c == QLatin1Char('!')) {
        // The history is looked into here, and a backslash before the mark would stay.
        return QStringLiteral("\"\\!\"");
    }
    return isOneOf(c, activeInDouble) ? QString(backslash) + c : QString(c);
}

QString quotedInSingle(QChar c)
{
    return c == singleQuote ? QStringLiteral("'\\''") : QString(c);
}

QString mark(ShellQuote quote)
{
    switch (quote) {
    case ShellQuote::Single:
        return QString(singleQuote);
    case ShellQuote::Double:
        return QString(doubleQuote);
    case ShellQuote::None:
        break;
    }
    return QString();
}

} // namespace

QString shellQuoted(const QString& text, ShellQuote quote)
{
    QString result;
    for (const QChar c : text) {
        if (isControl(c)) {
            result += mark(quote) + ansiQuoted(c) + mark(quote);
        } else if (quote == ShellQuote::Single) {
            result += quotedInSingle(c);
        } else if (quote == ShellQuote::Double) {
            result += quotedInDouble(c);
        } else {
            result += quotedPlainly(c);
        }
    }
    return result;
}

ShellLine::ShellLine(const QString& line, const QString& breaks)
    : m_line(line)
    , m_breaks(breaks)
{
    read();
    begin();
    // What comes before the program is no word of its own.
    static const QRegularExpression assignment(QStringLiteral("^[A-Za-z_][A-Za-z0-9_]*\\+?="));
    while (m_words.size() > 1 && assignment.match(m_words.constFirst().value).hasMatch()) {
        m_words.removeFirst();
    }
    const Word& last = m_words.constLast();
    const bool isActiveBefore = m_lastActive >= last.start && m_lastActive < replacedFrom().inLine;
    if (words().isEmpty() || !last.isKnown || last.isTarget || isActiveBefore) {
        m_isReadable = false;
    }
}

bool ShellLine::isReadable() const
{
    return m_isReadable;
}

QStringList ShellLine::words() const
{
    QStringList values;
    for (const Word& word : m_words) {
        if (!word.isTarget) {
            values.append(word.value);
        }
    }
    return values.mid(1);
}

ShellQuote ShellLine::quote() const
{
    return m_quote;
}

QString ShellLine::replacement(const QString& value, bool isWhole) const
{
    const Place from = replacedFrom();
    const QString& typed = m_words.constLast().value;
    QString text = m_line.mid(from.inLine);
    if (m_lastActive >= from.inLine) {
        text = (from.inLine < m_behindQuote.inLine ? mark(m_quote) : QString()) +
               shellQuoted(typed.mid(from.inValue), m_quote);
    } else if (m_endsWithBackslash) {
        text.chop(1);
    }
    const QString rest = value.mid(typed.size());
    if (typed.isEmpty() && rest.startsWith(equals) && m_quote == ShellQuote::None) {
        text += backslash; // zsh looks for a command of the name behind it.
    }
    text += shellQuoted(rest, m_quote);
    return isWhole ? text + mark(m_quote) : text;
}

void ShellLine::read()
{
    while (m_isReadable && m_at < m_line.size()) {
        const QChar c = m_line.at(m_at);
        if (m_quote == ShellQuote::None) {
            readPlain(c);
        } else if (c == mark(m_quote).at(0)) {
            m_quote = ShellQuote::None;
            ++m_at;
        } else if (m_quote == ShellQuote::Double) {
            readInDouble(c);
        } else {
            add(c);
        }
    }
}

void ShellLine::readPlain(QChar c)
{
    // Quotes and what they hold break no word, though the marks of quotes are among the breaks.
    if (c == singleQuote) {
        open(ShellQuote::Single);
        return;
    }
    if (c == doubleQuote) {
        open(ShellQuote::Double);
        return;
    }
    if (c == backslash) {
        readEscape();
        return;
    }
    if (c == dollar || c == backtick) {
        readExpansion();
        return;
    }

    const Place before = here();
    if (isBlank(c)) {
        m_inWord = false;
        ++m_at;
    } else if (isOneOf(c, "<>") || (c == QLatin1Char('&') && next(1) == QLatin1Char('>'))) {
        readRedirection();
    } else if (isOneOf(c, "&;|()")) {
        // Another command begins.
        m_inWord = false;
        m_words.clear();
        ++m_at;
    } else if (c == tilde && !m_inWord && next(1) == QLatin1Char('/')) {
        begin().value = QDir::homePath();
        ++m_at;
    } else if (isOneOf(c, "*?[]{}!^#~") || (c == equals && !m_inWord && m_breaks.isEmpty())) {
        addActive(c);
    } else {
        add(c);
    }
    if (m_breaks.contains(c)) {
        // bash, which completes names of hosts, hands on this break as part of the word.
        m_behindBreak = c == QLatin1Char('@') ? before : here();
    }
}

void ShellLine::readInDouble(QChar c)
{
    if (c == dollar || c == backtick) {
        readExpansion();
    } else if (c == backslash) {
        readEscape();
    } else if (c == QLatin1Char('!')) {
        addActive(c);
    } else {
        add(c);
    }
}

void ShellLine::readEscape()
{
    if (m_at + 1 == m_line.size()) {
        begin();
        m_endsWithBackslash = true;
        ++m_at;
    } else if (next(1) == QLatin1Char('\n')) {
        m_at += 2;
    } else {
        if (m_quote == ShellQuote::Double && !isOneOf(next(1), activeInDouble)) {
            add(backslash);
        } else {
            begin();
            ++m_at;
        }
        add(next(0));
    }
}

void ShellLine::readExpansion()
{
    static const QRegularExpression variable(
        QStringLiteral("^\\$(?:([A-Za-z_][A-Za-z0-9_]*)|\\{([A-Za-z_][A-Za-z0-9_]*)\\})"));
    Word& word = begin();
    const QRegularExpressionMatch match = variable.match(m_line.mid(m_at));
    if (match.hasMatch()) {
        const QString name = match.captured(1) + match.captured(2);
        const QString value = qEnvironmentVariable(name.toLocal8Bit().constData());
        // Outside of quotes it may be more than one word.
        const bool isOne =
            m_quote == ShellQuote::Double || std::none_of(value.begin(), value.end(), [](QChar c) {
                return isBlank(c) || isOneOf(c, "*?[\\");
            });
        word.isKnown = word.isKnown && !value.isEmpty() && isOne;
        word.value += value;
        m_at += match.capturedLength();
    } else if (next(1) == singleQuote && m_quote == ShellQuote::None) {
        readAnsiQuote();
    } else {
        word.isKnown = false;
        if (m_line.at(m_at) == backtick) {
            const int close = m_line.indexOf(backtick, m_at + 1);
            m_isReadable = close >= 0;
            m_at = close + 1;
        } else if (next(1) == QLatin1Char('(')) {
            skipBehind(QLatin1Char('('), QLatin1Char(')'));
        } else if (next(1) == QLatin1Char('{')) {
            skipBehind(QLatin1Char('{'), QLatin1Char('}'));
        } else {
            ++m_at;
        }
    }
}

void ShellLine::readAnsiQuote()
{
    static const QRegularExpression quoted(QStringLiteral("^\\$'((?:[^\\\\']|\\\\.)*)'"));
    // What shellQuoted() writes.
    static const QRegularExpression ours(QStringLiteral("^(?:\\\\n|\\\\t|(?:\\\\[0-7]{3})+)$"));
    const QRegularExpressionMatch match = quoted.match(m_line.mid(m_at));
    m_isReadable = match.hasMatch();
    m_at += match.capturedLength();
    Word& word = begin();
    const QString text = match.captured(1);
    if (!ours.match(text).hasMatch()) {
        word.isKnown = false;
    } else if (text == QLatin1String("\\n")) {
        word.value += QLatin1Char('\n');
    } else if (text == QLatin1String("\\t")) {
        word.value += QLatin1Char('\t');
    } else {
        QByteArray bytes;
        for (int i = 1; i < text.size(); i += 4) {
            bytes += char(text.mid(i, 3).toInt(nullptr, 8));
        }
        word.value += QString::fromLocal8Bit(bytes);
    }
}

void ShellLine::readRedirection()
{
    if (m_inWord) {
        // A number before it is that of a descriptor.
        bool isNumber = false;
        m_words.constLast().value.toUInt(&isNumber);
        if (isNumber) {
            m_words.removeLast();
        }
        m_inWord = false;
    }
    while (isOneOf(next(0), "<>&|")) {
        ++m_at;
    }
    m_nextIsTarget = true;
    if (next(0) == QLatin1Char('(')) {
        begin().isKnown = false;
        --m_at;
        skipBehind(QLatin1Char('('), QLatin1Char(')'));
    }
}

/// From the character before @p opening.
void ShellLine::skipBehind(QChar opening, QChar closing)
{
    int depth = 0;
    for (++m_at; m_at < m_line.size(); ++m_at) {
        if (next(0) == opening) {
            ++depth;
        } else if (next(0) == closing && --depth == 0) {
            ++m_at;
            return;
        }
    }
    m_isReadable = false;
}

void ShellLine::open(ShellQuote quote)
{
    begin();
    m_quote = quote;
    ++m_at;
    m_behindQuote = here();
}

ShellLine::Word& ShellLine::begin()
{
    if (!m_inWord) {
        Word word;
        word.start = m_at;
        word.isTarget = m_nextIsTarget;
        m_words.append(word);
        m_nextIsTarget = false;
        m_inWord = true;
    }
    return m_words.last();
}

void ShellLine::add(QChar c)
{
    begin().value += c;
    ++m_at;
}

void ShellLine::addActive(QChar c)
{
    m_lastActive = m_at;
    add(c);
}

/// NUL behind the end.
QChar ShellLine::next(int distance) const
{
    return m_at + distance < m_line.size() ? m_line.at(m_at + distance) : QChar();
}

ShellLine::Place ShellLine::here() const
{
    return {m_at, m_inWord ? int(m_words.constLast().value.size()) : 0};
}

ShellLine::Place ShellLine::replacedFrom() const
{
    if (m_breaks.isEmpty()) {
        return {m_words.constLast().start, 0};
    }
    return m_quote == ShellQuote::None ? m_behindBreak : m_behindQuote;
}

} // namespace Tool
} // namespace VeyFM
