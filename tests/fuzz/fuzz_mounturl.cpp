// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any text to the look at what is to be mounted, and to the jobs' own; and what passes to the
// jobs' and the tools' ways of reading it.

#include "fuzzing.h"

#include "core/smburl.h"
#include "core/urltext.h"
#include "host/mounturl.h"

#include <QDir>
#include <QProcess>
#include <QUrl>

using Fuzzing::require;
using VeyFM::SmbUrl;
namespace UrlText = VeyFM::UrlText;
using namespace VeyFM::Host;

namespace {

QString below(const QString& directory, const QString& path)
{
    return QDir::cleanPath(directory + QLatin1Char('/') + path);
}

bool isAtOrBelow(const QString& path, const QString& directory)
{
    return path == directory || path.startsWith(directory + QLatin1Char('/'));
}

QStringList smbWords(const QString& host, const QString& share, const QString& user)
{
    return UrlText::commandWords(
        {QStringLiteral("smbclient //"), host, QStringLiteral("/"), share, QStringLiteral(" -U "),
         user, QStringLiteral(" -c du")});
}

// Any names at all, as a network tells them.
void checkSmbWords(const QString& host, const QString& share, const QString& user)
{
    const QStringList words = smbWords(host, share, user);
    if (words.isEmpty()) {
        return;
    }
    require(words.first() == QLatin1String("smbclient"), "the program is ours");
    int options = 0;
    for (const QString& word : words) {
        require(!UrlText::hasControl(word), "no control character reaches the tool");
        options += word.startsWith(QLatin1Char('-')) ? 1 : 0;
    }
    // Quotes may swallow ours.
    require(options <= 2, "all options are ours");
}

// What sshfs makes of its first argument.
void checkSshfsTarget(const QUrl& url)
{
    const QString user = url.userName(QUrl::FullyDecoded);
    const QString target = (user.isEmpty() ? user : user + QLatin1Char('@')) +
                           UrlText::toolHost(url) + QStringLiteral(":/");
    QString host;
    int i = 0;
    for (; i < target.size() && target.at(i) != QLatin1Char(':'); ++i) {
        if (target.at(i) != QLatin1Char('[')) {
            host += target.at(i);
            continue;
        }
        const int end = target.indexOf(QLatin1Char(']'), i);
        require(end > i, "brackets are closed");
        host += target.mid(i + 1, end - i - 1);
        i = end;
    }
    require(target.mid(i) == QLatin1String(":/"), "the host ends where it should");
    require(!host.startsWith(QLatin1Char('-')), "a host is no option");
    const QString name = url.host(QUrl::FullyDecoded);
    require(host == (user.isEmpty() ? name : user + QLatin1Char('@') + name), "the host is ours");
}

void checkTools(const QUrl& url)
{
    if (!UrlText::isSafeForTool(url)) {
        return;
    }
    const QString user = url.userName(QUrl::FullyDecoded);
    const QString host = url.host(QUrl::FullyDecoded);
    require(!host.isEmpty() && !host.startsWith(QLatin1Char('-')), "there is a host");
    require(!UrlText::hasControl(user + host), "no control character reaches a tool");
    require(!(user + host).contains(QLatin1Char('/')), "names stay in their directory");
    if (url.scheme() == QLatin1String("sftp")) {
        checkSshfsTarget(url);
    } else if (url.scheme() == QLatin1String("ftp")) {
        require(!(user + host).contains(QLatin1Char(',')), "names stay in their mount option");
    }
}

void checkShare(const SmbUrl& url)
{
    const QString service = QStringLiteral("//%1/%2").arg(url.host(), url.share());
    const QStringList words =
        QProcess::splitCommand(QStringLiteral("smbclient %1 -k -c du").arg(service));
    require(words.size() == 5 && words.at(1) == service, "a share is one argument");
    require(
        smbWords(url.host(), url.share(), QStringLiteral("%")).size() == 6,
        "the job does not refuse it");
    const QString root = QStringLiteral("/network/%1/%2").arg(url.host(), url.share());
    require(QDir::cleanPath(root) == root, "a share has a directory of its own");
    require(isAtOrBelow(below(root, url.tailPath()), root), "a path stays in its share");
}

void checkFuse(const QUrl& url)
{
    const QString user = url.userName(QUrl::FullyDecoded);
    const QString host = url.host(QUrl::FullyDecoded);
    const QString account = user.isEmpty() ? host : user + QLatin1Char('@') + host;
    require(UrlText::isSafeForTool(url), "the job does not refuse it");
    require(url.isValid() && !host.isEmpty(), "there is a host");
    require(url.password().isEmpty(), "there is no password");
    require(url.port() == -1 && !url.hasQuery() && !url.hasFragment(), "nothing is dropped");
    require(!account.startsWith(QLatin1Char('-')), "an account is no option");
    require(!user.contains(QLatin1Char(':')), "a user ends at no colon");
    require(
        !host.contains(QLatin1Char(':')) || UrlText::toolHost(url).startsWith(QLatin1Char('[')),
        "a host ends at the colon behind it");
    require(account.toLocal8Bit().size() < 255, "an account is short enough for a directory");
    const QString root = QStringLiteral("/root/ftp/") + account;
    require(QDir::cleanPath(root) == root, "an account is one directory");
    require(
        isAtOrBelow(below(root, url.path(QUrl::FullyDecoded)), root), "a path stays in its mount");
    if (url.scheme() == QLatin1String("ftp")) {
        require(
            !user.contains(QLatin1Char(',')) && !user.contains(QLatin1Char('\\')),
            "a user is one mount option");
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QString text = Fuzzing::text(data, size);
    const QString shown = shownUrl(text);
    require(shownUrl(shown) == shown, "what is shown has no password");

    if (whyNoUser(QStringLiteral("smb"), text).isEmpty() && !text.isEmpty()) {
        const QStringList words =
            QProcess::splitCommand(QStringLiteral("smbclient //h/s -U %1 -c du").arg(text));
        require(words.size() == 6 && words.at(3) == text, "a user is one argument");
        require(!text.contains(QLatin1Char('%')), "a user has no password behind it");
    }
    checkTools(QUrl(text));
    const SmbUrl named(text);
    checkSmbWords(named.host(), named.share(), QString(text).section(QLatin1Char('@'), -1));
    checkSmbWords(text, text, text);
    if (!whyNotMountable(text).isEmpty()) {
        return 0;
    }
    require(shown == text, "what is mounted has no password");
    if (text.startsWith(QLatin1String("smb"))) {
        checkShare(SmbUrl(text));
    } else {
        checkFuse(QUrl(text));
    }
    return 0;
}
