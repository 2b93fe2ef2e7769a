// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service.h"

#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDBusMessage>
#include <QDBusReply>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int secondTryMilliseconds = 5000;

} // namespace

QString serviceName()
{
    return QStringLiteral("org.veylabs.vey-fm.vfs");
}

ServiceState serviceState()
{
    ServiceState state;
    const QDBusConnection bus = QDBusConnection::sessionBus();
    state.bus = bus.isConnected();
    if (state.bus) {
        const QDBusReply<QStringList> names = bus.interface()->activatableServiceNames();
        state.installed = names.value().contains(serviceName());
        state.running = bus.interface()->isServiceRegistered(serviceName());
    }
    return state;
}

QString whyNoService(const ServiceState& state)
{
    if (!state.bus) {
        return QStringLiteral("no session bus: start the program under dbus-run-session or in a "
                              "desktop session");
    }
    if (!state.installed) {
        return QStringLiteral("the file manager service (%1) is not installed on this session "
                              "bus: install the program that provides it")
            .arg(serviceName());
    }
    return QString();
}

QString startService()
{
    const QDBusReply<void> reply =
        QDBusConnection::sessionBus().interface()->startService(serviceName());
    if (reply.isValid()) {
        return QString();
    }
    return QStringLiteral("the file manager service (%1) does not start: %2")
        .arg(serviceName(), reply.error().message());
}

QString whyNoRunningService()
{
    const QString why = whyNoService(serviceState());
    return why.isEmpty() ? startService() : why;
}

QString whyNothing(const Question& question)
{
    QDBusMessage message = QDBusMessage::createMethodCall(
        serviceName(), QLatin1Char('/') + question.interface,
        QStringLiteral("org.veylabs.FileManager.") + question.interface, question.method);
    message.setArguments(question.arguments);
    message.setAutoStartService(false);
    const QDBusMessage reply =
        QDBusConnection::sessionBus().call(message, QDBus::Block, secondTryMilliseconds);
    if (reply.type() == QDBusMessage::ErrorMessage) {
        return reply.errorMessage();
    }
    if (reply.signature() != question.signature) {
        return QStringLiteral("the service gave an answer of the form \"%1\", not \"%2\"")
            .arg(reply.signature(), question.signature);
    }
    return QString();
}

} // namespace Tool
} // namespace VeyFM
