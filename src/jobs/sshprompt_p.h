// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SSHPROMPT_P_H
#define VEYFM_SSHPROMPT_P_H

#include <QByteArray>
#include <QString>
#include <QVector>

namespace VeyFM {

/// A user on a host.
struct Account
{
    QString user;
    QString host;
};

/**
 * What ssh has printed since it got its last answer, to learn who asks and for what.
 *
 * ssh says whose password it wants ("user@host's password: "), and with a jump host before the host
 * that is not always the user's on the URL's host. What a server has it ask stands behind
 * "(user@host) ". A server may print what looks like either, in front of the prompt, as its banner,
 * or behind that mark; but it can't take the genuine one away, which begins right behind the
 * carriage return that ssh prints first. So each place of that kind counts, and the begin of the
 * line that waits. Only so much is held as that needs, whatever is printed.
 */
class SshPrompt
{
public:
    void append(const QByteArray& output);

    /// To be called for each answer. One that the terminal shows is not taken for output.
    void clear(const QByteArray& shown = {});

    /// Whether the output ends amid a line with something in it.
    bool isOpen() const;

    /// What was printed last and did not end with a newline, for a person: without control
    /// characters, and with a blank where a line ended.
    QString text() const;

    /// Those that are named, but one of each host. With more than one it is not certain who asks.
    QVector<Account> accounts() const;

private:
    void takeByte(char byte);
    void dropShown(QByteArray* output);

    QByteArray m_shown; ///< What the terminal still has to show.
    QByteArray m_text;  ///< Since the last newline at the end of a read; its end, if it is long.
    QByteArray m_line;  ///< Since the last newline or carriage return; its begin, if it is long.
    bool m_isBehindReturn = false; ///< Whether the line begins where ssh begins its prompts.
    QVector<Account> m_accounts;   ///< Of lines before this one.
};

} // namespace VeyFM

#endif
