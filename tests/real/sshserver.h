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
        Key,                 ///< And nothing else: clientKey().
    };

    explicit SshServer(const char* host, Login login = Password);

    QByteArrayList programs() const override;
    bool start() override;

    /// What a server is known by: its host key as it stands in a list of known hosts.
    static QByteArray publicKey(const char* host);

    /// The file with the key that opens all accounts of a host with the login Key, for the user of
    /// the tests alone, and its passphrase. @{
    static QString clientKey(const char* host);
    static constexpr const char* passphrase = "diabase-4-key";
    /// @}

    /// "SHA256:..." as ssh-keygen tells it.
    static QString fingerprint(const char* host);

private:
    static QByteArray directory(const char* host);
    QByteArray configuration() const;
    bool makeClientKey() const;

    const char* const m_host;
    const Login m_login;
};

#endif
