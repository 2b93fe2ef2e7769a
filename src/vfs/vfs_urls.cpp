// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/smburl.h"
#include "core/urlparsing.h"
#include "vfs/standardpaths.h"
#include "vfs/vfs_p.h"

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

// Section of a path below Samba, counted from its start; empty outside of it.
QString sambaSection(const Entry& samba, const Entry& entry, int index)
{
    if (!entry.path().startsWith(samba.path())) {
        return QString();
    }
    return entry.path().split(slash, Qt::SkipEmptyParts).value(index);
}

QString sambaUrl(QString rest)
{
    using Setter = void (SmbUrl::*)(const QString&);
    const Setter setters[] = {&SmbUrl::setWorkgroup, &SmbUrl::setHost, &SmbUrl::setShare};
    SmbUrl url{QString()};
    for (const Setter set : setters) {
        const int end = rest.indexOf(slash);
        (url.*set)(rest.left(end));
        if (end < 0) {
            // A workgroup alone has no URL: there is no text without a host.
            return url.toString();
        }
        rest.remove(0, end + 1);
    }
    url.setTailPath(rest);
    return url.toString();
}

} // namespace

QString VFS::getUrlForEntry(const Entry& entry) const
{
    Q_D(const VFS);
    if (!isEntryInNetwork(entry) || entry.isNetworkPlace()) {
        return QString();
    }
    if (entry.isSambaNetworkPlace()) {
        return QStringLiteral("smb:/");
    }
    // Tests of text, in this order.
    const QString path = entry.m_path;
    if (path.startsWith(d->networkEntry.m_path)) {
        return d->bookmarkUrl(path.mid(d->networkEntry.m_path.size() + 1));
    }
    if (path.startsWith(d->ftpNetworkEntry.m_path)) {
        return QLatin1String("ftp:/") + path.mid(d->ftpNetworkEntry.m_path.size());
    }
    if (path.startsWith(d->sftpNetworkEntry.m_path)) {
        return QLatin1String("sftp:/") + path.mid(d->sftpNetworkEntry.m_path.size());
    }
    if (path.startsWith(d->sambaNetworkEntry.m_path)) {
        return sambaUrl(path.mid(d->sambaNetworkEntry.m_path.size() + 1));
    }
    return QString();
}

QString VFSPrivate::bookmarkUrl(const QString& relativePath) const
{
    const int end = relativePath.indexOf(slash);
    const QString name = relativePath.left(end);
    // The bookmark itself gets a URL that ends in two slashes, and keeps it so.
    const QString rest = end < 0 ? QString(slash) : relativePath.mid(end + 1);
    const Entry place = placeBase.placeEntry(networkEntry.m_path + slash + name);
    if (place.isNull()) {
        return QString();
    }
    return q->networkPlace(place).url() + slash + rest;
}

QList<QUrl> VFS::urlsFromEntries(const EntryList& given) const
{
    const EntryList entries = copied(given);
    QList<QUrl> urls;
    if (entries.isEmpty()) {
        return urls;
    }
    const QString desktop = VFSPrivate::realPath(StandardPaths::desktopDirPath());
    for (const Entry& entry : entries) {
        const QString local = entry.localPath();
        if (local.isEmpty()) {
            QUrl url = UrlParsing::url(entry.m_path);
            url.setScheme(QStringLiteral("vey-fm"));
            urls.append(url);
            continue;
        }
        const QString canonical = VFSPrivate::canonicalizedPath(local, desktop);
        if (!canonical.isEmpty()) {
            urls.append(QUrl::fromLocalFile(canonical));
        }
    }
    return urls;
}

EntryList VFS::entriesFromUrls(const QList<QUrl>& given) const
{
    const QList<QUrl> urls = copied(given);
    EntryList entries;
    for (const QUrl& url : urls) {
        // Null entries too: one element for each URL.
        entries.append(entry(url.isLocalFile() ? url.toLocalFile() : url.toString()));
    }
    return entries;
}

Entry VFS::createEntryForUrl(const QString& url, const QString& localPath) const
{
    Q_D(const VFS);
    const QUrl parsed = UrlParsing::url(url);
    const bool isFtp = parsed.scheme() == QLatin1String("ftp");
    if (!isFtp && parsed.scheme() != QLatin1String("sftp")) {
        return Entry();
    }
    const QString user = parsed.userName(QUrl::FullyDecoded);
    const QString name =
        (user.isEmpty() ? QString() : user + QLatin1Char('@')) + parsed.host(QUrl::FullyDecoded);
    const Entry& place = isFtp ? d->ftpNetworkEntry : d->sftpNetworkEntry;
    return Entry(
        place.m_path + slash + name, localPath, isFtp ? TypeFtpSharePlace : TypeSFtpSharePlace);
}

Entry VFS::smbShareEntry(const QString& share, const QString& host, const QString& workgroup) const
{
    Q_D(const VFS);
    return d->placeBase.placeEntry(
        d->sambaNetworkEntry.m_path + slash + workgroup + slash + host + slash + share);
}

QString VFS::smbHost(const Entry& entry) const
{
    return sambaSection(d_func()->sambaNetworkEntry, entry, 2);
}

QString VFS::smbWorkgroup(const Entry& entry) const
{
    return sambaSection(d_func()->sambaNetworkEntry, entry, 1);
}

} // namespace VeyFM
