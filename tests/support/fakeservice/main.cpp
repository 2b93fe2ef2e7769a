// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// veyfm-fake-service --contract DIRECTORY [--script FILE] [--die]

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
    parser.addOptions({contractOption, scriptOption, dieOption});
    parser.process(app);
    if (parser.isSet(dieOption)) {
        return 3;
    }

    Wire::registerTypes();
    const Contract contract(parser.value(contractOption));
    QDBusConnection bus = QDBusConnection::sessionBus();
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
    // QtDBus goes on without its bus, and the process would stay when the test is long over.
    bus.connect(
        QString(), QStringLiteral("/org/freedesktop/DBus/Local"),
        QStringLiteral("org.freedesktop.DBus.Local"), QStringLiteral("Disconnected"), &app,
        SLOT(quit()));
    return app.exec();
}
