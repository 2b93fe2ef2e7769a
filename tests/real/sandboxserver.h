// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SANDBOXSERVER_H
#define VEYFM_TESTS_SANDBOXSERVER_H

#include <QByteArrayList>

/**
 * A server of a sandbox. It starts as root when the namespaces are there, and ends with them. What
 * it prints is shown when a test fails.
 */
class SandboxServer
{
public:
    SandboxServer() = default;
    virtual ~SandboxServer() = default;
    SandboxServer(const SandboxServer&) = delete;
    SandboxServer& operator=(const SandboxServer&) = delete;

    /// What it runs, by absolute path. Where one is missing, the tests skip.
    virtual QByteArrayList programs() const = 0;

    /// Writes its files and starts; false, with a reason on standard error, when it can't. That
    /// is a failure of the tests.
    virtual bool start() = 0;

protected:
    /// Runs a program to its end; true if it exits with 0. Its output is shown if not.
    static bool run(const QByteArrayList& command, const QByteArray& input = {});

    /// Starts a program and waits until it accepts connections at a port of a host.
    static bool listen(const QByteArrayList& command, const char* host, unsigned short port);
};

#endif
