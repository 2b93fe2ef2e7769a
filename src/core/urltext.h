// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_URLTEXT_H
#define VEYFM_URLTEXT_H

#include <QString>
#include <QStringList>
#include <QUrl>

namespace VeyFM {

/**
 * What must hold of the texts in URLs, and of names told by a network, before a tool is given
 * them. Whoever starts smbclient, curlftpfs or sshfs asks here. May be called from any thread.
 */
namespace UrlText {

/// The scheme of a URL in the case that it was written in. QUrl gives it in lower case, and the
/// jobs take "sftp" but not "SFTP".
QString writtenScheme(const QString& url);

bool hasControl(const QString& text);

/**
 * The words of a command, split by quotes and blanks with no shell. The pieces are by turns our
 * own text and a name that is not ours, our own first. Nothing where a name holds a control
 * character, or makes a word that begins with a dash: it would be an option of the tool. Names
 * that break the command in another way are let by.
 */
QStringList commandWords(const QStringList& pieces);

/**
 * Whether sshfs (for the scheme "sftp") or curlftpfs ("ftp") takes the user and the host of a URL
 * for nothing else: neither for an option, which can run commands, nor for another host, nor for
 * the next mount option, nor for a way out of the directory of the mounts. What counts is the
 * decoded form, which is the one that is handed over. A host in brackets has to be an IPv6
 * address; behind it a zone may stand, of letters, digits, and "-._~" behind the first of them.
 */
bool isSafeForTool(const QUrl& url);

/// The host as these tools want it, an IPv6 address in brackets: a colon ends the host otherwise.
QString toolHost(const QUrl& url);

} // namespace UrlText
} // namespace VeyFM

#endif
