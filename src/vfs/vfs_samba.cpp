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
    news.tell([this, added, removed] {
        EntryList workgroups;
        for (const QString& name : added) {
            workgroups.append(placeBase.createPendingPlace(
                workgroupPath(name), TypeSambaWorkgroupPlace, q, "_q_createSambaHosts"));
        }
        addEntriesToPlace(workgroups, sambaNetworkEntry, true);
        for (const QString& name : removed) {
            destroyPlaceLater(Entry(workgroupPath(name), QString(), TypeSambaWorkgroupPlace));
        }
    });
}

void VFSPrivate::_q_smbWorkgroupUpdated(
    const QString& workgroup, const QStringList& added, const QStringList& removed)
{
    const QString path = workgroupPath(workgroup);
    news.tell(
        // Opens the Samba place where the workgroup is not there yet. In a step of its own, since
        // that tells the host something.
        [this, path] { placeBase.placeEntry(path); },
        [this, path, added, removed] {
            const Entry place = placeBase.placeEntry(path);
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
                destroyPlaceLater(
                    Entry(place.m_path + slash + name, QString(), TypeSambaServerPlace));
            }
        });
}

void VFSPrivate::_q_smbHostUpdated(
    const QString& host, const QString& workgroup, const StringMap& added, const StringMap& removed)
{
    const QString hostPath = workgroupPath(workgroup) + slash + host;
    news.tell(
        [this, hostPath] { placeBase.placeEntry(hostPath); },
        [this, hostPath, added, removed] {
            const Entry place = placeBase.placeEntry(hostPath);
            if (place.isNull()) {
                return;
            }
            EntryList shares;
            for (auto it = added.cbegin(); it != added.cend(); ++it) {
                shares.append(placeBase.createPlace(
                    hostPath + slash + it.key(), TypeSambaSharePlace, it.value()));
            }
            addEntriesToPlace(shares, place, true);
            // By the values, which are local paths, and not by the keys, which are the names: a
            // share that vanished stays in the tree unless its local path is its name. Not to be
            // straightened out: views rely on shares not going away under them.
            for (const QString& value : removed) {
                destroyPlaceLater(
                    Entry(hostPath + slash + value, removed.value(value), TypeSambaSharePlace));
            }
        });
}

void VFSPrivate::_q_smbShareUpdated(
    const QString& share, const QString& host, const QString& workgroup, const QString& localPath)
{
    const auto entryOfShare = [this, share, host, workgroup] {
        return q->smbShareEntry(share, host, workgroup);
    };
    news.tell(
        [entryOfShare] { entryOfShare(); },
        [this, entryOfShare, localPath] {
            const Entry entry = entryOfShare();
            if (entry.isNull()) {
                return;
            }
            // The entry that goes out still has the old local path. Receivers read it again.
            placeBase.setPlaceLocalPath(entry, localPath);
            news.then([this, entry] { q->notifyWatchers(entry); });
            news.then([this, entry] { Q_EMIT q->smbShareUpdated(entry); });
        });
}

} // namespace VeyFM
