// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_FAKESERVICE_CONTRACT_H
#define VEYFM_FAKESERVICE_CONTRACT_H

#include <QHash>
#include <QMap>
#include <QString>

/**
 * What the service offers, read from the introspection files that the library installs: the fake
 * service publishes them as they stand and refuses every call that is not of them.
 */
class Contract
{
public:
    struct Method
    {
        QString in;  // D-Bus signature of the arguments.
        QString out; // D-Bus signature of the reply.
    };

    /// Reads all files of a directory; exits with a message when one can't be used.
    explicit Contract(const QString& directory);

    /// The interface elements of an object path.
    QString introspection(const QString& path) const;

    bool hasMethod(const QString& interface, const QString& name) const;
    Method method(const QString& interface, const QString& name) const;
    /// The signature of a signal; null for one that is not offered.
    QString signalSignature(const QString& interface, const QString& name) const;
    /// The object path of an interface.
    QString path(const QString& interface) const;

private:
    void readFile(const QString& fileName);

    QMap<QString, QString> m_xml;      // By interface, its element.
    QHash<QString, Method> m_methods;  // By "interface.name".
    QHash<QString, QString> m_signals; // By "interface.name".
};

#endif
