// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SERVICE_H
#define VEYFM_TOOL_SERVICE_H

#include <QString>
#include <QVariantList>

namespace VeyFM {
namespace Tool {

/// The bus name of the file manager service.
QString serviceName();

/// How the service stands. Looking does not start it.
struct ServiceState
{
    bool bus = false;       ///< Whether there is a session bus.
    bool installed = false; ///< Whether the bus can start the service.
    bool running = false;
};

ServiceState serviceState();

/// Why there is no use in asking the service, and what helps; empty when it can be started. One
/// that runs but can't be started counts as missing, as it does for the library.
QString whyNoService(const ServiceState& state);

/// Starts the service where it does not run. Why it did not work, or empty.
QString startService();

/// Both: why there is no service even after it was started, or empty.
QString whyNoRunningService();

/// A read of the service, as its introspection describes it.
struct Question
{
    QString interface; ///< The last part of its name.
    QString method;
    QString signature; ///< Of a good answer.
    QVariantList arguments = {};
};

/**
 * Why the library came back from a read with nothing. It swallows what went wrong, so the service
 * is asked once more; empty when it really has nothing to tell.
 */
QString whyNothing(const Question& question);

} // namespace Tool
} // namespace VeyFM

#endif
