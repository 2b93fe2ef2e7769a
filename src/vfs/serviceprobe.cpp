// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/serviceprobe.h"

#include <QDBusConnection>
#include <QDBusError>
#include <QDBusMessage>
#include <QDBusReply>

#include <algorithm>
#include <atomic>

namespace VeyFM {

namespace {

std::atomic<int> probe{0};

// A program that has to be loaded first is slower than one that only has to answer.
constexpr int probesOfAStart = 3;

QDBusMessage call(QDBusMessage message, int probes = 1)
{
    const int milliseconds = probe;
    message.setAutoStartService(false);
    return QDBusConnection::sessionBus().call(
        message, QDBus::Block, milliseconds > 0 ? milliseconds * probes : -1);
}

QDBusMessage daemonCall(const char* method)
{
    const QString name = QStringLiteral("org.freedesktop.DBus");
    return QDBusMessage::createMethodCall(
        name, QStringLiteral("/org/freedesktop/DBus"), name, QLatin1String(method));
}

// An error is an answer too: that nobody owns the name, or that the owner knows no such call.
bool isAnswer(const QDBusMessage& reply)
{
    const QDBusError::ErrorType error = QDBusError(reply).type();
    return error != QDBusError::NoReply && error != QDBusError::Timeout &&
           error != QDBusError::TimedOut;
}

} // namespace

void ServiceProbe::setMilliseconds(int milliseconds)
{
    probe = std::max(milliseconds, 0);
}

QStringList ServiceProbe::activatableNames()
{
    const QDBusReply<QStringList> names = call(daemonCall("ListActivatableNames"));
    return names.value();
}

bool ServiceProbe::start(const QString& service)
{
    QDBusMessage message = daemonCall("StartServiceByName");
    message << service << uint(0);
    const QDBusMessage reply = call(message, probesOfAStart);
    // What comes of it is not looked at otherwise.
    return probe == 0 || (isAnswer(reply) && passes(service));
}

bool ServiceProbe::passes(const QString& service)
{
    return probe == 0 || isAnswer(call(QDBusMessage::createMethodCall(
                             service, QStringLiteral("/"),
                             QStringLiteral("org.freedesktop.DBus.Peer"), QStringLiteral("Ping"))));
}

} // namespace VeyFM
