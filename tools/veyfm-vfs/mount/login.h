// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_LOGIN_H
#define VEYFM_TOOL_LOGIN_H

#include "verb.h"

namespace VeyFM {
namespace Tool {

class Invocation;

/// What a command line says of logging in.
struct Login
{
    QString user;                ///< Empty when none was given.
    int passwordDescriptor = -1; ///< -1 when none was given.
    bool noInput = false;        ///< Whether nobody may be asked.
};

/// --user, --password-fd and --no-input.
QVector<Option> loginOptions();

/// Why they can't be used, or empty; see Verb::whyWrong.
QString whyNoLogin(const Invocation& invocation);

/// What they say. From then on the descriptor stays with this process.
Login readLogin(const Invocation& invocation);

/// The name that the user of this process has logged in by; may be empty.
QString loginName();

} // namespace Tool
} // namespace VeyFM

#endif
