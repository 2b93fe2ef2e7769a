// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_DBUSWIRE_H
#define VEYFM_TESTS_DBUSWIRE_H

#include <QDBusArgument>
#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusPendingCallWatcher>
#include <QDBusServer>
#include <QDBusVirtualObject>
#include <QSignalSpy>
#include <QUuid>

/// Two ends of a D-Bus connection without a bus: what is sent comes back as it was on the wire.
class DBusWire : public QDBusVirtualObject
{
public:
    DBusWire()
        : m_client(QDBusConnection::connectToPeer(server()->address(), QStringLiteral("wire")))
    {
        connect(server(), &QDBusServer::newConnection, this, [this](QDBusConnection connection) {
            m_serverName = connection.name();
            connection.registerVirtualObject(QStringLiteral("/"), this, QDBusConnection::SubPath);
        });
    }

    ~DBusWire() override
    {
        QDBusConnection::disconnectFromPeer(QStringLiteral("wire"));
        QDBusConnection::disconnectFromPeer(m_serverName);
    }

    bool isConnected() const
    {
        return server()->isConnected() && m_client.isConnected();
    }

    /// The reply, an error when none comes.
    QDBusMessage exchange(const QVariantList& arguments)
    {
        QDBusMessage message = QDBusMessage::createMethodCall(
            QString(), QStringLiteral("/"), QStringLiteral("org.example.Echo"),
            QStringLiteral("echo"));
        message.setArguments(arguments);
        QDBusPendingCallWatcher watcher(m_client.asyncCall(message));
        QSignalSpy finished(&watcher, &QDBusPendingCallWatcher::finished);
        if (!watcher.isFinished() && !finished.wait(20000)) {
            return QDBusMessage::createError(QDBusError::NoReply, QStringLiteral("no reply"));
        }
        return watcher.reply();
    }

    /// The one argument of a reply, as it is still on the wire.
    QDBusArgument exchange(const QVariant& argument)
    {
        return exchange(QVariantList{argument}).arguments().value(0).value<QDBusArgument>();
    }

    /// The signature of the last call, as the other end received it.
    QString signature() const
    {
        return m_signature;
    }

    QString introspect(const QString&) const override
    {
        return QString();
    }

    bool handleMessage(const QDBusMessage& message, const QDBusConnection& connection) override
    {
        m_signature = message.signature();
        return connection.send(message.createReply(message.arguments()));
    }

private:
    /// It stays to the end of the process, and has no file: Qt closes a server in a thread of its
    /// own, at a time nobody can wait for, and now and then while the destructor still holds its
    /// lock, for which both then wait for ever.
    static QDBusServer* server()
    {
        static QDBusServer* const instance = new QDBusServer(
            QLatin1String("unix:abstract=veyfm-") + QUuid::createUuid().toString(QUuid::Id128));
        return instance;
    }

    QDBusConnection m_client;
    QString m_serverName;
    QString m_signature;
};

#endif
