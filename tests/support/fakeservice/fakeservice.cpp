// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "fakeservice.h"

#include "wire.h"

#include <QCoreApplication>
#include <QJsonDocument>
#include <QTimer>

#include <cstdlib>

#include <signal.h>

namespace {

const QString prefix = QStringLiteral("org.veylabs.FileManager.");

QString compact(const QJsonArray& array)
{
    return QString::fromUtf8(QJsonDocument(array).toJson(QJsonDocument::Compact));
}

QJsonArray parsedArray(const QVariant& text)
{
    return QJsonDocument::fromJson(text.toString().toUtf8()).array();
}

void stopIfToldTo(const QJsonObject& rule)
{
    if (rule[QStringLiteral("stop")].toBool()) {
        ::raise(SIGSTOP);
    }
}

} // namespace

FakeService::FakeService(const Contract& contract, const QDBusConnection& bus)
    : m_contract(contract)
    , m_bus(bus)
{
}

void FakeService::load(const QJsonObject& script)
{
    const QJsonObject values = script[QStringLiteral("values")].toObject();
    for (auto it = values.begin(); it != values.end(); ++it) {
        m_values.insert(it.key(), it.value());
    }
    const QJsonObject rules = script[QStringLiteral("rules")].toObject();
    for (auto it = rules.begin(); it != rules.end(); ++it) {
        m_rules.insert(it.key(), it.value());
    }
    m_echo = script[QStringLiteral("echo")].toBool(m_echo);
    m_remember = script[QStringLiteral("remember")].toBool(m_remember);
}

QString FakeService::introspect(const QString& path) const
{
    m_introspections.append(path);
    stopIfToldTo(takeRule(QStringLiteral("Introspect ") + path));
    return m_contract.introspection(path);
}

bool FakeService::handleMessage(const QDBusMessage& message, const QDBusConnection& connection)
{
    Q_UNUSED(connection)
    if (message.interface() == QLatin1String("org.veylabs.Test.Control")) {
        return control(message);
    }
    if (!m_contract.hasMethod(message.interface(), message.member())) {
        if (message.interface().startsWith(prefix)) {
            m_violations.append(message.interface() + QLatin1Char('.') + message.member());
        }
        return false; // Qt answers: introspection, properties, or an unknown method.
    }
    const QString method =
        message.interface().mid(prefix.size()) + QLatin1Char('.') + message.member();
    if (message.path() != m_contract.path(message.interface()) ||
        message.signature() != m_contract.method(message.interface(), message.member()).in) {
        m_violations.append(
            method + QLatin1Char(' ') + message.path() + QLatin1Char(' ') + message.signature());
    }
    QJsonArray arguments;
    const QList<QVariant> received = message.arguments();
    for (const QVariant& argument : received) {
        arguments.append(Wire::toJson(argument));
    }
    m_calls.append(method + compact(arguments));

    const QJsonObject rule = takeRule(method);
    if (rule.contains(QStringLiteral("exit"))) {
        std::_Exit(rule[QStringLiteral("exit")].toInt());
    }
    stopIfToldTo(rule);
    const QJsonArray early = rule[QStringLiteral("signals")].toArray();
    for (const QJsonValue& signal : early) {
        emitSignal(signal[0].toString(), signal[1].toString(), signal[2].toArray());
    }
    const int delay = rule[QStringLiteral("delay")].toInt();
    if (delay > 0) {
        QTimer::singleShot(
            delay, this, [this, message, rule, arguments] { answer(message, rule, arguments); });
    } else {
        answer(message, rule, arguments);
    }
    return true;
}

QJsonObject FakeService::takeRule(const QString& method) const
{
    QJsonArray rules = m_rules[method].toArray();
    if (rules.isEmpty()) {
        return QJsonObject();
    }
    const QJsonObject rule = rules.first().toObject();
    if (!rule[QStringLiteral("keep")].toBool()) {
        rules.removeFirst();
        m_rules[method] = rules;
    }
    return rule;
}

QJsonValue FakeService::valueFor(const QString& method, const QJsonArray& arguments) const
{
    QString key = method;
    QJsonValue value = m_values[key];
    for (const QJsonValue& argument : arguments) {
        key += QLatin1Char(' ') + argument.toString();
        if (m_values.contains(key)) {
            value = m_values[key];
        }
    }
    return value;
}

