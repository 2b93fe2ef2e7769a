// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/liveservice.h"

#include <cstdlib>

namespace Benchmarks {

std::unique_ptr<LiveService> LiveService::running(const QJsonObject& script)
{
    return std::unique_ptr<LiveService>(new LiveService(&script));
}

std::unique_ptr<LiveService> LiveService::missing()
{
    return std::unique_ptr<LiveService>(new LiveService(nullptr));
}

LiveService::LiveService(const QJsonObject* script)
{
    if (script) {
        m_bus.installFakeService(*script);
    }
    if (!m_bus.start()) {
        qCritical("no bus: %s", qPrintable(m_bus.errorString()));
        std::exit(1);
    }
    if (script) {
        const QString name = QStringLiteral("liveservice");
        const bool isStarted = QDBusConnection::connectToBus(m_bus.address(), name)
                                   .interface()
                                   ->startService(ServiceScene::name())
                                   .isValid();
        QDBusConnection::disconnectFromBus(name);
        if (!isStarted) {
            qCritical("the service does not start");
            std::exit(1);
        }
        m_control = std::make_unique<FakeServiceControl>(m_bus.address());
    }
}

void LiveService::use() const
{
    qputenv("DBUS_SESSION_BUS_ADDRESS", address().toLocal8Bit());
}

QString LiveService::address() const
{
    return m_bus.address();
}

FakeServiceControl& LiveService::control() const
{
    return *m_control;
}

void LiveService::check() const
{
    const QStringList violations = m_control->violations();
    if (!violations.isEmpty()) {
        qCritical("not of the contract: %s", qPrintable(violations.join(QStringLiteral(", "))));
        std::exit(1);
    }
}

QJsonArray manyDevices(int count)
{
    QJsonArray devices;
    for (int i = 0; i < count; ++i) {
        devices.append(device(u"sd%1"_s.arg(i), u"udi%1"_s.arg(i)));
    }
    return devices;
}

QJsonArray manyUpdates(int count, int devices)
{
    QJsonArray updates;
    for (int i = 0; i < count; ++i) {
        const int number = i % devices;
        updates.append(QJsonArray{
            u"StoragePlacesManager"_s, u"storagePlaceUpdated"_s,
            arguments(
                device(u"sd%1"_s.arg(number), u"udi%1"_s.arg(number), 3, u"/media/%1"_s.arg(i)))});
    }
    return updates;
}

QJsonArray manyRemovals(int count)
{
    QJsonArray removals;
    for (int i = 0; i < count; ++i) {
        removals.append(QJsonArray{
            u"StoragePlacesManager"_s, u"storagePlaceRemoved"_s,
            arguments(device(u"sd%1"_s.arg(i), u"udi%1"_s.arg(i)))});
    }
    return removals;
}

QJsonObject manyShares(int count)
{
    QJsonObject shares;
    for (int i = 0; i < count; ++i) {
        shares.insert(u"share%1"_s.arg(i, 5, 10, QLatin1Char('0')), QString());
    }
    return shares;
}

} // namespace Benchmarks
