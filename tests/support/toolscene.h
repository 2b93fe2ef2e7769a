// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_TOOLSCENE_H
#define VEYFM_TESTS_TOOLSCENE_H

#include "support/privatebus.h"
#include "support/toolrunner.h"

#include <QDir>
#include <QTest>

#include <memory>

/// The tool, a session bus and the scripted service, which runs or is only installed.
class ToolScene
{
public:
    enum Service { Running, Installed, Missing };

    explicit ToolScene(const QJsonObject& script = {}, Service service = Running)
        : ToolScene(script, service, {})
    {
    }

    /// A service that ends before it owns its name.
    static std::unique_ptr<ToolScene> withDyingService()
    {
        return std::unique_ptr<ToolScene>(new ToolScene({}, Installed, {QStringLiteral("--die")}));
    }

    /// One that never owns its name.
    static std::unique_ptr<ToolScene> withHangingService()
    {
        return std::unique_ptr<ToolScene>(new ToolScene({}, Installed, {QStringLiteral("--hang")}));
    }

    ~ToolScene()
    {
        if (m_control && m_control->isRunning()) {
            m_control->exit();
        }
    }

    bool isReady() const
    {
        return m_ready;
    }
    FakeServiceControl& service()
    {
        return *m_control;
    }

    QProcessEnvironment environment() const
    {
        return toolEnvironment({{QStringLiteral("DBUS_SESSION_BUS_ADDRESS"), m_bus.address()}});
    }

    /// The words of a line for the tool, cut at its spaces, and @p more behind them.
    ToolResult run(const char* line, const QStringList& more = {}) const
    {
        return runTool(words(line) + more, QString(), environment());
    }

    static QStringList words(const char* line)
    {
        return QString::fromUtf8(line).split(QLatin1Char(' '), Qt::SkipEmptyParts);
    }

private:
    ToolScene(const QJsonObject& script, Service service, const QStringList& arguments)
    {
        if (service != Missing) {
            m_bus.installFakeService(script, arguments);
        }
        m_ready = m_bus.start();
        if (!m_ready) {
            return;
        }
        m_control = std::make_unique<FakeServiceControl>(m_bus.address());
        if (service == Running) {
            m_ready = runTool({QStringLiteral("tree")}, QString(), environment()).exitCode == 0 &&
                      m_control->waitForService();
        }
    }

    PrivateBus m_bus;
    std::unique_ptr<FakeServiceControl> m_control;
    bool m_ready = false;
};

/// A storage record as the bus has it.
inline QJsonArray deviceRecord(
    const QString& name, int type, const QString& udi, const QString& mountPoint = QString(),
    const QString& label = QString(), bool mountable = true)
{
    return {mountPoint, !mountPoint.isEmpty(), mountable, true, name, label, QString(), udi, type};
}

/// The arguments of a signal that has one. Braces alone would copy a record's own array.
inline QJsonArray oneArgument(const QJsonValue& argument)
{
    QJsonArray arguments;
    arguments.append(argument);
    return arguments;
}

/// A script with one value.
inline QJsonObject scriptOf(const QString& method, const QJsonValue& value)
{
    return {{QStringLiteral("values"), QJsonObject{{method, value}}}};
}

/// A script with one rule, which is used up unless it says otherwise.
inline QJsonObject ruleOf(const QString& method, const QJsonObject& rule)
{
    return {{QStringLiteral("rules"), QJsonObject{{method, QJsonArray{rule}}}}};
}

#endif
