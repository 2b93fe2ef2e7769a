// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "shown.h"

#include "host/mounturl.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QRegularExpression>

namespace VeyFM {
namespace Tool {

using Host::shownUrl;

namespace {

const QLatin1String authorityMark("://");

/// Where the URL ends that a message has at @p start.
int endOfUrl(const QString& message, int start)
{
    static const QRegularExpression ending(QStringLiteral("[\\s'\"<>]"));
    const int end = message.indexOf(ending, start);
    const QString url = message.mid(start, end < 0 ? -1 : end - start);
    // A blank or a quote may be part of a password that was typed.
    static const QRegularExpression open(QStringLiteral("^[^:]*://[^@/]*:(?![0-9]*$)[^@]+$"));
    return end < 0 || open.match(url).hasMatch() ? message.size() : end;
}

QJsonValue shownValue(const QJsonValue& value)
{
    if (value.isString()) {
        return shownText(value.toString());
    }
    if (value.isArray()) {
        QJsonArray array;
        const QJsonArray elements = value.toArray();
        for (const QJsonValue& element : elements) {
            array.append(shownValue(element));
        }
        return array;
    }
    if (value.isObject()) {
        QJsonObject object = value.toObject();
        for (auto it = object.begin(); it != object.end(); ++it) {
            it.value() = shownValue(it.value());
        }
        return object;
    }
    return value;
}

} // namespace

QString shownText(const QString& text)
{
    if (!text.contains(authorityMark)) {
        return text;
    }
    static const QRegularExpression mark(QStringLiteral("[A-Za-z][A-Za-z0-9+.-]*://"));
    QString shown;
    int from = 0;
    for (;;) {
        const QRegularExpressionMatch match = mark.match(text, from);
        if (!match.hasMatch()) {
            return shown + text.mid(from);
        }
        const int start = match.capturedStart();
        const int end = start == 0 ? text.size() : endOfUrl(text, start);
        const QString url = text.mid(start, end - start);
        shown += text.mid(from, start - from) + (start == 0 ? shownLocation(url) : shownUrl(url));
        from = end;
    }
}

QString shownLocation(const QString& text)
{
    static const QRegularExpression network(
        QStringLiteral("^\\s*(?:smb|ftps?|sftp|ssh|https?|davs?|nfs):[/\\\\]*"),
        QRegularExpression::CaseInsensitiveOption);
    static const QRegularExpression any(QStringLiteral("^[A-Za-z][A-Za-z0-9+.-]*://"));
    const QRegularExpressionMatch match = network.match(text);
    if (!match.hasMatch()) {
        return any.match(text).hasMatch() ? shownUrl(text) : shownText(text);
    }
    const QString scheme = QLatin1Char('x') + authorityMark;
    return match.captured() + shownUrl(scheme + text.mid(match.capturedEnd())).mid(scheme.size());
}

QByteArray shownJson(const QJsonObject& object)
{
    const QByteArray bytes = QJsonDocument(object).toJson(QJsonDocument::Compact);
    // Few objects hold a URL.
    return bytes.contains("://")
               ? QJsonDocument(shownValue(object).toObject()).toJson(QJsonDocument::Compact)
               : bytes;
}

} // namespace Tool
} // namespace VeyFM
