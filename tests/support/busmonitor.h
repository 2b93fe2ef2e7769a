// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_BUSMONITOR_H
#define VEYFM_TESTS_BUSMONITOR_H

#include <QProcess>
#include <QTest>

/// All method calls on a bus, as dbus-monitor sees them.
class BusMonitor
{
public:
    ~BusMonitor()
    {
        process.kill();
        process.waitForFinished();
    }

    bool start(const QString& address)
    {
        process.start(
            QStringLiteral("dbus-monitor"),
            {QStringLiteral("--address"), address, QStringLiteral("--profile")});
        // It says that it lost its name when it has become a monitor.
        return waitFor(QStringLiteral("NameLost"));
    }

    /// Waits for a line of output that ends in a word.
    bool waitFor(const QString& word)
    {
        return QTest::qWaitFor(
            [&] {
                while (process.canReadLine()) {
                    lines << QString::fromUtf8(process.readLine()).trimmed();
                    if (lines.last().endsWith(word)) {
                        return true;
                    }
                }
                return false;
            },
            20000);
    }

    /// The members of the calls so far, as "path member", for the members that are asked for.
    QStringList calls(const QStringList& members) const
    {
        QStringList result;
        for (const QString& line : lines) {
            // type, time, serial, sender, destination, path, interface, member
            const QStringList fields = line.split(QLatin1Char('\t'));
            if (fields.value(0) == QLatin1String("mc") && members.contains(fields.value(7))) {
                result << fields.value(5) + QLatin1Char(' ') + fields.value(7);
            }
        }
        return result;
    }

    QProcess process;
    QStringList lines;
};

#endif
