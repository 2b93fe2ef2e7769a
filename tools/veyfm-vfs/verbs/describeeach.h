// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_DESCRIBEEACH_H
#define VEYFM_TOOL_DESCRIBEEACH_H

#include "locate.h"

#include <QJsonObject>

namespace VeyFM {
namespace Tool {

class Invocation;
class Output;

/// How a verb finds the entry of an operand, and describes it.
struct Description
{
    Located (*find)(const QString& operand);
    QJsonObject (*toJson)(const QString& operand, const Entry& entry);
    void (*print)(Output& output, const QString& operand, const Entry& entry);
};

/// Describes the operands one by one, with an empty line between them. Those that nothing is found
/// for are reported. An ExitCode.
int describeEach(Invocation& invocation, const Description& description);

} // namespace Tool
} // namespace VeyFM

#endif
