// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_KNOWNHOSTS_H
#define VEYFM_TESTS_KNOWNHOSTS_H

#include "real/sshserver.h"

#include <QDir>
#include <QFile>
#include <QTest>

/// The hosts that ssh need not ask about.
namespace KnownHosts {

inline QString path()
{
    return QDir::homePath() + QStringLiteral("/.ssh/known_hosts");
}

inline void add(const char* host)
{
    QDir::home().mkpath(QStringLiteral(".ssh"));
    QFile file(path());
    QVERIFY(file.open(QIODevice::Append));
    file.write(QByteArray(host) + ' ' + SshServer::publicKey(host) + '\n');
}

inline void clear()
{
    QFile::remove(path());
}

} // namespace KnownHosts

#endif
