// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/storageplacejob.h"

#include <QDBusInterface>
#include <QDBusPendingCallWatcher>
#include <QDBusPendingReply>

namespace VeyFM {

StoragePlaceJob::StoragePlaceJob(
    const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface, QObject* parent)
    : Job(parent)
    , m_storagePlace(place)
    , m_interface(interface)
{
}

StoragePlaceJob::~StoragePlaceJob() = default;

void StoragePlaceJob::request(const QString& method, const QString& refusal)
{
    if (!m_interface) {
        finishedWithError(1, refusal);
        return;
    }
    const auto call = m_interface->asyncCall(method, QVariant::fromValue(m_storagePlace));
    auto* watcher = new QDBusPendingCallWatcher(call, this);
    connect(watcher, &QDBusPendingCallWatcher::finished, this, &StoragePlaceJob::callFinishedSlot);
}

void StoragePlaceJob::callFinishedSlot(QDBusPendingCallWatcher* call)
{
    const QDBusPendingReply<bool> reply = *call;
    // A pending reply lets further arguments pass behind those it expects, and its own count() is
    // of these. A good answer is one boolean and nothing else. Its value is not looked at: a
    // failure comes as an error.
    if (reply.isError()) {
        finishedWithError(2, reply.error().message());
    } else if (reply.reply().arguments().size() != 1) {
        finishedWithError(
            2, tr("Unexpected reply signature: got \"%1\", expected \"b\"")
                   .arg(reply.reply().signature()));
    } else {
        finishedOk();
    }
    call->deleteLater();
}

StoragePlaceMountJob::StoragePlaceMountJob(
    const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface, QObject* parent)
    : StoragePlaceJob(place, interface, parent)
{
}

void StoragePlaceMountJob::start()
{
    request(QStringLiteral("mountStoragePlace"), tr("Can't get service interface"));
}

StoragePlaceUnmountJob::StoragePlaceUnmountJob(
    const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface, QObject* parent)
    : StoragePlaceJob(place, interface, parent)
{
}

void StoragePlaceUnmountJob::start()
{
    request(QStringLiteral("unmountStoragePlace"), tr("Can't get service interface"));
}

StoragePlaceEjectJob::StoragePlaceEjectJob(
    const StoragePlace& place, const QSharedPointer<QDBusInterface>& interface, QObject* parent)
    : StoragePlaceJob(place, interface, parent)
{
}

void StoragePlaceEjectJob::start()
{
    request(QStringLiteral("ejectStoragePlaceDevice"), tr("Can't get service interface"));
}

} // namespace VeyFM
