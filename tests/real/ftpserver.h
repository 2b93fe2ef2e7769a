// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_FTPSERVER_H
#define VEYFM_TESTS_FTPSERVER_H

#include "real/sandboxserver.h"

/// Debian's pyftpdlib on port 21 of a host of the sandbox, for the accounts of the sandbox. All
/// that each of them sees is the home.
class FtpServer : public SandboxServer
{
public:
    /// With @p options of ftpserver.py.
    explicit FtpServer(const char* host, const QByteArrayList& options = {});

    QByteArrayList programs() const override;
    bool start() override;

private:
    const char* const m_host;
    const QByteArrayList m_options;
};

#endif
