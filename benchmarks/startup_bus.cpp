// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// A program that starts and opens the session bus, of which there is none.

#include <QCoreApplication>
#include <QDBusConnection>

int main(int argc, char** argv)
{
    const QCoreApplication application(argc, argv);
    return QDBusConnection::sessionBus().isConnected() ? 1 : 0;
}
