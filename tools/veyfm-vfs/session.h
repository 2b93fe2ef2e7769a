// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_SESSION_H
#define VEYFM_TOOL_SESSION_H

#include <QString>

#include <functional>

namespace VeyFM {
namespace Tool {

class Invocation;

/// Runs a verb, after what it needs has been made. An ExitCode.
int runVerb(Invocation& invocation);

/// What is shown while the service lets wait.
QString waitingForService();

/// Makes the tree, which asks the service, and has slow places show that they are slow.
void openTree();

/// Starts the service and makes the tree, then calls @p run. Without a service it reports why.
int runWithService(Invocation& invocation, int (*run)(Invocation& invocation));

/// Reports why a verb can't do without the service, and where to look further. An ExitCode.
int failWithoutService(const Invocation& invocation, const QString& why);

/// Whether Ctrl-C has ended a verb that needs the service. The verb then returns at once and says
/// nothing: that it was interrupted is told for it.
bool wasInterrupted();

/// For a list that came back empty: whether Ctrl-C or @p why is the reason, which is reported then.
bool hasFailed(const Invocation& invocation, const QString& why);

/// The value of --timeout, or what stands for it, in seconds; 0 for no bound.
int secondsToWait(const Invocation& invocation, int otherwise = 10);

/**
 * Waits until the service's news have come and made @p changed true, and shows what is done
 * meanwhile. False when they did not come in so many seconds (0 for no bound), or at all since
 * Ctrl-C came or the service stopped answering.
 *
 * The condition is looked at after each batch of events, so it should be cheap.
 */
bool waitUntil(const QString& doing, int seconds, const std::function<bool()>& changed);

/// The words for news that the service did not tell: "change", say.
QString whyNoNews(const QString& news, int seconds);

/// Waits for --timeout or ten seconds. When no news come, that is reported of @p what. An ExitCode.
int waitForNews(
    const Invocation& invocation, const QString& what, const std::function<bool()>& changed);

} // namespace Tool
} // namespace VeyFM

#endif
