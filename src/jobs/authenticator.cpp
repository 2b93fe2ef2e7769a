// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/authenticator.h"

namespace VeyFM {

Authenticator::Authenticator() = default;
Authenticator::~Authenticator() = default;

void Authenticator::setResource(
    const QString& protocol, const QString& domain, const QString& server, const QString& object)
{
    m_protocol = protocol;
    m_domain = domain;
    m_server = server;
    m_object = object;
}

QString Authenticator::protocol() const
{
    return m_protocol;
}

QString Authenticator::domain() const
{
    return m_domain;
}

QString Authenticator::server() const
{
    return m_server;
}

QString Authenticator::object() const
{
    return m_object;
}

} // namespace VeyFM
