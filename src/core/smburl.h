// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SMBURL_H
#define VEYFM_SMBURL_H

#include "veyfmvfs_export.h"

#include <QString>

namespace VeyFM {

/**
 * A Samba URL in its parts: `smb://[workgroup;][user@]host/share/tail`. A user name is passed over
 * and lost. Nothing is decoded or encoded.
 *
 * A plain value; distinct copies may be used in distinct threads.
 */
class VEYFMVFS_EXPORT SmbUrl
{
public:
    /**
     * Takes @p url apart, white space around it aside. A text that does not begin with "smb:/",
     * in lower case, is not valid and leaves all parts null. Behind that one more character is
     * dropped, whatever it is.
     */
    SmbUrl(const QString& url);

    /**
     * Whether the text began as a Samba URL does. An empty host or share is valid until a setter
     * decides otherwise.
     */
    bool isValid() const;

    QString workgroup() const; ///< Empty when the URL names none.
    QString host() const;      ///< Empty when the URL names none.
    QString share() const;     ///< Empty when the URL names none.
    QString tailPath() const;  ///< What stands behind the share and its slash.

    /// Makes the URL valid, even with an empty text. @{
    void setWorkgroup(const QString& workgroup);
    void setHost(const QString& host);
    /// @}

    /// Makes the URL valid exactly when there is a host.
    void setShare(const QString& share);

    /// Makes the URL valid exactly when there are a host and a share.
    void setTailPath(const QString& tailPath);

    /**
     * The URL, or a null text when there is no host. Host and share are followed by a slash, and
     * a tail without a share is left out. isValid() is not looked at.
     */
    QString toString() const;

private:
    bool m_valid = true;
    QString m_workgroup;
    QString m_host;
    QString m_share;
    QString m_tailPath;
};

} // namespace VeyFM

Q_DECLARE_TYPEINFO(VeyFM::SmbUrl, Q_MOVABLE_TYPE);

#endif
