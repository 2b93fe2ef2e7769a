// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_PRIVATEBUS_H
#define VEYFM_TESTS_PRIVATEBUS_H

#include <QDBusConnection>
#include <QJsonArray>
#include <QJsonObject>
#include <QProcess>
#include <QStringList>
#include <QTemporaryDir>

#include <memory>

/**
 * A session bus of the test's own, on which only the services that it installs can be activated.
 * It ends with the object, and its services with it.
 *
 * To be made before anything asks for QDBusConnection::sessionBus(): start() puts the address into
 * the environment of this process.
 */
class PrivateBus
{
public:
    PrivateBus();
    ~PrivateBus();

    /// Installs the scripted service, to be started on demand. Before start().
    void installFakeService(const QJsonObject& script = {}, const QStringList& arguments = {});

    /// Installs another program under the service's name. Before start().
    void installService(const QStringList& command);

    /// Starts the bus; false with a reason in errorString().
    bool start();

    QString address() const;
    QString errorString() const;

    /// The process of the bus itself.
    qint64 processId() const;

    /// The command that runs the scripted service by hand.
    QStringList fakeServiceCommand(const QJsonObject& script = {}) const;

private:
    QString writeScript(const QJsonObject& script) const;

    QTemporaryDir m_directory;
    QProcess m_daemon;
    QString m_address;
    QString m_error;
};

/// The scripted service as a test steers it, over a connection of its own.
class FakeServiceControl
{
public:
    explicit FakeServiceControl(const QString& address);
    ~FakeServiceControl();

    /// Whether the service owns its name.
    bool isRunning() const;
    /// Process of the service, 0 without one.
    qint64 processId() const;

    /// Takes values, rules, "echo" and "remember" over; see FakeService for the form.
    void load(const QJsonObject& script);
    void setValue(const QString& method, const QJsonValue& value);
    void setRules(const QString& method, const QJsonArray& rules);

    /// Has the service emit a signal, by the last part of the interface's name.
    void emitSignal(const QString& interface, const QString& name, const QJsonArray& arguments);

    /// Has the service emit any signal, with arguments that are all text.
    void emitRaw(
        const QString& path, const QString& interface, const QString& name,
        const QStringList& arguments);

    /// The object paths that were introspected so far, in order.
    QStringList introspections() const;

    /// Calls so far in their order, as "Interface.method[arguments]".
    QStringList calls() const;
    QStringList takeCalls();

    /// Calls and signals that are not of the contract. A test ends with none.
    QStringList violations() const;

    /// Ends the service and waits until its name is free.
    void exit(int code = 0);
    /// Kills the service and waits until its name is free.
    void kill();
    /// Stops the service where it is, or has it go on. @{
    void stop();
    void resume();
    /// @}
    /// The process that stop() has stopped, 0 without one.
    qint64 stoppedProcess() const;
    /// Waits until the service owns its name; false when it takes too long.
    bool waitForService(bool running = true) const;

private:
    QVariant call(const QString& method, const QList<QVariant>& arguments = {}) const;

    QString m_name;
    QDBusConnection m_bus;
    qint64 m_stopped = 0;
};

#endif
