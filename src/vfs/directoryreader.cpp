// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/directoryreader.h"

namespace VeyFM {

DirectoryReader::DirectoryReader(const QByteArray& path)
{
    if (path.contains('\0')) {
        return;
    }
    do {
        m_stream.reset(::opendir(path.constData()));
    } while (!m_stream && errno == EINTR);
}

} // namespace VeyFM
