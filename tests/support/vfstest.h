// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_VFSTEST_H
#define VEYFM_TESTS_VFSTEST_H

#include "support/vfslog.h"
#include "vfs/vfsplacebase.h"

#include <QDir>

/// The base of tests that have VFS follow the scripted service.
class VfsTest : public QObject
{
protected:
    /// Starts both; false with a reason in errorString().
    bool startVfs(const QByteArray& script)
    {
        if (!service.start(object(script))) {
            return false;
        }
        vfs = VeyFM::VFS::ptr();
        log = std::make_unique<VfsLog>();
        return true;
    }

    /// What VFS tells of a signal of the service.
    QStringList news(const QString& interface, const QString& signal, const QJsonArray& arguments)
    {
        service->emitSignal(interface, signal, arguments);
        return log->takeAll(service);
    }

    QStringList childPaths(const QString& place) const
    {
        return vfs->placeBase()->childEntries(vfs->placeBase()->placeEntry(place)).paths();
    }

    QString treeLocalPath(const QString& place) const
    {
        return storedLocalPath(vfs->placeBase()->placeEntry(place));
    }

    ServiceScene service;
    std::unique_ptr<VfsLog> log;
    VeyFM::VFS* vfs = nullptr;
};

#endif
