// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/helperprogram.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <dlfcn.h>

namespace VeyFM {
namespace Host {

QString mountHelperProgram()
{
    Dl_info library = {};
    if (::dladdr(reinterpret_cast<void*>(&mountHelperProgram), &library) == 0) {
        return QString();
    }
    const QDir directory = QFileInfo(QFile::decodeName(library.dli_fname)).canonicalPath();
    const QString installed =
        QDir::cleanPath(directory.filePath(QStringLiteral(VEYFM_LIBEXEC "/veyfm-mount")));
    const QString built = QDir::cleanPath(
        directory.filePath(QStringLiteral(VEYFM_BUILT_LIBEXEC "/veyfm-mount/veyfm-mount")));
    return QFileInfo::exists(built) && !QFileInfo::exists(installed) ? built : installed;
}

} // namespace Host
} // namespace VeyFM
