// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/boundedchild.h"

#include "host/pidfd.h"

#include <QByteArray>
#include <QFile>

#include <cerrno>

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/statfs.h>
#include <sys/wait.h>
#include <unistd.h>

namespace VeyFM {
namespace Host {

namespace {

constexpr std::chrono::seconds unmountPatience(5);

/// Waits for the end of a child, and ends it when it takes too long. Its exit code, or -1.
int waitForChild(pid_t pid, std::chrono::milliseconds patience)
{
    const int handle = openPidfd(pid);
    pollfd poll = {handle, POLLIN, 0};
    const auto latest = std::chrono::steady_clock::now() + patience;
    int ready = -1;
    do {
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
            latest - std::chrono::steady_clock::now());
        ready = ::poll(&poll, 1, left.count() > 0 ? int(left.count()) : 0);
    } while (ready < 0 && errno == EINTR);
    if (handle >= 0) {
        ::close(handle);
    }
    int status = 0;
    if (ready != 1) {
        ::kill(pid, SIGKILL);
        ::waitpid(pid, &status, WNOHANG);
        return -1;
    }
    return ::waitpid(pid, &status, 0) == pid && WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

/// What a program gets that is run for its exit code: the usual signals, and nothing to read or to
/// write.
class QuietSpawn
{
public:
    QuietSpawn()
    {
        sigset_t none;
        sigset_t all;
        ::sigemptyset(&none);
        ::sigfillset(&all);
        ::posix_spawnattr_init(&m_attributes);
        ::posix_spawnattr_setsigmask(&m_attributes, &none);
        ::posix_spawnattr_setsigdefault(&m_attributes, &all);
        ::posix_spawnattr_setflags(&m_attributes, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF);
        ::posix_spawn_file_actions_init(&m_files);
        for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
            ::posix_spawn_file_actions_addopen(&m_files, descriptor, "/dev/null", O_RDWR, 0);
        }
    }
    ~QuietSpawn()
    {
        ::posix_spawn_file_actions_destroy(&m_files);
        ::posix_spawnattr_destroy(&m_attributes);
    }

    /// Whether it did well.
    bool run(QByteArray program, QByteArray option, QByteArray operand) const
    {
        char* const arguments[] = {program.data(), option.data(), operand.data(), nullptr};
        pid_t pid = -1;
        return ::posix_spawnp(&pid, arguments[0], &m_files, &m_attributes, arguments, environ) ==
                   0 &&
               waitForChild(pid, unmountPatience) == 0;
    }

private:
    Q_DISABLE_COPY(QuietSpawn)

    posix_spawnattr_t m_attributes;
    posix_spawn_file_actions_t m_files;
};

} // namespace

int runInChild(const std::function<int()>& work, std::chrono::milliseconds patience)
{
    const pid_t pid = ::fork();
    if (pid == 0) {
        ::closefrom(STDIN_FILENO);
        ::_exit(work());
    }
    return pid < 0 ? -1 : waitForChild(pid, patience);
}

int lookAt(const QString& path, std::chrono::milliseconds patience)
{
    const QByteArray name = QFile::encodeName(path);
    return runInChild(
        [&name] {
            struct statfs info;
            return ::statfs(name.constData(), &info) == 0 ? 0 : errno;
        },
        patience);
}

bool unmountFuse(const QString& directory, bool lazily)
{
    const QByteArray path = QFile::encodeName(directory);
    const QuietSpawn spawn;
    for (const char* program : {"fusermount3", "fusermount"}) {
        if (spawn.run(program, lazily ? "-uz" : "-u", path)) {
            return true;
        }
    }
    return false;
}

} // namespace Host
} // namespace VeyFM
