// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "devices.h"
#include "jobs/job.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "session.h"
#include "table.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"

namespace VeyFM {
namespace Tool {

namespace {

QList<Device> readDevices()
{
    const Asking asking(QStringLiteral("Reading the storage devices"));
    return allDevices();
}

/// Why the service lists no devices, or empty.
QString whyNoDevices()
{
    const Asking asking(QStringLiteral("Reading the storage devices"));
    return whyNothing(
        {QStringLiteral("StoragePlacesManager"), QStringLiteral("availableStoragePlaces"),
         QStringLiteral("a(sbbbssssi)")});
}

QJsonObject toJson(const Device& device)
{
    const StoragePlace& place = device.place;
    return {
        {QStringLiteral("name"), device.name},
        {QStringLiteral("path"), place.name()},
        {QStringLiteral("label"), textOrNull(place.labelName())},
        {QStringLiteral("type"), int(place.type())},
        {QStringLiteral("typeName"), deviceTypeName(place.type())},
        {QStringLiteral("udi"), place.udi()},
        {QStringLiteral("mounted"), place.isMounted()},
        {QStringLiteral("mountable"), place.isMountable()},
        {QStringLiteral("ejectable"), place.isEjectable()},
        {QStringLiteral("mountPoint"), textOrNull(place.mountPoint())},
        {QStringLiteral("icon"), textOrNull(place.iconName())},
    };
}

int runList(Invocation& invocation)
{
    const QList<Device> devices = readDevices();
    if (wasInterrupted() || (devices.isEmpty() && hasFailed(invocation, whyNoDevices()))) {
        return Failed;
    }
    Output& output = invocation.output();
    if (invocation.json()) {
        JsonArray json(output);
        for (const Device& device : devices) {
            json.append(toJson(device));
        }
        json.end();
        return Done;
    }
    Table table;
    for (const Device& device : devices) {
        const StoragePlace& place = device.place;
        table.add(
            {device.name, deviceTypeName(place.type()), stateOf(place), place.mountPoint(),
             place.labelName()});
    }
    table.write(output);
    return Done;
}

/// A 64-bit number, which as a JSON number would lose its last digits.
QString number(quint64 value)
{
    return QString::number(value);
}

/// The service's own details. What they mean is between it and a user interface, so they go by
/// their positions.
QJsonObject detailsToJson(const StorageDeviceInfo& info)
{
    return {
        {QStringLiteral("text1"), info.text1},
        {QStringLiteral("text2"), info.text2},
        {QStringLiteral("text3"), info.text3},
        {QStringLiteral("text4"), info.text4},
        {QStringLiteral("flag1"), info.flag1},
        {QStringLiteral("text5"), info.text5},
        {QStringLiteral("text6"), info.text6},
        {QStringLiteral("text7"), info.text7},
        {QStringLiteral("text8"), info.text8},
        {QStringLiteral("text9"), info.text9},
        {QStringLiteral("text10"), info.text10},
        {QStringLiteral("number1"), number(info.number1)},
        {QStringLiteral("number2"), number(info.number2)},
        {QStringLiteral("flag2"), info.flag2},
        {QStringLiteral("number3"), number(info.number3)},
        {QStringLiteral("number4"), number(info.number4)},
        {QStringLiteral("number5"), number(info.number5)},
    };
}

bool isEmpty(const StorageDeviceInfo& info)
{
    return detailsToJson(info) == detailsToJson(StorageDeviceInfo());
}

void print(Output& output, const Device& device, const StorageDeviceInfo& info)
{
    const auto line = [&output](const QString& label, const QString& value) {
        if (!value.isEmpty()) {
            output.write(
                label.toLocal8Bit() + ": " + output.label(value, Entry()) + QByteArray("\n"));
        }
    };
    const auto yesNo = [](bool yes) {
        return yes ? QStringLiteral("yes") : QStringLiteral("no");
    };
    const StoragePlace& place = device.place;
    line(QStringLiteral("name"), device.name);
    line(QStringLiteral("path"), place.name());
    line(QStringLiteral("label"), place.labelName());
    line(QStringLiteral("type"), deviceTypeName(place.type()));
    line(QStringLiteral("udi"), place.udi());
    line(QStringLiteral("mounted"), yesNo(place.isMounted()));
    line(QStringLiteral("mountable"), yesNo(place.isMountable()));
    line(QStringLiteral("ejectable"), yesNo(place.isEjectable()));
    line(QStringLiteral("mount point"), place.mountPoint());
    line(QStringLiteral("icon"), place.iconName());
    const QString texts[] = {info.text1, info.text2, info.text3, info.text4, info.text5,
                             info.text6, info.text7, info.text8, info.text9, info.text10};
    int position = 0;
    for (const QString& text : texts) {
        line(QStringLiteral("text %1").arg(++position), text);
    }
    position = 0;
    for (const bool flag : {info.flag1, info.flag2}) {
        line(QStringLiteral("flag %1").arg(++position), yesNo(flag));
    }
    position = 0;
    for (const quint64 value :
         {info.number1, info.number2, info.number3, info.number4, info.number5}) {
        line(QStringLiteral("number %1").arg(++position), QString::number(value));
    }
}

/// The devices that the operands name; reports those that do not exist.
QList<Device> devicesOf(const Invocation& invocation, int& exitCode)
{
    const QList<Device> all = readDevices();
    QList<Device> named;
    QString why;
    if (all.isEmpty() && !wasInterrupted()) {
        why = whyNoDevices();
    }
    if (wasInterrupted()) {
        return named;
    }
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const Device device = findDevice(all, operand);
        if (device.place.isValid()) {
            named.append(device);
        } else {
            report(operand, why.isEmpty() ? QStringLiteral("no such storage device") : why);
            exitCode = Failed;
        }
    }
    return named;
}

int runInfo(Invocation& invocation)
{
    int exitCode = Done;
    const QList<Device> devices = devicesOf(invocation, exitCode);
    Output& output = invocation.output();
    JsonArray json(output);
    bool first = true;
    for (const Device& device : devices) {
        StorageDeviceInfo info;
        QString why;
        {
            const Asking asking(QStringLiteral("Asking for the details of the device"));
            info = VFS::ptr()->storageDeviceInfo(device.place);
            if (isEmpty(info) && !wasInterrupted()) {
                why = whyNothing(
                    {QStringLiteral("StoragePlacesManager"),
                     QStringLiteral("storageDeviceInfo"),
                     QStringLiteral("(ssssbssssssttbttt)"),
                     {QVariant::fromValue(device.place)}});
            }
        }
        if (wasInterrupted()) {
            return Failed;
        }
        if (!why.isEmpty()) {
            report(device.name, why);
            exitCode = Failed;
        }
        if (invocation.json()) {
            QJsonObject object = toJson(device);
            object.insert(QStringLiteral("details"), detailsToJson(info));
            json.append(object);
            continue;
        }
        if (!first) {
            output.write(QByteArrayLiteral("\n"));
        }
        first = false;
        print(output, device, info);
    }
    if (invocation.json()) {
        json.end();
    }
    return exitCode;
}

using MakeJob = Job* (VFS::*)(const Entry&);

/// Runs one job a device, one after the other.
int runJobs(Invocation& invocation, MakeJob makeJob, const QString& doing)
{
    int exitCode = Done;
    const QList<Device> devices = devicesOf(invocation, exitCode);
    for (const Device& device : devices) {
        bool finished = false;
        QString why;
        const Entry entry = entryOf(device);
        if (wasInterrupted()) {
            return Failed;
        }
        {
            const Waiting waiting(doing);
            const Heartbeat heartbeat;
            Job* job = (VFS::ptr()->*makeJob)(entry);
            QObject::connect(job, &Job::finished, job, [&finished, &why](Job* ended) {
                finished = true;
                if (ended->error() != 0) {
                    why = ended->errorString().isEmpty() ? QStringLiteral("failed")
                                                         : ended->errorString();
                }
            });
            job->exec();
        }
        if (wasInterrupted()) {
            return Failed;
        }
        if (Patience::isOver()) {
            report(device.name, whySilentToChange());
            return Failed;
        }
        if (!finished) {
            return Failed;
        }
        if (!why.isEmpty()) {
            report(device.name, why);
            exitCode = Failed;
        }
    }
    return exitCode;
}

int runMount(Invocation& invocation)
{
    return runJobs(invocation, &VFS::mount, QStringLiteral("Mounting"));
}

int runUnmount(Invocation& invocation)
{
    return runJobs(invocation, &VFS::unmount, QStringLiteral("Unmounting"));
}

int runEject(Invocation& invocation)
{
    return runJobs(invocation, &VFS::eject, QStringLiteral("Ejecting"));
}

Verb deviceVerb(const char* name, const char* summary, int (*run)(Invocation&))
{
    Verb verb;
    verb.name = QStringLiteral("storage ") + QLatin1String(name);
    verb.operands = QStringLiteral("DEVICE...");
    verb.summary = QLatin1String(summary);
    verb.details = QStringLiteral(
        "A device is named by its place path, such as 'Storage devices/sdb1', by its name there,\n"
        "or by its identifier.");
    verb.operandKind = OperandKind::Devices;
    verb.leastOperands = 1;
    verb.needs = Needs::Service;
    verb.printsData = false;
    verb.run = run;
    return verb;
}

} // namespace

Verb storageVerb()
{
    Verb list;
    list.name = QStringLiteral("storage list");
    list.summary = QStringLiteral("List the devices");
    list.details = QStringLiteral(
        "One device a line: its name, its type, whether it is mounted, mountable or\n"
        "not-mountable, its mount point and its label.");
    list.operandKind = OperandKind::Texts;
    list.mostOperands = 0;
    list.needs = Needs::Service;
    list.run = runList;

    Verb info = deviceVerb("info", "Show all that is known of a device", runInfo);
    info.details += QStringLiteral(" What the service adds goes by its position there.");
    info.printsData = true;

    Verb verb;
    verb.name = QStringLiteral("storage");
    verb.operands = QStringLiteral("[DEVICE...]");
    verb.summary = QStringLiteral("List, mount, unmount and eject storage devices");
    verb.operandKind = OperandKind::Verbs;
    verb.printsData = false;
    verb.verbs = {
        list, info, deviceVerb("mount", "Mount devices", runMount),
        deviceVerb("unmount", "Unmount devices", runUnmount),
        deviceVerb("eject", "Eject devices or their media", runEject)};
    return verb;
}

} // namespace Tool
} // namespace VeyFM
