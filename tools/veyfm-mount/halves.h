// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_HALVES_H
#define VEYFM_MOUNT_HALVES_H

#include "host/linereader.h"

#include <QByteArray>
#include <QString>

#include <optional>

namespace VeyFM {
namespace Mount {

// What the two processes of the program say to each other beyond the protocol of the host: the
// worker asks for a lock, and waits until it is granted. A password that the supervisor hands on
// is the bare line.

/// What the worker is about to mount.
struct LockRequest
{
    QString directory;
    QString mountRoot;
    QString url;           ///< Of the root.
    bool isShared = false; ///< Whether the service will be told of the mount.
};

QByteArray encode(const LockRequest& request);

/// Nothing where the line says something else.
std::optional<LockRequest> decodeLockRequest(const MountProtocol::Line& line);

/// The answer.
constexpr char locked[] = "locked\n";

} // namespace Mount
} // namespace VeyFM

#endif
