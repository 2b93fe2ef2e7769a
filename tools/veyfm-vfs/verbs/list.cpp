// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "columns.h"
#include "commandline.h"
#include "describe.h"
#include "interrupt.h"
#include "listing.h"
#include "locate.h"
#include "report.h"
#include "terminal.h"
#include "verbs/verbs.h"

#include <QDateTime>

#include <algorithm>
#include <cmath>

#include <signal.h>

namespace VeyFM {
namespace Tool {

namespace {

bool wantsFacts(const Invocation& invocation)
{
    return invocation.isSet(QStringLiteral("long")) ||
           invocation.isSet(QStringLiteral("human-readable"));
}

/// What stands for an entry: its name, or with --paths its path.
class Label
{
public:
    explicit Label(const Invocation& invocation)
        : m_whole(invocation.isSet(QStringLiteral("paths")))
    {
    }

    QString operator()(const Entry& entry) const
    {
        return m_whole ? shownPath(entry) : shownName(entry);
    }

private:
    const bool m_whole;
};

void printColumns(Invocation& invocation, const QVector<Item>& items)
{
    const Output& output = invocation.output();
    const Label label(invocation);
    QVector<Cell> cells;
    cells.reserve(items.size());
    for (const Item& item : items) {
        const QString text = label(item.entry);
        cells.append({output.name(text, item.entry), displayWidth(escaped(text))});
    }
    invocation.output().write(inColumns(cells, terminalWidth()));
}

void printLines(Invocation& invocation, const QVector<Item>& items)
{
    Output& output = invocation.output();
    const Label label(invocation);
    for (const Item& item : items) {
        output.writeRecord(output.name(label(item.entry), item.entry));
    }
}

/// As ls -h has them: rounded up, to a tenth where one digit stands before it.
QString sizeForPeople(qint64 size)
{
    constexpr qint64 step = 1024;
    if (size < step) {
        return QString::number(size);
    }
    const QString units = QStringLiteral("KMGTPE");
    int unit = 0;
    qint64 one = step;
    const auto rounded = [size, &one](qint64 parts) {
        // In parts of the unit; the product may be too great for an integer.
        return qint64(std::ceil((long double)(size)*parts / one));
    };
    while (unit + 1 < units.size() && rounded(1) >= step) {
        one *= step;
        ++unit;
    }
    const qint64 tenths = rounded(10);
    const QString number = tenths < 100 ? QStringLiteral("%1.%2").arg(tenths / 10).arg(tenths % 10)
                                        : QString::number(rounded(1));
    return number + units.at(unit);
}

void printLong(Invocation& invocation, const QVector<Item>& items)
{
    Output& output = invocation.output();
    const Label label(invocation);
    const bool isForPeople = invocation.isSet(QStringLiteral("human-readable"));
    const auto sizeText = [isForPeople](qint64 size) {
        return isForPeople ? sizeForPeople(size) : QString::number(size);
    };
    int typeWidth = 0;
    int sizeWidth = 1;
    for (const Item& item : items) {
        typeWidth = std::max(typeWidth, int(typeName(item.entry.type()).size()));
        sizeWidth = std::max(sizeWidth, int(sizeText(item.size).size()));
    }
    const QString none = QStringLiteral("-");
    const QString timeFormat = QStringLiteral("yyyy-MM-dd HH:mm");
    for (const Item& item : items) {
        const QString size = item.onDisk ? sizeText(item.size) : none;
        const QString time =
            item.onDisk
                ? QDateTime::fromMSecsSinceEpoch(item.modified / 1000000).toString(timeFormat)
                : none;
        const QString facts = QStringLiteral("%1  %2  %3  ")
                                  .arg(
                                      typeName(item.entry.type()).leftJustified(typeWidth),
                                      size.rightJustified(sizeWidth), time.leftJustified(16));
        QByteArray line = facts.toLocal8Bit() + output.name(label(item.entry), item.entry);
        if (item.entry.isSymLink()) {
            line += " -> " + output.name(item.entry.symLinkTarget());
        }
        output.writeRecord(line);
    }
}

void printJson(Invocation& invocation, JsonArray& json, const QVector<Item>& items)
{
    const bool isLong = wantsFacts(invocation);
    for (const Item& item : items) {
        QJsonObject object = toJson(item.entry);
        if (isLong) {
            object.insert(QStringLiteral("size"), item.onDisk ? item.size : QJsonValue());
            object.insert(
                QStringLiteral("modified"),
                textOrNull(item.onDisk ? isoTime(item.modified / 1000000000) : QString()));
            object.insert(
                QStringLiteral("linkTarget"),
                textOrNull(item.entry.isSymLink() ? item.entry.symLinkTarget() : QString()));
        }
        json.append(object);
    }
}

void print(Invocation& invocation, JsonArray& json, const QVector<Item>& items)
{
    if (invocation.json()) {
        printJson(invocation, json, items);
    } else if (wantsFacts(invocation)) {
        printLong(invocation, items);
    } else if (invocation.output().isTerminal() && !invocation.null()) {
        printColumns(invocation, items);
    } else {
        printLines(invocation, items);
    }
}

ListingOptions listingOptions(const Invocation& invocation)
{
    ListingOptions options;
    options.hidden = invocation.isSet(QStringLiteral("all"));
    options.facts = wantsFacts(invocation);
    options.reverse = invocation.isSet(QStringLiteral("reverse"));
    if (invocation.isSet(QStringLiteral("no-links"))) {
        options.filters = VFS::SkipSymLinks;
    }
    const QString sort = invocation.value(QStringLiteral("sort"));
    if (sort == QLatin1String("none") || invocation.isSet(QStringLiteral("unsorted"))) {
        options.sortBy = SortBy::Nothing;
    } else if (sort == QLatin1String("size")) {
        options.sortBy = SortBy::Size;
    } else if (sort == QLatin1String("time")) {
        options.sortBy = SortBy::Time;
    }
    return options;
}

/// The line above a directory, where several are shown to a person.
void printTitle(Invocation& invocation, const Entry& entry, bool first)
{
    Output& output = invocation.output();
    if (invocation.json() || invocation.null() || !output.isTerminal()) {
        return;
    }
    if (!first) {
        output.write(QByteArrayLiteral("\n"));
    }
    output.write(output.name(shownPath(entry), entry) + ":\n");
}

int run(Invocation& invocation)
{
    Output& output = invocation.output();
    QStringList operands = invocation.operands();
    const bool several = operands.size() > 1;
    if (operands.isEmpty()) {
        operands.append(QStringLiteral("."));
    }
    const ListingOptions options = listingOptions(invocation);
    JsonArray json(output);
    VFS* vfs = VFS::ptr();
    Interrupt interrupt({SIGINT}, [vfs] { vfs->stopGettingChilds(); });

    int exitCode = Done;
    bool first = true;
    for (const QString& operand : qAsConst(operands)) {
        const QString interrupted = QStringLiteral("interrupted");
        interrupt.setMessage(reportLine(operand, interrupted));
        const Located located = locate(operand);
        const QString why = located.why.isEmpty() ? whyUnreadable(located.entry) : located.why;
        // A place without its directory still has its children in the tree.
        if (why.isEmpty() || located.entry.isPlace()) {
            const Listing listed = listing(located.entry, options);
            if (interrupt.wasRequested()) {
                report(operand, interrupted);
                exitCode = Failed;
                break;
            }
            if (several) {
                printTitle(invocation, located.entry, first);
            }
            print(invocation, json, listed.items);
            first = false;
            output.flush();
            if (reportLeftOut(located.entry, listed.leftOut)) {
                exitCode = Failed;
            }
        }
        // What is done stays done when a later operand is cut off.
        output.flush();
        if (!why.isEmpty()) {
            report(operand, why);
            exitCode = Failed;
        }
    }
    if (invocation.json()) {
        json.end();
    }
    output.flush();
    return exitCode;
}

} // namespace

Verb listVerb()
{
    Verb verb;
    verb.name = QStringLiteral("list");
    verb.operands = QStringLiteral("[ENTRY...]");
    verb.summary = QStringLiteral("List the children of places and directories");
    verb.details = QStringLiteral(
        "Without an operand it lists the working directory. Places come first, in the order of\n"
        "the tree. Ctrl-C ends a long listing. Another name of the command is ls.");
    verb.otherName = QStringLiteral("ls");
    verb.options = {
        {{QStringLiteral("l"), QStringLiteral("long")},
         QStringLiteral("Show type, size, time and the target of links, too")},
        {{QStringLiteral("h"), QStringLiteral("human-readable")},
         QStringLiteral("As --long, with sizes such as 1.5K and 12M")},
        allOption(),
        {{QStringLiteral("p"), QStringLiteral("paths")},
         QStringLiteral("Show whole paths, not names")},
        {{QStringLiteral("no-links")}, QStringLiteral("Leave out symbolic links")},
        {{QStringLiteral("s"), QStringLiteral("sort")},
         QStringLiteral("Sort by name (default), size, time or none"),
         QStringLiteral("KEY"),
         {QStringLiteral("name"), QStringLiteral("size"), QStringLiteral("time"),
          QStringLiteral("none")}},
        {{QStringLiteral("U"), QStringLiteral("unsorted")},
         QStringLiteral("In the order of the disk; same as --sort=none")},
        {{QStringLiteral("r"), QStringLiteral("reverse")},
         QStringLiteral("Turn the order round, but not that of places")},
        nullOption(),
        colorOption()};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
