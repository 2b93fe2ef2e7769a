// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "columns.h"

#include <algorithm>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int gap = 2;

/// The widths of the columns with @p rows rows, or nothing when they do not fit.
QVector<int> columnWidths(const QVector<Cell>& cells, int rows, int width)
{
    QVector<int> widths;
    int total = 0;
    for (int first = 0; first < cells.size(); first += rows) {
        int widest = 0;
        const int end = std::min(first + rows, int(cells.size()));
        for (int i = first; i < end; ++i) {
            widest = std::max(widest, cells.at(i).width);
        }
        total += widest + (first > 0 ? gap : 0);
        if (total > width) {
            return {};
        }
        widths.append(widest);
    }
    return widths;
}

} // namespace

QByteArray inColumns(const QVector<Cell>& cells, int width)
{
    QByteArray text;
    if (cells.isEmpty()) {
        return text;
    }

    const int count = int(cells.size());
    QVector<int> widths;
    int rows = 1;
    // The narrowest column takes one cell and the gap, which bounds the columns to try.
    for (int columns = std::min(count, (width + gap) / (1 + gap)); columns > 1; --columns) {
        rows = (count + columns - 1) / columns;
        widths = columnWidths(cells, rows, width);
        if (!widths.isEmpty()) {
            break;
        }
    }
    if (widths.isEmpty()) {
        rows = count;
        widths = {0};
    }
    for (int row = 0; row < rows; ++row) {
        for (int column = 0; column < widths.size(); ++column) {
            const int index = column * rows + row;
            if (index >= count) {
                break;
            }
            const Cell& cell = cells.at(index);
            text += cell.bytes;
            if (index + rows < count) {
                text += QByteArray(widths.at(column) - cell.width + gap, ' ');
            }
        }
        text += '\n';
    }
    return text;
}

} // namespace Tool
} // namespace VeyFM
