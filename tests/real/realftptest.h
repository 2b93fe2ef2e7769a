// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_REALFTPTEST_H
#define VEYFM_TESTS_REALFTPTEST_H

#include "jobs/mountftpurljob.h"
#include "real/ftpserver.h"
#include "real/realmounttest.h"

/// Has "curlftpfs" be the one of tools/curlftpfs-rclone, which the tests run from the source tree,
/// also where there is a real one for it to hand over to.
inline void useCurlftpfsAdapter()
{
    ::qputenv("CURLFTPFS_RCLONE_HANDED_OVER", "1");
    ::qputenv("PATH", VEYFM_CURLFTPFS_FOLDER ":" + qgetenv("PATH"));
}

/// Nothing of what served FTP mounts is left. For cleanup() of each test.
inline void verifyNoRclone()
{
    QTRY_VERIFY(processesNamed("rclone").isEmpty());
    QVERIFY(processesNamed("curlftpfs").isEmpty());
    // Nothing of rclone's own is read or written.
    QVERIFY(!QDir::home().exists(u".config/rclone"_s));
    QVERIFY(!QDir::home().exists(u".cache/rclone"_s));
}

/**
 * A sandbox with two FTP servers:
 *
 *   - server.test knows the accounts of the sandbox and nobody else,
 *   - other.test lets anonymous visitors into bob's home, and closes a connection that does nothing
 *     for a second.
 */
class FtpSandbox : public Sandbox
{
public:
    FtpSandbox()
        : Sandbox({"/usr/bin/rclone", "/usr/bin/fusermount3"})
    {
        addServer(std::make_unique<SecretWatch>());
        addServer(std::make_unique<FtpServer>(serverHost));
        addServer(std::make_unique<FtpServer>(
            otherHost, QByteArrayList{"--anonymous", bob.name, "--idle", "1"}));
    }
};

#endif
