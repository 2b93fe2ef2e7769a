// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/sshprompt_p.h"

#include <QRegularExpression>

#include <algorithm>

namespace VeyFM {

namespace {

constexpr int mostText = 4096;
constexpr int mostLine = 2048; // More than the longest names.
constexpr int mostAccounts = 2;

bool isShown(QChar c)
{
    return c.category() != QChar::Other_Control;
}

void addAccountOf(const QByteArray& line, QVector<Account>* accounts)
{
    // In this order: behind the mark of who asks a server may put the other.
    static const QRegularExpression forms[] = {
        QRegularExpression(QStringLiteral("\\A\\(([^()]+)@([^@()\\s]+)\\) ")),
        QRegularExpression(QStringLiteral("\\A(.+)@([^@\\s]+)'s password:"))};
    if (accounts->size() == mostAccounts) {
        return;
    }
    const QString text = QString::fromLocal8Bit(line);
    for (const QRegularExpression& form : forms) {
        const QRegularExpressionMatch match = form.match(text);
        if (!match.hasMatch()) {
            continue;
        }
        const Account account = {match.captured(1), match.captured(2)};
        const bool isKnown =
            std::any_of(accounts->begin(), accounts->end(), [&account](const Account& known) {
                return known.host.compare(account.host, Qt::CaseInsensitive) == 0;
            });
        if (!isKnown) {
            accounts->append(account);
        }
        return;
    }
}

} // namespace

void SshPrompt::append(const QByteArray& output)
{
    QByteArray rest = output;
    dropShown(&rest);
    if (m_text.endsWith('\n')) {
        m_text.clear(); // That was no prompt.
    }
    m_text = (m_text + rest).right(mostText);
    for (const char byte : qAsConst(rest)) {
        takeByte(byte);
    }
}

void SshPrompt::dropShown(QByteArray* output)
{
    int same = 0;
    while (same < m_shown.size() && same < output->size() && m_shown.at(same) == output->at(same)) {
        ++same;
    }
    const bool isWhole = same == output->size();
    output->remove(0, same);
    m_shown = isWhole ? m_shown.mid(same) : QByteArray();
}

void SshPrompt::takeByte(char byte)
{
    if (byte != '\n' && byte != '\r') {
        if (m_line.size() < mostLine) {
            m_line += byte;
        }
        return;
    }
    if (m_isBehindReturn) {
        addAccountOf(m_line, &m_accounts);
    }
    m_isBehindReturn = byte == '\r';
    m_line.clear();
}

void SshPrompt::clear(const QByteArray& shown)
{
    *this = SshPrompt();
    m_shown = shown;
}

bool SshPrompt::isOpen() const
{
    const QString line = QString::fromLocal8Bit(m_line);
    return !m_text.endsWith('\n') && std::any_of(line.begin(), line.end(), [](QChar c) {
        return isShown(c) && !c.isSpace();
    });
}

QString SshPrompt::text() const
{
    QString text;
    bool isBehindLine = false;
    const QString all = QString::fromLocal8Bit(m_text);
    for (const QChar c : all) {
        if (isShown(c)) {
            if (isBehindLine) {
                text += QLatin1Char(' ');
            }
            text += c;
            isBehindLine = false;
        } else {
            isBehindLine = isBehindLine || (c == QLatin1Char('\n') && !text.isEmpty());
        }
    }
    return text;
}

QVector<Account> SshPrompt::accounts() const
{
    QVector<Account> all = m_accounts;
    addAccountOf(m_line, &all);
    return all;
}

} // namespace VeyFM
