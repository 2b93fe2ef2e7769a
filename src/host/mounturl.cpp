// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mounturl.h"

#include "core/smburl.h"
#include "core/urltext.h"

#include <QRegularExpression>
#include <QStringList>
#include <QUrl>

#include <algorithm>

namespace VeyFM {
namespace Host {

namespace {

const QLatin1Char dash('-');
const QLatin1Char slash('/');
const QLatin1String authorityMark("://");

constexpr int longestUrl = 4096;
constexpr int longestName = 255; // Of a directory, in bytes; and of a host, which takes 253.

/// What ssh refuses in names, since commands of the user's own configuration may hold them, and
/// what sshfs and curlftpfs look for in the name of a user.
const QLatin1String badInUsers("'\"`;&<>|(){}[]$:/");
const QLatin1String badInShares("'\"`\\/%;<>|{}[]:*?#");
const QLatin1String badInWorkgroups("'\"`\\/%@:");

/// What nobody sees in a name, or what turns the direction of writing.
bool hasInvisible(const QString& name)
{
    return std::any_of(name.begin(), name.end(), [](QChar c) {
        return c.category() == QChar::Other_Control || c.category() == QChar::Other_Format ||
               c.category() == QChar::Separator_Line || c.category() == QChar::Separator_Paragraph;
    });
}

bool hasSpace(const QString& text)
{
    return std::any_of(text.begin(), text.end(), [](QChar c) { return c.isSpace(); });
}

/// Whether the tools would get the same text.
bool survivesLocale(const QString& text)
{
    return !text.contains(QChar(QChar::ReplacementCharacter)) &&
           QString::fromLocal8Bit(text.toLocal8Bit()) == text;
}

bool isDots(const QString& name)
{
    return name == QLatin1String(".") || name == QLatin1String("..");
}

bool leadsUp(const QString& path)
{
    return path.split(slash).contains(QLatin1String(".."));
}

/// Where the part with user and host ends that begins at @p start.
int authorityEnd(const QString& url, int start)
{
    static const QRegularExpression ending(QStringLiteral("[/?#]"));
    const int end = url.indexOf(ending, start);
    return end < 0 ? url.size() : end;
}

QString toolOf(const QString& scheme)
{
    if (scheme == QLatin1String("smb")) {
        return QStringLiteral("smbclient");
    }
    return scheme == QLatin1String("ftp") ? QStringLiteral("curlftpfs") : QStringLiteral("sshfs");
}

/// What is wrong with any name, whatever it names.
QString whyNoName(const QString& name, const QString& what)
{
    if (hasInvisible(name)) {
        return QStringLiteral("a control character in the name of the %1").arg(what);
    }
    if (!survivesLocale(name)) {
        return QStringLiteral("the name of the %1 is not valid in the encoding of the locale")
            .arg(what);
    }
    if (name.startsWith(dash)) {
        return QStringLiteral("the name of the %1 must not begin with a dash").arg(what);
    }
    if (isDots(name)) {
        return QStringLiteral("'%1' is no name of a %2").arg(name, what);
    }
    if (name.toLocal8Bit().size() > longestName) {
        return QStringLiteral("the name of the %1 is too long").arg(what);
    }
    return QString();
}

QString whyHolding(const QString& name, QLatin1String bad, const QString& what, const QString& tool)
{
    const QString badText = bad;
    for (const QChar c : name) {
        if (badText.contains(c)) {
            return QStringLiteral("%1 can't be told of a %2 with %3 in its name")
                .arg(tool, what, QLatin1Char('\'') + c + QLatin1Char('\''));
        }
    }
    return QString();
}

QString whyHoldingSpace(const QString& name, const QString& what, const QString& tool)
{
    if (!hasSpace(name)) {
        return QString();
    }
    return QStringLiteral("%1 can't be told of a %2 with white space in its name").arg(tool, what);
}

QString whyNoHost(const QString& host, const QString& tool)
{
    const QString what = QStringLiteral("host");
    if (host.isEmpty()) {
        return QStringLiteral("the host is missing");
    }
    const QString why = whyNoName(host, what);
    if (!why.isEmpty()) {
        return why;
    }
    if (host.contains(QLatin1Char(':'))) {
        return QStringLiteral("%1 can't be told of an IPv6 address: use a name of the host")
            .arg(tool);
    }
    const bool plain = std::all_of(host.begin(), host.end(), [](QChar c) {
        return c.isLetterOrNumber() || c.isMark() || c == dash || c == QLatin1Char('.') ||
               c == QLatin1Char('_');
    });
    if (!plain || host.startsWith(QLatin1Char('.')) || host.contains(QLatin1String(".."))) {
        return QStringLiteral("'%1' is no name of a host").arg(host);
    }
    return QString();
}

QString whyNoPort(const QString& scheme)
{
    const QString why =
        QStringLiteral("%1 is not told of a port: leave it out").arg(toolOf(scheme));
    return scheme == QLatin1String("sftp")
               ? why + QStringLiteral(", and set it for the host in ~/.ssh/config")
               : why;
}

/// The host and port of an authority, as they are written.
struct HostAndPort
{
    explicit HostAndPort(const QString& authority)
    {
        static const QRegularExpression bracketed(QStringLiteral("^\\[(.*)\\](?::(.*))?$"));
        static const QRegularExpression usual(QStringLiteral("^([^:]*)(?::(.*))?$"));
        for (const QRegularExpression* form : {&bracketed, &usual}) {
            const QRegularExpressionMatch match = form->match(authority);
            if (!match.hasMatch()) {
                continue;
            }
            host = match.captured(1);
            hasPort = !match.captured(2).isNull();
            return;
        }
        host = authority;
    }

