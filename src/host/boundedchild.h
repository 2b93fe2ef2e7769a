// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_BOUNDEDCHILD_H
#define VEYFM_HOST_BOUNDEDCHILD_H

#include <QString>

#include <chrono>
#include <functional>

namespace VeyFM {
namespace Host {

// What may hang in a mount whose server has gone, done in a child that is given up after a while.
// A look that hangs can't be taken back, not even by the end of its process: such a child goes when
// the mount does.

/// Runs work in a child without descriptors: its exit code, or -1 for one that takes too long. In a
/// process with threads the work must do nothing that needs a lock.
int runInChild(const std::function<int()>& work, std::chrono::milliseconds patience);

/// Looks at the file system of a path: 0, the error, or -1 for one that does not answer.
int lookAt(const QString& path, std::chrono::milliseconds patience);

/// Unmounts a FUSE file system by fusermount3, or fusermount where there is none, in five seconds
/// at most. Whether that did well. Lazily, one that is in use goes as well.
bool unmountFuse(const QString& directory, bool lazily);

} // namespace Host
} // namespace VeyFM

#endif
