// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_VFSLOG_H
#define VEYFM_TESTS_VFSLOG_H

#include "core/networkplace.h"
#include "core/storageplace.h"
#include "support/servicescene.h"
#include "watch/entrywatcher.h"

#include <QDataStream>
#include <QTest>

/// The local path that an entry carries, without asking VFS for the one it has now.
inline QString storedLocalPath(const VeyFM::Entry& entry)
{
    QByteArray bytes;
    QDataStream out(&bytes, QIODevice::WriteOnly);
    out << entry;
    QDataStream in(bytes);
    QString path;
    QString localPath;
    in >> path >> localPath;
    return localPath;
}

/**
 * What VFS and its watcher tell, in order, a line each: the signal and the path, with the local
 * path that the entry carries behind a "=" where there is one.
 */
class VfsLog : public QObject
{
public:
    VfsLog()
    {
        using namespace VeyFM;
        VFS* const vfs = VFS::ptr();
        connect(vfs, &VFS::storagePlaceMountStateChanged, this, [this](const StoragePlace& place) {
            m_lines << QStringLiteral("mountState ") + place.udi();
        });
        connect(
            vfs, &VFS::storagePlaceMountabilityChanged, this, [this](const StoragePlace& place) {
                m_lines << QStringLiteral("mountability ") + place.udi();
            });
        connect(vfs, &VFS::storagePlaceRemoved, this, [this](const StoragePlace& place) {
            m_lines << QStringLiteral("removed ") + place.udi();
        });
        connect(vfs, &VFS::smbShareUpdated, this, [this](const Entry& entry) {
            m_lines << QStringLiteral("shareUpdated ") + text(entry);
        });
        connect(vfs, &VFS::networkPlaceUpdated, this, [this](const Entry& entry) {
            m_lines << QStringLiteral("bookmarkUpdated ") + text(entry);
        });
        connect(
            vfs, &VFS::networkPlaceAdded, this,
            [this](const NetworkPlace& place, const Entry& entry) {
                m_lines << QStringLiteral("bookmarkAdded %1 ").arg(place.name()) + text(entry);
            });
        connect(vfs, &VFS::fuseMountAdded, this, [this](const QString& url, const Entry& entry) {
            m_lines << QStringLiteral("mountAdded %1 ").arg(url) + text(entry);
        });
        connect(vfs, &VFS::longTimeOperationStarted, this, [this] {
            m_lines << QStringLiteral("started");
        });
        connect(vfs, &VFS::longTimeOperationFinished, this, [this] {
            m_lines << QStringLiteral("finished");
        });
        EntryWatcher* const watcher = vfs->entryWatcher();
        connect(watcher, &EntryWatcher::entryCreated, this, [this](const Entry& entry) {
            m_lines << QStringLiteral("created ") + text(entry);
        });
        connect(watcher, &EntryWatcher::entryDeleted, this, [this](const Entry& entry) {
            m_lines << QStringLiteral("deleted ") + text(entry);
        });
        connect(watcher, &EntryWatcher::entryReset, this, [this](const Entry& entry) {
            m_lines << QStringLiteral("reset ") + text(entry);
        });
    }

    /// The lines so far.
    QStringList take()
    {
        QStringList lines;
        lines.swap(m_lines);
        return lines;
    }

    /// The lines up to now, with all that the service has sent: its signals come in order, and
    /// the last one is a mark of ours.
    QStringList takeAll(const ServiceScene& service)
    {
        const QString mark = QStringLiteral("reset mark");
        service->emitSignal(
            QStringLiteral("FileSystem"), QStringLiteral("notifyWatchersSignal"),
            array("[[[\"mark\", \"\", 0]]]"));
        if (!QTest::qWaitFor([&] { return m_lines.contains(mark); }, 20000)) {
            m_lines << QStringLiteral("no mark");
        }
        m_lines.removeAll(mark);
        return take();
    }

private:
    static QString text(const VeyFM::Entry& entry)
    {
        const QString local = storedLocalPath(entry);
        return entry.isNull() ? QStringLiteral("-")
                              : entry.path() + (local.isEmpty() ? QString() : u"="_s + local);
    }

    QStringList m_lines;
};

#endif
