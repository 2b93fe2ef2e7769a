// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/networkmountsmanagerproxy.h"

#include "core/metatypes.h"
#include "service/servicecall.h"
#include "service/servicesignals.h"

namespace VeyFM {

NetworkMountsManagerProxy::NetworkMountsManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , m_interface(std::move(interface))
{
    if (const auto alive = m_interface.toStrongRef()) {
        followService(
            *alive, SIGNAL(mountAdded(QString, VeyFM::Entry)), this,
            SIGNAL(mountAdded(QString, VeyFM::Entry)));
    }
}

NetworkMountsManagerProxy::~NetworkMountsManagerProxy() = default;

QMap<QString, Entry> NetworkMountsManagerProxy::mounts() const
{
    return readFromService<QMap<QString, Entry>>(m_interface, QStringLiteral("mounts"));
}

void NetworkMountsManagerProxy::addMount(const QString& url, const Entry& entry)
{
    tellService(m_interface, QStringLiteral("addMount"), url, entry);
}

} // namespace VeyFM
