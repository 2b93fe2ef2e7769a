// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "report.h"

#include "patience.h"
#include "shown.h"
#include "spinner.h"
#include "terminal.h"

#include <atomic>

#include <cstring>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

std::atomic<bool> verbose{false};

void writeError(const QByteArray& bytes)
{
    Spinner::end();
    // One call, so that lines of several processes do not mix; nobody to tell of a failure.
    if (::write(STDERR_FILENO, bytes.constData(), size_t(bytes.size())) < 0) {
        return;
    }
}

void handleMessage(QtMsgType type, const QMessageLogContext& context, const QString& message)
{
    Q_UNUSED(context)
    if (verbose || type == QtFatalMsg) {
        // Not by report(): nobody minds a line of the log that comes twice.
        writeError(reportLine(QStringLiteral("libveyfmvfs"), message));
    }
}

} // namespace

QByteArray reportLine(const QString& what, const QString& why)
{
    return QStringLiteral("veyfm-vfs: %1: %2\n")
        .arg(escaped(shownLocation(what)), escaped(shownText(why)))
        .toLocal8Bit();
}

void report(const QString& what, const QString& why)
{
    Patience::notePrinted();
    writeError(reportLine(what, why));
}

void reportBytes(const QString& before, const QByteArray& name, const QString& why)
{
    QString shown = escaped(shownLocation(before));
    for (const char byte : name) {
        shown += uchar(byte) < 0x80
                     ? escaped(QString(QLatin1Char(byte)))
                     : QStringLiteral("\\%1").arg(uint(uchar(byte)), 3, 8, QLatin1Char('0'));
    }
    writeError(QStringLiteral("veyfm-vfs: %1: %2\n").arg(shown, why).toLocal8Bit());
}

void say(const QString& line)
{
    Patience::notePrinted();
    writeError((line + QLatin1Char('\n')).toLocal8Bit());
}

QString systemReason(int error)
{
    return QString::fromLocal8Bit(std::strerror(error));
}

void setVerbose(bool on)
{
    verbose = on;
}

void installLogging()
{
    qInstallMessageHandler(handleMessage);
}

QString versionText()
{
    return QStringLiteral("veyfm-vfs " VEYFM_VERSION "\n");
}

} // namespace Tool
} // namespace VeyFM
