// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/vfs.h"

#include "core/metatypes.h"
#include "jobs/job.h"
#include "vfs/vfs_p.h"

#include <QCoreApplication>
#include <QLocale>
#include <QTranslator>

namespace VeyFM {

void VFS::initialize()
{
    static bool initialized = false;
    if (initialized) {
        return;
    }
    auto* translator = new QTranslator(QCoreApplication::instance());
    // The last argument is empty and not null: catalogues are called "libveyfmvfs_de", with no
    // ".qm" behind.
    if (translator->load(
            QLocale::system(), QStringLiteral("libveyfmvfs"), QStringLiteral("_"),
            QStringLiteral("/usr/share/veyfm/translations"), QLatin1String(""))) {
        QCoreApplication::installTranslator(translator);
    }
    registerMetaTypes();
    qRegisterMetaType<Job*>("Job*"); // As its signal spells it.
    initialized = true;
}

VFS* VFS::ptr()
{
    static VFS instance;
    return &instance;
}

VFS::VFS()
    : QObject(nullptr)
    , d_ptr(new VFSPrivate(this))
{
    Q_D(VFS);
    d->initService();
    d->initialize();
}

VFS::~VFS()
{
    Q_D(VFS);
    d->releaseService();
}

VFSSettings* VFS::settings()
{
    return &d_func()->settings;
}

const VFSSettings* VFS::settings() const
{
    return &d_func()->settings;
}

EntryWatcher* VFS::entryWatcher()
{
    return &d_func()->entryWatcher;
}

VFSPlaceBase* VFS::placeBase()
{
    return &d_func()->placeBase;
}

const VFSPlaceBase* VFS::placeBase() const
{
    return &d_func()->placeBase;
}

SmbBrowserProxy* VFS::smbBrowser()
{
    return d_func()->smbBrowser.get();
}

NetworkMountsManagerProxy* VFS::networkMountsManager()
{
    return d_func()->networkMountsManager.get();
}

NetworkPlacesManagerProxy* VFS::networkPlacesManager()
{
    return d_func()->networkPlacesManager.get();
}

FuseMountsManagerProxy* VFS::fuseMountsManager()
{
    return d_func()->fuseMountsManager.get();
}

Entry VFS::rootEntry() const
{
    return d_func()->rootEntry;
}

Entry VFS::favouritesEntry() const
{
    return d_func()->favouritesEntry;
}

Entry VFS::desktopEntry() const
{
    return d_func()->desktopEntry;
}

Entry VFS::computerEntry() const
{
    return d_func()->computerEntry;
}

Entry VFS::trashEntry() const
{
    return d_func()->trashEntry;
}

Entry VFS::homeEntry() const
{
    return d_func()->homeEntry;
}

Entry VFS::fileSystemEntry() const
{
    return d_func()->fileSystemEntry;
}

Entry VFS::documentsEntry() const
{
    return d_func()->documentsEntry;
}

Entry VFS::placesEntry() const
{
    return d_func()->placesEntry;
}

Entry VFS::networkEntry() const
{
    return d_func()->networkEntry;
}

Entry VFS::sambaNetworkEntry() const
{
    return d_func()->sambaNetworkEntry;
}

Entry VFS::ftpNetworkEntry() const
{
    return d_func()->ftpNetworkEntry;
}

Entry VFS::sftpNetworkEntry() const
{
    return d_func()->sftpNetworkEntry;
}

Entry VFS::storageDevicesEntry() const
{
    return d_func()->storageDevicesEntry;
}

} // namespace VeyFM

#include "moc_vfs.cpp"
