// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNT_REGISTRATION_H
#define VEYFM_MOUNT_REGISTRATION_H

#include <QString>

namespace VeyFM {
namespace Mount {

/// Tells the service, in a second at most, that nothing is mounted for the root URL any more. For a
/// process without an application object, since it is done in a child.
void forgetRegistration(const QString& rootUrl);

} // namespace Mount
} // namespace VeyFM

#endif
