// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_OUTPUT_H
#define VEYFM_TOOL_OUTPUT_H

#include "core/entry.h"

#include <QByteArray>
#include <QJsonObject>
#include <QString>

namespace VeyFM {
namespace Tool {

/**
 * Standard output, gathered into large writes. Texts leave in the encoding of the locale.
 *
 * A write that fails is remembered and told once, by finish(); a reader that went away ends the
 * program by SIGPIPE as usual.
 */
class Output
{
public:
    Output();
    ~Output();

    bool isTerminal() const;

    /// Whether records end with NUL and names stay raw.
    void setNull(bool null);
    /// "auto" or empty, "always", "never".
    void setColour(const QString& when);
    bool hasColour() const;

    void write(const QByteArray& bytes);
    void write(const QString& text);
    void flush();

    /// What would be lacking behind all that is written from now on.
    void setEnd(const QByteArray& bytes);

    /// Whether anything was written.
    bool wasUsed() const;
    /// What can't be written is dropped. An errno value says why. @{
    void setFailed(int error);
    bool hasFailed() const;
    /// @}

    /// The bytes, and the end of a record.
    void writeRecord(const QByteArray& bytes);

    /// A name for a record: escaped on a terminal, raw elsewhere and with NUL ends.
    QByteArray name(const QString& name) const;
    /// name() in the colour of the entry, where there are colours.
    QByteArray name(const QString& name, const Entry& entry) const;
    /// For pictures and labelled lines, which a line break in a name would spoil: always escaped.
    QByteArray label(const QString& name, const Entry& entry) const;

    /// Flushes, and turns the exit code into that of a failure when a write failed.
    int finish(int exitCode);

private:
    Q_DISABLE_COPY(Output)

    QByteArray m_buffer;
    QByteArray m_end;
    bool m_terminal;
    bool m_null = false;
    bool m_wasUsed = false;
    bool m_colour = false;
    int m_error = 0;
};

/**
 * One JSON array, an element a line, written as its elements come: a listing of a million
 * entries never stands in memory as one document.
 */
class JsonArray
{
public:
    explicit JsonArray(Output& output);
    /// Ends an array that was begun.
    ~JsonArray();
    void append(const QJsonObject& object);
    void end();

private:
    Q_DISABLE_COPY(JsonArray)

    Output& m_output;
    bool m_empty = true;
    bool m_ended = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
