// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/stallingserver.h"

#include "real/sandbox.h"

#include <QFile>

#include <algorithm>

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <unistd.h>

namespace {

constexpr const char* stalledAddress = "127.0.0.15";
constexpr const char* serverAddress = "127.0.0.11";
constexpr unsigned short sshPort = 22;
constexpr unsigned short silentPorts[] = {21, 139, 445};

const char limitFile[] = "/run/sandbox/tmp/stall-after";
const char stalledFile[] = "/run/sandbox/tmp/has-stalled";

sockaddr_in addressOf(const char* host, unsigned short port)
{
    sockaddr_in address = {};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    ::inet_pton(AF_INET, host, &address.sin_addr);
    return address;
}

int listenOn(unsigned short port)
{
    const int fd = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    const sockaddr_in address = addressOf(stalledAddress, port);
    const bool done =
        ::bind(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0 &&
        ::listen(fd, 128) == 0;
    return done ? fd : -1;
}

int readLimit()
{
    QFile file(QString::fromLatin1(limitFile));
    return file.open(QIODevice::ReadOnly) ? file.readAll().toInt() : 0;
}

/// False at the end of the connection.
bool pass(int from, int to, int most)
{
    char buffer[4096];
    const ssize_t size = ::read(from, buffer, size_t(std::min(most, int(sizeof buffer))));
    return size > 0 && ::write(to, buffer, size_t(size)) == size;
}

[[noreturn]] void relay(int client)
{
    const int server = ::socket(AF_INET, SOCK_STREAM, 0);
    const sockaddr_in address = addressOf(serverAddress, sshPort);
    if (::connect(server, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
        ::_exit(1);
    }
    int left = readLimit();
    bool isOpen = true;
    while (isOpen) {
        if (left == 0) {
            QFile file(QString::fromLatin1(stalledFile));
            file.open(QIODevice::WriteOnly);
            left = -1;
        }
        pollfd polls[] = {{client, POLLIN, 0}, {left > 0 ? server : -1, POLLIN, 0}};
        ::poll(polls, 2, -1);
        if (polls[0].revents != 0) {
            isOpen = pass(client, server, 4096);
        }
        if (isOpen && polls[1].revents != 0) {
            char buffer[4096];
            const ssize_t size = ::read(server, buffer, size_t(std::min(left, int(sizeof buffer))));
            isOpen = size > 0 && ::write(client, buffer, size_t(size)) == size;
            left -= int(size);
        }
    }
    ::_exit(0);
}

} // namespace

QByteArrayList StallingServer::programs() const
{
    return {};
}

bool StallingServer::start()
{
    for (const unsigned short port : silentPorts) {
        if (listenOn(port) < 0) { // Open as long as the sandbox.
            return false;
        }
    }
    const int listener = listenOn(sshPort);
    if (listener < 0) {
        return false;
    }
    const pid_t pid = ::fork();
    if (pid == 0) {
        ::prctl(PR_SET_PDEATHSIG, SIGKILL);
        ::signal(SIGCHLD, SIG_IGN);
        while (true) {
            const int client = ::accept(listener, nullptr, nullptr);
            if (client >= 0 && ::fork() == 0) {
                relay(client);
            }
            ::close(client);
        }
    }
    return pid > 0;
}

void StallingServer::stallAfter(int bytes)
{
    QFile::remove(QString::fromLatin1(stalledFile));
    QFile file(QString::fromLatin1(limitFile));
    if (!file.open(QIODevice::WriteOnly) || file.write(QByteArray::number(bytes)) <= 0) {
        qFatal("%s", qPrintable(file.errorString()));
    }
}

bool StallingServer::hasStalled()
{
    return QFile::exists(QString::fromLatin1(stalledFile));
}
