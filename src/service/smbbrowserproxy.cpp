// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "service/smbbrowserproxy.h"

#include "core/copied.h"
#include "service/servicecall.h"
#include "service/servicesignals.h"
#include "service/smbleveldelta.h"

namespace VeyFM {

namespace {

// Makes a level of exactly these names, with nothing known below them.
template <typename Record>
QMap<QString, Record> freshLevel(const QStringList& names)
{
    QMap<QString, Record> level;
    for (const QString& name : names) {
        level.insert(name, Record());
    }
    return level;
}

} // namespace

SmbBrowserProxy::SmbBrowserProxy(QWeakPointer<QDBusInterface> interface, QObject* parent)
    : QObject(parent)
    , m_interface(std::move(interface))
{
    if (const auto alive = m_interface.toStrongRef()) {
        followService(*alive, SIGNAL(rescanFinished(bool)), this, SLOT(slotRescanFinished(bool)));
        followService(
            *alive, SIGNAL(rescanWorkgroupFinished(QString, bool)), this,
            SLOT(slotRescanWorkgroupFinished(QString, bool)));
        followService(
            *alive, SIGNAL(rescanHostFinished(QString, QString, bool)), this,
            SLOT(slotRescanHostFinished(QString, QString, bool)));
        followService(
            *alive, SIGNAL(shareUpdated(QString, QString, QString, QString)), this,
            SLOT(slotSharedUpdated(QString, QString, QString, QString)));
    }
}

SmbBrowserProxy::~SmbBrowserProxy() = default;

void SmbBrowserProxy::rescan()
{
    if (!m_workgroupsLoaded) {
        const QStringList known = workgroups();
        if (!known.isEmpty()) {
            Q_EMIT workgroupsChanged(known, QStringList());
        }
    }
    askService(m_interface, QStringLiteral("rescan"));
}

void SmbBrowserProxy::rescanWorkgroup(const QString& given)
{
    const QString workgroup = copied(given);
    // Makes an unknown workgroup known.
    if (!m_workgroupMap[workgroup].hostsLoaded) {
        const QStringList known = hosts(workgroup);
        if (!known.isEmpty()) {
            Q_EMIT workgroupUpdated(workgroup, known, QStringList());
        }
    }
    askService(m_interface, QStringLiteral("rescanWorkgroup"), workgroup);
}

void SmbBrowserProxy::rescanHost(const QString& givenHost, const QString& givenWorkgroup)
{
    const QString host = copied(givenHost);
    const QString workgroup = copied(givenWorkgroup);
    // Makes an unknown host, and its workgroup, known.
    if (!m_workgroupMap[workgroup].hostMap[host].sharesLoaded) {
        const StringMap known = shares(host, workgroup);
        if (!known.isEmpty()) {
            Q_EMIT hostUpdated(host, workgroup, known, StringMap());
        }
    }
    askService(m_interface, QStringLiteral("rescanHost"), host, workgroup);
}

QStringList SmbBrowserProxy::workgroups() const
{
    if (!m_workgroupsLoaded) {
        m_workgroupMap = freshLevel<Hosts>(readWorkgroups());
        m_workgroupsLoaded = true;
    }
    return m_workgroupMap.keys();
}

QStringList SmbBrowserProxy::hosts(const QString& workgroup) const
{
    const auto found = m_workgroupMap.find(workgroup);
    if (found == m_workgroupMap.end()) {
        return QStringList();
    }
    if (!found->hostsLoaded) {
        found->hostMap = freshLevel<Shares>(readHosts(workgroup));
        found->hostsLoaded = true;
    }
    return found->hostMap.keys();
}

StringMap SmbBrowserProxy::shares(const QString& host, const QString& workgroup) const
{
    Shares* const record = knownHost(host, workgroup);
    if (!record) {
        return StringMap();
    }
    if (!record->sharesLoaded) {
        record->shareMap = readShares(host, workgroup);
        record->sharesLoaded = true;
    }
    return record->shareMap;
}

QString SmbBrowserProxy::smbNetworkLocalPath() const
{
    return readFromService<QString>(m_interface, QStringLiteral("smbNetworkLocalPath"));
}

QString SmbBrowserProxy::shareLocalPath(
    const QString& share, const QString& host, const QString& workgroup,
    const QString& hostForKerberos) const
{
    return readFromService<QString>(
        m_interface, QStringLiteral("shareLocalPath"), share, host, workgroup, hostForKerberos);
}

void SmbBrowserProxy::slotRescanFinished(bool changed)
{
    if (!changed) {
        Q_EMIT workgroupsNotChanged();
        return;
    }
    QStringList added;
    QStringList removed;
    updateStringMap(m_workgroupMap, readWorkgroups(), m_workgroupsLoaded, added, removed);
    Q_EMIT workgroupsChanged(added, removed);
}

void SmbBrowserProxy::slotRescanWorkgroupFinished(QString workgroup, bool changed)
{
    const auto found = m_workgroupMap.find(workgroup);
    if (found == m_workgroupMap.end()) {
        return;
    }
    if (!changed) {
        Q_EMIT workgroupNotUpdated(workgroup);
        return;
    }
    QStringList added;
    QStringList removed;
    updateStringMap(found->hostMap, readHosts(workgroup), found->hostsLoaded, added, removed);
    Q_EMIT workgroupUpdated(workgroup, added, removed);
}

void SmbBrowserProxy::slotRescanHostFinished(QString host, QString workgroup, bool changed)
{
    Shares* const record = knownHost(host, workgroup);
    if (!record) {
        return;
    }
    if (!changed) {
        Q_EMIT hostNotUpdated(host, workgroup);
        return;
    }
    StringMap added;
    StringMap removed;
    updateStringMap(
        record->shareMap, readShares(host, workgroup), record->sharesLoaded, added, removed);
    Q_EMIT hostUpdated(host, workgroup, added, removed);
}

void SmbBrowserProxy::slotSharedUpdated(
    QString share, QString host, QString workgroup, QString localPath)
{
    Shares* const record = knownHost(host, workgroup);
    if (!record || !record->shareMap.contains(share)) {
        return;
    }
    record->shareMap[share] = localPath;
    Q_EMIT shareUpdated(share, host, workgroup, localPath);
}

SmbBrowserProxy::Shares*
SmbBrowserProxy::knownHost(const QString& host, const QString& workgroup) const
{
    const auto hosts = m_workgroupMap.find(workgroup);
    if (hosts == m_workgroupMap.end()) {
        return nullptr;
    }
    const auto found = hosts->hostMap.find(host);
    return found == hosts->hostMap.end() ? nullptr : &found.value();
}

QStringList SmbBrowserProxy::readWorkgroups() const
{
    return readFromService<QStringList>(m_interface, QStringLiteral("workgroups"));
}

QStringList SmbBrowserProxy::readHosts(const QString& workgroup) const
{
    return readFromService<QStringList>(m_interface, QStringLiteral("hosts"), workgroup);
}

StringMap SmbBrowserProxy::readShares(const QString& host, const QString& workgroup) const
{
    return readFromService<StringMap>(m_interface, QStringLiteral("shares"), host, workgroup);
}

} // namespace VeyFM
