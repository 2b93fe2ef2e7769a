// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "output.h"

#include "patience.h"
#include "report.h"
#include "shown.h"
#include "spinner.h"
#include "terminal.h"

#include <cerrno>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int bufferSize = 64 * 1024;

} // namespace

Output::Output()
    : m_terminal(::isatty(STDOUT_FILENO) == 1)
{
    setColour(QString());
}

Output::~Output()
{
    flush();
}

bool Output::isTerminal() const
{
    return m_terminal;
}

void Output::setNull(bool null)
{
    m_null = null;
}

void Output::setColour(const QString& when)
{
    if (when == QLatin1String("always")) {
        m_colour = true;
    } else if (when == QLatin1String("never")) {
        m_colour = false;
    } else {
        m_colour = m_terminal && environmentWantsColour();
    }
}

bool Output::hasColour() const
{
    return m_colour;
}

void Output::write(const QByteArray& bytes)
{
    m_wasUsed = m_wasUsed || !bytes.isEmpty();
    m_buffer += bytes;
    if (m_buffer.size() >= bufferSize) {
        flush();
    }
}

void Output::write(const QString& text)
{
    write(text.toLocal8Bit());
}

void Output::setEnd(const QByteArray& bytes)
{
    m_end = bytes;
}

bool Output::wasUsed() const
{
    return m_wasUsed;
}

void Output::flush()
{
    if (!m_buffer.isEmpty()) {
        Patience::notePrinted();
        Spinner::end();
    }
    const char* data = m_buffer.constData();
    size_t left = size_t(m_buffer.size());
    while (left > 0 && m_error == 0) {
        const ssize_t written = ::write(STDOUT_FILENO, data, left);
        if (written >= 0) {
            data += written;
            left -= size_t(written);
        } else if (errno != EINTR) {
            m_error = errno;
        }
    }
    if (!m_buffer.isEmpty()) {
        Patience::setOutputEnd(m_end);
    }
    m_buffer.clear();
}

void Output::setFailed(int error)
{
    m_error = error;
}

bool Output::hasFailed() const
{
    return m_error != 0;
}

void Output::writeRecord(const QByteArray& bytes)
{
    write(bytes);
    write(QByteArray(1, m_null ? '\0' : '\n'));
}

QByteArray Output::name(const QString& name) const
{
    const QString shown = shownText(name);
    return (m_terminal && !m_null ? escaped(shown) : shown).toLocal8Bit();
}

QByteArray Output::name(const QString& text, const Entry& entry) const
{
    return m_colour ? coloured(name(text), colourOf(entry)) : name(text);
}

QByteArray Output::label(const QString& text, const Entry& entry) const
{
    const QByteArray bytes = escaped(shownText(text)).toLocal8Bit();
    return m_colour ? coloured(bytes, colourOf(entry)) : bytes;
}

int Output::finish(int exitCode)
{
    flush();
    if (m_error == 0) {
        return exitCode;
    }
    report(QStringLiteral("standard output"), systemReason(m_error));
    return exitCode == 0 ? 1 : exitCode;
}

JsonArray::JsonArray(Output& output)
    : m_output(output)
{
}

JsonArray::~JsonArray()
{
    if (!m_empty && !m_ended) {
        end();
    }
}

void JsonArray::append(const QJsonObject& object)
{
    // In one piece, since the end fits behind whole elements.
    m_output.setEnd(QByteArrayLiteral("\n]\n"));
    m_output.write((m_empty ? "[\n" : ",\n") + shownJson(object));
    m_empty = false;
}

void JsonArray::end()
{
    m_output.setEnd(QByteArray());
    m_output.write(m_empty ? QByteArrayLiteral("[]\n") : QByteArrayLiteral("\n]\n"));
    m_ended = true;
}

} // namespace Tool
} // namespace VeyFM
