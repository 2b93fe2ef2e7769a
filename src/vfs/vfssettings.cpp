// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/vfssettings.h"

#include <QDir>
#include <QSettings>

#include <veycore.h>

namespace VeyFM {

VFSSettings::VFSSettings()
    : m_settings(std::make_unique<QSettings>(
          QString::fromLocal8Bit(GetOrganization()), QStringLiteral("vey-fm-vfs")))
{
}

VFSSettings::~VFSSettings() = default;

QString VFSSettings::mountRootPath() const
{
    return QDir::homePath() + QLatin1String("/.vey-fm-vfs");
}

bool VFSSettings::isNetworkEnabled() const
{
    // value() alone answers from what this process read first.
    m_settings->sync();
    return m_settings->value(QStringLiteral("Network/Enabled"), true).toBool();
}

} // namespace VeyFM
