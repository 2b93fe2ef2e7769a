// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SERVICESCENE_H
#define VEYFM_TESTS_SERVICESCENE_H

#include "support/privatebus.h"
#include "vfs/vfs.h"

#include <QDBusConnectionInterface>
#include <QDBusInterface>
#include <QJsonDocument>
#include <QSharedPointer>

/// u"text"_s is a QString.
inline QString operator""_s(const char16_t* text, size_t size)
{
    return QString::fromUtf16(text, int(size));
}

/// JSON as tests write it: a mistake ends the test.
inline QJsonDocument parsedJson(const QByteArray& text)
{
    QJsonParseError error;
    const QJsonDocument document = QJsonDocument::fromJson(text, &error);
    if (document.isNull()) {
        qFatal("%s: %s", text.constData(), qPrintable(error.errorString()));
    }
    return document;
}

inline QJsonObject object(const QByteArray& text)
{
    return parsedJson(text).object();
}

inline QJsonArray array(const QByteArray& text)
{
    return parsedJson(text).array();
}

/// The arguments of a signal that has one record. Braces around an array are the array itself.
inline QJsonArray arguments(const QJsonArray& record)
{
    QJsonArray result;
    result.append(record);
    return result;
}

/// A device as it goes over the bus; it is mounted if it has a mount point.
inline QJsonArray device(
    const QString& placeName, const QString& udi, int type = 3, const QString& mountPoint = {},
    bool mountable = true, const QString& label = {})
{
    return {mountPoint, !mountPoint.isEmpty(), mountable, false, placeName, label, QString(), udi,
            type};
}

/// A scripted service that runs on a bus of its own, with the library's meta types registered.
class ServiceScene
{
public:
    /// False with a reason in errorString().
    bool start(const QJsonObject& script = {})
    {
        m_bus.installFakeService(script);
        if (!m_bus.start()) {
            return false;
        }
        VeyFM::VFS::initialize();
        m_control = std::make_unique<FakeServiceControl>(m_bus.address());
        return QDBusConnection::sessionBus().interface()->startService(name()).isValid();
    }

    QString errorString() const
    {
        return m_bus.errorString();
    }

    FakeServiceControl* operator->() const
    {
        return m_control.get();
    }

    FakeServiceControl& control() const
    {
        return *m_control;
    }

    const PrivateBus& bus() const
    {
        return m_bus;
    }

    /// An interface of the service by the last part of its name.
    QSharedPointer<QDBusInterface> interface(const QString& interface) const
    {
        return QSharedPointer<QDBusInterface>::create(
            name(), QLatin1Char('/') + interface,
            QStringLiteral("org.veylabs.FileManager.") + interface, QDBusConnection::sessionBus());
    }

    static QString name()
    {
        return QStringLiteral("org.veylabs.vey-fm.vfs");
    }

private:
    PrivateBus m_bus;
    std::unique_ptr<FakeServiceControl> m_control;
};

#endif
