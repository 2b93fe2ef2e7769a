// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountforgetter.h"

#include "core/stringmap.h"
#include "host/mountinfo.h"

#include <QDBusConnection>
#include <QDBusReply>

namespace VeyFM {
namespace Host {

namespace {

constexpr int patience = 1000; // Milliseconds.

} // namespace

MountForgetter::MountForgetter(const QString& directory, const QString& mountRoot, QObject* parent)
    : QObject(parent)
    , m_directory(directory)
    , m_mountRoot(mountRoot)
{
    m_patience.setSingleShot(true);
    connect(&m_patience, &QTimer::timeout, this, &MountForgetter::done);
}

void MountForgetter::start()
{
    if (!QDBusConnection::sessionBus().isConnected()) {
        m_patience.start(0);
        return;
    }
    m_patience.start(patience);
    call("NetworkMountsManager", "mounts", {}, [](const QDBusMessage&) {});
    call("FuseMountsManager", "mounts", {}, [this](const QDBusMessage& mounts) { forget(mounts); });
}

void MountForgetter::forget(const QDBusMessage& mounts)
{
    const StringMap directories = QDBusReply<StringMap>(mounts).value();
    for (auto it = directories.cbegin(); it != directories.cend(); ++it) {
        if (kernelPath(it.value(), m_mountRoot) == m_directory) {
            call(
                "FuseMountsManager", "addMount", {it.key(), QString()}, [](const QDBusMessage&) {});
        }
    }
}

void MountForgetter::call(
    const char* interface, const char* method, const QVariantList& arguments,
    const std::function<void(const QDBusMessage&)>& take)
{
    const QString name = QLatin1String(interface);
    QDBusMessage message = QDBusMessage::createMethodCall(
        QStringLiteral("org.veylabs.vey-fm.vfs"), QLatin1Char('/') + name,
        QStringLiteral("org.veylabs.FileManager.") + name, QLatin1String(method));
    message.setArguments(arguments);
    message.setAutoStartService(false); // One that does not run has nothing to forget.
    ++m_open;
    auto* const watcher = new QDBusPendingCallWatcher(
        QDBusConnection::sessionBus().asyncCall(message, patience), this);
    connect(watcher, &QDBusPendingCallWatcher::finished, this, [this, take, watcher] {
        watcher->deleteLater();
        take(watcher->reply());
        if (--m_open == 0) {
            m_patience.stop();
            Q_EMIT done();
        }
    });
}

} // namespace Host
} // namespace VeyFM
