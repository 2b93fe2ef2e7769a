// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SERVICESIGNALS_H
#define VEYFM_SERVICESIGNALS_H

#include <QDBusInterface>
#include <QMetaObject>

namespace VeyFM {

/**
 * Connects a signal of the service, as SIGNAL() spells it, to a slot or signal of @p receiver.
 *
 * The signals of an interface are known only from the service's introspection. With no service
 * there is nothing to connect to and nothing to say about it, since its absence was reported
 * once; a service that is there and lacks the signal gets Qt's warning.
 */
inline void followService(
    const QDBusInterface& interface, const char* signal, const QObject* receiver,
    const char* member)
{
    // SIGNAL() puts a digit in front of the signature.
    const QByteArray signature = QMetaObject::normalizedSignature(signal + 1);
    if (interface.metaObject()->indexOfSignal(signature.constData()) >= 0 || interface.isValid()) {
        QObject::connect(&interface, signal, receiver, member);
    }
}

} // namespace VeyFM

#endif
