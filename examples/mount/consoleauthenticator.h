// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef CONSOLEAUTHENTICATOR_H
#define CONSOLEAUTHENTICATOR_H

#include "rememberingauthenticator.h"

/// Asks on the terminal. A desktop program would open dialogs in the same places.
class ConsoleAuthenticator : public RememberingAuthenticator
{
protected:
    std::optional<Credentials>
    ask(const QString& server, const QString& user, bool wasRejected) override;
    std::optional<QString> askOther(const QString& text) override;
    bool confirm(const QString& text) override;
};

#endif
