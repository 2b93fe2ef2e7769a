// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/childprocess.h"

#include "host/background.h"
#include "host/pidfd.h"

#include <QFile>
#include <QTimer>

#include <cerrno>
#include <csignal>
#include <utility>

#include <fcntl.h>
#include <spawn.h>
#include <string.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

namespace VeyFM {
namespace Host {

namespace {

void closeFile(int* file)
{
    if (*file >= 0) {
        ::close(*file);
    }
    *file = -1;
}

/// Makes both ends of a socket, neither of which is a standard stream. 0, or an error.
int makeSocket(int (&ends)[2])
{
    if (::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends) != 0) {
        return errno;
    }
    for (int& end : ends) {
        const int moved = ::fcntl(end, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
        const int error = errno;
        ::close(end);
        end = moved;
        if (moved < 0) {
            closeFile(&ends[0]);
            closeFile(&ends[1]);
            return error;
        }
    }
    // Only ours: the flag belongs to an end, and programs don't reckon with it.
    return ::fcntl(ends[0], F_SETFL, O_NONBLOCK) == 0 ? 0 : errno;
}

/// What a program gets of this one: the usual signals, three streams, and a group of its own.
class Spawning
{
public:
    Spawning(int socket, ChildProcess::Streams streams)
    {
        sigset_t none;
        sigset_t all;
        ::sigemptyset(&none);
        ::sigfillset(&all);
        ::posix_spawnattr_init(&m_attributes);
        ::posix_spawnattr_setsigmask(&m_attributes, &none);
        ::posix_spawnattr_setsigdefault(&m_attributes, &all);
        ::posix_spawnattr_setpgroup(&m_attributes, 0);
        ::posix_spawnattr_setflags(
            &m_attributes, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF | POSIX_SPAWN_SETPGROUP);
        ::posix_spawn_file_actions_init(&m_files);
        if (streams == ChildProcess::Conversation) {
            ::posix_spawn_file_actions_adddup2(&m_files, socket, STDIN_FILENO);
        } else {
            ::posix_spawn_file_actions_addopen(&m_files, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
            ::posix_spawn_file_actions_adddup2(&m_files, socket, STDERR_FILENO);
        }
        ::posix_spawn_file_actions_adddup2(&m_files, socket, STDOUT_FILENO);
        ::posix_spawn_file_actions_addclosefrom_np(&m_files, STDERR_FILENO + 1);
    }
    ~Spawning()
    {
        ::posix_spawn_file_actions_destroy(&m_files);
        ::posix_spawnattr_destroy(&m_attributes);
    }

    int start(pid_t* pid, const QString& program, const QStringList& arguments) const
    {
        std::vector<QByteArray> words{QFile::encodeName(program)};
        for (const QString& argument : arguments) {
            words.push_back(QFile::encodeName(argument));
        }
        std::vector<char*> pointers;
        for (QByteArray& word : words) {
            pointers.push_back(word.data());
        }
        pointers.push_back(nullptr);
        return ::posix_spawnp(
            pid, pointers.front(), &m_files, &m_attributes, pointers.data(), environ);
    }

private:
    Q_DISABLE_COPY(Spawning)

    posix_spawnattr_t m_attributes;
    posix_spawn_file_actions_t m_files;
};

int statusOf(pid_t pid)
{
    int status = 0;
    pid_t result = -1;
    do {
        result = ::waitpid(pid, &status, 0);
    } while (result < 0 && errno == EINTR);
    // Where the program ignores SIGCHLD nobody learns how its children end.
    return result == pid ? status : 0;
}

} // namespace

/// A process that nobody may have taken when it is there.
struct ChildProcess::Started
{
    Started() = default;
    ~Started()
    {
        if (pid > 0) {
            startThread([pid = pid] { statusOf(pid); });
        }
    }
    Q_DISABLE_COPY(Started)

