// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "core/smburl.h"
#include "describe.h"
#include "host/mounturl.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "service/networkplacesmanagerproxy.h"
#include "session.h"
#include "shown.h"
#include "table.h"
#include "verbs/browse.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

#include <QUrl>

#include <algorithm>

namespace VeyFM {
namespace Tool {

using Host::shownUrl;
using Host::whyNotMountable;

namespace {

const QLatin1Char slash('/');

/// Below a place, or empty where the network is switched off and the place is not there.
QString pathBelow(const Entry& place, const QString& name)
{
    return place.isNull() ? QString() : place.path() + slash + name;
}

QString whyNoBookmarks()
{
    const Asking asking(QStringLiteral("Reading the network bookmarks"));
    return whyNothing(
        {QStringLiteral("NetworkPlacesManager"), QStringLiteral("networkPlaces"),
         QStringLiteral("a(sss)")});
}

int runList(Invocation& invocation)
{
    const QList<NetworkPlace> places = VFS::ptr()->networkPlacesManager()->networkPlaces();
    if (places.isEmpty() && hasFailed(invocation, whyNoBookmarks())) {
        return Failed;
    }
    Output& output = invocation.output();
    if (invocation.json()) {
        JsonArray json(output);
        for (const NetworkPlace& place : places) {
            json.append(
                {{QStringLiteral("name"), place.name()},
                 {QStringLiteral("path"),
                  textOrNull(pathBelow(VFS::ptr()->networkEntry(), place.name()))},
                 {QStringLiteral("url"), shownLocation(place.url())},
                 {QStringLiteral("localPath"), textOrNull(place.localPath())}});
        }
        json.end();
        return Done;
    }
    Table table;
    for (const NetworkPlace& place : places) {
        table.add({place.name(), shownLocation(place.url()), place.localPath()});
    }
    table.write(output);
    return Done;
}

/// A bookmark is less than a mount: its URL may have a port, say, that a mount would drop.
QString whyNoUrl(const QString& text)
{
    if (whyNotMountable(text).isEmpty()) {
        return QString();
    }
    const QUrl url(text, QUrl::StrictMode);
    const QStringList schemes = {
        QStringLiteral("smb"), QStringLiteral("ftp"), QStringLiteral("sftp")};
    if (!url.isValid() || !schemes.contains(url.scheme()) || url.host().isEmpty()) {
        return QStringLiteral("not a URL of a network resource: smb, ftp or sftp, and a host");
    }
    if (shownUrl(text) != text) {
        return QStringLiteral("a bookmark is no place for a password");
    }
    return text.contains(QChar(QChar::Null)) ? QStringLiteral("not a URL") : QString();
}

/// QUrl knows no workgroups.
QString hostOf(const QString& url)
{
    const QString host = QUrl(url).host();
    return host.isEmpty() ? SmbUrl(url).host() : host;
}

int runAdd(Invocation& invocation)
{
    NetworkPlacesManagerProxy* manager = VFS::ptr()->networkPlacesManager();
    const QString text = invocation.operands().constFirst();
    const QString why = whyNoUrl(text);
    if (!why.isEmpty()) {
        report(shownUrl(text), why);
        return Failed;
    }
    const QString name = invocation.operands().value(1, hostOf(text));
    if (name.isEmpty() || name.contains(slash) || name == QLatin1String(".") ||
        name == QLatin1String("..")) {
        report(name, QStringLiteral("no name for a place: give another behind the URL"));
        return Failed;
    }
    const NetworkPlace place(name, text, QString());
    const auto isThere = [manager, &place] {
        return manager->networkPlaces().contains(place);
    };
    if (isThere()) {
        report(name, QStringLiteral("there is a network bookmark of that name already"));
        return Failed;
    }
    bool accepted = false;
    {
        const AskingForChange asking;
        accepted = manager->addNetworkPlace(place);
    }
    if (!accepted) {
        if (!wasInterrupted()) {
            report(
                name, Patience::isOver()
                          ? whySilentToChange()
                          : QStringLiteral("the service did not accept the bookmark"));
        }
        return Failed;
    }
    return waitForNews(invocation, name, isThere);
}

int runRemove(Invocation& invocation)
{
    NetworkPlacesManagerProxy* manager = VFS::ptr()->networkPlacesManager();
    int exitCode = Done;
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const QList<NetworkPlace> places = manager->networkPlaces();
        const QString path = VFS::ptr()->entry(operand).path();
        const auto first = [&places](const auto& fits) {
            const auto found = std::find_if(places.begin(), places.end(), fits);
            return found == places.end() ? NetworkPlace() : *found;
        };
        NetworkPlace place =
            first([&](const NetworkPlace& each) { return each.name() == operand; });
        if (place.isNull()) {
            place = first([&](const NetworkPlace& each) {
                const QString its = pathBelow(VFS::ptr()->networkEntry(), each.name());
                return !its.isEmpty() && (its == operand || its == path);
            });
        }
        if (place.isNull()) {
            place = first([&](const NetworkPlace& each) { return each.url() == operand; });
        }
        if (place.isNull()) {
            const QString why = places.isEmpty() ? whyNoBookmarks() : QString();
            if (wasInterrupted()) {
                return Failed;
            }
            report(operand, why.isEmpty() ? QStringLiteral("no such network bookmark") : why);
            exitCode = Failed;
            continue;
        }
        {
            const AskingForChange asking;
            manager->removeNetworkPlace(place);
        }
        const int code = waitForNews(invocation, operand, [manager, &place] {
            return !manager->networkPlaces().contains(place);
        });
        if (wasInterrupted()) {
            return Failed;
        }
        if (code != Done) {
            exitCode = code;
        }
    }
    return exitCode;
}

Verb makeVerb(const char* name, const char* operands, const char* summary)
{
    Verb verb;
    verb.name = QStringLiteral("network ") + QLatin1String(name);
    verb.operands = QLatin1String(operands);
    verb.summary = QLatin1String(summary);
    verb.operandKind = OperandKind::Texts;
    verb.needs = Needs::Service;
    return verb;
}

} // namespace

Verb networkVerb()
{
    Verb list = makeVerb("list", "", "List the network bookmarks");
    list.details =
        QStringLiteral("One bookmark a line: its name, its URL, and its directory while mounted.");
    list.mostOperands = 0;
    list.run = runList;

    Verb add = makeVerb("add", "URL [NAME]", "Add a network bookmark");
    add.details = QStringLiteral(
        "A URL of the schemes smb, ftp and sftp. Without a name the bookmark gets that of the\n"
        "host. A name is there once.");
    add.leastOperands = 1;
    add.mostOperands = 2;
    add.printsData = false;
    add.options = {timeoutOption()};
    add.run = runAdd;

    Verb remove = makeVerb("remove", "BOOKMARK...", "Remove network bookmarks");
    remove.details = QStringLiteral("A bookmark is named by its name, its place path, or its URL.");
    remove.operandKind = OperandKind::Bookmarks;
    remove.leastOperands = 1;
    remove.printsData = false;
    remove.options = {timeoutOption()};
    remove.run = runRemove;

    Verb verb;
    verb.name = QStringLiteral("network");
    verb.operands = QStringLiteral("[OPERAND...]");
    verb.summary = QStringLiteral("Manage network bookmarks, browse the Samba network");
    verb.operandKind = OperandKind::Verbs;
    verb.printsData = false;
    verb.verbs = QVector<Verb>({list, add, remove}) + browseVerbs();
    return verb;
}

} // namespace Tool
} // namespace VeyFM
