// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "completion/shellline.h"
#include "completion/shellreply.h"
#include "describe.h"
#include "devices.h"
#include "locate.h"
#include "patience.h"
#include "service/networkplacesmanagerproxy.h"
#include "shown.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

#include <QDir>

#include <algorithm>

#include <sys/stat.h>

namespace VeyFM {
namespace Tool {

namespace {

const QLatin1Char dash('-');

/// The fixed places, so far as they exist: the first sections of paths through places.
EntryList fixedPlaces()
{
    const VFS& vfs = *VFS::ptr();
    EntryList places;
    const Entry all[] = {
        vfs.favouritesEntry(), vfs.computerEntry(),    vfs.homeEntry(),
        vfs.desktopEntry(),    vfs.trashEntry(),       vfs.fileSystemEntry(),
        vfs.placesEntry(),     vfs.networkEntry(),     vfs.sambaNetworkEntry(),
        vfs.ftpNetworkEntry(), vfs.sftpNetworkEntry(), vfs.storageDevicesEntry(),
    };
    for (const Entry& place : all) {
        if (!place.isNull()) {
            places.append(place);
        }
    }
    return places;
}

/// Whether the name is that of a link that can't be written in the encoding of the locale.
bool isGarbled(const QString& name, const Entry& entry)
{
    struct stat status = {};
    return name.contains(QChar(QChar::ReplacementCharacter)) &&
           ::lstat(entry.localPath().toLocal8Bit().constData(), &status) != 0;
}

/// Texts behind @p typed that name one of the entries. The slash invites the next section.
void addEntries(
    QStringList& candidates, const EntryList& entries, const QString& typed, const QString& start)
{
    for (const Entry& entry : entries) {
        const QString name = shownName(entry);
        if (!name.startsWith(start)) {
            continue;
        }
        const bool hidden = entry.isHidden() && !entry.isPlace();
        if (hidden && !start.startsWith(QLatin1Char('.'))) {
            continue;
        }
        if (isGarbled(name, entry)) {
            continue;
        }
        // Not an option, for one who has typed nothing yet.
        const bool isLikeOption = typed.isEmpty() && start.isEmpty() && name.startsWith(dash);
        const bool leadsOn = entry.isPlace() || entry.isDir();
        candidates.append(
            (isLikeOption ? QStringLiteral("./") : typed) + name +
            (leadsOn ? QStringLiteral("/") : QString()));
    }
}

QStringList entryCandidates(const QString& word)
{
    QStringList candidates;
    const int slash = word.lastIndexOf(QLatin1Char('/'));
    const QString typed = word.left(slash + 1);
    const QString start = word.mid(slash + 1);
    if (typed.isEmpty()) {
        addEntries(candidates, fixedPlaces(), typed, start);
    }

    // The shell hands over a tilde as it was typed.
    QString directory = typed.isEmpty() ? QStringLiteral(".") : typed;
    if (directory.startsWith(QLatin1String("~/"))) {
        directory.replace(0, 1, QDir::homePath());
    }
    const Entry entry = resolveText(directory).entry;
    if (!entry.isNull() && !opensOnFirstLook(entry)) {
        addEntries(candidates, VFS::ptr()->childs(entry), typed, start);
    }
    return candidates;
}

QStringList verbCandidates(const QString& word, const QVector<Verb>& verbs)
{
    QStringList candidates;
    for (const Verb& verb : verbs) {
        if (!verb.hidden && verb.word().startsWith(word)) {
            candidates.append(verb.word());
        }
    }
    return candidates;
}

/// What the service knows, so far as it is at hand: nobody waits for a network to be searched.
QStringList recordNames(OperandKind kind)
{
    const VFS& vfs = *VFS::ptr();
    QStringList names;
    if (kind == OperandKind::Devices) {
        const QList<Device> devices = allDevices();
        for (const Device& device : devices) {
            names.append(device.name);
        }
    } else if (kind == OperandKind::Favourites) {
        const EntryList favourites = vfs.childs(vfs.favouritesEntry());
        for (const Entry& favourite : favourites) {
            names.append(shownName(favourite));
        }
    } else if (kind == OperandKind::Bookmarks) {
        const QList<NetworkPlace> places = VFS::ptr()->networkPlacesManager()->networkPlaces();
        for (const NetworkPlace& place : places) {
            names.append(place.name());
        }
    }
    return names;
}

QStringList operandCandidates(OperandKind kind, const QString& word)
{
    switch (kind) {
    case OperandKind::Entries:
        return entryCandidates(word);
    case OperandKind::Verbs:
        return verbCandidates(word, verbs());
    case OperandKind::Devices:
    case OperandKind::Favourites:
    case OperandKind::Bookmarks:
    case OperandKind::Texts:
        break;
    }
    QStringList candidates;
    const QStringList names = recordNames(kind);
    for (const QString& name : names) {
        if (name.startsWith(word)) {
            candidates.append(name);
        }
    }
    return candidates;
}

QString withDashes(const QString& name)
{
    return (name.size() == 1 ? QStringLiteral("-") : QStringLiteral("--")) + name;
}

QStringList optionCandidates(const QVector<Option>& options, const QString& word)
{
    QStringList candidates;
    for (const Option& option : options) {
        const QString text = withDashes(option.names.constLast());
        const QString behind = option.valueName.isEmpty() ? QString() : QStringLiteral("=");
        if (!word.contains(QLatin1Char('=')) && text.startsWith(word)) {
            candidates.append(text + behind);
        }
        for (const QString& value : option.values) {
            const QString whole = text + QLatin1Char('=') + value;
            if (word.startsWith(text + QLatin1Char('=')) && whole.startsWith(word)) {
                candidates.append(whole);
            }
        }
    }
    return candidates;
}

/// The values of the option that @p before names, where it waits for one.
const Option* optionWaiting(const QVector<Option>& options, const QString& before)
{
    for (const Option& option : options) {
        for (const QString& name : option.names) {
            if (!option.valueName.isEmpty() && before == withDashes(name)) {
                return &option;
            }
        }
    }
    return nullptr;
}

/// What may stand for the last of the words behind the program's name.
QStringList candidatesFor(QStringList words)
{
    const QString word = words.isEmpty() ? QString() : words.constLast();
    if (words.size() < 2) {
        if (!word.startsWith(dash)) {
            return verbCandidates(word, verbs());
        }
        return QStringList({QStringLiteral("--help"), QStringLiteral("--version")}).filter(word);
    }
    const Verb* verb = findVerb(words.constFirst());
    if (verb && !verb->verbs.isEmpty()) {
        if (words.size() == 2 && !word.startsWith(dash)) {
            return verbCandidates(word, verb->verbs);
        }
        if (words.size() > 2) {
            verb = findVerb(words.at(1), verb->verbs);
            words.removeFirst();
        }
    }
    if (!verb) {
        return {};
    }
    const QVector<Option> options = allOptions(*verb);
    const QStringList before = words.mid(1, words.size() - 2);
    const bool optionsEnded = before.contains(QStringLiteral("--"));
    if (!optionsEnded && !before.isEmpty()) {
        const Option* waiting = optionWaiting(options, before.constLast());
        if (waiting && waiting->isNumber) {
            return {};
        }
        if (waiting && !waiting->values.isEmpty()) {
            QStringList values;
            for (const QString& value : waiting->values) {
                if (value.startsWith(word)) {
                    values.append(value);
                }
            }
            return values;
        }
    }
    if (!optionsEnded && word.startsWith(dash)) {
        return optionCandidates(options, word);
    }
    if (verb->operandKind == OperandKind::Verbs && !before.isEmpty()) {
        const Verb* named = findVerb(before.constLast());
        if (named && !named->verbs.isEmpty()) {
            return verbCandidates(word, named->verbs);
        }
    }
    return operandCandidates(verb->operandKind, word);
}

/// The same each once, and none that would show a password.
QStringList offered(const QStringList& words)
{
    QStringList candidates = candidatesFor(words);
    candidates.removeDuplicates();
    const auto isSecret = [](const QString& candidate) {
        return shownText(candidate) != candidate;
    };
    candidates.erase(
        std::remove_if(candidates.begin(), candidates.end(), isSecret), candidates.end());
    return candidates;
}

/// What may stand for the last word of a line as the shell reads it.
QStringList offered(const ShellLine& line)
{
    QStringList words = line.words();
    const QString typed = words.constLast();
    // The line knows where home is. A tilde that is left is one of a name.
    const QString here = typed.startsWith(QLatin1Char('~')) ? QStringLiteral("./") : QString();
    words.last().prepend(here);
    QStringList candidates;
    const QStringList found = offered(words);
    for (const QString& candidate : found) {
        const QString value = candidate.mid(here.size());
        if (value.startsWith(typed)) {
            candidates.append(value);
        }
    }
    return candidates;
}

/// What the scripts of the shells ask for, in bash's own variables, with the line up to the cursor;
/// and for zsh the quote behind the cursor.
ShellReply replyFor(const QString& shell)
{
    const QByteArray bytes = qgetenv("COMP_LINE");
    const QString text = QString::fromLocal8Bit(bytes);
    const ShellLine line(text, QString::fromLocal8Bit(qgetenv("COMP_WORDBREAKS")));
    if (!line.isReadable() || text.toLocal8Bit() != bytes) {
        return {};
    }
    const QStringList candidates = offered(line);
    if (shell == QLatin1String("zsh")) {
        return replyForZsh(line, candidates, !qEnvironmentVariableIsEmpty("COMP_CLOSING"));
    }
    return replyForBash(line, candidates, qEnvironmentVariableIntValue("COMP_TYPE"));
}

void write(Output& output, const QString& record)
{
    output.write(record.toLocal8Bit() + '\0');
}

int run(Invocation& invocation)
{
    const Patience patience;
    Output& output = invocation.output();
    const QString shell = invocation.value(QStringLiteral("shell"));
    if (!shell.isEmpty()) {
        const ShellReply reply = replyFor(shell);
        write(output, reply.endsWord ? QStringLiteral("space") : QStringLiteral("nospace"));
        for (int i = 0; i < reply.texts.size(); ++i) {
            write(output, reply.texts.at(i));
            if (shell == QLatin1String("zsh")) {
                write(output, reply.shown.at(i));
            }
        }
        return Done;
    }

    const QStringList candidates = offered(invocation.operands());
    for (const QString& candidate : candidates) {
        write(output, candidate);
    }
    return Done;
}

} // namespace

Verb completeVerb()
{
    Verb verb;
    verb.name = QStringLiteral("complete");
    verb.operands = QStringLiteral("-- [WORD...]");
    verb.summary = QStringLiteral("Print what may stand for the last word of a command line");
    verb.details = QStringLiteral("For the shells. Each candidate ends with a NUL byte.");
    verb.needs = Needs::Nothing;
    verb.printsData = false;
    verb.hidden = true;
    verb.options = {
        {{QStringLiteral("shell")},
         QStringLiteral("Read the line from COMP_LINE, and print what goes into it"),
         QStringLiteral("SHELL"),
         {QStringLiteral("bash"), QStringLiteral("zsh")}}};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
