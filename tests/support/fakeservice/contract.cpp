// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "contract.h"

#include <QDir>
#include <QFile>
#include <QXmlStreamReader>

namespace {

QString key(const QString& interface, const QString& name)
{
    return interface + QLatin1Char('.') + name;
}

} // namespace

Contract::Contract(const QString& directory)
{
    const QStringList files = QDir(directory).entryList({QStringLiteral("*.xml")});
    if (files.isEmpty()) {
        qFatal("no introspection files in %s", qPrintable(directory));
    }
    for (const QString& file : files) {
        readFile(directory + QLatin1Char('/') + file);
    }
}

void Contract::readFile(const QString& fileName)
{
    QFile file(fileName);
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("can't read %s", qPrintable(fileName));
    }
    const QString text = QString::fromUtf8(file.readAll());
    const int begin = text.indexOf(QLatin1String("<interface"));
    const int end = text.lastIndexOf(QLatin1String("</node>"));

    QXmlStreamReader xml(text);
    QString interface;
    QString member;
    bool isSignal = false;
    while (!xml.atEnd()) {
        if (xml.readNext() != QXmlStreamReader::StartElement) {
            continue;
        }
        const auto attributes = xml.attributes();
        const QString name = attributes.value(QLatin1String("name")).toString();
        if (xml.name() == QLatin1String("interface")) {
            interface = name;
            m_xml.insert(interface, text.mid(begin, end - begin));
        } else if (xml.name() == QLatin1String("method")) {
            isSignal = false;
            member = key(interface, name);
            m_methods.insert(member, Method());
        } else if (xml.name() == QLatin1String("signal")) {
            isSignal = true;
            member = key(interface, name);
            m_signals.insert(member, QStringLiteral(""));
        } else if (xml.name() == QLatin1String("arg")) {
            const QString type = attributes.value(QLatin1String("type")).toString();
            if (isSignal) {
                m_signals[member] += type;
            } else if (attributes.value(QLatin1String("direction")) == QLatin1String("out")) {
                m_methods[member].out += type;
            } else {
                m_methods[member].in += type;
            }
        }
    }
    if (xml.hasError() || interface.isEmpty()) {
        qFatal("%s: %s", qPrintable(fileName), qPrintable(xml.errorString()));
    }
}

QString Contract::introspection(const QString& path) const
{
    QString result;
    for (auto it = m_xml.begin(); it != m_xml.end(); ++it) {
        if (this->path(it.key()) == path) {
            result += it.value();
        }
    }
    return result;
}

bool Contract::hasMethod(const QString& interface, const QString& name) const
{
    return m_methods.contains(key(interface, name));
}

Contract::Method Contract::method(const QString& interface, const QString& name) const
{
    return m_methods.value(key(interface, name));
}

QString Contract::signalSignature(const QString& interface, const QString& name) const
{
    return m_signals.value(key(interface, name));
}

QString Contract::path(const QString& interface) const
{
    // An object is named after its one interface, but for the two of the root.
    const QString name = interface.section(QLatin1Char('.'), -1);
    return name == QLatin1String("Service") || name == QLatin1String("FileSystem")
               ? QStringLiteral("/")
               : QLatin1Char('/') + name;
}
