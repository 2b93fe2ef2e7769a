// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "host/mountinfo.h"
#include "mount/networkmounts.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "service/fusemountsmanagerproxy.h"
#include "service/networkmountsmanagerproxy.h"
#include "session.h"
#include "shown.h"
#include "table.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"
#include "vfs/vfssettings.h"

namespace VeyFM {
namespace Tool {

namespace {

int print(Invocation& invocation, const RegisteredMounts& registered)
{
    const MountInfo kernel = MountInfo::read();
    if (!kernel.why().isEmpty()) {
        report(invocation.verb().name, kernel.why());
    }
    const QVector<NetworkMount> mounts =
        networkMounts(registered, kernel, VFSSettings().mountRootPath());
    Output& output = invocation.output();
    JsonArray json(output);
    Table table;
    for (const NetworkMount& mount : mounts) {
        const QString url = shownLocation(mount.url);
        if (invocation.json()) {
            json.append(
                {{QStringLiteral("url"), textOrNull(url)},
                 {QStringLiteral("localPath"), mount.directory},
                 {QStringLiteral("state"), mount.state},
                 {QStringLiteral("path"), textOrNull(mount.placePath)}});
        } else {
            table.add({url, mount.directory, mount.state, mount.placePath});
        }
    }
    if (invocation.json()) {
        json.end();
    } else {
        table.write(output);
    }
    return kernel.why().isEmpty() ? Done : Failed;
}

/// Reads what the service has. What can't be read is reported.
RegisteredMounts readRegistered()
{
    const Asking asking(QStringLiteral("Reading the mounts"));
    VFS* vfs = VFS::ptr();
    RegisteredMounts registered;
    registered.isKnown = true;
    const auto check = [&registered](const char* what, const Question& again) {
        const QString why = wasInterrupted() ? QString() : whyNothing(again);
        if (why.isEmpty()) {
            return;
        }
        report(QLatin1String(what), why);
        registered.isKnown = false;
    };
    const QString method = QStringLiteral("mounts");
    registered.directories = vfs->fuseMountsManager()->mounts();
    if (registered.directories.isEmpty()) {
        check(
            "FUSE mounts", {QStringLiteral("FuseMountsManager"), method, QStringLiteral("a{ss}")});
    }
    if (!wasInterrupted()) {
        registered.places = vfs->networkMountsManager()->mounts();
    }
    if (registered.places.isEmpty()) {
        check(
            "network mounts",
            {QStringLiteral("NetworkMountsManager"), method, QStringLiteral("a{s(ssi)}")});
    }
    return registered;
}

int runWithRegistered(Invocation& invocation)
{
    const RegisteredMounts registered = readRegistered();
    if (wasInterrupted()) {
        return Failed;
    }
    const int exitCode = print(invocation, registered);
    return registered.isKnown ? exitCode : Failed;
}

int run(Invocation& invocation)
{
    const QString why = whyNoService(serviceState());
    if (why.isEmpty()) {
        return runWithService(invocation, runWithRegistered);
    }
    report(invocation.verb().name, QStringLiteral("only what the kernel lists: ") + why);
    RegisteredMounts nothing;
    nothing.isKnown = true;
    return print(invocation, nothing);
}

} // namespace

Verb mountsVerb()
{
    Verb verb;
    verb.name = QStringLiteral("mounts");
    verb.summary = QStringLiteral("List the mounts of network resources");
    verb.details = QStringLiteral(
        "One mount a line: its URL, its directory, its state, and its place. The state is\n"
        "mounted; stale, where the service has it but nothing is mounted any more; or\n"
        "unregistered, where it is mounted but the service does not have it. None of the\n"
        "mounts is looked at, so a server that has gone can't make the command wait.");
    verb.operandKind = OperandKind::Texts;
    verb.mostOperands = 0;
    verb.needs = Needs::Nothing;
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
