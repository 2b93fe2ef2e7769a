// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_COLUMNS_H
#define VEYFM_TOOL_COLUMNS_H

#include <QByteArray>
#include <QVector>

namespace VeyFM {
namespace Tool {

/// A name ready for the terminal, and the columns that it takes there.
struct Cell
{
    QByteArray bytes;
    int width;
};

/// The cells in as many columns as fit into @p width, filled from top to bottom.
QByteArray inColumns(const QVector<Cell>& cells, int width);

} // namespace Tool
} // namespace VeyFM

#endif
