// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_NETWORKMOUNTSMANAGERPROXY_H
#define VEYFM_NETWORKMOUNTSMANAGERPROXY_H

#include "core/entry.h"
#include "veyfmvfs_export.h"

#include <QMap>
#include <QObject>
#include <QWeakPointer>

class QDBusInterface;

namespace VeyFM {

/**
 * The service's register of mounted network resources, which lets all processes of a session
 * share one mount. Nothing is kept here: each read asks the service, and blocks for the answer.
 */
class VEYFMVFS_EXPORT NetworkMountsManagerProxy : public QObject
{
    Q_OBJECT

public:
    /// The interface is not kept alive; once it has expired, reads are empty and calls do nothing.
    explicit NetworkMountsManagerProxy(
        QWeakPointer<QDBusInterface> interface, QObject* parent = nullptr);
    ~NetworkMountsManagerProxy() override;

    /// URL to the entry of its mount; empty where the service gives none.
    QMap<QString, Entry> mounts() const;

    /// Records a mount. A failure is not told: the next process will then mount it again.
    void addMount(const QString& url, const Entry& entry);

Q_SIGNALS:
    /// A process of the session, this one or another, has recorded a mount.
    void mountAdded(QString url, VeyFM::Entry entry);

private:
    const QWeakPointer<QDBusInterface> m_interface;
};

} // namespace VeyFM

#endif
