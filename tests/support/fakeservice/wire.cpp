// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "wire.h"

#include <QDBusMetaType>
#include <QDBusVariant>
#include <QJsonArray>
#include <QJsonObject>
#include <QMap>

#include <array>
#include <cstring>

namespace {

constexpr char entry[] = "ssi";
constexpr char favourite[] = "ss";
constexpr char bookmark[] = "sss";
constexpr char device[] = "sbbbssssi";
constexpr char deviceInfo[] = "ssssbssssssttbttt";

// A structure of basic members by their signature. The members stay JSON until they are written.
template <const char* Signature>
struct Record
{
    QJsonArray members;
};

template <const char* Signature>
QDBusArgument& operator<<(QDBusArgument& argument, const Record<Signature>& record)
{
    argument.beginStructure();
    for (int i = 0; Signature[i]; ++i) {
        const QJsonValue member = record.members.at(i);
        switch (Signature[i]) {
        case 's':
            argument << member.toString();
            break;
        case 'b':
            argument << member.toBool();
            break;
        case 'i':
            argument << member.toInt();
            break;
        default:
            argument << quint64(member.toDouble());
        }
    }
    argument.endStructure();
    return argument;
}

template <const char* Signature>
const QDBusArgument& operator>>(const QDBusArgument& argument, Record<Signature>& record)
{
    record.members = Wire::toJson(QVariant::fromValue(argument)).toArray();
    return argument;
}

using Entry = Record<entry>;
using Favourite = Record<favourite>;
using Bookmark = Record<bookmark>;
using Device = Record<device>;
using DeviceInfo = Record<deviceInfo>;
using EntryMap = QMap<QString, Entry>;
using TextMap = QMap<QString, QString>;

template <typename T>
T structure(const QJsonValue& value)
{
    return T{value.toArray()};
}

template <typename T>
QVariant list(const QJsonValue& value)
{
    QList<T> result;
    const QJsonArray elements = value.toArray();
    for (const QJsonValue& element : elements) {
        result.append(structure<T>(element));
    }
    return QVariant::fromValue(result);
}

} // namespace

Q_DECLARE_METATYPE(Entry)
Q_DECLARE_METATYPE(Favourite)
Q_DECLARE_METATYPE(Bookmark)
Q_DECLARE_METATYPE(Device)
Q_DECLARE_METATYPE(DeviceInfo)
Q_DECLARE_METATYPE(TextMap)
Q_DECLARE_METATYPE(EntryMap)

void Wire::registerTypes()
{
    qDBusRegisterMetaType<Entry>();
    qDBusRegisterMetaType<QList<Entry>>();
    qDBusRegisterMetaType<Favourite>();
    qDBusRegisterMetaType<QList<Favourite>>();
    qDBusRegisterMetaType<Bookmark>();
    qDBusRegisterMetaType<QList<Bookmark>>();
    qDBusRegisterMetaType<Device>();
    qDBusRegisterMetaType<QList<Device>>();
    qDBusRegisterMetaType<DeviceInfo>();
    qDBusRegisterMetaType<TextMap>();
    qDBusRegisterMetaType<EntryMap>();
}

QVariant Wire::fromJson(const QString& signature, const QJsonValue& value)
{
    const auto is = [&signature](const char* other) {
        return signature == QLatin1String(other);
    };
    if (is("s")) {
        return value.toString();
    }
    if (is("b")) {
        return value.toBool();
    }
    if (is("i")) {
        return value.toInt();
    }
    if (is("t")) {
        return quint64(value.toDouble());
    }
    if (is("as")) {
        return value.toVariant().toStringList();
    }
    if (is("a{ss}")) {
        TextMap map;
        const QJsonObject object = value.toObject();
        for (auto it = object.begin(); it != object.end(); ++it) {
            map.insert(it.key(), it->toString());
        }
        return QVariant::fromValue(map);
    }
    if (is("a{s(ssi)}")) {
        EntryMap map;
        const QJsonObject object = value.toObject();
        for (auto it = object.begin(); it != object.end(); ++it) {
            map.insert(it.key(), structure<Entry>(*it));
        }
        return QVariant::fromValue(map);
    }
    if (is("(ssi)")) {
        return QVariant::fromValue(structure<Entry>(value));
    }
    if (is("a(ssi)")) {
        return list<Entry>(value);
    }
    if (is("(ss)")) {
        return QVariant::fromValue(structure<Favourite>(value));
    }
    if (is("a(ss)")) {
        return list<Favourite>(value);
    }
    if (is("(sss)")) {
        return QVariant::fromValue(structure<Bookmark>(value));
    }
    if (is("a(sss)")) {
        return list<Bookmark>(value);
    }
    if (is("(sbbbssssi)")) {
        return QVariant::fromValue(structure<Device>(value));
    }
    if (is("a(sbbbssssi)")) {
        return list<Device>(value);
    }
    if (is("(ssssbssssssttbttt)")) {
        return QVariant::fromValue(structure<DeviceInfo>(value));
    }
    return QVariant();
}

QJsonValue Wire::toJson(const QVariant& value)
{
    if (value.userType() != qMetaTypeId<QDBusArgument>()) {
        return QJsonValue::fromVariant(value);
    }
    const auto argument = value.value<QDBusArgument>();
    QJsonArray array;
    QJsonObject object;
    switch (argument.currentType()) {
    case QDBusArgument::StructureType:
        argument.beginStructure();
        while (!argument.atEnd()) {
            array.append(toJson(argument.asVariant()));
        }
        argument.endStructure();
        return array;
    case QDBusArgument::ArrayType:
        argument.beginArray();
        while (!argument.atEnd()) {
            array.append(toJson(argument.asVariant()));
        }
        argument.endArray();
        return array;
    case QDBusArgument::MapType:
        argument.beginMap();
        while (!argument.atEnd()) {
            argument.beginMapEntry();
            const QString key = argument.asVariant().toString();
            object.insert(key, toJson(argument.asVariant()));
            argument.endMapEntry();
        }
        argument.endMap();
        return object;
    default:
        return QJsonValue::fromVariant(argument.asVariant());
    }
}

QStringList Wire::split(const QString& signature)
{
    QStringList types;
    QString type;
    int depth = 0;
    for (const QChar c : signature) {
        type += c;
        if (c == QLatin1Char('(') || c == QLatin1Char('{')) {
            ++depth;
        } else if (c == QLatin1Char(')') || c == QLatin1Char('}')) {
            --depth;
        }
        if (depth == 0 && c != QLatin1Char('a')) {
            types.append(type);
            type.clear();
        }
    }
    return types;
}
