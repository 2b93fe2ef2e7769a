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

/// What ssh reads before it connects; "clear()" takes it away too.
inline void setConfiguration(const QByteArray& lines)
{
    QDir::home().mkpath(QStringLiteral(".ssh"));
    QFile file(QDir::homePath() + QStringLiteral("/.ssh/config"));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.setPermissions(QFile::ReadOwner | QFile::WriteOwner);
    file.write(lines);
}

inline void clear()
{
    QFile::remove(path());
    QFile::remove(QDir::homePath() + QStringLiteral("/.ssh/config"));
}

} // namespace KnownHosts

#endif