    QString host;
    bool hasPort = false;
};

/// The user of a Samba URL, whom SmbUrl passes over. No character is encoded there.
QString smbUser(const QString& authority)
{
    const QString login = authority.mid(authority.indexOf(QLatin1Char(';')) + 1);
    return login.left(std::max(login.indexOf(QLatin1Char('@')), 0));
}

QString whyNotSmb(const QString& text, const QString& authority)
{
    static const QRegularExpression escape(QStringLiteral("%[0-9A-Fa-f]{2}"));
    const QRegularExpressionMatch match = escape.match(text);
    if (match.hasMatch()) {
        // Not every character would be taken.
        const SmbUrl meant(QUrl::fromPercentEncoding(text.toUtf8()));
        const QString why =
            whyNoShare(meant.share(), HostAndPort(meant.host()).host, meant.workgroup());
        return why.isEmpty()
                   ? QStringLiteral("'%1' stands for itself in an smb URL: write the character")
                         .arg(match.captured())
                   : why;
    }
    const QString scheme = QStringLiteral("smb");
    const SmbUrl url(text);
    const HostAndPort address(url.host());
    if (address.hasPort) {
        return whyNoPort(scheme);
    }
    const QString why = whyNoShare(url.share(), address.host, url.workgroup());
    if (!why.isEmpty()) {
        return why;
    }
    if (leadsUp(url.tailPath())) {
        return QStringLiteral("'..' in the path");
    }
    return whyNoUser(scheme, smbUser(authority));
}

QString whyNotFuse(const QString& text, const QString& scheme, const QString& authority)
{
    const QUrl url(text);
    const QString written = authority.mid(authority.indexOf(QLatin1Char('@')) + 1);
    const HostAndPort address(written);
    const QString host = url.isValid() ? url.host(QUrl::FullyDecoded) : address.host;
    const bool isBracketed = written.startsWith(QLatin1Char('['));
    if (!isBracketed && written.count(QLatin1Char(':')) > 1) {
        return QStringLiteral("an IPv6 address needs brackets: [%1]").arg(written);
    }
    QString why;
    if (!isBracketed || !host.contains(QLatin1Char(':'))) {
        why = whyNoHost(host, toolOf(scheme));
    } else if (!UrlText::isSafeForTool(url.adjusted(QUrl::RemoveUserInfo))) {
        why = QStringLiteral("'%1' is no IPv6 address").arg(host);
    }
    if (!why.isEmpty()) {
        return why;
    }
    if (address.hasPort) {
        return whyNoPort(scheme);
    }
    if (!url.isValid()) {
        return QStringLiteral("'%1' is no name of a host").arg(host);
    }
    const QString user = url.userName(QUrl::FullyDecoded);
    if (user.isEmpty() && written != authority) {
        return QStringLiteral("the name of the user is missing");
    }
    why = whyNoUser(scheme, user);
    if (!why.isEmpty()) {
        return why;
    }
    // The job's own look, which is less strict.
    if (!UrlText::isSafeForTool(url)) {
        return QStringLiteral("%1 can't be told of this user and host").arg(toolOf(scheme));
    }
    // With the sign of a mount of the home directory behind it.
    if (QStringLiteral("%1@%2~").arg(user, host).toLocal8Bit().size() > longestName) {
        return QStringLiteral("the names of the user and the host are too long together");
    }
    if (url.hasQuery()) {
        return QStringLiteral("a '?' ends the path: write %3F for one that is part of it");
    }
    if (url.hasFragment()) {
        return QStringLiteral("a '#' ends the path: write %23 for one that is part of it");
    }
    const QString path = url.path(QUrl::FullyDecoded);
    if (UrlText::hasControl(path)) {
        return QStringLiteral("a control character in the path");
    }
    if (!survivesLocale(path)) {
        return QStringLiteral("the path is not valid in the encoding of the locale");
    }
    if (leadsUp(path)) {
        return QStringLiteral("'..' in the path");
    }
    if (path.startsWith(QLatin1String("/~"))) {
        if (scheme == QLatin1String("ftp")) {
            return QStringLiteral("'~' at the beginning of the path, which ftp does not know");
        }
        if (path.size() > 2 && path.at(2) != slash) {
            return QStringLiteral("'%1' at the beginning of the path: only '~' is known there")
                .arg(path.section(slash, 1, 1));
        }
    }
    return QString();
}

} // namespace

QString schemeOf(const QString& url)
{
    return url.left(url.indexOf(authorityMark));
}

QString userOf(const QString& url)
{
    const QString scheme = schemeOf(url);
    if (scheme != QLatin1String("smb")) {
        return QUrl(url).userName(QUrl::FullyDecoded);
    }
    const int start = scheme.size() + authorityMark.size();
    return smbUser(url.mid(start, authorityEnd(url, start) - start));
}

QString whyNotMountable(const QString& url)
{
    if (url.size() > longestUrl) {
        return QStringLiteral("longer than %1 characters").arg(longestUrl);
    }
    if (UrlText::hasControl(url)) {
        return QStringLiteral("a control character in the URL");
    }
    if (!survivesLocale(url)) {
        return QStringLiteral("not valid in the encoding of the locale");
    }
    if (url.trimmed() != url) {
        return QStringLiteral("white space around the URL");
    }
    const QStringList schemes = {
        QStringLiteral("smb"), QStringLiteral("ftp"), QStringLiteral("sftp")};
    const int schemeEnd = url.indexOf(authorityMark);
    const QString scheme = url.left(schemeEnd);
    if (schemeEnd > 0 && !schemes.contains(scheme) && schemes.contains(scheme.toLower())) {
        return QStringLiteral("a scheme is written in lower case: %1").arg(scheme.toLower());
    }
    if (schemeEnd < 0 || !schemes.contains(scheme)) {
        return QStringLiteral("not a URL of a network resource: smb, ftp or sftp, and a host");
    }
    if (shownUrl(url) != url) {
        return QStringLiteral("a password in a URL is seen by others: leave it out, and it is "
                              "asked for, or read as --password-fd says");
    }
    const int start = schemeEnd + authorityMark.size();
    const QString authority = url.mid(start, authorityEnd(url, start) - start);
    if (hasInvisible(authority)) {
        return QStringLiteral("a control character in the URL");
    }
    return scheme == QLatin1String("smb") ? whyNotSmb(url, authority)
                                          : whyNotFuse(url, scheme, authority);
}

QString whyNoUser(const QString& scheme, const QString& user)
{
    const QString what = QStringLiteral("user");
    const QString tool = toolOf(scheme);
    QString why = whyNoName(user, what);
    if (why.isEmpty()) {
        why = whyHoldingSpace(user, what, tool);
    }
    if (why.isEmpty()) {
        why = whyHolding(user, badInUsers, what, tool);
    }
    if (!why.isEmpty()) {
        return why;
    }
    if (scheme == QLatin1String("ftp")) {
        return whyHolding(user, QLatin1String(",\\"), what, tool);
    }
    if (scheme == QLatin1String("smb")) {
        why = whyHolding(user, QLatin1String("%"), what, tool);
    }
    // "DOMAIN\user" is how a user of a domain is named.
    const QLatin1Char backslash('\\');
    const bool isLoose = user.startsWith(backslash) || user.endsWith(backslash);
    return why.isEmpty() && isLoose ? whyHolding(user, QLatin1String("\\"), what, tool) : why;
}

QString whyNoShare(const QString& share, const QString& host, const QString& workgroup)
{
    const QString tool = QStringLiteral("smbclient");
    const QString shareWhat = QStringLiteral("share");
    const QString workgroupWhat = QStringLiteral("workgroup");
    QString why = whyNoHost(host, tool);
    if (why.isEmpty() && share.isEmpty()) {
        why = QStringLiteral("the share is missing behind the host");
    }
    if (why.isEmpty()) {
        why = whyNoName(share, shareWhat);
    }
    if (why.isEmpty()) {
        why = whyHoldingSpace(share, shareWhat, tool);
    }
    if (why.isEmpty()) {
        why = whyHolding(share, badInShares, shareWhat, tool);
    }
    // A hidden share ends with one.
    if (why.isEmpty()) {
        why = whyHolding(share.chopped(1), QLatin1String("$"), shareWhat, tool);
    }
    // No tool is told of the workgroup.
    if (why.isEmpty()) {
        why = whyNoName(workgroup, workgroupWhat);
    }
    if (why.isEmpty()) {
        why = whyHolding(workgroup, badInWorkgroups, workgroupWhat, QStringLiteral("a server"));
    }
    return why;
}

QString shownUrl(const QString& url)
{
    static const QRegularExpression scheme(QStringLiteral("^[A-Za-z][A-Za-z0-9+.-]*://"));
    static const QRegularExpression port(QStringLiteral("^[0-9]*$"));
    // An encoded colon ends a user as well, for curlftpfs.
    static const QRegularExpression colon(QStringLiteral(":|%3[Aa]"));
    static const QRegularExpression address(QStringLiteral("^\\[[^\\]@]*\\](?::[0-9]*)?$"));
    const int start = scheme.match(url).capturedLength();
    const int end = authorityEnd(url, start);
    if (address.match(url.mid(start, end - start)).hasMatch()) {
        return url;
    }
    const QRegularExpressionMatch match = colon.match(url.left(end), start);
    if (!match.hasMatch()) {
        return url;
    }
    int at = url.left(end).lastIndexOf(QLatin1Char('@'));
    // A password with a slash, which should be %2F, seems to end before its '@'. Behind a number,
    // which is a port, it is the path that has one.
    const int behind = match.capturedEnd();
    if (at < start && !port.match(url.mid(behind, end - behind)).hasMatch()) {
        at = url.lastIndexOf(QLatin1Char('@'));
    }
    return at >= behind ? url.left(match.capturedStart()) + url.mid(at) : url;
}

} // namespace Host
} // namespace VeyFM