    int error = 0;
    pid_t pid = -1;
};

ChildProcess::ChildProcess(QObject* parent)
    : QObject(parent)
{
}

ChildProcess::~ChildProcess()
{
    for (std::vector<char>& bytes : m_unsent) {
        ::explicit_bzero(bytes.data(), bytes.size());
    }
    m_reading.reset();
    m_writing.reset();
    m_ending.reset();
    closeFile(&m_socket);
    closeFile(&m_handle);
    if (m_pid > 0) {
        startThread([pid = m_pid] { statusOf(pid); });
    }
}

void ChildProcess::start(const QString& program, const QStringList& arguments, Streams streams)
{
    int ends[2] = {-1, -1};
    const int error = makeSocket(ends);
    if (error != 0) {
        failLater(error);
        return;
    }
    m_socket = ends[0];
    m_reading = std::make_unique<QSocketNotifier>(m_socket, QSocketNotifier::Read);
    connect(m_reading.get(), &QSocketNotifier::activated, this, &ChildProcess::readyRead);
    m_writing = std::make_unique<QSocketNotifier>(m_socket, QSocketNotifier::Write);
    m_writing->setEnabled(false);
    connect(m_writing.get(), &QSocketNotifier::activated, this, &ChildProcess::flush);
    m_starting = std::make_unique<Background>();
    const bool isBegun = m_starting->run(
        [socket = ends[1], program, arguments, streams] {
            const auto started = std::make_shared<Started>();
            started->error = Spawning(socket, streams).start(&started->pid, program, arguments);
            started->pid = started->error == 0 ? started->pid : -1;
            ::close(socket);
            return started;
        },
        [this](const std::shared_ptr<Started>& started) { takeStarted(started); });
    if (!isBegun) {
        closeFile(&ends[1]);
        failLater(EAGAIN);
    }
}

void ChildProcess::failLater(int error)
{
    stopReading();
    QTimer::singleShot(0, this, [this, error] { Q_EMIT failed(error); });
}

void ChildProcess::takeStarted(const std::shared_ptr<Started>& started)
{
    if (started->error != 0) {
        failLater(started->error);
        return;
    }
    m_handle = openPidfd(started->pid);
    if (m_handle < 0) {
        failLater(errno);
        closeFile(&m_socket); // With its input at the end, the program does nothing.
        return;
    }
    m_pid = std::exchange(started->pid, -1);
    m_ending = std::make_unique<QSocketNotifier>(m_handle, QSocketNotifier::Read);
    connect(m_ending.get(), &QSocketNotifier::activated, this, &ChildProcess::reap);
}

void ChildProcess::send(const char* bytes, size_t size)
{
    if (m_socket < 0 || m_isClosing) {
        return;
    }
    m_unsent.emplace_back(bytes, bytes + size);
    flush();
}

void ChildProcess::closeWriting()
{
    m_isClosing = true;
    flush();
}

void ChildProcess::flush()
{
    while (m_socket >= 0 && !m_unsent.empty()) {
        std::vector<char>& bytes = m_unsent.front();
        const ssize_t sent =
            ::send(m_socket, bytes.data(), bytes.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
        if (sent < 0 && errno == EINTR) {
            continue;
        }
        if (sent < 0 && (errno == EAGAIN || errno == EWOULDBLOCK)) {
            m_writing->setEnabled(true);
            return;
        }
        // Who does not listen any more gets nothing of the rest either.
        const size_t done = sent < 0 ? bytes.size() : size_t(sent);
        ::explicit_bzero(bytes.data(), done);
        if (done == bytes.size()) {
            m_unsent.pop_front();
        } else {
            std::vector<char> rest(bytes.begin() + ssize_t(done), bytes.end());
            ::explicit_bzero(bytes.data(), bytes.size());
            bytes.swap(rest);
        }
    }
    if (m_writing) {
        m_writing->setEnabled(false);
    }
    if (m_socket >= 0 && m_isClosing) {
        ::shutdown(m_socket, SHUT_WR);
    }
}

int ChildProcess::descriptor() const
{
    return m_socket;
}

void ChildProcess::stopReading()
{
    if (m_reading) {
        m_reading->setEnabled(false);
    }
}

void ChildProcess::kill(int signal)
{
    if (m_handle >= 0) {
        sendSignal(m_handle, signal);
    }
}

void ChildProcess::reap()
{
    m_ending->setEnabled(false);
    const int status = statusOf(m_pid);
    m_pid = -1;
    stopReading();
    Q_EMIT ended(status);
}

} // namespace Host
} // namespace VeyFM
