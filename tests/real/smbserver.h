// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SMBSERVER_H
#define VEYFM_TESTS_SMBSERVER_H

#include "real/sandboxserver.h"

struct SandboxAccount;

/**
 * Debian's Samba server on port 445 of server.test, for alice and bob. It has the shares
 *
 *   "public"    for everybody, guests too,
 *   "private"   for alice alone,
 *   "public -Tc .profile name.txt", for everybody, whose name is a trap.
 *
 * The files of the Samba of the machine, settings too, are out of sight for the whole sandbox.
 */
class SmbServer : public SandboxServer
{
public:
    QByteArrayList programs() const override;
    bool start() override;

private:
    static bool hideSystemFiles();
    static bool addUser(const SandboxAccount& account);
};

#endif
