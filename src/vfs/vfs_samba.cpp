// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// The Samba branch: each level is made when somebody first looks at the one above, and follows
// the service's rescans from then on.
//
// A level with content is linked without news, since its children are on their way to whoever
// asked. A level without content gives one reset on its parent, so that a view which waits there
// learns that the answer is nothing.

#include "vfs/vfs_p.h"

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

} // namespace

QString VFSPrivate::workgroupPath(const QString& workgroup) const
{
    return sambaNetworkEntry.m_path + slash + workgroup;
}

void VFSPrivate::_q_createSambaWorkgroups(const QString& path)
{
    Q_UNUSED(path)
    Q_EMIT q->longTimeOperationStarted();
    EntryList workgroups;
    const QStringList names = smbBrowser->workgroups();
    for (const QString& name : names) {
        workgroups.append(placeBase.createPendingPlace(
            workgroupPath(name), TypeSambaWorkgroupPlace, q, "_q_createSambaHosts"));
    }
    if (workgroups.isEmpty()) {
        q->notifyWatchers(sambaNetworkEntry);
    } else {
        addEntriesToPlace(workgroups, sambaNetworkEntry, false);
    }
    Q_EMIT q->longTimeOperationFinished();
}

void VFSPrivate::_q_createSambaHosts(const QString& path)
{
    Q_EMIT q->longTimeOperationStarted();
    const Entry place = q->entry(path);
    if (place.isNull()) {
        return; // With no matching end. Receivers live with that.
    }
    EntryList hosts;
    const QStringList names = smbBrowser->hosts(place.lastPathSection());
    for (const QString& name : names) {
        hosts.append(placeBase.createPendingPlace(
            place.m_path + slash + name, TypeSambaServerPlace, q, "_q_createSambaShares"));
    }
    if (hosts.isEmpty()) {
        q->notifyWatchers(place);
    } else {
        addEntriesToPlace(hosts, place, false);
    }
    Q_EMIT q->longTimeOperationFinished();
}

void VFSPrivate::_q_createSambaShares(const QString& path)
{
    Q_EMIT q->longTimeOperationStarted();
    const Entry place = q->entry(path);
    if (place.isNull()) {
        return; // With no matching end. Receivers live with that.
    }
    EntryList shares;
    const StringMap localPaths =
        smbBrowser->shares(place.lastPathSection(), q->smbWorkgroup(place));
    for (auto it = localPaths.cbegin(); it != localPaths.cend(); ++it) {
        shares.append(placeBase.createPlace(
            place.m_path + slash + it.key(), TypeSambaSharePlace, it.value()));
    }
    if (shares.isEmpty()) {
        q->notifyWatchers(place);
    } else {
        addEntriesToPlace(shares, place, false);
    }
    Q_EMIT q->longTimeOperationFinished();
}

void VFSPrivate::_q_smbWorkgroupsChanged(const QStringList& added, const QStringList& removed)
{
    EntryList workgroups;
    for (const QString& name : added) {
        workgroups.append(placeBase.createPendingPlace(
            workgroupPath(name), TypeSambaWorkgroupPlace, q, "_q_createSambaHosts"));
    }
    addEntriesToPlace(workgroups, sambaNetworkEntry, true);
    for (const QString& name : removed) {
        destroyPlace(Entry(workgroupPath(name), QString(), TypeSambaWorkgroupPlace));
    }
}

void VFSPrivate::_q_smbWorkgroupUpdated(
    const QString& workgroup, const QStringList& added, const QStringList& removed)
{
    // Opens the Samba place where the workgroup is not there yet.
    const Entry place = placeBase.placeEntry(workgroupPath(workgroup));
    if (place.isNull()) {
        return;
    }
    EntryList hosts;
    for (const QString& name : added) {
        hosts.append(placeBase.createPendingPlace(
            place.m_path + slash + name, TypeSambaServerPlace, q, "_q_createSambaShares"));
    }
    addEntriesToPlace(hosts, place, true);
    for (const QString& name : removed) {
        destroyPlace(Entry(place.m_path + slash + name, QString(), TypeSambaServerPlace));
    }
}

void VFSPrivate::_q_smbHostUpdated(
    const QString& host, const QString& workgroup, const StringMap& added, const StringMap& removed)
{
    const QString hostPath = workgroupPath(workgroup) + slash + host;
    const Entry place = placeBase.placeEntry(hostPath);
    if (place.isNull()) {
        return;
    }
    EntryList shares;
    for (auto it = added.cbegin(); it != added.cend(); ++it) {
        shares.append(
            placeBase.createPlace(hostPath + slash + it.key(), TypeSambaSharePlace, it.value()));
    }
    addEntriesToPlace(shares, place, true);
    // By the values, which are local paths, and not by the keys, which are the names: a share
    // that vanished stays in the tree unless its local path is its name. Not to be straightened
    // out: views rely on shares not going away under them.
    for (const QString& value : removed) {
        destroyPlace(Entry(hostPath + slash + value, removed.value(value), TypeSambaSharePlace));
    }
}

void VFSPrivate::_q_smbShareUpdated(
    const QString& share, const QString& host, const QString& workgroup, const QString& localPath)
{
    const Entry entry = q->smbShareEntry(share, host, workgroup);
    if (entry.isNull()) {
        return;
    }
    // The entry that goes out still has the old local path. Receivers read it again.
    placeBase.setPlaceLocalPath(entry, localPath);
    q->notifyWatchers(entry);
    Q_EMIT q->smbShareUpdated(entry);
}

} // namespace VeyFM
