// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FAKESERVICE_FAKESERVICE_H
#define VEYFM_FAKESERVICE_FAKESERVICE_H

#include "contract.h"

#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusVirtualObject>
#include <QJsonArray>
#include <QJsonObject>
#include <QMap>
#include <QStringList>

/**
 * A file manager service that says what a script tells it to.
 *
 * Each method answers from its value ("values", by "Interface.method", for example
 * "SmbBrowser.workgroups": ["WG"]), or with the default of its type. Methods with arguments take
 * a value by their first arguments too: "SmbBrowser.hosts WG". Rules ("rules", by
 * "Interface.method", a list that is used up from its front) come before values:
 *
 *   {"error": "text"}           an error reply with this text
 *   {"value": ...}              this value, once
 *   {"wrong": true}             a reply of another type
 *   {"extra": true}             the usual reply and one argument more
 *   {"empty": true}             a reply without arguments
 *   {"silent": true}            no reply at all
 *   {"delay": ms}               with any of these, or alone: later
 *   {"signals": [[interface, name, [arguments]], ...]}   emitted before the reply
 *   {"exit": code}              ends the process without a reply
 *   {"stop": true}              stops the process (SIGSTOP); what is left of the rule follows when
 *                               it goes on. Introspections take this one too, by "Introspect PATH"
 *   {"keep": true}              the rule is not used up
 *
 * What a service does of its own accord (the echo of notifyWatchers, the signals behind add,
 * remove and update, mountAdded) it does while "echo" is true, as it is by default.
 *
 * While "remember" is true, which it is not by default, what addMount brings is in the values of
 * the register's "mounts" from then on, unless a rule has the call fail.
 *
 * Tests steer it on the path "/Control", interface "org.veylabs.Test.Control":
 *   Load(s json), Emit(s interface, s signal, s arguments), Calls() -> as, ClearCalls(),
 *   Violations() -> as, Exit(i code), Introspections() -> as (the paths, in order),
 *   EmitRaw(s path, s interface, s signal, as arguments): a signal that need not be of the
 *   contract, with arguments that are all text.
 */
class FakeService : public QDBusVirtualObject
{
    Q_OBJECT

public:
    FakeService(const Contract& contract, const QDBusConnection& bus);

    /// Takes values, rules, "echo" and "remember" over from a script.
    void load(const QJsonObject& script);

    QString introspect(const QString& path) const override;
    bool handleMessage(const QDBusMessage& message, const QDBusConnection& connection) override;

private:
    bool control(const QDBusMessage& message);
    QJsonObject takeRule(const QString& method) const;
    QJsonValue valueFor(const QString& method, const QJsonArray& arguments) const;
    void answer(const QDBusMessage& message, const QJsonObject& rule, const QJsonArray& arguments);
    void rememberMount(const QString& interface, const QJsonArray& arguments);
    void echo(const QString& interface, const QString& member, const QJsonArray& arguments);
    void emitSignal(const QString& interface, const QString& name, const QJsonArray& arguments);

    const Contract& m_contract;
    QDBusConnection m_bus;
    QJsonObject m_values;
    mutable QJsonObject m_rules;
    bool m_echo = true;
    bool m_remember = false;
    QStringList m_calls;
    QStringList m_violations;
    mutable QStringList m_introspections;
};

#endif
