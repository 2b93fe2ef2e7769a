// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_ENTRYSCENE_H
#define VEYFM_TESTS_ENTRYSCENE_H

#include "support/temporarytree.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "watch/entrywatcher.h"
#include "watch/inotifywatcher.h"

#include <QStringList>

/**
 * A folder of its own and a watcher whose signals are written down: "created Home/x", with the
 * folder itself as "~". Kernel events are waiting as soon as the call that caused them has
 * returned, so process() makes a test independent of time.
 */
class EntryScene
{
public:
    EntryScene()
        : inotify(watcher.findChild<VeyFM::InotifyWatcher*>())
    {
        record(&watcher);
    }

    /// Writes down the signals of another watcher too.
    void record(VeyFM::EntryWatcher* source)
    {
        using VeyFM::EntryWatcher;
        connectOne(source, &EntryWatcher::entryCreated, "created");
        connectOne(source, &EntryWatcher::entryDeleted, "deleted");
        connectOne(source, &EntryWatcher::entryChanged, "changed");
        connectOne(source, &EntryWatcher::entryAttributesChanged, "attributes");
        connectOne(source, &EntryWatcher::entryReset, "reset");
    }

    /// The entry that goes by its local path.
    VeyFM::Entry plain(const char* relative) const
    {
        return VeyFM::VFS::ptr()->entry(tree.path(relative));
    }

    /// A place of the tree over a folder here, which need not exist.
    VeyFM::Entry place(const char* name, const char* relative) const
    {
        return VeyFM::VFS::ptr()->placeBase()->createPlace(
            QString::fromUtf8(name), VeyFM::TypeFavouritePlace, tree.path(relative));
    }

    bool isRegistered(const char* relative) const
    {
        return inotify->isPathRegistered(tree.path(relative));
    }

    /// Reports an event on a path of the folder, past the kernel. Without a file name it is about
    /// the path itself.
    bool report(const char* slot, const QString& path, const char* fileName = nullptr)
    {
        return QMetaObject::invokeMethod(
            &watcher, slot, Qt::DirectConnection, Q_ARG(QString, path),
            Q_ARG(QString, QString::fromUtf8(fileName)));
    }

    /// What was signalled since the last time, sorted: the entries of one path have no order.
    QStringList takeLog()
    {
        QStringList result;
        result.swap(log);
        result.sort();
        return result;
    }

    /// Processes what the kernel has, then takes the log.
    QStringList processedLog()
    {
        if (!QMetaObject::invokeMethod(inotify, "processInotifyMessages", Qt::DirectConnection)) {
            return {QStringLiteral("no such slot")};
        }
        return takeLog();
    }

    TemporaryTree tree;
    VeyFM::EntryWatcher watcher;
    VeyFM::InotifyWatcher* const inotify;
    QStringList log;             ///< In order.
    QList<VeyFM::Entry> entries; ///< What the signals carried, in order, since the beginning.

private:
    using Signal = void (VeyFM::EntryWatcher::*)(VeyFM::Entry);

    void connectOne(VeyFM::EntryWatcher* source, Signal signal, const char* name)
    {
        QObject::connect(source, signal, &m_context, [this, name](const VeyFM::Entry& entry) {
            QString path = entry.path();
            path.replace(tree.path(), QStringLiteral("~"));
            log.append(
                QLatin1String(name) + QLatin1Char(' ') +
                (entry.isNull() ? QStringLiteral("(null)") : path));
            entries.append(entry);
        });
    }

    QObject m_context;
};

#endif
