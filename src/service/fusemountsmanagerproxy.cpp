// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/fusemountsmanagerproxy.h"

#include "service/servicecall.h"

namespace VeyFM {

FuseMountsManagerProxy::FuseMountsManagerProxy(
    QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , m_interface(std::move(interface))
{
}

FuseMountsManagerProxy::~FuseMountsManagerProxy() = default;

StringMap FuseMountsManagerProxy::mounts() const
{
    return readFromService<StringMap>(m_interface, QStringLiteral("mounts"));
}

void FuseMountsManagerProxy::addMount(const QString& url, const QString& localPath)
{
    tellService(m_interface, QStringLiteral("addMount"), url, localPath);
}

} // namespace VeyFM
