// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "table.h"

#include "output.h"
#include "shown.h"
#include "terminal.h"

#include <algorithm>

namespace VeyFM {
namespace Tool {

namespace {

constexpr int gap = 2;
// One name of absurd length does not push the columns of all others away.
constexpr int widest = 40;

} // namespace

void Table::add(const QStringList& cells)
{
    QStringList row;
    for (const QString& cell : cells) {
        row.append(cell.isEmpty() ? QStringLiteral("-") : escaped(shownText(cell)));
    }
    m_rows.append(row);
}

void Table::write(Output& output) const
{
    QVector<int> widths;
    for (const QStringList& row : m_rows) {
        widths.resize(std::max(int(widths.size()), int(row.size())));
        for (int i = 0; i < row.size(); ++i) {
            widths[i] = std::max(widths.at(i), std::min(displayWidth(row.at(i)), widest));
        }
    }
    for (const QStringList& row : m_rows) {
        QByteArray line;
        for (int i = 0; i < row.size(); ++i) {
            line += row.at(i).toLocal8Bit();
            if (i + 1 < row.size()) {
                const int missing = std::max(widths.at(i) - displayWidth(row.at(i)), 0);
                line += QByteArray(missing + gap, ' ');
            }
        }
        output.write(line + '\n');
    }
}

} // namespace Tool
} // namespace VeyFM
