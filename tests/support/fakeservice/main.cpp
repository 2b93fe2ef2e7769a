// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// veyfm-fake-service --contract DIRECTORY [--script FILE] [--die | --hang]

#include "fakeservice.h"
#include "wire.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QFile>
#include <QJsonDocument>

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    QCommandLineParser parser;
    const QCommandLineOption contractOption(
        QStringLiteral("contract"), QStringLiteral("Introspection files."), QStringLiteral("dir"));
    const QCommandLineOption scriptOption(
        QStringLiteral("script"), QStringLiteral("Values and rules."), QStringLiteral("file"));
    const QCommandLineOption dieOption(
        QStringLiteral("die"), QStringLiteral("End before the name is owned."));
    const QCommandLineOption hangOption(
        QStringLiteral("hang"), QStringLiteral("Never own the name, as long as there is a bus."));
    parser.addOptions({contractOption, scriptOption, dieOption, hangOption});
    parser.process(app);
    if (parser.isSet(dieOption)) {
        return 3;
    }

    Wire::registerTypes();
    const Contract contract(parser.value(contractOption));
    QDBusConnection bus = QDBusConnection::sessionBus();
    // QtDBus goes on without its bus, and the process would stay when the test is long over.
    bus.connect(
        QString(), QStringLiteral("/org/freedesktop/DBus/Local"),
        QStringLiteral("org.freedesktop.DBus.Local"), QStringLiteral("Disconnected"), &app,
        SLOT(quit()));
    if (parser.isSet(hangOption)) {
        return app.exec();
    }
    FakeService service(contract, bus);
    if (parser.isSet(scriptOption)) {
        QFile file(parser.value(scriptOption));
        if (!file.open(QIODevice::ReadOnly)) {
            qFatal("can't read %s", qPrintable(file.fileName()));
        }
        service.load(QJsonDocument::fromJson(file.readAll()).object());
    }
    // Everything is there before the name is, so that nobody finds half a service.
    if (!bus.registerVirtualObject(QStringLiteral("/"), &service, QDBusConnection::SubPath) ||
        !bus.registerService(QStringLiteral("org.veylabs.vey-fm.vfs"))) {
        qFatal("%s", qPrintable(bus.lastError().message()));
    }
    return app.exec();
}
