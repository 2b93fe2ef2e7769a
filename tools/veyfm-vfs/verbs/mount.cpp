// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "host/mounturl.h"
#include "mount/login.h"
#include "mount/urlmount.h"
#include "mount/watchedjob.h"
#include "report.h"
#include "session.h"
#include "verbs/verbs.h"

namespace VeyFM {
namespace Tool {

using Host::schemeOf;
using Host::shownUrl;
using Host::userOf;
using Host::whyNotMountable;
using Host::whyNoUser;

namespace {

void print(Output& output, bool asJson, const UrlMount& mount)
{
    if (!asJson) {
        output.writeRecord(output.name(mount.localPath));
        return;
    }
    QJsonObject object = {
        {QStringLiteral("url"), mount.url},
        {QStringLiteral("path"), textOrNull(mount.placePath)},
        {QStringLiteral("localPath"), mount.localPath},
        {QStringLiteral("alreadyMounted"), mount.state != UrlMount::New}};
    JsonArray json(output);
    json.append(object);
    json.end();
}

int run(Invocation& invocation)
{
    const QString url = invocation.operands().constFirst();
    QString why = whyNotMountable(url);
    if (why.isEmpty()) {
        why = whyNoUser(schemeOf(url), invocation.value(QStringLiteral("user")));
    }
    const int timeout = jobTimeout(invocation);
    if (why.isEmpty()) {
        why = askService(shownUrl(url), timeout, openTree);
    }
    UrlMount mount;
    if (why.isEmpty()) {
        Login login = readLogin(invocation);
        if (login.user.isEmpty()) {
            login.user = userOf(url);
        }
        mount = mountUrl(url, login, timeout);
        why = mount.why;
    }
    if (!why.isEmpty()) {
        report(shownUrl(url), why);
        return Failed;
    }
    print(invocation.output(), invocation.json(), mount);
    return Done;
}

QString whyWrong(const Invocation& invocation)
{
    const QString why = whyNoLogin(invocation);
    if (!why.isEmpty()) {
        return why;
    }
    const QString url = invocation.operands().constFirst();
    const QString user = invocation.value(QStringLiteral("user"));
    if (user.isEmpty() || !whyNotMountable(url).isEmpty()) {
        return QString();
    }
    const QString other = userOf(url);
    return other.isEmpty() || other == user
               ? QString()
               : QStringLiteral("the user is '%1' in the URL and '%2' in --user").arg(other, user);
}

} // namespace

Verb mountVerb()
{
    Verb verb;
    verb.name = QStringLiteral("mount");
    verb.operands = QStringLiteral("URL");
    verb.summary = QStringLiteral("Mount a network resource");
    verb.details = QStringLiteral(
        "A URL of the schemes smb, ftp and sftp. Prints the local path of what it names. "
        "Passwords\n"
        "and the keys of unknown hosts are asked about on the terminal. What is mounted stays so:\n"
        "'veyfm-vfs unmount' ends it.");
    verb.operandKind = OperandKind::Texts;
    verb.leastOperands = 1;
    verb.mostOperands = 1;
    verb.needs = Needs::Nothing; // The tree is made under a watch.
    verb.options = loginOptions() + QVector<Option>{jobTimeoutOption()};
    verb.whyWrong = whyWrong;
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
