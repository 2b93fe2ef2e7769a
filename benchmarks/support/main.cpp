// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/options.h"

#include <benchmark/benchmark.h>

#include <QCoreApplication>
#include <QDir>
#include <QTemporaryDir>

#include <cstring>

namespace {

QTemporaryDir* scratch = nullptr;

// Neither the settings nor the bus of whoever runs this may reach the figures.
void isolate()
{
    const QByteArray home = QDir(scratch->path()).filePath(QStringLiteral("home")).toLocal8Bit();
    QDir().mkpath(QString::fromLocal8Bit(home));
    qputenv("HOME", home);
    qputenv("XDG_CONFIG_HOME", home + "/.config");
    qputenv("XDG_DATA_HOME", home + "/.local/share");
    qputenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/bus");
    qputenv("LC_ALL", "C.UTF-8");
    // A monitor of the portable road, not one of a desktop's service.
    qputenv("GIO_USE_VFS", "local");
}

} // namespace

QString Benchmarks::scratchDirectory()
{
    return scratch->path();
}

int main(int argc, char** argv)
{
    Benchmarks::Options options;
    if (argc > 1 && std::strcmp(argv[1], "--smoke") == 0) {
        options.smoke = true;
        std::memmove(argv + 1, argv + 2, sizeof(char*) * size_t(argc - 1));
        --argc;
    }
    QTemporaryDir directory(QDir::tempPath() + QStringLiteral("/veyfm-bench-XXXXXX"));
    scratch = &directory;
    isolate();
    QCoreApplication application(argc, argv);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) {
        return 2;
    }
    Benchmarks::registerRows(options);
    benchmark::RunSpecifiedBenchmarks();
    // What the rows hold, a bus for one, ends while there is an application.
    benchmark::ClearRegisteredBenchmarks();
    benchmark::Shutdown();
    return 0;
}
