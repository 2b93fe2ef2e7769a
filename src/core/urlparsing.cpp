// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/urlparsing.h"

#include <QStringView>

#include <algorithm>

namespace VeyFM {

namespace {

// A section of a host has 63 letters at most. Whatever is not removed before they are counted
// makes one of them, but for four at most that become one together.
constexpr int SafeLength = 256;

struct Range
{
    int begin = 0;
    int end = 0;
};

bool isOneOf(QChar letter, QLatin1String letters)
{
    return letters.contains(letter);
}

// Where the host of a URL stands, by QUrl's rules: behind the first "@" and before the last colon
// of what "//" begins.
Range hostOf(const QString& url)
{
    const int afterScheme = UrlParsing::scheme(url).isEmpty() ? 0 : url.indexOf(u':') + 1;
    if (!QStringView(url).mid(afterScheme).startsWith(QLatin1String("//"))) {
        return {};
    }
    const auto authority = url.begin() + afterScheme + 2;
    const auto authorityEnd = std::find_if(
        authority, url.end(), [](QChar letter) { return isOneOf(letter, QLatin1String("/?#")); });
    const auto user = std::find(authority, authorityEnd, u'@');
    const auto host = user == authorityEnd ? authority : user + 1;
    const int begin = int(host - url.begin());
    const int end = int(authorityEnd - url.begin());
    const int colon = int(QStringView(url).mid(begin, end - begin).lastIndexOf(u':'));
    return {begin, colon < 0 ? end : begin + colon};
}

// The characters that separate the sections of a host.
bool isDot(uint letter)
{
    return letter == '.' || letter == 0x3002 || letter == 0xFF0E || letter == 0xFF61;
}

// Whether a letter may be removed before the letters of a section are counted (RFC 3454, tables
// B.1 and C).
bool mayVanish(uint letter)
{
    switch (QChar::category(letter)) {
    case QChar::Separator_Space:
    case QChar::Separator_Line:
    case QChar::Separator_Paragraph:
    case QChar::Other_Control:
    case QChar::Other_Format:
    case QChar::Other_Surrogate:
    case QChar::Other_PrivateUse:
    case QChar::Other_NotAssigned:
        return true;
    default:
        return letter == 0x034F || letter == 0x1806 || (letter >= 0x180B && letter <= 0x180D) ||
               (letter >= 0x2FF0 && letter <= 0x2FFB) || (letter >= 0xFE00 && letter <= 0xFE0F) ||
               letter == 0xFFFC || letter == 0xFFFD;
    }
}

// The host is decoded, with a question mark for what can't be. None can stand in it otherwise.
bool hasOverlongSection(const QString& host)
{
    int length = 0;
    bool isAscii = true;
    for (const uint letter : host.toUcs4()) {
        if (isDot(letter)) {
            length = 0;
            isAscii = true;
        } else if (letter != '?' && !mayVanish(letter)) {
            ++length;
            isAscii = isAscii && letter < 0x80;
            // ASCII alone may be a number, part of an address, and takes no time.
            if (length > SafeLength && !isAscii) {
                return true;
            }
        }
    }
    return false;
}

bool isOverlong(const QString& url, Range range)
{
    if (range.end - range.begin <= SafeLength || url.at(range.begin) == u'[') {
        return false;
    }
    QString host = url.mid(range.begin, range.end - range.begin);
    if (host.contains(u'%')) {
        host = QUrl::fromPercentEncoding(host.toUtf8());
    }
    return !host.startsWith(u'[') && hasOverlongSection(host);
}

} // namespace

QString UrlParsing::scheme(const QString& text)
{
    // QUrl knows best what a scheme is, and the text up to its first colon is all that it needs.
    // Most texts have no colon, or begin with a slash, and need no parser.
    const int colon = text.startsWith(u'/') ? -1 : text.indexOf(u':');
    return colon < 0 ? QString() : QUrl(text.left(colon + 1)).scheme();
}

bool UrlParsing::hasOverlongHost(const QString& text)
{
    return text.size() > SafeLength && isOverlong(text, hostOf(text));
}

QUrl UrlParsing::url(const QString& text)
{
    if (text.size() <= SafeLength) {
        return QUrl(text);
    }
    const Range host = hostOf(text);
    if (!isOverlong(text, host)) {
        return QUrl(text);
    }
    // One that is none either, and short.
    return QUrl(text.left(host.begin) + QLatin1String("..") + text.mid(host.end));
}

} // namespace VeyFM
