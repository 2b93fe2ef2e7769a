// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "session.h"

#include "commandline.h"
#include "interrupt.h"
#include "mount/watchedjob.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "vfs/vfs.h"

#include <QAbstractEventDispatcher>
#include <QCoreApplication>
#include <QEventLoop>
#include <QTimer>

#include <algorithm>
#include <chrono>
#include <optional>

namespace VeyFM {
namespace Tool {

namespace {

constexpr uint longestTimeout = 1000000; // Seconds; a timer holds milliseconds in an int.

QString interrupted()
{
    return QStringLiteral("interrupted");
}

/**
 * Made before the tree, and so there until the tree has gone: a service that hangs keeps a
 * process at its very end too.
 */
Interrupt& serviceInterrupt()
{
    static Interrupt interrupt({SIGINT}, [] {
        if (qApp) {
            QMetaObject::invokeMethod(qApp, &QCoreApplication::quit, Qt::QueuedConnection);
        }
    });
    return interrupt;
}

/// Does what may block on the service, in a verb that has an end of its own for Ctrl-C otherwise.
/// False when Ctrl-C came meanwhile, which has been told then.
bool runInterruptibly(const Invocation& invocation, const std::function<void()>& work)
{
    // The verbs have interrupts of their own, one at a time.
    Interrupt interrupt({SIGINT}, [] {});
    interrupt.setMessage(reportLine(invocation.verb().name, interrupted()));
    const Asking asking(waitingForService());
    work();
    if (!interrupt.wasRequested()) {
        return true;
    }
    interrupt.setWorkEnded();
    report(invocation.verb().name, interrupted());
    return false;
}

/// Whether a place was opened that has its content from the service, which did not answer.
bool hasMissedPlaces = false;

int runWithTree(Invocation& invocation)
{
    if (!runInterruptibly(invocation, openTree)) {
        return Failed;
    }
    const int exitCode = invocation.verb().run(invocation);
    if (!hasMissedPlaces) {
        return exitCode;
    }
    report(invocation.verb().name, whySilent());
    return Failed;
}

int runWithNeeds(Invocation& invocation)
{
    switch (invocation.verb().needs) {
    case Needs::Tree:
        return runWithTree(invocation);
    case Needs::Service:
        return runWithService(invocation, invocation.verb().run);
    case Needs::Nothing:
        break;
    }
    return invocation.verb().run(invocation);
}

} // namespace

QString waitingForService()
{
    return QStringLiteral("Waiting for the file manager service");
}

void openTree()
{
    const Patience patience;
    const VFS* vfs = VFS::ptr();
    static std::optional<Asking> opening;
    QObject::connect(
        vfs, &VFS::longTimeOperationStarted, vfs, [] { opening.emplace(waitingForService()); });
    QObject::connect(vfs, &VFS::longTimeOperationFinished, vfs, [] {
        hasMissedPlaces = hasMissedPlaces || isServiceSilent();
        opening.reset();
    });
}

int runWithService(Invocation& invocation, int (*run)(Invocation& invocation))
{
    const Verb& verb = invocation.verb();
    Interrupt& interrupt = serviceInterrupt();
    interrupt.setMessage(reportLine(verb.name, interrupted()));
    int exitCode = Failed;
    QString why;
    {
        const Waiting waiting(waitingForService());
        why = whyNoRunningService();
        if (why.isEmpty()) {
            openTree();
        }
        if (why.isEmpty() && Patience::isOver()) {
            why = whySilent();
        }
    }
    if (!interrupt.wasRequested()) {
        if (why.isEmpty()) {
            exitCode = run(invocation);
        } else {
            failWithoutService(invocation, why);
        }
    }
    if (interrupt.wasRequested()) {
        interrupt.setWorkEnded();
        report(verb.name, interrupted());
        exitCode = Failed;
    }
    return exitCode;
}

int failWithoutService(const Invocation& invocation, const QString& why)
{
    const QString hint = QStringLiteral("'veyfm-vfs status' shows how it stands");
    report(
        invocation.verb().name, why.contains(hint) ? why : QStringLiteral("%1; %2").arg(why, hint));
    return Failed;
}

int runVerb(Invocation& invocation)
{
    Patience::setVerb(invocation.verb().name);
    const int exitCode = runWithNeeds(invocation);
    boundParting();
    return exitCode;
}

bool wasInterrupted()
{
    return serviceInterrupt().wasRequested();
}

bool hasFailed(const Invocation& invocation, const QString& why)
{
    if (wasInterrupted()) {
        return true;
    }
    if (!why.isEmpty()) {
        report(invocation.verb().name, why);
    }
    return !why.isEmpty();
}

int secondsToWait(const Invocation& invocation, int otherwise)
{
    const QString option = QStringLiteral("timeout");
    return invocation.isSet(option)
               ? int(std::min(invocation.value(option).toUInt(), longestTimeout))
               : otherwise;
}

bool waitUntil(const QString& doing, int seconds, const std::function<bool()>& changed)
{
    if (wasInterrupted()) {
        return false;
    }
    if (changed() || Patience::isOver()) {
        return changed();
    }
    const Waiting waiting(doing);
    const Heartbeat heartbeat;
    QEventLoop loop;
    QObject::connect(
        QAbstractEventDispatcher::instance(), &QAbstractEventDispatcher::aboutToBlock, &loop, [&] {
            if (changed() || Patience::isOver()) {
                loop.quit();
            }
        });
    if (seconds > 0) {
        QTimer::singleShot(std::chrono::seconds(seconds), &loop, &QEventLoop::quit);
    }
    loop.exec();
    return changed();
}

QString whyNoNews(const QString& news, int seconds)
{
    if (Patience::isOver()) {
        return whySilentToChange();
    }
    return QStringLiteral("asked for, but the service told of no %1 within %2 s")
        .arg(news)
        .arg(seconds);
}

int waitForNews(
    const Invocation& invocation, const QString& what, const std::function<bool()>& changed)
{
    const int seconds = secondsToWait(invocation);
    if (waitUntil(QStringLiteral("Waiting for the news of the change"), seconds, changed)) {
        return Done;
    }
    if (!wasInterrupted()) {
        report(what, whyNoNews(QStringLiteral("change"), seconds));
    }
    return Failed;
}

} // namespace Tool
} // namespace VeyFM
