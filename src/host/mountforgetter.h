// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_MOUNTFORGETTER_H
#define VEYFM_HOST_MOUNTFORGETTER_H

#include <QDBusMessage>
#include <QDBusPendingCallWatcher>
#include <QObject>
#include <QTimer>

#include <functional>

namespace VeyFM {
namespace Host {

/**
 * Has the file manager service take note that a directory is no mount any more, where it runs: it
 * looks when it is asked for its mounts. One that does not look is told. Nothing here waits for the
 * service.
 */
class MountForgetter : public QObject
{
    Q_OBJECT

public:
    MountForgetter(const QString& directory, const QString& mountRoot, QObject* parent = nullptr);

    void start();

Q_SIGNALS:
    /// When the service has answered, a second has passed, or there is no service. Never inside
    /// start().
    void done();

private:
    void call(
        const char* interface, const char* method, const QVariantList& arguments,
        const std::function<void(const QDBusMessage&)>& take);
    void forget(const QDBusMessage& mounts);

    const QString m_directory;
    const QString m_mountRoot;
    int m_open = 0; ///< Calls.
    QTimer m_patience;
};

} // namespace Host
} // namespace VeyFM

#endif
