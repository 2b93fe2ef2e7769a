// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/sshconfig.h"

#include <QProcess>
#include <QStringList>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int patienceMs = 5000; // The configuration may run programs.

} // namespace

bool isSshNameOf(const QString& name, const QString& user, const QString& host)
{
    const auto isSame = [&name](const QString& other) {
        return other.compare(name, Qt::CaseInsensitive) == 0;
    };
    if (isSame(host)) {
        return true;
    }
    QProcess ssh;
    QStringList words = {QStringLiteral("-G"), host};
    if (!user.isEmpty()) {
        words << QStringLiteral("-l") << user;
    }
    ssh.setStandardErrorFile(QProcess::nullDevice());
    ssh.start(QStringLiteral("ssh"), words, QIODevice::ReadOnly);
    if (!ssh.waitForFinished(patienceMs)) {
        ssh.kill();
        ssh.waitForFinished(patienceMs);
        return false;
    }
    const QStringList lines =
        QString::fromLocal8Bit(ssh.readAllStandardOutput()).split(QLatin1Char('\n'));
    // The alias wins where there is one, as in what ssh prints.
    QString called;
    for (const QString& line : lines) {
        const QString value = line.section(QLatin1Char(' '), 1);
        if (line.startsWith(QLatin1String("hostkeyalias "))) {
            return isSame(value);
        }
        if (line.startsWith(QLatin1String("hostname "))) {
            called = value;
        }
    }
    return isSame(called);
}

} // namespace Tool
} // namespace VeyFM
