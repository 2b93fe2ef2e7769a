// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FAKESERVICE_WIRE_H
#define VEYFM_FAKESERVICE_WIRE_H

#include <QDBusArgument>
#include <QJsonValue>
#include <QVariant>

/**
 * Values of the bus made from JSON by their D-Bus signature and back, with none of the library's
 * own types: what the fake service says is held against the library's reading of it.
 *
 * A structure is an array of its members, a map is an object, and a 64-bit number is a JSON number.
 */
namespace Wire {

/// Registers the types for all signatures of the contract. Called once.
void registerTypes();

/// A value of one complete type; invalid for a signature that is not of the contract.
QVariant fromJson(const QString& signature, const QJsonValue& value);

/// What came over the bus, structures and all.
QJsonValue toJson(const QVariant& value);

/// The complete types of a signature, such as "s" and "(ssi)" of "s(ssi)".
QStringList split(const QString& signature);

} // namespace Wire

#endif
