// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "interrupt.h"
#include "listing.h"
#include "locate.h"
#include "report.h"
#include "terminal.h"
#include "verbs/verbs.h"
#include "vfs/vfsplacebase.h"

#include <QJsonArray>

#include <algorithm>
#include <vector>

#include <cerrno>
#include <signal.h>

namespace VeyFM {
namespace Tool {

namespace {

struct Node
{
    Entry entry;
    bool opened = true;
    std::vector<Node> children = {};
};

/// Gathers the nodes below an operand.
class Gatherer
{
public:
    Gatherer(const Invocation& invocation, const Interrupt& interrupt)
        : m_interrupt(interrupt)
        , m_expand(invocation.isSet(QStringLiteral("expand")))
        , m_contents(invocation.isSet(QStringLiteral("depth")))
    {
        m_options.hidden = invocation.isSet(QStringLiteral("all"));
    }

    /// An operand is opened in any case: its name was given. @p levels below zero has no end.
    Node gather(const Entry& entry, int levels, bool isOperand = true)
    {
        Node node = {entry};
        if (opensOnFirstLook(entry) && !m_expand && !isOperand) {
            node.opened = false;
            return node;
        }
        if (levels == 0 || m_interrupt.wasRequested()) {
            return node;
        }
        const EntryList children = childrenOf(entry, isOperand);
        for (const Entry& child : children) {
            node.children.push_back(gather(child, levels - 1, false));
        }
        return node;
    }

    bool hasFailed() const
    {
        return m_failed;
    }

private:
    EntryList childrenOf(const Entry& entry, bool isOperand)
    {
        const bool follow = isOperand || !entry.isSymLink();
        if (!hasDirectory(entry) || !follow || !(m_contents || isOperand)) {
            return entry.isPlace() ? VFS::ptr()->placeBase()->childEntries(entry) : EntryList();
        }
        const QString why = whyUnreadable(entry);
        // The directories of places, such as Trash, are made when they are needed.
        if (!why.isEmpty() && !(entry.isPlace() && why == systemReason(ENOENT))) {
            report(shownPath(entry), why);
            m_failed = true;
        }
        EntryList children;
        const Listing listed = listing(entry, m_options);
        for (const Item& item : listed.items) {
            children.append(item.entry);
        }
        if (reportLeftOut(entry, listed.leftOut)) {
            m_failed = true;
        }
        return children;
    }

    const Interrupt& m_interrupt;
    ListingOptions m_options;
    const bool m_expand;
    const bool m_contents;
    bool m_failed = false;
};

/// Draws nodes, with the local paths of places in a column of their own.
class Picture
{
public:
    Picture(Output& output)
        : m_output(output)
    {
        if (isUtf8Locale()) {
            m_branch = QStringLiteral("\u251c\u2500\u2500 ");
            m_last = QStringLiteral("\u2514\u2500\u2500 ");
            m_bar = QStringLiteral("\u2502   ");
            m_unopened = QStringLiteral(" \u2026");
        } else {
            m_branch = QStringLiteral("|-- ");
            m_last = QStringLiteral("`-- ");
            m_bar = QStringLiteral("|   ");
            m_unopened = QStringLiteral(" ...");
        }
    }

    /// The operand, under its whole path.
    void addTop(const Node& node)
    {
        addLine(QString(), shownPath(node.entry), node);
        addChildren(QString(), node);
    }

    /// Nodes that stand at the left edge: the children of the top of the tree.
    void addNames(const std::vector<Node>& nodes)
    {
        for (const Node& node : nodes) {
            addLine(QString(), shownName(node.entry), node);
            addChildren(QString(), node);
        }
    }

    void write()
    {
        int column = 0;
        for (const Line& line : m_lines) {
            if (!line.localPath.isEmpty()) {
                column = std::max(column, line.width);
            }
        }
        for (const Line& line : m_lines) {
            QByteArray bytes = line.bytes;
            if (!line.localPath.isEmpty()) {
                bytes += QByteArray(column - line.width + 2, ' ') + line.localPath;
            }
            m_output.write(bytes + '\n');
        }
    }

private:
    struct Line
    {
        QByteArray bytes;
        int width;
        QByteArray localPath;
    };

