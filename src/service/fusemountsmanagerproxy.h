// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FUSEMOUNTSMANAGERPROXY_H
#define VEYFM_FUSEMOUNTSMANAGERPROXY_H

#include "core/stringmap.h"
#include "veyfmvfs_export.h"

#include <QObject>
#include <QWeakPointer>

class QDBusInterface;

namespace VeyFM {

/**
 * The service's register of FUSE mounts and their directories. Nothing is kept here: each read
 * asks the service, and blocks for the answer.
 */
class VEYFMVFS_EXPORT FuseMountsManagerProxy : public QObject
{
    Q_OBJECT

public:
    /// The interface is not kept alive; once it has expired, reads are empty and calls do nothing.
    explicit FuseMountsManagerProxy(
        QWeakPointer<QDBusInterface> interface, QObject* parent = nullptr);
    ~FuseMountsManagerProxy() override;

    /// URL of a mount's root to the directory it is mounted on.
    StringMap mounts() const;

    /// Records a mount. A failure is not told: the next process will then mount it again.
    void addMount(const QString& url, const QString& localPath);

Q_SIGNALS:
    /// Never emitted: nothing here follows the service's news of these mounts.
    void mountAdded(QString url, QString localPath);

private:
    const QWeakPointer<QDBusInterface> m_interface;
};

} // namespace VeyFM

#endif
