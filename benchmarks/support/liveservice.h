// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_BENCHMARKS_LIVESERVICE_H
#define VEYFM_BENCHMARKS_LIVESERVICE_H

#include "support/servicescene.h"

#include <memory>

namespace Benchmarks {

/// A bus of its own, with the scripted service on it or without.
class LiveService
{
public:
    /// Starts a bus where the service is installed and runs. Ends the process if it can't.
    static std::unique_ptr<LiveService> running(const QJsonObject& script);

    /// Starts a bus where no service is installed. Ends the process if it can't.
    static std::unique_ptr<LiveService> missing();

    /// Makes it the session bus of the programs that are run from here on.
    void use() const;

    QString address() const;

    /// The service, where there is one.
    FakeServiceControl& control() const;

    /// That the service saw nothing but its contract. Ends the process if it did.
    void check() const;

private:
    explicit LiveService(const QJsonObject* script);

    PrivateBus m_bus;
    std::unique_ptr<FakeServiceControl> m_control;
};

/// Devices that are there, and the signals by which a number of them is mounted in turn, or by
/// which they go. @{
QJsonArray manyDevices(int count);
QJsonArray manyUpdates(int count, int devices);
QJsonArray manyRemovals(int count);
/// @}

/// Shares by their names, none of which is mounted.
QJsonObject manyShares(int count);

} // namespace Benchmarks

#endif
