// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/sandboxserver.h"

#include "real/sandboxsystem.h"

#include <QElapsedTimer>
#include <QVector>

#include <fcntl.h>
#include <netdb.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

constexpr int patienceMs = 20000;

[[noreturn]] void become(const QByteArrayList& command)
{
    QByteArrayList words = command;
    QVector<char*> argv;
    for (QByteArray& word : words) {
        argv.append(word.data());
    }
    argv.append(nullptr);
    ::execv(argv.constFirst(), argv.constData());
    ::perror(argv.constFirst());
    ::_exit(127);
}

// What it prints goes to a file of the log folder.
pid_t spawn(const QByteArrayList& command, int input)
{
    const pid_t pid = ::fork();
    if (pid != 0) {
        return pid;
    }
    const QByteArray name = command.first().mid(command.first().lastIndexOf('/') + 1);
    const QByteArray log = QByteArray(SandboxSystem::logDirectory) + '/' + name;
    const int output = ::open(log.constData(), O_CREAT | O_APPEND | O_WRONLY | O_CLOEXEC, 0600);
    if (::setsid() < 0 || ::dup2(input, STDIN_FILENO) < 0 || ::dup2(output, STDOUT_FILENO) < 0 ||
        ::dup2(output, STDERR_FILENO) < 0) {
        ::_exit(126);
    }
    become(command);
}

bool accepts(const char* host, unsigned short port)
{
    addrinfo hints = {};
    hints.ai_socktype = SOCK_STREAM;
    addrinfo* found = nullptr;
    if (::getaddrinfo(host, QByteArray::number(port).constData(), &hints, &found) != 0) {
        return false;
    }
    const int fd = ::socket(found->ai_family, SOCK_STREAM | SOCK_CLOEXEC, 0);
    const bool connected = fd >= 0 && ::connect(fd, found->ai_addr, found->ai_addrlen) == 0;
    ::close(fd);
    ::freeaddrinfo(found);
    return connected;
}

bool complain(const QByteArrayList& command, const char* what)
{
    ::fprintf(stderr, "%s %s\n", command.join(' ').constData(), what);
    return false;
}

} // namespace

bool SandboxServer::run(const QByteArrayList& command, const QByteArray& input)
{
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0) {
        return complain(command, "has no pipe");
    }
    const pid_t pid = spawn(command, ends[0]);
    ::close(ends[0]);
    // Small enough for the pipe, also where nobody reads it.
    const bool written = ::write(ends[1], input.constData(), size_t(input.size())) == input.size();
    ::close(ends[1]);
    int status = 0;
    return (written && ::waitpid(pid, &status, 0) == pid && status == 0) ||
           complain(command, "has failed");
}

bool SandboxServer::listen(const QByteArrayList& command, const char* host, unsigned short port)
{
    const int nothing = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
    const pid_t pid = spawn(command, nothing);
    ::close(nothing);
    QElapsedTimer timer;
    timer.start();
    while (!accepts(host, port)) {
        if (::waitpid(pid, nullptr, WNOHANG) != 0) {
            return complain(command, "has ended");
        }
        if (timer.hasExpired(patienceMs)) {
            return complain(command, "does not accept connections");
        }
        ::usleep(5000);
    }
    return true;
}
