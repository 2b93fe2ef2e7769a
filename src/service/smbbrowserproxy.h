// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SMBBROWSERPROXY_H
#define VEYFM_SMBBROWSERPROXY_H

#include "core/stringmap.h"
#include "veyfmvfs_export.h"

#include <QMap>
#include <QObject>
#include <QStringList>
#include <QWeakPointer>

class QDBusInterface;

namespace VeyFM {

/**
 * What the service has seen of the Samba network: workgroups, their hosts, and the hosts' shares.
 *
 * Each level is read once, when it is first asked for, and kept. A failed read stands as an empty
 * level. Only a rescan refreshes a level: the service looks again, and tells by a signal whether
 * anything changed; what was added and removed then goes out from here. A share whose local path
 * changes is told of by shareUpdated() alone.
 *
 * Names are case sensitive, and lists come in ascending order, not in the service's. The narrower
 * name comes first everywhere: share, host, workgroup.
 *
 * To be used in the thread that owns the object. Reads block for one exchange with the service.
 */
class VEYFMVFS_EXPORT SmbBrowserProxy : public QObject
{
    Q_OBJECT

public:
    /// The interface is not kept alive; once it has expired, reads are empty and rescans end
    /// without a signal.
    explicit SmbBrowserProxy(QWeakPointer<QDBusInterface> interface, QObject* parent = nullptr);
    ~SmbBrowserProxy() override;

public Q_SLOTS:
    /**
     * Has the service look again. A level that was not read yet is read first, and what is known
     * goes out at once, from inside the call; the outcome comes later. A rescan of a workgroup or
     * host that is not known makes it known, with no signal to say so.
     * @{
     */
    void rescan();
    void rescanWorkgroup(const QString& workgroup);
    void rescanHost(const QString& host, const QString& workgroup);
    /// @}

    /// All workgroups.
    QStringList workgroups() const;

    /// The hosts of a workgroup. Empty, with no question to the service, for a workgroup that
    /// neither workgroups() nor a rescan has made known.
    QStringList hosts(const QString& workgroup) const;

    /// The shares of a host with their local paths. Empty for a host that is not known, likewise.
    StringMap shares(const QString& host, const QString& workgroup) const;

    /// The local directory below which the Samba network is reachable; asked at each call.
    QString smbNetworkLocalPath() const;

    /**
     * Has the service attach a share and returns its local path. What is kept here changes only
     * when the service announces the update.
     *
     * @param hostForKerberos the canonical host name where a Kerberos ticket is what works, or
     *     empty
     */
    QString shareLocalPath(
        const QString& share, const QString& host, const QString& workgroup,
        const QString& hostForKerberos) const;

Q_SIGNALS:
    /// A rescan of the workgroups has ended, and something changed, or not. The lists may be
    /// empty. @{
    void workgroupsChanged(QStringList addedWorkgroups, QStringList removedWorkgroups);
    void workgroupsNotChanged();
    /// @}

    /// A rescan of a workgroup that is known has ended. @{
    void workgroupUpdated(QString workgroup, QStringList addedHosts, QStringList removedHosts);
    void workgroupNotUpdated(QString workgroup);
    /// @}

    /// A rescan of a host that is known has ended. @{
    void
    hostUpdated(QString host, QString workgroup, StringMap addedShares, StringMap removedShares);
    void hostNotUpdated(QString host, QString workgroup);
    /// @}

    /// The local path of a share that is known has changed.
    void shareUpdated(QString share, QString host, QString workgroup, QString localPath);

    /// Never emitted. @{
    void shareAccessDenied(QString share, QString host, QString workgroup);
    void shareLogonFailure(QString share, QString host, QString workgroup);
    void shareAccessGranted(QString share, QString host, QString workgroup);
    /// @}

private Q_SLOTS:
    void slotRescanFinished(bool changed);
    void slotRescanWorkgroupFinished(QString workgroup, bool changed);
    void slotRescanHostFinished(QString host, QString workgroup, bool changed);
    void slotSharedUpdated(QString share, QString host, QString workgroup, QString localPath);

private:
    struct Shares
    {
        StringMap shareMap; // Share name to local path.
        bool sharesLoaded = false;
    };

    struct Hosts
    {
        QMap<QString, Shares> hostMap;
        bool hostsLoaded = false;
    };

    Shares* knownHost(const QString& host, const QString& workgroup) const;
    QStringList readWorkgroups() const;
    QStringList readHosts(const QString& workgroup) const;
    StringMap readShares(const QString& host, const QString& workgroup) const;

    const QWeakPointer<QDBusInterface> m_interface;
    // Filled by the reads, which are const for their callers.
    mutable QMap<QString, Hosts> m_workgroupMap;
    mutable bool m_workgroupsLoaded = false;
};

} // namespace VeyFM

#endif
