// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "terminal.h"

#include <QVector>

#include <cwchar>
#include <langinfo.h>
#include <strings.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

bool needsEscape(QChar c)
{
    const ushort code = c.unicode();
    const bool control = code < 0x20 || (code >= 0x7f && code < 0xa0);
    const bool turnsOrBreaks = (code >= 0x2028 && code <= 0x202e) ||
                               (code >= 0x2066 && code <= 0x2069) || code == 0x200e ||
                               code == 0x200f || code == 0x061c;
    return control || turnsOrBreaks || c == QLatin1Char('\\');
}

QString escape(QChar c)
{
    switch (c.unicode()) {
    case '\\':
        return QStringLiteral("\\\\");
    case '\a':
        return QStringLiteral("\\a");
    case '\b':
        return QStringLiteral("\\b");
    case '\f':
        return QStringLiteral("\\f");
    case '\n':
        return QStringLiteral("\\n");
    case '\r':
        return QStringLiteral("\\r");
    case '\t':
        return QStringLiteral("\\t");
    case '\v':
        return QStringLiteral("\\v");
    default:
        break;
    }
    QString text;
    const QByteArray bytes = QString(c).toLocal8Bit();
    for (const char byte : bytes) {
        text += QStringLiteral("\\%1").arg(uint(uchar(byte)), 3, 8, QLatin1Char('0'));
    }
    return text;
}

} // namespace

QString escaped(const QString& text)
{
    QString result;
    result.reserve(text.size());
    for (const QChar c : text) {
        if (needsEscape(c)) {
            result += escape(c);
        } else {
            result += c;
        }
    }
    return result;
}

int displayWidth(const QString& text)
{
    int width = 0;
    const QVector<uint> characters = text.toUcs4();
    for (const uint character : characters) {
        const int columns = ::wcwidth(wchar_t(character));
        width += columns < 0 ? 1 : columns;
    }
    return width;
}

QString cutToWidth(const QString& text, int columns)
{
    const QVector<uint> characters = text.toUcs4();
    int width = 0;
    int count = 0;
    for (; count < characters.size(); ++count) {
        const uint character = characters.at(count);
        width += displayWidth(QString::fromUcs4(&character, 1));
        if (width > columns) {
            break;
        }
    }
    return QString::fromUcs4(characters.constData(), count);
}

int terminalWidth()
{
    bool ok = false;
    const int columns = qEnvironmentVariableIntValue("COLUMNS", &ok);
    if (ok && columns > 0) {
        return columns;
    }
    return terminalWidth(STDOUT_FILENO);
}

int terminalWidth(int descriptor)
{
    winsize size = {};
    return ::ioctl(descriptor, TIOCGWINSZ, &size) == 0 && size.ws_col > 0 ? size.ws_col : 80;
}

bool isUtf8Locale()
{
    return ::strcasecmp(::nl_langinfo(CODESET), "UTF-8") == 0;
}

bool environmentWantsColour()
{
    const QByteArray terminal = qgetenv("TERM");
    return qEnvironmentVariableIsEmpty("NO_COLOR") && !terminal.isEmpty() && terminal != "dumb";
}

QByteArray colourOf(const Entry& entry)
{
    if (entry.isPlace()) {
        return QByteArrayLiteral("1;35");
    }
    if (entry.isSymLink()) {
        return entry.exists() ? QByteArrayLiteral("1;36") : QByteArrayLiteral("1;31");
    }
    if (entry.isDir()) {
        return QByteArrayLiteral("1;34");
    }
    return QByteArray();
}

QByteArray coloured(const QByteArray& name, const QByteArray& colour)
{
    return colour.isEmpty() ? name : "\033[" + colour + 'm' + name + "\033[0m";
}

} // namespace Tool
} // namespace VeyFM
