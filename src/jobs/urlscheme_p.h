// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_URLSCHEME_P_H
#define VEYFM_URLSCHEME_P_H

#include <QString>
#include <QUrl>

namespace VeyFM {

/// The scheme of a URL in the case that it was written in. QUrl gives it in lower case, and the
/// jobs take "sftp" but not "SFTP".
inline QString writtenScheme(const QString& url)
{
    return url.left(QUrl(url).scheme().size());
}

} // namespace VeyFM

#endif