void FakeService::answer(
    const QDBusMessage& message, const QJsonObject& rule, const QJsonArray& arguments)
{
    if (rule[QStringLiteral("silent")].toBool()) {
        return;
    }
    if (rule.contains(QStringLiteral("error"))) {
        m_bus.send(message.createErrorReply(
            QStringLiteral("org.veylabs.Test.Failed"), rule[QStringLiteral("error")].toString()));
        return;
    }
    if (m_remember && message.member() == QLatin1String("addMount")) {
        rememberMount(message.interface(), arguments);
    }
    const QString name =
        message.interface().mid(prefix.size()) + QLatin1Char('.') + message.member();
    const QString out = m_contract.method(message.interface(), message.member()).out;
    QDBusMessage reply = message.createReply();
    if (rule[QStringLiteral("wrong")].toBool()) {
        reply << QVariant::fromValue(QDBusObjectPath(QStringLiteral("/wrong")));
    } else if (!out.isEmpty() && !rule[QStringLiteral("empty")].toBool()) {
        reply << Wire::fromJson(
            out, rule.contains(QStringLiteral("value")) ? rule[QStringLiteral("value")]
                                                        : valueFor(name, arguments));
    }
    if (rule[QStringLiteral("extra")].toBool()) {
        reply << QStringLiteral("extra");
    }
    if (message.isReplyRequired()) {
        m_bus.send(reply);
    }
    if (m_echo) {
        echo(message.interface(), message.member(), arguments);
    }
}

void FakeService::rememberMount(const QString& interface, const QJsonArray& arguments)
{
    const QString key = interface.mid(prefix.size()) + QLatin1String(".mounts");
    QJsonObject mounts = m_values[key].toObject();
    mounts.insert(arguments.at(0).toString(), arguments.at(1));
    m_values[key] = mounts;
}

void FakeService::echo(const QString& interface, const QString& member, const QJsonArray& arguments)
{
    static const QMap<QString, QString> echoes = {
        {QStringLiteral("notifyWatchers"), QStringLiteral("notifyWatchersSignal")},
        {QStringLiteral("addFavouritePlace"), QStringLiteral("favouritePlaceAdded")},
        {QStringLiteral("removeFavouritePlace"), QStringLiteral("favouritePlaceRemoved")},
        {QStringLiteral("addNetworkPlace"), QStringLiteral("networkPlaceAdded")},
        {QStringLiteral("removeNetworkPlace"), QStringLiteral("networkPlaceRemoved")},
        {QStringLiteral("updateNetworkPlace"), QStringLiteral("networkPlaceUpdated")},
        {QStringLiteral("addMount"), QStringLiteral("mountAdded")},
    };
    const QString signal = echoes.value(member);
    if (!signal.isEmpty() && !m_contract.signalSignature(interface, signal).isNull()) {
        emitSignal(interface, signal, arguments);
    }
}

void FakeService::emitSignal(
    const QString& interface, const QString& name, const QJsonArray& arguments)
{
    const QString full = interface.startsWith(prefix) ? interface : prefix + interface;
    const QString signature = m_contract.signalSignature(full, name);
    if (signature.isNull()) {
        m_violations.append(QStringLiteral("signal %1.%2").arg(interface, name));
        return;
    }
    QDBusMessage signal = QDBusMessage::createSignal(m_contract.path(full), full, name);
    const QStringList types = Wire::split(signature);
    for (int i = 0; i < types.size(); ++i) {
        signal << Wire::fromJson(types.at(i), arguments.at(i));
    }
    m_bus.send(signal);
}

bool FakeService::control(const QDBusMessage& message)
{
    const QList<QVariant> arguments = message.arguments();
    QDBusMessage reply = message.createReply();
    if (message.member() == QLatin1String("Load")) {
        load(QJsonDocument::fromJson(arguments.value(0).toString().toUtf8()).object());
    } else if (message.member() == QLatin1String("Emit")) {
        emitSignal(
            arguments.value(0).toString(), arguments.value(1).toString(),
            parsedArray(arguments.value(2)));
    } else if (message.member() == QLatin1String("Calls")) {
        reply << m_calls;
    } else if (message.member() == QLatin1String("ClearCalls")) {
        m_calls.clear();
    } else if (message.member() == QLatin1String("Violations")) {
        reply << m_violations;
    } else if (message.member() == QLatin1String("Introspections")) {
        reply << m_introspections;
    } else if (message.member() == QLatin1String("EmitRaw")) {
        QDBusMessage signal = QDBusMessage::createSignal(
            arguments.value(0).toString(), arguments.value(1).toString(),
            arguments.value(2).toString());
        const QStringList texts = arguments.value(3).toStringList();
        for (const QString& text : texts) {
            signal << text;
        }
        m_bus.send(signal);
    } else if (message.member() == QLatin1String("Exit")) {
        m_bus.send(reply);
        const int code = arguments.value(0).toInt();
        QTimer::singleShot(0, this, [code] { QCoreApplication::exit(code); });
        return true;
    } else {
        return false;
    }
    m_bus.send(reply);
    return true;
}
