// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// What service.cpp of veyfm-vfs, which asks for the service here too, wants of that program. This
// one may wait for the service: its other half ends it when the host has had enough.

#include "patience.h"

#include "restart.h"

namespace VeyFM {
namespace Tool {

Patience::Patience() = default;
Patience::~Patience() = default;

bool Patience::isOver()
{
    return false;
}

bool Restart::wasDone()
{
    return false;
}

} // namespace Tool
} // namespace VeyFM
