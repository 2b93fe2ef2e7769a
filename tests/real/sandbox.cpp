// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/sandbox.h"

#include "real/sandboxsystem.h"
#include "support/reachable.h"

#include <QFile>
#include <QStringList>

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <fcntl.h>
#include <grp.h>
#include <sched.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

constexpr int skippedCode = 77; // See SKIP_RETURN_CODE in CMakeLists.txt.

QString reason;

int exitCode(int status)
{
    return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

// Waits for a child, and for whatever else ends meanwhile: to the first process come those who
// have lost their parents.
int waitForChild(pid_t child)
{
    int status = 0;
    while (true) {
        const pid_t ended = ::wait(&status);
        if (ended == child) {
            return exitCode(status);
        }
        if (ended < 0 && errno != EINTR) {
            return 1;
        }
    }
}

QString programPath()
{
    return QFile::symLinkTarget(QStringLiteral("/proc/self/exe"));
}

void setEnvironment()
{
    const QByteArray home = QFile::encodeName(Sandbox::home(Sandbox::tester));
    const QByteArray directory = SandboxSystem::directory;
    ::qputenv("HOME", home);
    ::qputenv("XDG_CONFIG_HOME", home + "/.config");
    ::qputenv("XDG_DATA_HOME", home + "/.local/share");
    ::qputenv("XDG_CACHE_HOME", home + "/.cache");
    ::qputenv("XDG_RUNTIME_DIR", directory + "/user");
    ::qputenv("TMPDIR", directory + "/tmp");
    ::qputenv("USER", Sandbox::tester.name);
    ::qputenv("LOGNAME", Sandbox::tester.name);
    ::qputenv("SHELL", "/bin/sh");
    // What would lead tools to the agents, tickets and windows of whoever runs the tests.
    for (const char* name :
         {"SSH_AUTH_SOCK", "SSH_ASKPASS", "DISPLAY", "WAYLAND_DISPLAY", "KRB5CCNAME", "PASSWD",
          "PASSWD_FD", "PASSWD_FILE"}) {
        ::qunsetenv(name);
    }
}

bool becomeTester()
{
    const group* const fuse = ::getgrnam("fuse");
    if (!fuse) {
        return false;
    }
    const std::array<gid_t, 2> groups = {Sandbox::tester.id, fuse->gr_gid};
    setEnvironment();
    // Who changes its user may not be looked into by the leak checker, nor by the tests' own look
    // at environments, until it says otherwise.
    return ::setgroups(groups.size(), groups.data()) == 0 && ::setgid(Sandbox::tester.id) == 0 &&
           ::setuid(Sandbox::tester.id) == 0 && ::prctl(PR_SET_DUMPABLE, 1) == 0 &&
           ::setsid() > 0 && ::chdir(qgetenv("HOME").constData()) == 0;
}

// Asked as the user of the tests.
QString missingAccess()
{
    const QByteArray program = QFile::encodeName(programPath());
    if (::access(program.constData(), X_OK) != 0 || ::access(VEYFM_SOURCE_DIR, X_OK) != 0) {
        return QStringLiteral("no sandbox: %1 and %2 must be open to all users")
            .arg(QFile::decodeName(program), QStringLiteral(VEYFM_SOURCE_DIR));
    }
    const int fd = ::open("/dev/fuse", O_RDWR | O_CLOEXEC);
    if (fd < 0) {
        return QStringLiteral("/dev/fuse: ") + qt_error_string();
    }
    ::close(fd);
    return QString();
}

} // namespace

Sandbox::Sandbox(const QByteArrayList& programs)
    : m_programs(programs)
{
}

void Sandbox::addServer(std::unique_ptr<SandboxServer> server)
{
    m_programs += server->programs();
    m_servers.push_back(std::move(server));
}

bool Sandbox::isEntered()
{
    return reason.isEmpty();
}

QString Sandbox::skipReason()
{
    return reason;
}

bool Sandbox::hasVersion6()
{
    return QFile::exists(QStringLiteral("/proc/net/if_inet6"));
}

QString Sandbox::home(const SandboxAccount& account)
{
    return directory() + QStringLiteral("/home/") + QString::fromLatin1(account.name);
}

QString Sandbox::directory()
{
    return QString::fromLatin1(SandboxSystem::directory);
}

QString Sandbox::missingPrograms() const
{
    QStringList missing;
    for (const QByteArray& program : m_programs) {
        if (::access(program.constData(), X_OK) != 0) {
            missing.append(QFile::decodeName(program));
        }
    }
    return missing.isEmpty()
               ? QString()
               : QStringLiteral("not installed: ") + missing.join(QLatin1String(", "));
}

int Sandbox::run(const std::function<int()>& tests)
{
    reason = missingPrograms();
    if (reason.isEmpty() && ::geteuid() != 0) {
        reason = QStringLiteral("no sandbox: only root can make one");
    }
    if (reason.isEmpty() && ::unshare(CLONE_NEWPID) != 0) {
        reason = QStringLiteral("no sandbox: ") + qt_error_string();
    }
    if (!reason.isEmpty()) {
        return runTests(tests);
    }
    const pid_t first = ::fork();
    if (first == 0) {
        return runFirstProcess(tests);
    }
    // Not back through main(): whose children are to have new process numbers can't have a thread
    // any more, and the leak checker wants one.
    ::_exit(waitForChild(first));
}

// Returns in the process of the tests alone.
int Sandbox::runFirstProcess(const std::function<int()>& tests)
{
    // All others are killed at the end of this one.
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    reason = SandboxSystem::prepare();
    const bool prepared = reason.isEmpty();
    if (prepared) {
        // What stays closed shows in missingAccess().
        makeReachable(QFile::encodeName(programPath()));
        makeReachable(VEYFM_SOURCE_DIR "/");
        if (!startServers()) {
            std::fputs(SandboxSystem::logs().constData(), stderr);
            ::_exit(1);
        }
    }
    const pid_t child = ::fork();
    if (child == 0) {
        if (prepared) {
            reason = becomeTester() ? missingAccess()
                                    : QStringLiteral("no sandbox: ") + qt_error_string();
            return runTests(tests);
        }
        const int code = runTests(tests);
        std::fflush(nullptr);
        ::_exit(code); // The leak checker wants a /proc of these process numbers.
    }
    const int code = waitForChild(child);
    if (code != 0 && code != skippedCode) {
        std::fputs(SandboxSystem::logs().constData(), stderr);
    }
    ::_exit(code);
}

int Sandbox::runTests(const std::function<int()>& tests)
{
    const int code = tests();
    return code == 0 && !reason.isEmpty() ? skippedCode : code;
}

bool Sandbox::startServers() const
{
    return std::all_of(
        m_servers.begin(), m_servers.end(), [](const auto& server) { return server->start(); });
}
