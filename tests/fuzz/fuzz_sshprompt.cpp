// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// What ssh prints while it asks, with any text of a server in it.

#include "fuzzing.h"

#include "jobs/sshprompt_p.h"

#include <algorithm>

using Fuzzing::require;
using VeyFM::Account;
using VeyFM::SshPrompt;

namespace {

// In reads of the length that the text itself says.
void append(SshPrompt* prompt, const QByteArray& bytes)
{
    for (int at = 0; at < bytes.size();) {
        const int count = 1 + uchar(bytes.at(at)) % 64;
        prompt->append(bytes.mid(at, count));
        at += count;
    }
}

void checkBounds(const SshPrompt& prompt)
{
    const QString text = prompt.text();
    require(text.size() <= 4096, "little is held");
    require(
        std::none_of(
            text.begin(), text.end(), [](QChar c) { return c.category() == QChar::Other_Control; }),
        "what is shown steers no terminal");
    const QVector<Account> accounts = prompt.accounts();
    require(accounts.size() <= 2, "two are enough for doubt");
    for (const Account& account : accounts) {
        require(!account.user.isEmpty() && !account.host.isEmpty(), "an account has a name");
    }
}

bool names(const SshPrompt& prompt, const QString& host)
{
    const QVector<Account> accounts = prompt.accounts();
    return std::any_of(accounts.begin(), accounts.end(), [&host](const Account& account) {
        return account.host == host;
    });
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QByteArray bytes(reinterpret_cast<const char*>(data), int(size));
    SshPrompt prompt;
    append(&prompt, bytes);
    checkBounds(prompt);

    // The server's part of a prompt can't hide whose it is, nor can what it printed before.
    const QString gateway = QStringLiteral("gw.test");
    prompt.clear();
    prompt.append("\r(jumper@gw.test) ");
    append(&prompt, bytes);
    require(names(prompt, gateway) || prompt.accounts().size() == 2, "the asking host is known");
    checkBounds(prompt);
    prompt.clear();
    append(&prompt, bytes);
    prompt.append("\rjumper@gw.test's password: ");
    require(names(prompt, gateway) || prompt.accounts().size() == 2, "the asking host is known");
    checkBounds(prompt);

    // What a person typed is not part of what is asked.
    prompt.clear(bytes + '\n');
    append(&prompt, bytes + '\n');
    require(prompt.text().isEmpty() && !prompt.isOpen(), "an answer is no prompt");
    return 0;
}
