// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/secretwatch.h"

#include "real/sandbox.h"
#include "real/sandboxsystem.h"

#include <QDir>
#include <QDirIterator>
#include <QFile>
#include <QSet>

#include <algorithm>
#include <array>
#include <cstring>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace {

constexpr int pauseMs = 3;

constexpr std::array<const char*, 4> secrets = {
    Sandbox::tester.password, Sandbox::alice.password, Sandbox::bob.password,
    Sandbox::wrongPassword};

sockaddr_un address()
{
    sockaddr_un result = {};
    result.sun_family = AF_UNIX;
    const QByteArray path = QByteArray(SandboxSystem::directory) + "/secretwatch";
    std::strncpy(result.sun_path, path.constData(), sizeof(result.sun_path) - 1);
    return result;
}

// A process may end while it is looked at.
QByteArray contents(const QString& path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

bool holdsSecret(const QByteArray& text)
{
    return std::any_of(
        secrets.begin(), secrets.end(), [&](const char* secret) { return text.contains(secret); });
}

QByteArray nameIn(const QString& processFolder)
{
    return contents(processFolder + QLatin1String("comm")).trimmed();
}

void look(QSet<QByteArray>& findings)
{
    const QDir processes(QStringLiteral("/proc"));
    const QStringList ids = processes.entryList({QStringLiteral("[0-9]*")}, QDir::Dirs);
    for (const QString& id : ids) {
        const QString folder = processes.filePath(id) + QLatin1Char('/');
        for (const char* file : {"cmdline", "environ"}) {
            const QByteArray before = nameIn(folder);
            if (holdsSecret(contents(folder + QLatin1String(file)))) {
                // It may have become another program meanwhile, or have ended.
                const QByteArray behind = nameIn(folder);
                findings.insert((behind.isEmpty() ? before : behind) + ' ' + file);
            }
        }
    }
}

[[noreturn]] void watch(int listener)
{
    QSet<QByteArray> findings;
    pollfd wanted = {listener, POLLIN, 0};
    while (true) {
        const bool asked = ::poll(&wanted, 1, pauseMs) > 0;
        look(findings);
        if (!asked) {
            continue;
        }
        const int client = ::accept(listener, nullptr, nullptr);
        const QByteArray answer = findings.values().join('\n');
        [[maybe_unused]] const ssize_t written =
            ::write(client, answer.constData(), size_t(answer.size()));
        ::close(client);
        findings.clear();
    }
}

} // namespace

QByteArrayList SecretWatch::programs() const
{
    return {};
}

bool SecretWatch::start()
{
    const sockaddr_un name = address();
    const int listener = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (::bind(listener, reinterpret_cast<const sockaddr*>(&name), sizeof(name)) != 0 ||
        ::chmod(name.sun_path, 0777) != 0 || ::listen(listener, 1) != 0) {
        ::perror(name.sun_path);
        return false;
    }
    if (::fork() == 0) {
        watch(listener);
    }
    ::close(listener);
    return true;
}

QStringList SecretWatch::takeFindings()
{
    const sockaddr_un name = address();
    QFile connection;
    const int fd = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (::connect(fd, reinterpret_cast<const sockaddr*>(&name), sizeof(name)) != 0 ||
        !connection.open(fd, QIODevice::ReadOnly, QFile::AutoCloseHandle)) {
        return {QStringLiteral("no watch")};
    }
    QStringList findings =
        QString::fromLocal8Bit(connection.readAll()).split(QLatin1Char('\n'), Qt::SkipEmptyParts);
    findings.sort();
    return findings;
}

QStringList SecretWatch::findFiles()
{
    QStringList found;
    const QString session = QFile::decodeName(qgetenv("XDG_RUNTIME_DIR"));
    for (const QString& folder : {QDir::homePath(), QDir::tempPath(), session}) {
        QDirIterator files(folder, QDir::Files | QDir::Hidden, QDirIterator::Subdirectories);
        while (files.hasNext()) {
            const QString file = files.next();
            if (holdsSecret(contents(file))) {
                found.append(file);
            }
        }
    }
    return found;
}
