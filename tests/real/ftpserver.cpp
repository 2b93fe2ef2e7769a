// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/ftpserver.h"

FtpServer::FtpServer(const char* host, const QByteArrayList& options)
    : m_host(host)
    , m_options(options)
{
}

QByteArrayList FtpServer::programs() const
{
    return {"/usr/bin/python3", "/usr/lib/python3/dist-packages/pyftpdlib"};
}

bool FtpServer::start()
{
    const QByteArrayList command = {
        "/usr/bin/python3", VEYFM_SOURCE_DIR "/tests/real/ftpserver.py", m_host};
    return listen(command + m_options, m_host, 21);
}
