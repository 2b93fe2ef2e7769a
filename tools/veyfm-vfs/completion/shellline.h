// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SHELLLINE_H
#define VEYFM_TOOL_SHELLLINE_H

#include <QString>
#include <QStringList>
#include <QVector>

namespace VeyFM {
namespace Tool {

/// What quotes a text in a command line.
enum class ShellQuote { None, Single, Double };

/**
 * A text as bash and zsh have to read it to get it back, from inside of a quote that is open
 * before the text and behind it. Nothing in it is expanded, by the history neither.
 */
QString shellQuoted(const QString& text, ShellQuote quote);

/**
 * The command line that somebody is typing, up to the cursor, as bash and zsh read it. It says what
 * the words mean, and how the last one is written on.
 *
 * What is typed stays as it is, as far as it means itself: a word is written on in the quotes that
 * are open at the cursor.
 */
class ShellLine
{
public:
    /// @p breaks are the characters behind which the shell replaces a word, COMP_WORDBREAKS; empty
    /// for one that replaces whole words.
    ShellLine(const QString& line, const QString& breaks);

    /// False where nobody but the shell knows the last word: in expansions, redirections, and
    /// quotes such as $'...'.
    bool isReadable() const;

    /// What the program gets, behind its name. The last word is the one at the cursor, which may be
    /// empty.
    QStringList words() const;

    ShellQuote quote() const;

    /// What stands for the last word, from where the shell replaces it, so that it means @p value.
    /// That begins with the last of words(). With @p isWhole the quote that is open is closed.
    QString replacement(const QString& value, bool isWhole) const;

private:
    struct Word
    {
        QString value;
        int start = 0;
        bool isKnown = true;
        bool isTarget = false; // Of a redirection.
    };

    /// A place in the line, and what of the last word's value lies before it.
    struct Place
    {
        int inLine = 0;
        int inValue = 0;
    };

    void read();
    void readPlain(QChar c);
    void readInDouble(QChar c);
    void readEscape();
    void readExpansion();
    void readAnsiQuote();
    void readRedirection();
    void skipBehind(QChar opening, QChar closing);
    void open(ShellQuote quote);
    Word& begin();
    void add(QChar c);
    void addActive(QChar c);

    QChar next(int distance) const;
    Place here() const;
    Place replacedFrom() const;

    const QString m_line;
    const QString m_breaks;
    int m_at = 0;
    QVector<Word> m_words;
    bool m_inWord = false;
    bool m_nextIsTarget = false;
    bool m_isReadable = true;
    ShellQuote m_quote = ShellQuote::None;
    Place m_behindQuote;   // That is open.
    Place m_behindBreak;   // That is no part of a quote.
    int m_lastActive = -1; // Of what is typed as itself, but means more to the shell.
    bool m_endsWithBackslash = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
