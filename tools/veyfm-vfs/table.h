// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_TABLE_H
#define VEYFM_TOOL_TABLE_H

#include <QStringList>
#include <QVector>

namespace VeyFM {
namespace Tool {

class Output;

/// Rows of texts under each other, control characters escaped, "-" for an empty text.
class Table
{
public:
    void add(const QStringList& cells);
    void write(Output& output) const;

private:
    QVector<QStringList> m_rows;
};

} // namespace Tool
} // namespace VeyFM

#endif
