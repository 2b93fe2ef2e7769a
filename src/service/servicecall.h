// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SERVICECALL_H
#define VEYFM_SERVICECALL_H

#include <QDBusInterface>
#include <QDBusReply>
#include <QSharedPointer>
#include <QVariant>
#include <QWeakPointer>

#include <utility>

namespace VeyFM {

/**
 * A blocking call to the service, with the bus's default timeout.
 *
 * The answer is a default value when the interface has expired (nothing is sent then), when the
 * service answers with an error, and when it answers with another type: nobody above can do
 * anything about a service that fails, and the tree stands without it.
 */
template <typename Result, typename... Args>
Result readFromService(
    const QWeakPointer<QDBusInterface>& interface, const QString& method, Args&&... args)
{
    const QSharedPointer<QDBusInterface> alive = interface.toStrongRef();
    if (!alive) {
        return Result();
    }
    const QDBusReply<Result> reply =
        alive->call(method, QVariant::fromValue(std::forward<Args>(args))...);
    return reply.value();
}

/// The same for a call whose answer nobody reads.
template <typename... Args>
void tellService(
    const QWeakPointer<QDBusInterface>& interface, const QString& method, Args&&... args)
{
    if (const QSharedPointer<QDBusInterface> alive = interface.toStrongRef()) {
        alive->call(method, QVariant::fromValue(std::forward<Args>(args))...);
    }
}

/// A call that nobody waits for. What comes of it is told by signals.
template <typename... Args>
void askService(
    const QWeakPointer<QDBusInterface>& interface, const QString& method, Args&&... args)
{
    if (const QSharedPointer<QDBusInterface> alive = interface.toStrongRef()) {
        alive->asyncCall(method, QVariant::fromValue(std::forward<Args>(args))...);
    }
}

} // namespace VeyFM

#endif
