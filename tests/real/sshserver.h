// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SSHSERVER_H
#define VEYFM_TESTS_SSHSERVER_H

#include "real/sandboxserver.h"

#include <QString>

/// Debian's OpenSSH server on port 22 of a host of the sandbox, for the accounts of the sandbox.
class SshServer : public SandboxServer
{
public:
    enum Login {
        Password,
        KeyboardInteractive, ///< And nothing else, through PAM.
    };

    explicit SshServer(const char* host, Login login = Password);

    QByteArrayList programs() const override;
    bool start() override;

    /// What a server is known by: its host key as it stands in a list of known hosts.
    static QByteArray publicKey(const char* host);

    /// "SHA256:..." as ssh-keygen tells it.
    static QString fingerprint(const char* host);

private:
    static QByteArray directory(const char* host);
    QByteArray configuration() const;

    const char* const m_host;
    const Login m_login;
};

#endif
