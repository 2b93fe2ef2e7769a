// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_STALLINGSERVER_H
#define VEYFM_TESTS_STALLINGSERVER_H

#include "real/sandboxserver.h"

/**
 * What accepts connections on stalled.test and then stays silent: for SSH from a moment on that the
 * test chooses, up to which it passes on what server.test says, and for FTP and Samba from the
 * begin on.
 */
class StallingServer : public SandboxServer
{
public:
    QByteArrayList programs() const override;
    bool start() override;

    /// So many bytes of the server come through a new connection.
    static void stallAfter(int bytes);

    /// Whether a connection has been stalled since the last call of stallAfter().
    static bool hasStalled();
};

#endif
