// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "locate.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "session.h"
#include "table.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

#include <algorithm>

#include <cerrno>

namespace VeyFM {
namespace Tool {

namespace {

struct Favourite
{
    QString name;
    Entry entry;
};

/// In the order of the tree, which is the service's. Two bookmarks of one name share a place.
QList<Favourite> favourites()
{
    const Entry parent = VFS::ptr()->favouritesEntry();
    const int prefix = parent.path().size() + 1;
    QList<Favourite> all;
    const EntryList entries = VFS::ptr()->childs(parent);
    for (const Entry& entry : entries) {
        all.append({entry.path().mid(prefix), entry});
    }
    return all;
}

QString whyNoFavourites()
{
    const Asking asking(QStringLiteral("Reading the favourites"));
    return whyNothing(
        {QStringLiteral("FavouritePlacesManager"), QStringLiteral("favouritePlaces"),
         QStringLiteral("a(ss)")});
}

int runList(Invocation& invocation)
{
    const QList<Favourite> all = favourites();
    if (all.isEmpty() && hasFailed(invocation, whyNoFavourites())) {
        return Failed;
    }
    Output& output = invocation.output();
    if (invocation.json()) {
        JsonArray json(output);
        for (const Favourite& favourite : all) {
            QJsonObject object = toJson(favourite.entry);
            object.insert(QStringLiteral("name"), favourite.name);
            json.append(object);
        }
        json.end();
        return Done;
    }
    Table table;
    for (const Favourite& favourite : all) {
        table.add({favourite.name, favourite.entry.localPath()});
    }
    table.write(output);
    return Done;
}

int runAdd(Invocation& invocation)
{
    VFS* vfs = VFS::ptr();
    const QString operand = invocation.operands().constFirst();
    const Located located = locate(operand);
    QString why = located.why;
    if (why.isEmpty() && located.entry.localPath().isEmpty()) {
        why = QStringLiteral("no directory on the disk");
    }
    if (why.isEmpty()) {
        why = whyUnreadable(located.entry);
    }
    if (!why.isEmpty()) {
        report(operand, why);
        return Failed;
    }
    const QString local = located.entry.localPath();
    const QString name = invocation.operands().value(1, located.entry.lastPathSection());
    if (name.isEmpty() || name.contains(QLatin1Char('/')) || name == QLatin1String(".") ||
        name == QLatin1String("..")) {
        report(name, QStringLiteral("no name for a place: give another behind the directory"));
        return Failed;
    }
    const FavouritePlace place(name, local);
    if (vfs->hasFavouritePlace(place)) {
        const FavouritePlace known = vfs->favouritePlace(located.entry);
        report(operand, QStringLiteral("is a favourite already, as '%1'").arg(known.name()));
        return Failed;
    }
    const QList<Favourite> all = favourites();
    for (const Favourite& favourite : all) {
        if (favourite.name == name) {
            report(
                name,
                QStringLiteral("is the favourite of %1 already").arg(favourite.entry.localPath()));
            return Failed;
        }
    }
    {
        const AskingForChange asking;
        vfs->addFavouritePlace(place);
    }
    return waitForNews(invocation, name, [vfs, &place] { return vfs->hasFavouritePlace(place); });
}

int runRemove(Invocation& invocation)
{
    VFS* vfs = VFS::ptr();
    int exitCode = Done;
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const QList<Favourite> all = favourites();
        const Entry entry = resolveText(operand).entry;
        const auto first = [&all](const auto& fits) {
            const auto found = std::find_if(all.begin(), all.end(), fits);
            return found == all.end() ? Favourite() : *found;
        };
        Favourite found = first([&](const Favourite& each) { return each.name == operand; });
        if (found.entry.isNull() && !entry.isNull()) {
            found = first([&](const Favourite& each) { return each.entry == entry; });
        }
        if (found.entry.isNull() && !entry.localPath().isEmpty()) {
            found = first(
                [&](const Favourite& each) { return each.entry.localPath() == entry.localPath(); });
        }
        if (found.entry.isNull()) {
            const QString why = all.isEmpty() ? whyNoFavourites() : QString();
            if (wasInterrupted()) {
                return Failed;
            }
            report(operand, why.isEmpty() ? QStringLiteral("no such favourite") : why);
            exitCode = Failed;
            continue;
        }
        const FavouritePlace place(found.name, found.entry.localPath());
        {
            const AskingForChange asking;
            vfs->removeFavouritePlace(place);
        }
        const int code = waitForNews(
            invocation, operand, [vfs, &place] { return !vfs->hasFavouritePlace(place); });
        if (wasInterrupted()) {
            return Failed;
        }
        if (code != Done) {
            exitCode = code;
        }
    }
    return exitCode;
}

} // namespace

Verb bookmarkVerb()
{
    Verb list;
    list.name = QStringLiteral("bookmark list");
    list.summary = QStringLiteral("List the favourites");
    list.details = QStringLiteral("One favourite a line: its name and its directory.");
    list.operandKind = OperandKind::Texts;
    list.mostOperands = 0;
    list.needs = Needs::Service;
    list.run = runList;

    Verb add;
    add.name = QStringLiteral("bookmark add");
    add.operands = QStringLiteral("DIRECTORY [NAME]");
    add.summary = QStringLiteral("Add a directory to the favourites");
    add.details = QStringLiteral(
        "Without a name it gets that of the directory. A directory has one favourite, and a name\n"
        "stands for one directory.");
    add.leastOperands = 1;
    add.mostOperands = 2;
    add.needs = Needs::Service;
    add.printsData = false;
    add.options = {timeoutOption()};
    add.run = runAdd;

    Verb remove;
    remove.name = QStringLiteral("bookmark remove");
    remove.operands = QStringLiteral("FAVOURITE...");
    remove.summary = QStringLiteral("Remove favourites");
    remove.details = QStringLiteral(
        "A favourite is named by its name, its place path, or its directory. Each goes with all\n"
        "others of its directory.");
    remove.operandKind = OperandKind::Favourites;
    remove.leastOperands = 1;
    remove.needs = Needs::Service;
    remove.printsData = false;
    remove.options = {timeoutOption()};
    remove.run = runRemove;

    Verb verb;
    verb.name = QStringLiteral("bookmark");
    verb.operands = QStringLiteral("[OPERAND...]");
    verb.summary = QStringLiteral("List, add and remove favourites");
    verb.operandKind = OperandKind::Verbs;
    verb.printsData = false;
    verb.verbs = {list, add, remove};
    return verb;
}

} // namespace Tool
} // namespace VeyFM
