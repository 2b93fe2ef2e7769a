// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "fuzzing.h"

#include "vfs/vfs.h"

#include <QCoreApplication>
#include <QTemporaryDir>

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

// Not a word: Qt warns of each path with a NUL, and the fuzzer has a great many of them.
void dropMessage(QtMsgType type, const QMessageLogContext&, const QString& message)
{
    if (type == QtFatalMsg) {
        std::fprintf(stderr, "%s\n", qPrintable(message));
    }
}

} // namespace

void Fuzzing::require(bool holds, const char* what)
{
    if (!holds) {
        std::fprintf(stderr, "does not hold: %s\n", what);
        std::abort();
    }
}

QString Fuzzing::text(const std::uint8_t* data, std::size_t size)
{
    if (size == 0 || data[0] != 0xFF) {
        return QString::fromUtf8(reinterpret_cast<const char*>(data), static_cast<int>(size));
    }
    QString result(static_cast<int>((size - 1) / sizeof(QChar)), Qt::Uninitialized);
    std::memcpy(result.data(), data + 1, static_cast<std::size_t>(result.size()) * sizeof(QChar));
    return result;
}

extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv)
{
    static const QTemporaryDir home;
    Fuzzing::require(home.isValid(), "there is a temporary directory");
    const QByteArray path = home.path().toLocal8Bit();
    qputenv("HOME", path);
    qputenv("XDG_CONFIG_HOME", path + "/.config");
    qputenv("XDG_DATA_HOME", path + "/.local/share");
    qputenv("XDG_CACHE_HOME", path + "/.cache");
    qputenv("XDG_RUNTIME_DIR", path);
    qputenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/bus");
    qputenv("LC_ALL", "C.UTF-8");

    qInstallMessageHandler(dropMessage);
    static const QCoreApplication app(*argc, *argv);
    VeyFM::VFS::initialize();
    VeyFM::VFS::ptr();
    return 0;
}
