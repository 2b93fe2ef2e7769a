// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/stallingserver.h"

#include "real/sandbox.h"

#include <QFile>

#include <algorithm>
#include <limits>

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

/// Bytes, and a number for what is stalled then: the server's files can't be removed by the tests.
const char limitFile[] = "/run/sandbox/tmp/stall-after";

QString stalledFile(int number)
{
    return QStringLiteral("/run/sandbox/tmp/has-stalled-%1").arg(number);
}

int lastNumber = 0; // Of the tests.

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

QList<QByteArray> readLimit()
{
    QFile file(QString::fromLatin1(limitFile));
    return file.open(QIODevice::ReadOnly) ? file.readAll().split(' ') : QList<QByteArray>();
}

/// False at the end of the connection.
bool pass(int from, int to, int* most)
{
    char buffer[4096];
    const ssize_t size = ::read(from, buffer, size_t(std::min(*most, int(sizeof buffer))));
    *most -= size > 0 ? int(size) : 0;
    return size > 0 && ::write(to, buffer, size_t(size)) == size;
}

[[noreturn]] void relay(int client)
{
    const int server = ::socket(AF_INET, SOCK_STREAM, 0);
    const sockaddr_in address = addressOf(serverAddress, sshPort);
    if (::connect(server, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
        ::_exit(1);
    }
    const QList<QByteArray> limit = readLimit();
    int left = limit.value(0).toInt();
    bool isOpen = true;
    while (isOpen) {
        if (left == 0) {
            QFile file(stalledFile(limit.value(1).toInt()));
            file.open(QIODevice::WriteOnly);
            left = -1;
        }
        pollfd polls[] = {{client, POLLIN, 0}, {left > 0 ? server : -1, POLLIN, 0}};
        ::poll(polls, 2, -1);
        if (polls[0].revents != 0) {
            int unbounded = std::numeric_limits<int>::max();
            isOpen = pass(client, server, &unbounded);
        }
        if (isOpen && polls[1].revents != 0) {
            isOpen = pass(server, client, &left);
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
    QFile file(QString::fromLatin1(limitFile));
    const QByteArray text = QByteArray::number(bytes) + ' ' + QByteArray::number(++lastNumber);
    if (!file.open(QIODevice::WriteOnly) || file.write(text) != text.size()) {
        qFatal("%s", qPrintable(file.errorString()));
    }
}

bool StallingServer::hasStalled()
{
    return QFile::exists(stalledFile(lastNumber));
}