    void addChildren(const QString& indent, const Node& node)
    {
        for (const Node& child : node.children) {
            const bool isLast = &child == &node.children.back();
            addLine(indent + (isLast ? m_last : m_branch), shownName(child.entry), child);
            addChildren(indent + (isLast ? QStringLiteral("    ") : m_bar), child);
        }
    }

    void addLine(const QString& lead, const QString& name, const Node& node)
    {
        const QString tail = node.opened ? QString() : m_unopened;
        Line line;
        line.bytes = lead.toLocal8Bit() + m_output.label(name, node.entry) + tail.toLocal8Bit();
        line.width = displayWidth(lead + escaped(name) + tail);
        if (node.entry.isPlace()) {
            line.localPath = m_output.label(node.entry.localPath(), Entry());
        }
        m_lines.push_back(line);
    }

    Output& m_output;
    std::vector<Line> m_lines;
    QString m_branch;
    QString m_last;
    QString m_bar;
    QString m_unopened;
};

QJsonObject nodeToJson(const Node& node)
{
    QJsonObject object = toJson(node.entry);
    object.insert(QStringLiteral("opened"), node.opened);
    QJsonArray children;
    for (const Node& child : node.children) {
        children.append(nodeToJson(child));
    }
    object.insert(QStringLiteral("children"), children);
    return object;
}

int run(Invocation& invocation)
{
    Output& output = invocation.output();
    VFS* vfs = VFS::ptr();
    QStringList operands = invocation.operands();
    if (operands.isEmpty()) {
        operands.append(vfs->rootEntry().path());
    }

    int levels = -1;
    if (invocation.isSet(QStringLiteral("depth"))) {
        levels = int(invocation.value(QStringLiteral("depth")).toUInt());
    }

    Interrupt interrupt({SIGINT}, [vfs] { vfs->stopGettingChilds(); });
    Gatherer gatherer(invocation, interrupt);
    JsonArray json(output);
    int exitCode = Done;
    bool first = true;
    for (const QString& operand : qAsConst(operands)) {
        const QString interrupted = QStringLiteral("interrupted");
        interrupt.setMessage(reportLine(operand, interrupted));
        const Located located = locate(operand);
        if (!located.why.isEmpty()) {
            report(operand, located.why);
            exitCode = Failed;
            continue;
        }
        const Node node = gatherer.gather(located.entry, levels);
        if (interrupt.wasRequested()) {
            report(operand, interrupted);
            exitCode = Failed;
            break;
        }
        if (invocation.json()) {
            json.append(nodeToJson(node));
            output.flush();
            continue;
        }
        if (!first) {
            output.write(QByteArrayLiteral("\n"));
        }
        first = false;
        Picture picture(output);
        // The top of the tree has a name that is not meant to be seen.
        if (node.entry == vfs->rootEntry()) {
            picture.addNames(node.children);
        } else {
            picture.addTop(node);
        }
        picture.write();
        output.flush();
    }
    if (invocation.json()) {
        json.end();
    }
    output.flush();
    return gatherer.hasFailed() ? int(Failed) : exitCode;
}

} // namespace

Verb treeVerb()
{
    Verb verb;
    verb.name = QStringLiteral("tree");
    verb.operands = QStringLiteral("[ENTRY...]");
    verb.summary = QStringLiteral("Show the tree of places");
    verb.details = QStringLiteral(
        "Without an operand it shows the whole tree of places. An operand with a directory shows\n"
        "what is in it; directories further down are shown with --depth only. Places that take\n"
        "long to open (storage devices, Samba, its workgroups and hosts) are marked, and opened\n"
        "with --expand or as operands only.");
    verb.options = {
        {{QStringLiteral("d"), QStringLiteral("depth")},
         QStringLiteral("Show so many levels, with the content of directories"),
         QStringLiteral("N"),
         {},
         true},
        {{QStringLiteral("e"), QStringLiteral("expand")},
         QStringLiteral("Open the places that take long to open")},
        allOption(),
        colorOption()};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
