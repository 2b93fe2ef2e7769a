// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// A program that starts and opens the session bus: there is one if it has an argument.

#include <QCoreApplication>
#include <QDBusConnection>

int main(int argc, char** argv)
{
    const QCoreApplication application(argc, argv);
    return QDBusConnection::sessionBus().isConnected() == (argc > 1) ? 0 : 1;
}
