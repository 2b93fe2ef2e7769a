// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/urltext.h"

#include <QProcess>
#include <QRegularExpression>

#include <algorithm>

#include <arpa/inet.h>

namespace VeyFM {

namespace {

const QLatin1Char dash('-');

bool holdsAny(const QString& text, const char* characters)
{
    return std::any_of(text.begin(), text.end(), [unwanted = QLatin1String(characters)](QChar c) {
        return unwanted.contains(c);
    });
}

// QUrl gives the host without them.
bool hasBrackets(const QUrl& url)
{
    return url.adjusted(QUrl::RemoveUserInfo).authority().startsWith(QLatin1Char('['));
}

// QUrl lets more by: addresses of versions to come, and anything as a zone.
bool isIpv6(const QString& host)
{
    static const QRegularExpression form(
        QStringLiteral("\\A([0-9A-Fa-f:.]+)(?:%[0-9A-Za-z][0-9A-Za-z._~-]*)?\\z"));
    const QRegularExpressionMatch match = form.match(host);
    in6_addr address;
    return match.hasMatch() &&
           ::inet_pton(AF_INET6, match.captured(1).toLatin1().constData(), &address) == 1;
}

} // namespace

QString UrlText::writtenScheme(const QString& url)
{
    return url.left(QUrl(url).scheme().size());
}

bool UrlText::hasControl(const QString& text)
{
    return std::any_of(
        text.begin(), text.end(), [](QChar c) { return c.category() == QChar::Other_Control; });
}

QStringList UrlText::commandWords(const QStringList& pieces)
{
    // Our own dashes are told from those of the names by what no name may hold.
    const QChar ownDash(1);
    QString command;
    for (int i = 0; i < pieces.size(); ++i) {
        const bool isOwn = i % 2 == 0;
        if (!isOwn && hasControl(pieces.at(i))) {
            return {};
        }
        command += isOwn ? QString(pieces.at(i)).replace(dash, ownDash) : pieces.at(i);
    }
    QStringList words = QProcess::splitCommand(command);
    for (QString& word : words) {
        // As the tool gets it.
        if (word.toLocal8Bit().startsWith('-')) {
            return {};
        }
        word.replace(ownDash, dash);
    }
    return words;
}

bool UrlText::isSafeForTool(const QUrl& url)
{
    const QString user = url.userName(QUrl::FullyDecoded);
    const QString host = url.host(QUrl::FullyDecoded);
    // Without a port that fits into its number, say, a URL is none, and all of those share a key.
    if (!url.isValid() || host.isEmpty() || host.startsWith(dash)) {
        return false;
    }
    if (hasControl(user + host) || holdsAny(user + host, "/")) {
        return false;
    }
    if (hasBrackets(url) && !isIpv6(host)) {
        return false;
    }
    if (url.scheme() == QLatin1String("ftp")) {
        return !holdsAny(user + host, ",");
    }
    // The user comes first in what sshfs is to mount. It takes off all brackets, also those that
    // keep a dash from being the first character, and a colon ends the host.
    return !user.startsWith(dash) && !holdsAny(user, "[]:");
}

QString UrlText::toolHost(const QUrl& url)
{
    const QString host = url.host(QUrl::FullyDecoded);
    return hasBrackets(url) ? QLatin1Char('[') + host + QLatin1Char(']') : host;
}

} // namespace VeyFM
