// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SERVICE_H
#define VEYFM_TOOL_SERVICE_H

#include <QDBusMessage>
#include <QString>
#include <QVariantList>

namespace VeyFM {
namespace Tool {

/// The bus name of the file manager service.
QString serviceName();

/// The time that the library gives the service to answer when it makes the tree.
constexpr int probeMilliseconds = 1000;

/// How the service stands. Looking does not start it.
struct ServiceState
{
    bool bus = false;        ///< Whether there is a session bus.
    bool busAnswers = false; ///< Whether that tells what it has.
    bool installed = false;  ///< Whether the bus can start the service.
    bool running = false;
    bool answers = false; ///< Whether one that runs answers.
    uint processId = 0;   ///< Of one that runs.
};

ServiceState serviceState();

/// Why there is no use in asking the service, and what helps; empty when it can be started. One
/// that runs but can't be started counts as missing, as it does for the library.
QString whyNoService(const ServiceState& state);

/// Whether there is a service, and it does not answer.
bool isServiceSilent();

/// Why the service that stopped answering is of no use any more, and what helps; for a change
/// that may come about all the same. @{
QString whySilent();
QString whySilentToChange();
/// @}

/// Has the library, and all that asks it, do without the service. Before the tree is made.
void leaveService();

/// Starts the service where it does not run. Why it did not work in that time, or empty.
QString startService(int milliseconds = 3000);

/// What the service answers as long as it lives, whatever else it does.
QDBusMessage pingMessage();

/// Whether somebody has answered, if only with an error.
bool isAnswer(const QDBusMessage& reply);

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
