// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_MOUNTURL_H
#define VEYFM_HOST_MOUNTURL_H

#include <QString>

namespace VeyFM {
namespace Host {

// What is looked at before a job gets it. The jobs hand texts on to smbclient, curlftpfs and sshfs
// as they come: a blank in the name of a share ends the argument that it is in, a comma in the
// name of an FTP user begins the next mount option, and a port is dropped. Each function returns
// the reason for a refusal, or an empty text.

/// The scheme as it is written, and the user; empty where there is none. For URLs that
/// whyNotMountable() has nothing against. @{
QString schemeOf(const QString& url);
QString userOf(const QString& url);
/// @}

/// Why a URL is not mounted.
QString whyNotMountable(const QString& url);

/// Why nobody logs in under this name, by the scheme of the URL. An empty name is fine: it stands
/// for a guest, or for whoever runs the program.
QString whyNoUser(const QString& scheme, const QString& user);

/// Why a Samba share is not asked for by these names. The workgroup may be empty.
QString whyNoShare(const QString& share, const QString& host, const QString& workgroup);

/// The URL as it may be shown: without the password, be it a valid URL or not.
QString shownUrl(const QString& url);

} // namespace Host
} // namespace VeyFM

#endif
