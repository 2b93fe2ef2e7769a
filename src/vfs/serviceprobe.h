// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SERVICEPROBE_H
#define VEYFM_SERVICEPROBE_H

#include <QString>
#include <QStringList>

namespace VeyFM {

/**
 * The calls of the start that come before the interfaces of the service are made, on a bus that is
 * connected. Each interface asks the owner of the name what it has, and a hanging one lets it wait
 * 25 seconds, so VFS::setServiceProbe() may have found out before that nobody answers. Without a
 * probe these calls have the default timeout of the bus, and none is added to them.
 */
namespace ServiceProbe {

/// 0 for no probe.
void setMilliseconds(int milliseconds);

/// What the bus can start; empty when it does not say.
QStringList activatableNames();

/// Has the service run. False when the probe found that it does not come, or does not answer.
bool start(const QString& service);

/// False when the probe found that the name has an owner that does not answer.
bool passes(const QString& service);

} // namespace ServiceProbe
} // namespace VeyFM

#endif
