// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_VFSSETTINGS_H
#define VEYFM_VFSSETTINGS_H

#include "veyfmvfs_export.h"

#include <QString>

#include <memory>

class QSettings;

namespace VeyFM {

/**
 * The settings of the library: the file `vey-fm-vfs.conf` of the platform's organisation in the
 * user's configuration directory. The library only ever reads it.
 *
 * To be used from one thread at a time.
 */
class VEYFMVFS_EXPORT VFSSettings
{
public:
    VFSSettings();
    ~VFSSettings();

    /// The directory below which network resources are mounted: ".vey-fm-vfs" in the home
    /// directory. It is not created here.
    QString mountRootPath() const;

    /**
     * Whether the network branch of the place tree is offered: the key "Network/Enabled", true
     * when it is not set. Read again at each call, so that a change by another program is seen;
     * a file that did not change costs no more than a look at its date.
     */
    bool isNetworkEnabled() const;

private:
    Q_DISABLE_COPY(VFSSettings)
    std::unique_ptr<QSettings> const m_settings;
};

} // namespace VeyFM

#endif
