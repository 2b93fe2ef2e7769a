// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SECRETWATCH_H
#define VEYFM_TESTS_SECRETWATCH_H

#include "real/sandboxserver.h"

#include <QStringList>

/**
 * Looks all the time, as root, whether a password of the sandbox stands in the command line or the
 * environment of any process of the sandbox.
 */
class SecretWatch : public SandboxServer
{
public:
    QByteArrayList programs() const override;
    bool start() override;

    /// What was seen since the last call, once each and in order: the name of the process and the
    /// file below /proc/<pid>, such as "smbclient environ". Has all processes looked at once more.
    static QStringList takeFindings();

    /// The files of the tests' user, at home, among the temporary ones and those of the session,
    /// that hold a password. What is mounted there is searched too.
    static QStringList findFiles();
};

#endif
