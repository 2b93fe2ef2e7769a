// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "devices.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "service/networkplacesmanagerproxy.h"
#include "service/smbbrowserproxy.h"
#include "session.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

namespace VeyFM {
namespace Tool {

namespace {

/// How many records the service has of one kind.
struct Holding
{
    const char* key;
    const char* label;
    int count;
    Question again;
    QString why = {}; ///< Why they can't be read, or empty.
};

Question question(const char* interface, const char* method, const char* signature)
{
    return {QLatin1String(interface), QLatin1String(method), QLatin1String(signature)};
}

/// Reads all that the service holds. Reads that come back empty are looked into.
QList<Holding> holdings()
{
    VFS* vfs = VFS::ptr();
    const Asking asking(QStringLiteral("Asking what the service holds"));
    QList<Holding> all;
    const auto add = [&all](Holding holding) {
        if (wasInterrupted()) {
            return;
        }
        if (holding.count == 0) {
            holding.why = whyNothing(holding.again);
        }
        all.append(holding);
    };
    add(
        {"storageDevices", "storage devices", int(allDevices().size()),
         question("StoragePlacesManager", "availableStoragePlaces", "a(sbbbssssi)")});
    add(
        {"favourites", "favourites", int(vfs->childs(vfs->favouritesEntry()).size()),
         question("FavouritePlacesManager", "favouritePlaces", "a(ss)")});
    add(
        {"networkBookmarks", "network bookmarks",
         int(vfs->networkPlacesManager()->networkPlaces().size()),
         question("NetworkPlacesManager", "networkPlaces", "a(sss)")});
    add(
        {"networkMounts", "network mounts", int(vfs->networkMountsManager()->mounts().size()),
         question("NetworkMountsManager", "mounts", "a{s(ssi)}")});
    add(
        {"fuseMounts", "FUSE mounts", int(vfs->fuseMountsManager()->mounts().size()),
         question("FuseMountsManager", "mounts", "a{ss}")});
    add(
        {"workgroups", "Samba workgroups", int(vfs->smbBrowser()->workgroups().size()),
         question("SmbBrowser", "workgroups", "as")});
    return all;
}

int print(Invocation& invocation, const ServiceState& state, const QList<Holding>& all)
{
    int exitCode = Done;
    QJsonObject counts;
    QByteArray lines;
    for (const Holding& holding : all) {
        if (!holding.why.isEmpty()) {
            if (exitCode == Done || !Patience::isOver()) {
                report(QLatin1String(holding.label), holding.why);
            }
            exitCode = Failed;
        }
        counts.insert(
            QLatin1String(holding.key),
            holding.why.isEmpty() ? QJsonValue(holding.count) : QJsonValue(QJsonValue::Null));
        lines += QByteArray(holding.label) + ": " +
                 (holding.why.isEmpty() ? QByteArray::number(holding.count) : "unknown") + '\n';
    }
    Output& output = invocation.output();
    if (invocation.json()) {
        JsonArray json(output);
        QJsonObject object = {
            {QStringLiteral("bus"), state.bus},
            {QStringLiteral("service"), serviceName()},
            {QStringLiteral("installed"), state.installed},
            {QStringLiteral("running"), state.running}};
        if (state.running) {
            object.insert(QStringLiteral("answers"), state.answers);
        }
        if (!all.isEmpty()) {
            object.insert(QStringLiteral("holds"), counts);
        }
        json.append(object);
        json.end();
        return exitCode;
    }
    const auto yesNo = [](bool yes) {
        return yes ? QByteArray("yes\n") : QByteArray("no\n");
    };
    output.write("session bus: " + yesNo(state.bus));
    output.write("service: " + serviceName().toLatin1() + '\n');
    output.write("installed: " + yesNo(state.installed));
    output.write("running: " + yesNo(state.running));
    if (state.running && !state.answers) {
        output.write(QByteArrayLiteral("answers: no\n"));
    }
    output.write(lines);
    return exitCode;
}

bool hasPrinted = false;

int printWithHoldings(Invocation& invocation)
{
    const QList<Holding> all = holdings();
    if (wasInterrupted()) {
        return Failed;
    }
    hasPrinted = true;
    ServiceState state;
    state.bus = state.busAnswers = state.installed = state.running = true;
    state.answers = !Patience::isOver();
    return print(invocation, state, all);
}

int run(Invocation& invocation)
{
    ServiceState state = serviceState();
    const QString why = whyNoService(state);
    // Looking is no reason to start it.
    if (why.isEmpty() && state.running) {
        const int exitCode = runWithService(invocation, printWithHoldings);
        if (hasPrinted || wasInterrupted()) {
            return exitCode;
        }
        // It has stopped since.
        state.answers = false;
        print(invocation, state, {});
        return Failed;
    }
    print(invocation, state, {});
    if (why.isEmpty()) {
        return Done;
    }
    invocation.output().flush();
    report(invocation.verb().name, why);
    return Failed;
}

} // namespace

Verb statusVerb()
{
    Verb verb;
    verb.name = QStringLiteral("status");
    verb.summary = QStringLiteral("Show how the file manager service stands");
    verb.details = QStringLiteral(
        "Whether there is a session bus, whether the service is installed and running, and how\n"
        "much it holds. A service that does not run is not started for that: it starts when it\n"
        "is needed.");
    verb.operandKind = OperandKind::Texts;
    verb.mostOperands = 0;
    verb.needs = Needs::Nothing;
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
