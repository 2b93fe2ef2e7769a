// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service.h"

#include "patience.h"
#include "restart.h"

#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDBusError>
#include <QDBusReply>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int secondTryMilliseconds = 5000;

constexpr char addressVariable[] = "DBUS_SESSION_BUS_ADDRESS";

/// The session bus; where the library must not have it, by a connection of its own.
QDBusConnection sessionBus()
{
    if (!Restart::wasDone()) {
        return QDBusConnection::sessionBus();
    }
    const QString address = qEnvironmentVariable(
        addressVariable,
        QStringLiteral("unix:path=%1/bus").arg(qEnvironmentVariable("XDG_RUNTIME_DIR")));
    return QDBusConnection::connectToBus(address, QStringLiteral("veyfm-vfs"));
}

QDBusMessage ask(const QDBusMessage& message, int milliseconds)
{
    return sessionBus().call(message, QDBus::Block, milliseconds);
}

/// How each sentence begins.
QString theService()
{
    return QStringLiteral("the file manager service (%1)").arg(serviceName());
}

} // namespace

QString serviceName()
{
    return QStringLiteral("org.veylabs.vey-fm.vfs");
}

ServiceState serviceState()
{
    const Patience patience;
    ServiceState state;
    const QDBusConnection bus = sessionBus();
    state.bus = bus.isConnected();
    if (!state.bus) {
        return state;
    }
    const QDBusReply<QStringList> names = bus.interface()->activatableServiceNames();
    state.busAnswers = names.isValid();
    state.installed = names.value().contains(serviceName());
    state.running = bus.interface()->isServiceRegistered(serviceName());
    if (state.running) {
        state.answers = !isServiceSilent();
        state.processId = bus.interface()->servicePid(serviceName());
    }
    return state;
}

QString whyNoService(const ServiceState& state)
{
    if (Patience::isOver()) {
        return whySilent();
    }
    if (!state.bus) {
        return QStringLiteral("no session bus: start the program under dbus-run-session or in a "
                              "desktop session");
    }
    if (!state.busAnswers) {
        return QStringLiteral("the session bus does not answer");
    }
    if (!state.installed) {
        return theService() +
               QStringLiteral(" is not installed on this session bus: install the program that "
                              "provides it");
    }
    if (state.running && !state.answers) {
        return theService() +
               QStringLiteral(" does not answer: end it with 'kill -KILL %1', and it "
                              "is started again when it is needed")
                   .arg(state.processId);
    }
    return Restart::wasDone() ? whySilent() : QString();
}

bool isServiceSilent()
{
    if (Restart::wasDone() || Patience::isOver()) {
        return true;
    }
    return sessionBus().isConnected() && !isAnswer(ask(pingMessage(), probeMilliseconds));
}

QString whySilent()
{
    return theService() +
           QStringLiteral(" does not answer: 'veyfm-vfs status' shows how it stands");
}

QString whySilentToChange()
{
    return QStringLiteral("asked for, but ") + whySilent();
}

void leaveService()
{
    const bool isSet = qEnvironmentVariableIsSet(addressVariable);
    const QByteArray address = qgetenv(addressVariable);
    qputenv(addressVariable, "unix:path=/dev/null/none");
    // QtDBus keeps the one that it could not connect.
    QDBusConnection::sessionBus();
    if (isSet) {
        qputenv(addressVariable, address);
    } else {
        qunsetenv(addressVariable);
    }
}

QString startService(int milliseconds)
{
    const Patience patience;
    const QString daemon = QStringLiteral("org.freedesktop.DBus");
    QDBusMessage message = QDBusMessage::createMethodCall(
        daemon, QStringLiteral("/org/freedesktop/DBus"), daemon,
        QStringLiteral("StartServiceByName"));
    message << serviceName() << uint(0);
    const QDBusMessage reply = ask(message, milliseconds);
    if (reply.type() == QDBusMessage::ReplyMessage) {
        return QString();
    }
    return theService() +
           QStringLiteral(" does not start: %1; its own messages tell more ('journalctl --user')")
               .arg(
                   isAnswer(reply)
                       ? reply.errorMessage()
                       : QStringLiteral("it did not come within %1 s").arg(milliseconds / 1000));
}

QDBusMessage pingMessage()
{
    QDBusMessage message = QDBusMessage::createMethodCall(
        serviceName(), QStringLiteral("/"), QStringLiteral("org.freedesktop.DBus.Peer"),
        QStringLiteral("Ping"));
    message.setAutoStartService(false);
    return message;
}

bool isAnswer(const QDBusMessage& reply)
{
    const QDBusError::ErrorType error = QDBusError(reply).type();
    return error != QDBusError::NoReply && error != QDBusError::Timeout &&
           error != QDBusError::TimedOut && error != QDBusError::Disconnected;
}

QString whyNoRunningService()
{
    const QString why = whyNoService(serviceState());
    return why.isEmpty() ? startService() : why;
}

QString whyNothing(const Question& question)
{
    const Patience patience;
    QDBusMessage message = QDBusMessage::createMethodCall(
        serviceName(), QLatin1Char('/') + question.interface,
        QStringLiteral("org.veylabs.FileManager.") + question.interface, question.method);
    message.setArguments(question.arguments);
    message.setAutoStartService(false);
    const QDBusMessage reply = ask(message, secondTryMilliseconds);
    if (Patience::isOver()) {
        return whySilent();
    }
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
